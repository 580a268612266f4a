# SPDX-License-Identifier: BSL-1.0
# Installs what only packages contain: licences, the list of changes, guides and examples, as the
# component `documents`. Configures CPack for the Windows installer. Must be included before MzInstall.
# packaging/package.sh makes the packages.
include_guard()
include(GNUInstallDirs)

set(mzPackaging ${PROJECT_SOURCE_DIR}/packaging)
set(mzPackageFiles ${PROJECT_BINARY_DIR}/packageFiles)
set(mzDocuments ${CMAKE_INSTALL_DATADIR}/doc/libMZcomponentManager)
file(MAKE_DIRECTORY ${mzPackageFiles})

set(mzCopyright ${mzPackaging}/copyright)
if(WIN32)
  # The compiler's runtime DLLs are installed with their licences and the versions of their sources,
  # but without debug symbols, which are nine tenths of their size.
  set(mzStripped)
  foreach(file IN LISTS MZ_RUNTIME_FILES)
    cmake_path(GET file FILENAME name)
    # Keep the file's time: otherwise strip writes the present time into the file.
    execute_process(COMMAND ${CMAKE_STRIP} --preserve-dates -o ${mzPackageFiles}/${name} ${file}
      COMMAND_ERROR_IS_FATAL ANY)
    list(APPEND mzStripped ${mzPackageFiles}/${name})
  endforeach()
  set(MZ_RUNTIME_FILES ${mzStripped})
  execute_process(
    COMMAND dpkg-query -W
      -f "\${Package} \${Version}, from \${source:Package} \${source:Version}\\n"
      gcc-mingw-w64-x86-64-posix-runtime mingw-w64-x86-64-dev
    OUTPUT_FILE ${mzPackageFiles}/RUNTIME-VERSIONS.txt COMMAND_ERROR_IS_FATAL ANY)
  file(READ ${mzPackaging}/copyright copyright)
  file(READ ${mzPackaging}/copyright.windows copyrightOfRuntime)
  file(WRITE ${mzPackageFiles}/copyright "${copyright}${copyrightOfRuntime}")
  set(mzCopyright ${mzPackageFiles}/copyright)
  install(FILES ${mzPackageFiles}/RUNTIME-VERSIONS.txt DESTINATION ${mzDocuments}
    COMPONENT documents)
  install(FILES /usr/share/common-licenses/GPL-3 RENAME GPL-3.txt DESTINATION ${mzDocuments}
    COMPONENT documents)
endif()
install(FILES ${PROJECT_SOURCE_DIR}/LICENSE ${PROJECT_SOURCE_DIR}/CHANGELOG.md ${mzCopyright}
  ${PROJECT_SOURCE_DIR}/README.md ${PROJECT_SOURCE_DIR}/SECURITY.md
  DESTINATION ${mzDocuments} COMPONENT documents)
# The guides and examples, in the folders that README.md links.
file(GLOB mzGuides CONFIGURE_DEPENDS ${PROJECT_SOURCE_DIR}/docs/*.md)
install(FILES ${mzGuides} DESTINATION ${mzDocuments}/docs COMPONENT documents)
file(GLOB mzPictures CONFIGURE_DEPENDS ${PROJECT_SOURCE_DIR}/docs/pictures/*.svg)
install(FILES ${mzPictures} DESTINATION ${mzDocuments}/docs/pictures COMPONENT documents)
install(DIRECTORY ${PROJECT_SOURCE_DIR}/examples DESTINATION ${mzDocuments} COMPONENT documents)

# ---- The installer for Windows ----------------------------------------------------------------
set(CPACK_GENERATOR NSIS)
set(CPACK_PACKAGE_NAME libMZcomponentManager)
set(CPACK_PACKAGE_FILE_NAME libMZcomponentManager-${PROJECT_VERSION}-windows-x86_64)
set(CPACK_PACKAGE_VENDOR "libMZcomponentManager authors")
set(CPACK_RESOURCE_FILE_LICENSE ${PROJECT_SOURCE_DIR}/LICENSE)
set(CPACK_MONOLITHIC_INSTALL ON)
# By default CPack's script makes a 32-bit installer. On a system without 32-bit support that
# program ends without a message and without installing anything.
set(CPACK_NSIS_DEFINES "Target amd64-unicode\n  SetDateSave off")
set(CPACK_NSIS_PACKAGE_NAME "libMZcomponentManager ${PROJECT_VERSION}")
set(CPACK_NSIS_DISPLAY_NAME "libMZcomponentManager ${PROJECT_VERSION}")
include(CPack)
