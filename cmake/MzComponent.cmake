# SPDX-License-Identifier: BSL-1.0
# mz_add_component(NAME [FOLDER folder] sources...): adds a component library. Hosts find it in its
# folder, which is components/ in the build folder by default.
#
# Its file is NAME plus the platform's extension, without a prefix, so that a folder of components
# has the same names in the same order on every platform.
include_guard()

function(mz_add_component name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "FOLDER" "")
  if(NOT arg_FOLDER)
    set(arg_FOLDER ${CMAKE_BINARY_DIR}/components)
  endif()
  add_library(${name} MODULE ${arg_UNPARSED_ARGUMENTS})
  target_link_libraries(${name} PRIVATE Mz::MZcomponentManager)
  set_target_properties(${name} PROPERTIES
    PREFIX ""
    CXX_VISIBILITY_PRESET hidden
    VISIBILITY_INLINES_HIDDEN ON
    LIBRARY_OUTPUT_DIRECTORY ${arg_FOLDER}
    RUNTIME_OUTPUT_DIRECTORY ${arg_FOLDER})
  if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU")
    # A library that defines a unique symbol cannot be unmapped.
    target_compile_options(${name} PRIVATE -fno-gnu-unique)
  endif()
endfunction()
