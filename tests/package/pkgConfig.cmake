# SPDX-License-Identifier: BSL-1.0
# Installs `build` below `work` and compiles the host and the component of `source` with one line
# each, as pkg-config says.
include(${CMAKE_CURRENT_LIST_DIR}/common.cmake)

file(REMOVE_RECURSE ${work})
run(${CMAKE_COMMAND} --install ${build} --prefix ${work}/prefix)
file(MAKE_DIRECTORY ${work}/components)
set(ENV{PKG_CONFIG_PATH} ${work}/prefix/${libraries}/pkgconfig)
set(ENV{LD_LIBRARY_PATH} ${work}/prefix/${libraries})

set(flags "$(${pkgConfig} --cflags --libs MZcomponentManager)")
run(sh -ec "${compiler} -std=c++20 ${source}/helloHost.cpp -o ${work}/helloHost ${flags}")
set(componentFlags "$(${pkgConfig} --variable=component_flags MZcomponentManager)")
run(sh -ec "${compiler} -std=c++20 ${componentFlags} ${source}/helloComponent.cpp -o ${work}/components/hello.so ${flags}")
says("Hello, world!" ${work}/helloHost)

# Clang has options of its own.
if(clang)
  file(REMOVE ${work}/components/hello.so)
  set(componentFlags "$(${pkgConfig} --variable=clang_component_flags MZcomponentManager)")
  run(sh -ec "${clang} -Werror -std=c++20 ${componentFlags} ${source}/helloComponent.cpp -o ${work}/components/hello.so ${flags}")
  says("Hello, world!" ${work}/helloHost)
endif()

# The libraries that a library's headers need come with it: here libMZbase.
run(sh -ec "${compiler} -std=c++20 ${CMAKE_CURRENT_LIST_DIR}/parent/parent.cpp -o ${work}/parent ${flags}")
says("in the parent" ${work}/parent)

# Each library has a file of its own.
foreach(library MZbase MZcomponentManager MZobjectIO ${tools})
  run(sh -ec "echo 'int main() {}' | ${compiler} -x c++ - -Wl,--no-as-needed $(${pkgConfig} --cflags --libs ${library}) -o ${work}/${library}")
  says("${version}" ${pkgConfig} --modversion ${library})
endforeach()
