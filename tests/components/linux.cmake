# What ends a process here.
mz_add_fault(endsThreadInInitialiser endsThreadInInitialiser.cpp)
mz_add_fault(throwsInFinaliser throwsInFinaliser.cpp)

# One that wants to stand at an address of its own choice, and gets it in a program that does too.
mz_add_fault(ownAddress goodWithKit.cpp)
target_link_options(ownAddress PRIVATE -Wl,-Ttext-segment=0x70000000)

# The smallest libraries, for the probe: one for each kind of symbol table. Without the sanitizers,
# which would make them large.
foreach(style gnu sysv)
  set(name tiny-${style})
  add_library(${name} MODULE tiny.cpp)
  target_include_directories(${name} PRIVATE ${PROJECT_SOURCE_DIR})
  target_link_options(${name} PRIVATE -nostdlib -s -Wl,--hash-style=${style} -Wl,--build-id=none)
  set_target_properties(${name} PROPERTIES PREFIX ""
    LIBRARY_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/components/${name})
endforeach()
