# SPDX-License-Identifier: BSL-1.0
# Runs the programs of an example as its README shows, and compares what they print, to standard
# output and standard error, with what is shown there. They run in a copy of the example's folder.
#
#   cmake -D source=FOLDER -D programs=FOLDER -D work=FOLDER -D emulator=COMMAND -D suffix=.exe
#         -D librarySuffix=.so -P readmeOutput.cmake
#
# Of the block of commands, `build/NAME ARGUMENT...` is run; a comment "# ends with N" gives its exit
# status. `cmake` is not: the examples are built already. README files name libraries as on Linux.
file(REMOVE_RECURSE ${work})
file(MAKE_DIRECTORY ${work})
file(COPY ${source}/ DESTINATION ${work})

file(READ ${source}/README.md shown)
if(NOT shown MATCHES "```console\n(.*)")
  message(FATAL_ERROR "${source}/README.md shows no commands")
endif()
string(FIND "${CMAKE_MATCH_1}" "\n```" end)
string(SUBSTRING "${CMAKE_MATCH_1}" 0 ${end} shown)

# run(PROGRAM STATUS ARGUMENTS OUTPUT)
function(run program status arguments expected)
  separate_arguments(arguments UNIX_COMMAND "${arguments}")
  execute_process(COMMAND ${emulator} ${programs}/${program}${suffix} ${arguments}
    WORKING_DIRECTORY ${work} OUTPUT_VARIABLE output ERROR_VARIABLE output RESULT_VARIABLE result)
  string(REPLACE "\r\n" "\n" output "${output}")
  string(REPLACE "${librarySuffix}:" ".so:" output "${output}")
  string(STRIP "${output}" output)
  string(STRIP "${expected}" expected)
  if(NOT result EQUAL status OR NOT output STREQUAL expected)
    message(FATAL_ERROR "${program} ${arguments} ended with ${result} and printed\n${output}\n"
      "instead of ${status} and\n${expected}")
  endif()
endfunction()

# Command by command; the output of each reaches up to the next "$ ".
set(count 0)
string(PREPEND shown "\n")
while(shown MATCHES "\n\\$ ([^\n]*)\n?")
  set(command "${CMAKE_MATCH_1}")
  string(FIND "${shown}" "\n$ ${command}" begin)
  string(LENGTH "\n$ ${command}" length)
  math(EXPR begin "${begin} + ${length}")
  string(SUBSTRING "${shown}" ${begin} -1 shown)
  string(FIND "${shown}" "\n$ " next)
  string(SUBSTRING "${shown}" 0 ${next} expected)
  set(status 0)
  if(command MATCHES "^(.*[^ ]) +# ends with ([0-9]+)$")
    set(command "${CMAKE_MATCH_1}")
    set(status ${CMAKE_MATCH_2})
  endif()
  if(command MATCHES "^build/([A-Za-z]+) ?(.*)$")
    run(${CMAKE_MATCH_1} ${status} "${CMAKE_MATCH_2}" "${expected}")
    math(EXPR count "${count} + 1")
  elseif(NOT command MATCHES "^cmake ")
    message(FATAL_ERROR "unknown command: ${command}")
  endif()
endwhile()
if(count EQUAL 0)
  message(FATAL_ERROR "${source}/README.md shows no program")
endif()
