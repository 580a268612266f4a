# SPDX-License-Identifier: BSL-1.0
# Reads the version from components/componentManager/version.h. Sets MZ_VERSION, and MZ_SOVERSION,
# which is incremented when binary compatibility breaks (see CONTRIBUTING.md).
include_guard()

set(MZ_SOVERSION 0)
set(MZ_VERSION)
foreach(part MAJOR MINOR PATCH)
  file(STRINGS ${CMAKE_CURRENT_LIST_DIR}/../components/componentManager/version.h line
    REGEX "^#define MZ_VERSION_${part} [0-9]+$")
  string(REGEX MATCH "[0-9]+$" number "${line}")
  list(APPEND MZ_VERSION ${number})
endforeach()
list(JOIN MZ_VERSION . MZ_VERSION)
set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS
  ${CMAKE_CURRENT_LIST_DIR}/../components/componentManager/version.h)
