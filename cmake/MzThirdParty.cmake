# SPDX-License-Identifier: BSL-1.0
# The header-only libraries of others that the tools use. Each is seen through a folder of the build
# tree that holds its headers and nothing else: a compiler for another system must not see the rest
# of where they are installed.
include_guard(GLOBAL)

# mz_third_party(NAME HEADER LINK): the interface library NAME, with the header or folder LINK of the
# folder in which HEADER is found.
function(mz_third_party name header link)
  find_path(MZ_${name}_FOLDER ${header} PATHS /usr/include /usr/local/include
    NO_CMAKE_FIND_ROOT_PATH REQUIRED)
  set(folder ${PROJECT_BINARY_DIR}/thirdParty/${name})
  file(MAKE_DIRECTORY ${folder})
  file(CREATE_LINK ${MZ_${name}_FOLDER}/${link} ${folder}/${link} SYMBOLIC)
  add_library(${name} INTERFACE)
  target_include_directories(${name} SYSTEM INTERFACE ${folder})
endfunction()

mz_third_party(mzJson nlohmann/json.hpp nlohmann)
mz_third_party(mzCommandLine CLI/CLI.hpp CLI)
mz_third_party(mzTerminal rang.hpp rang.hpp)
