# SPDX-License-Identifier: BSL-1.0
# Adds a copy of the library's sources to the project `source` as a folder of it, where no headers of
# third parties are found; builds and installs the project; and looks at where it wrote.
include(${CMAKE_CURRENT_LIST_DIR}/common.cmake)

file(REMOVE_RECURSE ${work})
file(MAKE_DIRECTORY ${work}/library)
foreach(entry CMakeLists.txt cmake components tools LICENSE)
  file(COPY ${library}/${entry} DESTINATION ${work}/library)
endforeach()
file(GLOB_RECURSE before LIST_DIRECTORIES TRUE ${work}/library/*)

set(configure ${CMAKE_COMMAND} -S ${source} -G ${generator} -D LIBRARY=${work}/library
  ${toolchainOptions})
refused("always built as shared libraries" ${configure} -B ${work}/refused -D BUILD_SHARED_LIBS=OFF)

run(${configure} -B ${work}/build)
run(${CMAKE_COMMAND} --build ${work}/build --target parent)
says("in the parent" ${emulator} ${work}/build/parent${suffix})
run(${CMAKE_COMMAND} --install ${work}/build --prefix ${work}/installed)

file(GLOB_RECURSE after LIST_DIRECTORIES TRUE ${work}/library/*)
if(NOT before STREQUAL after)
  message(FATAL_ERROR "the sources' folder has other files than before: ${after}")
endif()
file(GLOB written RELATIVE ${work}/build ${work}/build/*)
list(FILTER written EXCLUDE REGEX
  "^(CMake.*|cmake_install.cmake|install_manifest.txt|build.ninja|.ninja_(deps|log)|compile_commands.json|library|parent.*|.*\\.dll)$")
if(written)
  message(FATAL_ERROR "the library wrote into the parent's build folder: ${written}")
endif()
file(GLOB_RECURSE installed RELATIVE ${work}/installed ${work}/installed/*)
if(NOT installed STREQUAL "bin/parent${suffix}")
  message(FATAL_ERROR "the parent installed: ${installed}")
endif()
