# SPDX-License-Identifier: BSL-1.0
# Reads the version from components/componentManager/version.h. Sets MZ_VERSION, and MZ_SOVERSION,
# which is incremented when binary compatibility breaks (see CONTRIBUTING.md).
include_guard()

# mz_read_version(VARIABLE MACRO): the number that version.h defines.
function(mz_read_version variable macro)
  file(STRINGS ${CMAKE_CURRENT_FUNCTION_LIST_DIR}/../components/componentManager/version.h line
    REGEX "^#define ${macro} [0-9]+$")
  string(REGEX MATCH "[0-9]+$" number "${line}")
  set(${variable} ${number} PARENT_SCOPE)
endfunction()

set(MZ_VERSION)
foreach(part MAJOR MINOR PATCH)
  mz_read_version(number MZ_VERSION_${part})
  list(APPEND MZ_VERSION ${number})
endforeach()
list(JOIN MZ_VERSION . MZ_VERSION)
mz_read_version(MZ_SOVERSION MZ_SOVERSION)
set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS
  ${CMAKE_CURRENT_LIST_DIR}/../components/componentManager/version.h)
