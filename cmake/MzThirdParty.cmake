# SPDX-License-Identifier: BSL-1.0
# The header-only libraries that the tools use. Each is included through a folder of the build tree
# that contains only its headers: a cross compiler must not see the other headers of the system.
include_guard(GLOBAL)

# mz_third_party(NAME HEADER LINK): adds the interface library NAME. It finds the folder that
# contains HEADER and makes the header or folder LINK of it available.
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
