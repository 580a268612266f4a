# SPDX-License-Identifier: BSL-1.0
# Fails unless `readme` contains every file of `example` word for word, apart from the licence line,
# and the component and the host are as short as a first look deserves.
file(READ ${readme} shown)
foreach(name greeter.h helloComponent.cpp helloHost.cpp CMakeLists.txt)
  file(READ ${example}/${name} content)
  string(REGEX REPLACE "^[^\n]*SPDX-License-Identifier[^\n]*\n" "" content "${content}")
  string(FIND "${shown}" "${content}" position)
  if(position EQUAL -1)
    message(FATAL_ERROR "${readme} does not show ${name} as it is in ${example}")
  endif()
endforeach()

# shorter(NAME LINES): the file, without its licence, has fewer lines.
function(shorter name lines)
  file(READ ${example}/${name} content)
  string(REGEX MATCHALL "\n" ends "${content}")
  list(LENGTH ends count)
  math(EXPR count "${count} - 1")
  if(NOT count LESS lines)
    message(FATAL_ERROR "${name} has ${count} lines")
  endif()
endfunction()
shorter(helloComponent.cpp 15)
shorter(helloHost.cpp 12)
