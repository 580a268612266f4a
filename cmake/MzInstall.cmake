# SPDX-License-Identifier: BSL-1.0
# Installs the libraries, their public headers, the command line, and what build systems use to find
# them: a CMake package and pkg-config files.
include_guard()
include(CMakePackageConfigHelpers)
include(GNUInstallDirs)

set(mzPackageFolder ${CMAKE_INSTALL_LIBDIR}/cmake/MZcomponentManager)
set(mzLibraries MZbase MZresmgt MZcomponentManager MZobjectIO)
if(TARGET MZcomponentTools)
  list(APPEND mzLibraries MZcomponentTools)
endif()

install(TARGETS ${mzLibraries}
  EXPORT MZcomponentManagerTargets
  RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT runtime
  LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT runtime NAMELINK_COMPONENT development
  ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT development
  FILE_SET HEADERS DESTINATION ${CMAKE_INSTALL_INCLUDEDIR} COMPONENT development)
if(WIN32)
  install(FILES ${MZ_RUNTIME_FILES} DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT runtime)
endif()

# The probe is installed in the folder of the library that starts it.
if(TARGET MZcomponentTools)
  set(mzProbeFolder ${CMAKE_INSTALL_LIBDIR})
  if(WIN32)
    set(mzProbeFolder ${CMAKE_INSTALL_BINDIR})
  endif()
  install(TARGETS mzcomponents-probe
    RUNTIME DESTINATION ${mzProbeFolder} COMPONENT runtime)
endif()
if(MZ_BUILD_TOOLS)
  install(TARGETS mzcomponents RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT tools)
endif()
if(MZ_BUILD_TOOLS AND NOT WIN32)
  install(FILES ${PROJECT_SOURCE_DIR}/docs/mzcomponents.1
    DESTINATION ${CMAKE_INSTALL_MANDIR}/man1 COMPONENT tools)
  install(FILES ${PROJECT_SOURCE_DIR}/tools/mzcomponents/mzcomponents.bash
    DESTINATION ${CMAKE_INSTALL_DATADIR}/bash-completion/completions RENAME mzcomponents
    COMPONENT tools)
endif()

# ---- The CMake package ------------------------------------------------------------------------
install(EXPORT MZcomponentManagerTargets NAMESPACE Mz:: DESTINATION ${mzPackageFolder}
  COMPONENT development)
configure_package_config_file(
  ${CMAKE_CURRENT_LIST_DIR}/MZcomponentManagerConfig.cmake.in
  ${CMAKE_CURRENT_BINARY_DIR}/MZcomponentManagerConfig.cmake
  INSTALL_DESTINATION ${mzPackageFolder})
write_basic_package_version_file(
  ${CMAKE_CURRENT_BINARY_DIR}/MZcomponentManagerConfigVersion.cmake COMPATIBILITY SameMinorVersion)
install(FILES
  ${CMAKE_CURRENT_BINARY_DIR}/MZcomponentManagerConfig.cmake
  ${CMAKE_CURRENT_BINARY_DIR}/MZcomponentManagerConfigVersion.cmake
  ${CMAKE_CURRENT_LIST_DIR}/MzComponent.cmake
  ${CMAKE_CURRENT_LIST_DIR}/MzComponentCheck.cmake
  ${CMAKE_CURRENT_LIST_DIR}/MzRuntime.cmake
  DESTINATION ${mzPackageFolder} COMPONENT development)

# ---- pkg-config -------------------------------------------------------------------------------
set(mzPkgConfigFolder ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
file(RELATIVE_PATH mzPrefixFromHere /prefix/${mzPkgConfigFolder} /prefix)

# mz_install_pc(LIBRARY DESCRIPTION [REQUIRED-LIBRARIES...]): installs the library's pkg-config
# file.
function(mz_install_pc mzLibrary mzDescription)
  list(JOIN ARGN ", " mzRequires)
  string(REPLACE "," " = ${PROJECT_VERSION}," mzRequires "${mzRequires}")
  if(mzRequires)
    string(APPEND mzRequires " = ${PROJECT_VERSION}")
  endif()
  configure_file(${PROJECT_SOURCE_DIR}/cmake/library.pc.in
    ${CMAKE_CURRENT_BINARY_DIR}/pkgconfig/${mzLibrary}.pc @ONLY)
  install(FILES ${CMAKE_CURRENT_BINARY_DIR}/pkgconfig/${mzLibrary}.pc
    DESTINATION ${mzPkgConfigFolder} COMPONENT development)
endfunction()
mz_install_pc(MZbase "Base class of the exceptions of libMZcomponentManager")
# What CMake adds to a component by mz_add_component. GCC's unique symbols would keep it mapped; Clang
# makes none and refuses the option.
set(mzComponentFlags -shared)
set(mzUniqueFlag)
if(NOT WIN32)
  string(APPEND mzComponentFlags " -fPIC -fvisibility=hidden")
  set(mzUniqueFlag " -fno-gnu-unique")
endif()
set(mzVariables "component_flags=${mzComponentFlags}${mzUniqueFlag}\n")
string(APPEND mzVariables "clang_component_flags=${mzComponentFlags}\n")
mz_install_pc(MZcomponentManager "Plug-ins for C++ applications" MZbase)
unset(mzVariables)
mz_install_pc(MZobjectIO "Whole objects on the streams of libMZcomponentManager" MZcomponentManager)
if(TARGET MZcomponentTools)
  mz_install_pc(MZcomponentTools "Diagnosis and crash-proof scan of component libraries"
    MZcomponentManager MZobjectIO)
endif()
