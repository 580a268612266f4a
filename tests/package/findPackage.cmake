# SPDX-License-Identifier: BSL-1.0
# Installs `build` below `work` and asks for it in several ways, by the project `source`.
include(${CMAKE_CURRENT_LIST_DIR}/common.cmake)

file(REMOVE_RECURSE ${work})
run(${CMAKE_COMMAND} --install ${build} --prefix ${work}/prefix)
set(configure ${CMAKE_COMMAND} -S ${source} -B ${work}/build -G ${generator}
  -D CMAKE_PREFIX_PATH=${work}/prefix ${toolchainOptions})

string(REGEX MATCH "^([0-9]+)\\.([0-9]+)" wanted ${version})
math(EXPR nextMinor "${CMAKE_MATCH_2} + 1")
set(next ${CMAKE_MATCH_1}.${nextMinor})

run(${configure} "-DWANTED=${wanted} REQUIRED COMPONENTS ${components}")
string(REPLACE ";" ", " listed "base;componentManager;objectIO")
if(components MATCHES "componentTools")
  string(APPEND listed ", componentTools")
endif()
refused("has no component \"nothing\"; it has ${listed}\\." ${configure} "-DWANTED=${wanted} REQUIRED COMPONENTS nothing")
refused("compatible with requested version \"${next}\"" ${configure} "-DWANTED=${next} REQUIRED")
