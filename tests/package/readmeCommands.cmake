# SPDX-License-Identifier: BSL-1.0
# Runs the commands that `readme` shows in its section "A host and a component", and compares what
# they print with what is shown. The line "…" stands for any lines. /src is the folder of the
# sources, PREFIX the folder into which `build` is installed.
include(${CMAKE_CURRENT_LIST_DIR}/common.cmake)

file(REMOVE_RECURSE ${work})
run(${CMAKE_COMMAND} --install ${build} --prefix ${work}/prefix)
file(COPY ${source} DESTINATION ${work}/src/examples)

# The block of commands, without its fences.
file(READ ${readme} shown)
string(REGEX REPLACE "^.*\n## A host and a component\n" "" shown "${shown}")
string(REGEX REPLACE "\n## .*$" "" shown "${shown}")
string(FIND "${shown}" "```console\n" start)
if(start EQUAL -1)
  message(FATAL_ERROR "${readme} shows no commands")
endif()
string(SUBSTRING "${shown}" ${start} -1 shown)
string(REGEX REPLACE "^```console\n(.*)\n```.*$" "\\1" shown "${shown}")
# A list of lines; a semicolon would part one.
string(REPLACE ";" "<semicolon>" shown "${shown}")
string(REPLACE "\n" ";" lines "${shown}")

# check(): compares `output` with `expected` after each command.
function(check)
  string(REPLACE "${work}/src/" "/src/" output "${output}")
  string(STRIP "${output}" output)
  string(STRIP "${expected}" expected)
  if(command AND NOT expected STREQUAL "…" AND NOT output STREQUAL expected)
    message(FATAL_ERROR "${command} printed\n${output}\ninstead of\n${expected}")
  endif()
endfunction()

set(ENV{CMAKE_GENERATOR} ${generator})
set(ENV{CXX} ${compiler})
set(count 0)
set(command)
foreach(line IN LISTS lines)
  string(REPLACE "<semicolon>" ";" line "${line}")
  if(line MATCHES "^\\$ (.*)$")
    set(next "${CMAKE_MATCH_1}")
    check()
    set(command "${next}")
    string(REPLACE "=PREFIX" "=${work}/prefix" toRun "${command}")
    execute_process(COMMAND sh -c "${toRun}" WORKING_DIRECTORY ${work}/src
      OUTPUT_VARIABLE output ERROR_VARIABLE output RESULT_VARIABLE result)
    if(NOT result EQUAL 0)
      message(FATAL_ERROR "${command} ended with ${result}:\n${output}")
    endif()
    set(expected)
    math(EXPR count "${count} + 1")
  else()
    string(APPEND expected "${line}\n")
  endif()
endforeach()
check()
if(count LESS 5)
  message(FATAL_ERROR "${readme} shows only ${count} commands")
endif()
