# A Debian package of everything that is installed, made by `cpack` in the build directory. Included
# last: it packs what was said before. Configure with CMAKE_INSTALL_PREFIX=/usr, so that the library
# goes to the system's library directory.
set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME plexor-provider)
set(CPACK_PACKAGE_VENDOR Tovexa)
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY ${PROJECT_DESCRIPTION})
set(CPACK_PACKAGE_CONTACT "Plexor provider maintainers <plexor-provider@localhost>")
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_STRIP_FILES ON)

set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_SECTION admin)
# What the binaries link to; dpkg-shlibdeps works it out.
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)

include(CPack)
