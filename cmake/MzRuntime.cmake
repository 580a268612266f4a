# SPDX-License-Identifier: BSL-1.0
# Finds and copies the DLLs that programs need on Windows. It is installed with the package.
include_guard()

# mz_find_runtime(VARIABLE): finds the compiler's runtime libraries that MinGW C++ programs need.
function(mz_find_runtime variable)
  set(files)
  if(WIN32 AND MINGW)
    foreach(name libstdc++-6.dll libgcc_s_seh-1.dll libwinpthread-1.dll)
      execute_process(COMMAND ${CMAKE_CXX_COMPILER} -print-file-name=${name}
        OUTPUT_VARIABLE file OUTPUT_STRIP_TRAILING_WHITESPACE)
      if(NOT IS_ABSOLUTE "${file}")
        # The compiler knows only its own folders. The thread library is in the system's.
        find_file(mzFile ${name} PATH_SUFFIXES lib bin NO_CACHE REQUIRED)
        set(file ${mzFile})
      endif()
      list(APPEND files ${file})
    endforeach()
  endif()
  set(${variable} ${files} PARENT_SCOPE)
endfunction()

# mz_copy_runtime(PROGRAM): copies the DLLs that PROGRAM needs, with those of the compiler, to its
# folder whenever it has been built. If PROGRAM links Mz::MZcomponentTools directly, copies the program
# that the library starts to try components, too. A no-op on other systems, where the run path names
# the folders.
function(mz_copy_runtime program)
  if(NOT WIN32)
    return()
  endif()
  mz_find_runtime(runtime)
  get_target_property(libraries ${program} LINK_LIBRARIES)
  if("Mz::MZcomponentTools" IN_LIST libraries)
    if(TARGET mzcomponents-probe) # in the library's own build
      list(APPEND runtime $<TARGET_FILE:mzcomponents-probe>)
    else()
      list(APPEND runtime $<TARGET_FILE_DIR:Mz::MZcomponentTools>/mzcomponents-probe.exe)
    endif()
  endif()
  add_custom_command(TARGET ${program} POST_BUILD
    COMMAND ${CMAKE_COMMAND} -E copy_if_different
      $<TARGET_RUNTIME_DLLS:${program}> ${runtime} $<TARGET_FILE_DIR:${program}>
    COMMAND_EXPAND_LISTS)
endfunction()
