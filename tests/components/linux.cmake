# SPDX-License-Identifier: BSL-1.0
# Components that terminate a process on Linux.
mz_add_fault(endsThreadInInitialiser endsThreadInInitialiser.cpp)
mz_add_fault(throwsInFinaliser throwsInFinaliser.cpp)

# A library linked for a fixed address. It gets that address in a position-dependent program too.
mz_add_fault(ownAddress goodWithKit.cpp)
target_link_options(ownAddress PRIVATE -Wl,-Ttext-segment=0x70000000)

# Minimal libraries for the probe, one for each style of hash table. Without the sanitizers, which
# would make them large.
foreach(style gnu sysv)
  set(name tiny-${style})
  add_library(${name} MODULE tiny.cpp)
  target_include_directories(${name} PRIVATE ${PROJECT_SOURCE_DIR})
  target_link_options(${name} PRIVATE -nostdlib -s -Wl,--hash-style=${style} -Wl,--build-id=none)
  set_target_properties(${name} PROPERTIES PREFIX ""
    LIBRARY_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/components/${name})
endforeach()

# Libraries in a chain of dependencies: the component needs neededMiddle, which needs neededLeaf.
# Each component uses other folders and tags, so that the loader finds all of the chain or not.
#   mz_add_needed(NAME FUNCTION function [NEXT function LIBRARY library] [FOLDER folder] [TAGS tags]
#     [RPATH folders...] [SONAME name])
function(mz_add_needed name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "FUNCTION;NEXT;LIBRARY;FOLDER;TAGS;SONAME" "RPATH")
  add_library(${name} SHARED needed.cpp)
  target_compile_definitions(${name} PRIVATE MZ_TEST_FUNCTION=${arg_FUNCTION})
  set_target_properties(${name} PROPERTIES PREFIX "" BUILD_WITH_INSTALL_RPATH ON
    INSTALL_RPATH "${arg_RPATH}"
    LIBRARY_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/components/needed/${arg_FOLDER})
  target_link_options(${name} PRIVATE -Wl,--no-as-needed,--allow-shlib-undefined)
  if(arg_TAGS)
    target_link_options(${name} PRIVATE -Wl,--${arg_TAGS}-new-dtags)
  endif()
  if(arg_SONAME)
    set_target_properties(${name} PROPERTIES NO_SONAME ON)
    # In a response file, so that neither the build tool nor the shell expands the variable.
    file(CONFIGURE OUTPUT ${CMAKE_CURRENT_BINARY_DIR}/${name}.options @ONLY
      CONTENT "-Wl,-soname,@arg_SONAME@\n")
    target_link_options(${name} PRIVATE @${CMAKE_CURRENT_BINARY_DIR}/${name}.options)
  endif()
  if(arg_NEXT)
    target_compile_definitions(${name} PRIVATE MZ_TEST_NEXT=${arg_NEXT})
    target_link_libraries(${name} PRIVATE ${arg_LIBRARY})
  endif()
endfunction()

set(entryPoint QrGetComponentDescription)
mz_add_needed(neededLeaf FUNCTION mzLeaf FOLDER leaf)
mz_add_needed(neededMiddle FUNCTION mzMiddle NEXT mzLeaf LIBRARY neededLeaf FOLDER middle)
mz_add_needed(neededMiddleAlone FUNCTION mzMiddle NEXT mzLeaf LIBRARY neededLeaf FOLDER middle
  TAGS enable RPATH /nowhere)
mz_add_needed(neededThroughRpath FUNCTION ${entryPoint} NEXT mzMiddle LIBRARY neededMiddle
  TAGS disable RPATH $ORIGIN/middle $ORIGIN/leaf)
mz_add_needed(neededThroughRunpath FUNCTION ${entryPoint} NEXT mzMiddle LIBRARY neededMiddle
  TAGS enable RPATH $ORIGIN/middle $ORIGIN/leaf)
mz_add_needed(neededBehindRunpath FUNCTION ${entryPoint} NEXT mzMiddle LIBRARY neededMiddleAlone
  TAGS disable RPATH $ORIGIN/middle $ORIGIN/leaf)
mz_add_needed(neededLeafByOrigin FUNCTION mzLeaf FOLDER leaf
  SONAME $ORIGIN/leaf/neededLeafByOrigin.so)
mz_add_needed(neededByOrigin FUNCTION ${entryPoint} NEXT mzLeaf LIBRARY neededLeafByOrigin)
mz_add_needed(neededLeafByLostOrigin FUNCTION mzLeaf FOLDER leaf
  SONAME $ORIGIN/lost/neededLeafByLostOrigin.so)
mz_add_needed(neededByLostOrigin FUNCTION ${entryPoint} NEXT mzLeaf LIBRARY neededLeafByLostOrigin)
