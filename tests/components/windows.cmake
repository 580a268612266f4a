# SPDX-License-Identifier: BSL-1.0
# A library that forwards its entry point to another library.
mz_add_fault(forwardsEntryPoint forwardsEntryPoint.cpp forwardsEntryPoint.def)

# A library that loads only with its own manifest, which names the private assembly that contains
# its dependency.
enable_language(RC)
add_library(sideBySide SHARED sideBySide.cpp)
target_include_directories(sideBySide PRIVATE ${PROJECT_SOURCE_DIR})
target_link_options(sideBySide PRIVATE -static)
set_target_properties(sideBySide PROPERTIES PREFIX ""
  RUNTIME_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/components/ownManifest/mzTestAssembly)
configure_file(mzTestAssembly.manifest
  ${PROJECT_BINARY_DIR}/components/ownManifest/mzTestAssembly/mzTestAssembly.manifest COPYONLY)
mz_add_fault(ownManifest ownManifest.cpp ownManifest.rc)
target_link_libraries(ownManifest PRIVATE sideBySide)
# The same without the manifest, so that it cannot be loaded.
mz_add_fault(noManifest FOLDER ownManifest ownManifest.cpp)
target_link_libraries(noManifest PRIVATE sideBySide)

# A minimal library for the tests of damaged files.
add_library(tiny MODULE tiny.cpp)
target_include_directories(tiny PRIVATE ${PROJECT_SOURCE_DIR})
target_link_options(tiny PRIVATE -nostdlib -s -Wl,--entry,anotherFunction)
set_target_properties(tiny PROPERTIES PREFIX ""
  LIBRARY_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/components/tiny)
