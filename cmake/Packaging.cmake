# One Debian package of all that is installed: cd BUILD && cpack
set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME ${PROJECT_NAME})
set(CPACK_PACKAGE_CONTACT "Nimbra Drive settings <settings@vantrel.example>")
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "settings of Nimbra Drive, with a window and without")
set(CPACK_PACKAGE_DESCRIPTION
"Nimbra Drive keeps the documents and data of an account's applications in the
cloud. Its settings page says which applications may do so and how the sync is
getting on, moves an older account to the new document service and collects
what helps to find a fault.
.
This package has the page with two programs that open it, settingshost with a
window and settingsctl on the command line, and mrctl, which tells of the
document service of a device.")
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_STRIP_FILES ON)
# Whatever the umask of whoever makes the package.
set(CPACK_INSTALL_DEFAULT_DIRECTORY_PERMISSIONS
  OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ WORLD_EXECUTE)

set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_SECTION utils)
# The libraries are read off the programs; the platform's own is in the package.
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${CMAKE_LIBRARY_OUTPUT_DIRECTORY})
# No program shows that it imports these: the window's modules and the font it falls back to, whose
# light face the upgrade's title has.
string(CONCAT CPACK_DEBIAN_PACKAGE_DEPENDS
  "fonts-dejavu-core, fonts-dejavu-extra, qml6-module-qtqml, qml6-module-qtqml-models, "
  "qml6-module-qtqml-workerscript, qml6-module-qtquick, qml6-module-qtquick-window")
set(CPACK_DEBIAN_PACKAGE_RECOMMENDS "qt6-wayland, xdg-utils")

install(FILES ${PROJECT_SOURCE_DIR}/LICENSE
  DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/${PROJECT_NAME} RENAME copyright)

include(CPack)
