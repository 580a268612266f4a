# SPDX-License-Identifier: BSL-1.0
# Makes locales for tests and benchmarks: a minimal system has only "C". The C library reads locales
# from the folder that LOCPATH names, so the build folder can contain them.
include_guard(GLOBAL)

# mz_use_locales(TARGET): makes the locales before TARGET and defines MZ_LOCALE_FOLDER, their
# folder. If the tools are missing (Debian: locales), the folder does not exist.
find_program(MZ_LOCALEDEF localedef)

# The numbers in the files of a locale have the order of the processor.
set(mzLocaleOrder --little-endian)
if(CMAKE_CXX_BYTE_ORDER STREQUAL "BIG_ENDIAN")
  set(mzLocaleOrder --big-endian)
endif()

function(mz_make_locale name charmap)
  if(NOT MZ_LOCALEDEF OR NOT EXISTS /usr/share/i18n/charmaps/${charmap}.gz)
    return()
  endif()
  set(output ${PROJECT_BINARY_DIR}/locales/${name}.${charmap})
  add_custom_command(OUTPUT ${output}/LC_NUMERIC
    COMMAND ${CMAKE_COMMAND} -E make_directory ${PROJECT_BINARY_DIR}/locales
    COMMAND ${MZ_LOCALEDEF} --no-warnings=ascii ${mzLocaleOrder} -i ${name} -f ${charmap} --no-archive ${output}
    COMMENT "Making the locale ${name}.${charmap}")
  set_property(GLOBAL APPEND PROPERTY mzLocales ${output}/LC_NUMERIC)
endfunction()

if(NOT WIN32)
  mz_make_locale(de_DE UTF-8)
  mz_make_locale(de_DE ISO-8859-15)
  # Has other characters in the place of the backslash and the tilde.
  mz_make_locale(ja_JP SHIFT_JIS)
endif()
get_property(mzLocales GLOBAL PROPERTY mzLocales)
add_custom_target(mzLocales DEPENDS ${mzLocales})

function(mz_use_locales target)
  target_compile_definitions(${target} PRIVATE MZ_LOCALE_FOLDER="${PROJECT_BINARY_DIR}/locales")
  add_dependencies(${target} mzLocales)
endfunction()
