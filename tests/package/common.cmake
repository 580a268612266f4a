# SPDX-License-Identifier: BSL-1.0
# Functions of the tests with outside projects.

# run(COMMAND...): the output is `output`; fails the test if the command fails.
function(run)
  execute_process(COMMAND ${ARGN} RESULT_VARIABLE result OUTPUT_VARIABLE text ERROR_VARIABLE text)
  if(NOT result EQUAL 0)
    message(FATAL_ERROR "${ARGN}\n${text}")
  endif()
  set(output "${text}" PARENT_SCOPE)
endfunction()

# refused(PATTERN COMMAND...): the command must fail and say PATTERN. Line breaks count as spaces.
function(refused pattern)
  execute_process(COMMAND ${ARGN} RESULT_VARIABLE result OUTPUT_VARIABLE text ERROR_VARIABLE text)
  string(REGEX REPLACE "[ \n]+" " " said "${text}")
  if(result EQUAL 0 OR NOT said MATCHES "${pattern}")
    message(FATAL_ERROR "not refused with \"${pattern}\": ${ARGN}\n${text}")
  endif()
endfunction()

# says(TEXT COMMAND...)
function(says expected)
  run(${ARGN})
  string(STRIP "${output}" said)
  if(NOT said STREQUAL expected)
    message(FATAL_ERROR "${ARGN} said: ${said}")
  endif()
endfunction()

# What each project is configured with, as `configure` and `toolchainOptions`.
set(toolchainOptions)
if(toolchain)
  list(APPEND toolchainOptions --toolchain ${toolchain})
else()
  list(APPEND toolchainOptions -D CMAKE_CXX_COMPILER=${compiler})
endif()
if(sanitize)
  list(APPEND toolchainOptions -D CMAKE_CXX_FLAGS=-fsanitize=address,undefined)
endif()
