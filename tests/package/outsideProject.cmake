# SPDX-License-Identifier: BSL-1.0
# Installs `build` below `work`, builds the project `source` against that, and runs its host.
include(${CMAKE_CURRENT_LIST_DIR}/common.cmake)

file(REMOVE_RECURSE ${work})
run(${CMAKE_COMMAND} --install ${build} --prefix ${work}/prefix)
run(${CMAKE_COMMAND} -S ${source} -B ${work}/build -G ${generator}
  -D CMAKE_PREFIX_PATH=${work}/prefix ${toolchainOptions})
run(${CMAKE_COMMAND} --build ${work}/build)

# Windows programs look for libraries along this path; elsewhere it means nothing.
set(ENV{WINEPATH} "${work}/prefix/bin;${build}/bin")
says("Hello, world!" ${emulator} ${work}/build/helloHost${suffix} ${work}/build/components)

# Wherever the components are, and whatever the locale, where arguments come as bytes.
if(NOT suffix)
  file(RENAME ${work}/build/components "${work}/build/ü 日")
  foreach(locale C C.UTF-8)
    set(ENV{LC_ALL} ${locale})
    says("Hello, world!" ${work}/build/helloHost "${work}/build/ü 日")
  endforeach()
endif()
