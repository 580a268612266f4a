# SPDX-License-Identifier: BSL-1.0
# mz_add_component_check(NAME [FAIL_ON grade] [SUPPRESS file] [SAMPLES files...] [THREAD_SAFE]): a
# test that runs `mzcomponents check` on the component library NAME. Call enable_testing() before it.
#
# The program is the one of this build or of the installation; MZ_COMPONENTS_PROGRAM names another
# one. If there is none, the test is skipped.
include_guard()

function(mz_add_component_check name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "THREAD_SAFE" "FAIL_ON;SUPPRESS" "SAMPLES")
  set(options)
  if(arg_FAIL_ON)
    list(APPEND options --fail-on ${arg_FAIL_ON})
  endif()
  if(arg_SUPPRESS)
    cmake_path(ABSOLUTE_PATH arg_SUPPRESS)
    list(APPEND options --suppress ${arg_SUPPRESS})
  endif()
  foreach(sample IN LISTS arg_SAMPLES)
    cmake_path(ABSOLUTE_PATH sample)
    list(APPEND options --sample ${sample})
  endforeach()
  if(arg_THREAD_SAFE)
    list(APPEND options --thread-safe)
  endif()

  if(TARGET mzcomponents)
    add_test(NAME check-${name} COMMAND mzcomponents check $<TARGET_FILE:${name}> ${options})
    return()
  endif()
  # The program of the system that the component is for: another system's ends well without a check.
  find_program(MZ_COMPONENTS_PROGRAM NAMES mzcomponents${CMAKE_EXECUTABLE_SUFFIX}
    HINTS ${MZcomponentManager_PREFIX}/bin)
  if(MZ_COMPONENTS_PROGRAM)
    add_test(NAME check-${name} COMMAND ${CMAKE_CROSSCOMPILING_EMULATOR} ${MZ_COMPONENTS_PROGRAM}
      check $<TARGET_FILE:${name}> ${options})
  else()
    add_test(NAME check-${name} COMMAND ${CMAKE_COMMAND} -E echo "skipped: no program mzcomponents")
    set_tests_properties(check-${name} PROPERTIES SKIP_REGULAR_EXPRESSION "^skipped: ")
  endif()
endfunction()
