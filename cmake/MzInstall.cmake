# Installation: the libraries, their public headers, and a package for find_package.
include_guard()
include(CMakePackageConfigHelpers)
include(GNUInstallDirs)

set(mzPackageFolder ${CMAKE_INSTALL_LIBDIR}/cmake/MZcomponentManager)

install(TARGETS MZbase MZresmgt MZcomponentManager MZobjectIO MZcomponentTools
  EXPORT MZcomponentManagerTargets
  FILE_SET HEADERS DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
# The probe stands beside the library that starts it.
if(WIN32)
  install(TARGETS mzcomponents-probe RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR})
else()
  install(TARGETS mzcomponents-probe RUNTIME DESTINATION ${CMAKE_INSTALL_LIBDIR})
endif()
if(MZ_BUILD_TOOLS)
  install(TARGETS mzcomponents RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR})
  install(FILES ${PROJECT_SOURCE_DIR}/docs/mzcomponents.1
    DESTINATION ${CMAKE_INSTALL_MANDIR}/man1)
  install(FILES ${PROJECT_SOURCE_DIR}/tools/mzcomponents/mzcomponents.bash
    DESTINATION ${CMAKE_INSTALL_DATADIR}/bash-completion/completions RENAME mzcomponents)
endif()
install(EXPORT MZcomponentManagerTargets NAMESPACE Mz:: DESTINATION ${mzPackageFolder})

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
  DESTINATION ${mzPackageFolder})
