# SPDX-License-Identifier: BSL-1.0
# Installs `build` below `work`, builds the project `source` against that, and runs its host.
include(${CMAKE_CURRENT_LIST_DIR}/common.cmake)

file(REMOVE_RECURSE ${work})
run(${CMAKE_COMMAND} --install ${build} --prefix ${work}/prefix)
run(${CMAKE_COMMAND} -S ${source} -B ${work}/build -G ${generator}
  -D CMAKE_PREFIX_PATH=${work}/prefix ${toolchainOptions})
run(${CMAKE_COMMAND} --build ${work}/build)

# On Windows the build has copied the libraries beside the program; here only Wine must find it.
says("Hello, world!" ${emulator} ${work}/build/helloHost${suffix})

# It looks beside itself, however it was started, wherever that is and whatever the locale.
file(RENAME ${work}/build "${work}/ü 日")
if(suffix)
  file(RENAME "${work}/ü 日" ${work}/moved)
  says("Hello, world!" ${emulator} ${work}/moved/helloHost${suffix})
  set(home ${work}/moved)
else()
  set(home "${work}/ü 日")
  foreach(locale C C.UTF-8)
    set(ENV{LC_ALL} ${locale})
    says("Hello, world!" "${home}/helloHost")
    says("Hello, world!" sh -c "cd '${home}' && ./helloHost")
    says("Hello, world!" sh -c "cd / && PATH='${home}':$PATH helloHost")
  endforeach()
endif()

# Without a component it says where it looked, and fails.
file(RENAME "${home}/components" "${home}/elsewhere")
refused("no greeter was found in .*components" ${emulator} "${home}/helloHost${suffix}")
