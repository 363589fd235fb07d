# A Debian package of everything that is installed, made by `cpack` in the build directory. Included
# last: it packs what was said before. Configure with CMAKE_INSTALL_PREFIX=/usr, so that the library
# goes to the system's library directory; scripts/package does.
set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME ${PLEXOR_PACKAGE})
set(CPACK_PACKAGE_VENDOR Tovexa)
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGE_CONTACT "Plexor provider maintainers <plexor-provider@localhost.localdomain>")
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_STRIP_FILES ON)
set(CPACK_PRE_BUILD_SCRIPTS ${PROJECT_SOURCE_DIR}/cmake/FinishPackage.cmake)

if(PLEXOR_CONTEXT_FLUSH)
    set(build_is_for
        "This build is for object managers whose context table has the entry\n'flush'.")
else()
    set(build_is_for "This build is for standard object managers.")
endif()
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY ${PROJECT_DESCRIPTION})
set(CPACK_DEBIAN_PACKAGE_DESCRIPTION
"The provider shows WBEM clients the hardware RAID controllers of the host with
their firmware, volumes, drives, ports and batteries. With it come its classes,
plexor-register, which registers it with an object manager, and plexor-testbed,
which runs it against a simulated array.
.
${build_is_for}")

set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_RELEASE 1)
set(CPACK_DEBIAN_PACKAGE_SECTION admin)
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION TRUE)
# What the binaries link to; dpkg-shlibdeps works it out.
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
# A library of the one kind brings a manager of the other down. Without "Replaces": whoever wants to
# change over removes the old package knowingly.
set(CPACK_DEBIAN_PACKAGE_CONFLICTS ${PLEXOR_OTHER_PACKAGE})

include(CPack)
