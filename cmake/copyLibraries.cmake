# SPDX-License-Identifier: BSL-1.0
# Copies the DLLs of the folder `from` to the folder `to`, except libMZcomponentManager, of which
# `to` contains another variant.
file(GLOB libraries RELATIVE ${from} ${from}/*.dll)
list(REMOVE_ITEM libraries libMZcomponentManager.dll)
foreach(library IN LISTS libraries)
  file(COPY_FILE ${from}/${library} ${to}/${library} ONLY_IF_DIFFERENT)
endforeach()
