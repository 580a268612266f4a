# SPDX-License-Identifier: BSL-1.0
# Extracts the examples of docs/objects.md to files, so that the tests compile them unchanged.
set(page ${PROJECT_SOURCE_DIR}/docs/objects.md)
set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${page})
file(READ ${page} text)
set(example 0)
while(text MATCHES "\n```cpp\n")
  string(FIND "${text}" "\n```cpp\n" begin)
  math(EXPR begin "${begin} + 8")
  string(SUBSTRING "${text}" ${begin} -1 text)
  string(FIND "${text}" "\n```\n" length)
  string(SUBSTRING "${text}" 0 ${length} example${example})
  string(SUBSTRING "${text}" ${length} -1 text)
  math(EXPR example "${example} + 1")
endwhile()
if(NOT example EQUAL 3)
  message(FATAL_ERROR "${page} has ${example} examples")
endif()
set(documentedFolder ${CMAKE_CURRENT_BINARY_DIR}/documented)
file(CONFIGURE OUTPUT ${documentedFolder}/documentedHost.h
  CONTENT "#pragma once\n${example0}\n${example2}\n" @ONLY)
file(CONFIGURE OUTPUT ${documentedFolder}/documentedGauges.cpp
  CONTENT "${example0}\n${example1}\n" @ONLY)
