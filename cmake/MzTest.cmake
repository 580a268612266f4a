# SPDX-License-Identifier: BSL-1.0
# Builds GoogleTest from the sources of Debian's package, and adds test programs.
include_guard()

set(MZ_GOOGLETEST_SOURCES /usr/src/googletest CACHE PATH "The sources of GoogleTest")
set(CMAKE_POLICY_DEFAULT_CMP0077 NEW)
set(BUILD_GMOCK ON)
set(INSTALL_GTEST OFF)
set(gtest_force_shared_crt ON)
add_subdirectory(${MZ_GOOGLETEST_SOURCES} ${PROJECT_BINARY_DIR}/googletest EXCLUDE_FROM_ALL SYSTEM)
include(GoogleTest)

# The test code runs once per build, so it is not optimised and has few debug symbols or none: both
# took most of the build time. The tested libraries and the examples, components among them, keep the
# build's options, and so do the header templates that they use.
add_library(mzTestCode INTERFACE)
if(MZ_SANITIZE)
  target_compile_options(mzTestCode INTERFACE -O0 -g1 ${MZ_FEWER_CHECKS})
else()
  target_compile_options(mzTestCode INTERFACE
    "$<$<CONFIG:Release,RelWithDebInfo>:SHELL:-O0 -g0>")
endif()

foreach(target gtest gtest_main gmock gmock_main)
  target_link_libraries(${target} PRIVATE mzTestCode)
  if(MZ_SANITIZE)
    target_compile_options(${target} PRIVATE -fsanitize=address)
  endif()
endforeach()

# Precompiles GoogleTest's headers for all test programs: parsing them took a third of the time to
# compile the tests. Only these headers, so that each source includes what it uses: the Clang build
# compiles without them and fails where an include is missing.
add_library(mzTestHeaders OBJECT ${PROJECT_SOURCE_DIR}/tests/support/testHeaders.cpp)
target_link_libraries(mzTestHeaders PRIVATE mzCompile mzTestCode GTest::gmock)
target_precompile_headers(mzTestHeaders PRIVATE <gmock/gmock.h> <gtest/gtest.h>)
# A program can use the precompiled headers only if both are compiled with the same options.
set_target_properties(mzTestHeaders PROPERTIES POSITION_INDEPENDENT_CODE OFF)
target_compile_options(mzTestHeaders PRIVATE ${CMAKE_CXX_COMPILE_OPTIONS_PIE})

# The same for test components: most of the time to compile one went into the kit's headers.
add_library(mzTestComponentHeaders OBJECT ${PROJECT_SOURCE_DIR}/tests/support/testHeaders.cpp)
target_link_libraries(mzTestComponentHeaders PRIVATE mzCompile mzTestCode Mz::MZcomponentManager)
target_precompile_headers(mzTestComponentHeaders PRIVATE
  "${PROJECT_SOURCE_DIR}/components/componentKit/componentKit.h")

# Each test has the name of its build as a prefix, so that one summary covers all builds.
get_filename_component(MZ_BUILD_NAME ${PROJECT_BINARY_DIR} NAME)

# The build folder as tested programs see it. Wine maps the whole file system to drive Z.
set(MZ_BUILD_PATH ${PROJECT_BINARY_DIR})
set(MZ_SOURCE_PATH ${PROJECT_SOURCE_DIR})
if(WIN32)
  set(MZ_BUILD_PATH Z:${PROJECT_BINARY_DIR})
  set(MZ_SOURCE_PATH Z:${PROJECT_SOURCE_DIR})
endif()

# mz_add_test_program(NAME [INTERNALS] sources...): adds a program with tests but no ctest entries.
# INTERNALS makes the hidden classes of libMZcomponentManager available.
function(mz_add_test_program name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "INTERNALS" "" "")
  add_executable(${name} ${arg_UNPARSED_ARGUMENTS})
  mz_link_manager(${name} ${arg_INTERNALS})
  target_link_libraries(${name} PRIVATE mzCompile mzTestCode mzTestSupport GTest::gmock)
  target_precompile_headers(${name} REUSE_FROM mzTestHeaders)
  mz_allow_precompiled(${name})
  mz_compile_together(${name})
endfunction()

# mz_link_manager(PROGRAM INTERNALS): links libMZcomponentManager as it is installed, or with
# INTERNALS the variant that exports everything. A program must not link both: their file names are
# equal.
function(mz_link_manager program internals)
  if(NOT internals)
    target_link_libraries(${program} PRIVATE Mz::MZcomponentManager)
    return()
  endif()
  target_link_libraries(${program} PRIVATE mzManagerForTests)
  set_target_properties(${program} PROPERTIES RUNTIME_OUTPUT_DIRECTORY ${MZ_INTERNALS_FOLDER})
  if(WIN32)
    # Programs find the libraries in their own folder.
    add_custom_command(TARGET ${program} PRE_LINK
      COMMAND ${CMAKE_COMMAND} -D from=${PROJECT_BINARY_DIR}/bin -D to=${MZ_INTERNALS_FOLDER}
        -P ${PROJECT_SOURCE_DIR}/cmake/copyLibraries.cmake)
  endif()
endfunction()

# mz_add_tests(NAME [INTERNALS] [TOGETHER] sources...): adds a test program. Each test is a ctest entry
# and runs in a process of its own. With TOGETHER they share one in builds with MZ_TESTS_TOGETHER,
# where starting a process takes longer than most tests; they are one entry then.
option(MZ_TESTS_TOGETHER "Run the tests of a program in one process where they allow it" OFF)
function(mz_add_tests name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "INTERNALS;TOGETHER" "" "")
  set(internals)
  if(arg_INTERNALS)
    set(internals INTERNALS)
  endif()
  mz_add_test_program(${name} ${internals} ${arg_UNPARSED_ARGUMENTS})
  target_link_libraries(${name} PRIVATE GTest::gtest_main)
  if(arg_TOGETHER AND MZ_TESTS_TOGETHER)
    # The most costly first: they must not be what the others wait for in the end.
    add_test(NAME ${MZ_BUILD_NAME}/${name} COMMAND ${name} --gtest_brief=1)
    set_tests_properties(${MZ_BUILD_NAME}/${name} PROPERTIES TIMEOUT 600 COST 1000)
  else()
    mz_discover_tests(${name})
  endif()
endfunction()

function(mz_discover_tests name)
  gtest_discover_tests(${name} TEST_PREFIX "${MZ_BUILD_NAME}/"
    DISCOVERY_TIMEOUT 120 PROPERTIES TIMEOUT 120)
endfunction()

# mz_add_test_component(NAME [AS_SHIPPED] [FOLDER folder] sources...): adds a component library in
# <build>/components/<folder>. The default folder is NAME. AS_SHIPPED compiles it with the build's
# options, for tests that look at the file, or with options of its own. The target `mzTestComponents`
# builds all of them.
add_custom_target(mzTestComponents)
function(mz_add_test_component name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "AS_SHIPPED" "FOLDER" "")
  if(NOT arg_FOLDER)
    set(arg_FOLDER ${name})
  endif()
  mz_add_component(${name} ${arg_UNPARSED_ARGUMENTS})
  target_link_libraries(${name} PRIVATE mzCompile)
  if(NOT arg_AS_SHIPPED)
    target_link_libraries(${name} PRIVATE mzTestCode)
    target_precompile_headers(${name} REUSE_FROM mzTestComponentHeaders)
  endif()
  set_target_properties(${name} PROPERTIES
    LIBRARY_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/components/${arg_FOLDER}
    RUNTIME_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/components/${arg_FOLDER})
  add_dependencies(mzTestComponents ${name})
endfunction()
