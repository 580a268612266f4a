# SPDX-License-Identifier: BSL-1.0
# Sets how this project is compiled and where its files are written.
include_guard()

set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_LINK_DEPENDS_NO_SHARED ON)

set(CMAKE_RUNTIME_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/bin)
set(CMAKE_LIBRARY_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/lib)
set(CMAKE_ARCHIVE_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/lib)

# The folder for tests that use hidden symbols of libMZcomponentManager, and for the variant of the
# library that exports these.
set(MZ_INTERNALS_FOLDER ${PROJECT_BINARY_DIR}/internals)

include(MzRuntime)
if(WIN32)
  enable_language(RC)
  # Programs find the DLLs in their own folder.
  mz_find_runtime(MZ_RUNTIME_FILES)
  file(COPY ${MZ_RUNTIME_FILES} DESTINATION ${PROJECT_BINARY_DIR}/bin)
endif()

include(CheckCXXCompilerFlag)
check_cxx_compiler_flag(-fno-gnu-unique MZ_HAS_NO_GNU_UNIQUE)
check_cxx_compiler_flag(-fno-semantic-interposition MZ_HAS_NO_SEMANTIC_INTERPOSITION)
check_cxx_compiler_flag(-Wshadow=local MZ_HAS_SHADOW_LOCAL)

# Options for this project's code. They are not passed on to users of the libraries.
add_library(mzCompile INTERFACE)
target_compile_options(mzCompile INTERFACE -Wall -Wextra -Wpedantic -Wconversion
  -Wnon-virtual-dtor -Wold-style-cast -Wundef $<$<BOOL:${MZ_HAS_SHADOW_LOCAL}>:-Wshadow=local>)
if(MZ_WARNINGS_AS_ERRORS)
  target_compile_options(mzCompile INTERFACE -Werror)
endif()
if(MZ_HAS_NO_GNU_UNIQUE)
  # A library that defines a unique symbol cannot be unmapped.
  target_compile_options(mzCompile INTERFACE -fno-gnu-unique)
endif()
if(MZ_HAS_NO_SEMANTIC_INTERPOSITION AND NOT WIN32)
  # Replacing single functions of a library is not supported, so the library can call and inline its
  # own directly.
  target_compile_options(mzCompile INTERFACE -fno-semantic-interposition)
  target_link_options(mzCompile INTERFACE -Wl,-Bsymbolic-functions)
endif()
if(MZ_SANITIZE)
  # With the checks of the sanitizers, GCC warns wrongly of uninitialised values in the standard
  # library.
  target_compile_options(mzCompile INTERFACE -fsanitize=address,undefined -fno-sanitize-recover=all
    -fno-omit-frame-pointer $<$<CXX_COMPILER_ID:GNU>:-Wno-maybe-uninitialized>)
  target_link_options(mzCompile INTERFACE -fsanitize=address,undefined)
endif()

# Programs and tests do without the checks before each access through a pointer, which took 40 % of
# the time to compile them: what these find ends in a fault or in a report of the address sanitizer
# as well. The libraries keep all checks.
set(MZ_FEWER_CHECKS -fno-sanitize=null,alignment,object-size,vptr)

# mz_compile_together(TARGET...): compiles up to sixteen sources of each target at once, in the builds
# of developers. Templates of large headers are instantiated once for all of them, which more than
# halves the time. Packages are built source by source. So is the Clang build, which fails where a source lacks
# an include or uses what another one defines.
option(MZ_COMPILE_TOGETHER "Compile several sources at once, to save time" OFF)
function(mz_compile_together)
  set_target_properties(${ARGN} PROPERTIES UNITY_BUILD ${MZ_COMPILE_TOGETHER} UNITY_BUILD_BATCH_SIZE 16)
endfunction()

# mz_compile_alone(SOURCE...): compiles these sources by themselves all the same: they use names that
# others of their target use, too.
function(mz_compile_alone)
  set_source_files_properties(${ARGN} PROPERTIES SKIP_UNITY_BUILD_INCLUSION ON)
endfunction()

# GCC 12 does not know which precompiled headers are the system's, and reports its known false
# warnings on std::string.
function(mz_allow_precompiled target)
  if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU")
    target_compile_options(${target} PRIVATE -Wno-array-bounds -Wno-restrict
      -Wno-stringop-overflow -Wno-stringop-overread)
  endif()
endfunction()

# mz_copy_file(TARGET FILE FOLDER): copies FILE to FOLDER whenever TARGET has been built.
function(mz_copy_file target file folder)
  add_custom_command(TARGET ${target} POST_BUILD
    COMMAND ${CMAKE_COMMAND} -E make_directory ${folder}
    COMMAND ${CMAKE_COMMAND} -E copy_if_different ${file} ${folder})
endfunction()

# mz_describe_file(TARGET): adds a version resource on Windows, where file names contain no version.
function(mz_describe_file target)
  if(NOT WIN32)
    return()
  endif()
  set(mzTarget ${target})
  string(REPLACE . , mzVersionNumbers ${PROJECT_VERSION})
  set(resource ${PROJECT_BINARY_DIR}/resources/${target}.rc)
  configure_file(${PROJECT_SOURCE_DIR}/cmake/version.rc.in ${resource} @ONLY)
  target_sources(${target} PRIVATE ${resource})
endfunction()

# mz_make_library(NAME MACRO FOLDER sources...): adds a shared library in FOLDER, with the file name
# lib<NAME> on every platform. MACRO is defined while it is compiled.
function(mz_make_library name macro folder)
  add_library(${name} SHARED ${ARGN})
  target_compile_features(${name} PUBLIC cxx_std_20)
  target_link_libraries(${name} PRIVATE $<BUILD_INTERFACE:mzCompile>)
  target_compile_definitions(${name} PRIVATE ${macro})
  target_include_directories(${name} PUBLIC
    $<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}> $<INSTALL_INTERFACE:include>)
  set_target_properties(${name} PROPERTIES PREFIX lib
    VERSION ${PROJECT_VERSION} SOVERSION ${MZ_SOVERSION}
    LIBRARY_OUTPUT_DIRECTORY ${folder}
    RUNTIME_OUTPUT_DIRECTORY ${folder}
    ARCHIVE_OUTPUT_DIRECTORY ${folder})
  mz_describe_file(${name})
endfunction()

# mz_add_library(NAME MACRO sources...): adds a shared library of this project.
function(mz_add_library name macro)
  mz_make_library(${name} ${macro} ${PROJECT_BINARY_DIR}/lib ${ARGN})
  add_library(Mz::${name} ALIAS ${name})
  # The libraries find one another in the folder in which they are installed.
  set_target_properties(${name} PROPERTIES INSTALL_RPATH "$ORIGIN")
  if(WIN32)
    # Programs find the libraries in their own folder.
    mz_copy_file(${name} $<TARGET_FILE:${name}> ${PROJECT_BINARY_DIR}/bin)
  endif()
endfunction()

# mz_public_headers(NAME headers...): the headers that are installed with a library.
function(mz_public_headers name)
  get_target_property(type ${name} TYPE)
  set(scope PUBLIC)
  if(type STREQUAL "INTERFACE_LIBRARY")
    set(scope INTERFACE)
  endif()
  list(TRANSFORM ARGN PREPEND ${CMAKE_CURRENT_SOURCE_DIR}/)
  target_sources(${name} ${scope} FILE_SET HEADERS BASE_DIRS ${PROJECT_SOURCE_DIR} FILES ${ARGN})
endfunction()
