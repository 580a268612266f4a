# Installation: the libraries, their public headers, and a package for find_package.
include_guard()
include(CMakePackageConfigHelpers)
include(GNUInstallDirs)

set(mzPackageFolder ${CMAKE_INSTALL_LIBDIR}/cmake/MZcomponentManager)

install(TARGETS MZbase MZresmgt MZcomponentManager MZobjectIO EXPORT MZcomponentManagerTargets
  FILE_SET HEADERS DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
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
