# SPDX-License-Identifier: BSL-1.0
# Fails unless `readme` contains every file of `example` word for word, apart from the licence line.
file(READ ${readme} shown)
foreach(name greeter.h helloComponent.cpp helloHost.cpp CMakeLists.txt)
  file(READ ${example}/${name} content)
  string(REGEX REPLACE "^[^\n]*SPDX-License-Identifier[^\n]*\n" "" content "${content}")
  string(FIND "${shown}" "${content}" position)
  if(position EQUAL -1)
    message(FATAL_ERROR "${readme} does not show ${name} as it is in ${example}")
  endif()
endforeach()
