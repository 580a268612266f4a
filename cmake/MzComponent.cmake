# mz_add_component(NAME sources...): a component library, found by scanning the folder it stands in.
#
# On every platform its file is NAME plus the platform's extension, without a prefix, so that a
# folder of components reads, and sorts, the same everywhere.
include_guard()

function(mz_add_component name)
  add_library(${name} MODULE ${ARGN})
  target_link_libraries(${name} PRIVATE Mz::MZcomponentManager)
  set_target_properties(${name} PROPERTIES PREFIX "" CXX_VISIBILITY_PRESET hidden
    VISIBILITY_INLINES_HIDDEN ON)
  if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU")
    # A library that defines a unique symbol can never be unmapped.
    target_compile_options(${name} PRIVATE -fno-gnu-unique)
  endif()
endfunction()
