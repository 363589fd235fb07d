# Packages of everything that is installed, made by `cpack` in the build directory: the provider in
# each build that there is, and the test bed. Included last: it packs what was said before. Configure
# with CMAKE_INSTALL_PREFIX=/usr, so that the library goes to the system's library directory;
# scripts/package does.
set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME plexor-provider)
set(CPACK_PACKAGE_VENDOR Tovexa)
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "")  # each has its own
set(CPACK_PACKAGE_CONTACT "Plexor provider maintainers <plexor-provider@localhost.localdomain>")
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_STRIP_FILES ON)
set(CPACK_PRE_BUILD_SCRIPTS ${PROJECT_SOURCE_DIR}/cmake/FinishPackage.cmake)
set(CPACK_COMPONENTS_ALL ${PLEXOR_PROVIDER_COMPONENTS})
if(PLEXOR_BUILD_TESTBED)
    list(APPEND CPACK_COMPONENTS_ALL testbed)
endif()
set(CPACK_COMPONENTS_GROUPING IGNORE)
set(packaging ${PROJECT_SOURCE_DIR}/packaging)

set(provider_text
"The provider shows WBEM clients the hardware RAID controllers of the host with
their firmware, volumes, drives, ports and batteries. With it come its classes
and plexor-register, which registers it with an object manager.")
set(provider_summary "CMPI instance provider for host hardware RAID controllers")
set(flush_summary "${provider_summary} (context flush)")
set(testbed_summary "check and test bed for the Plexor RAID provider")
set(provider_description "${provider_text}
.
This is the build for standard object managers, and the one to take in doubt.")
set(flush_description "${provider_text}
.
This build is for object managers whose context table has the entry 'flush'
behind 'addEntry'. It may bring down any other.")
set(testbed_description
"The check plugin check_plexor asks any WBEM server for its RAID controllers and
judges what it hears; it is all that a monitoring host needs. plexor-testbed
shows the same as a tree, and is an object manager with a simulated array,
which runs the provider on a desk, with copies of its own.")

# Each build brings the managers of the other kind down, so only one can be installed.
set(provider_others "plexor-provider-flush, plexor-provider-standard")
set(flush_others "plexor-provider, plexor-provider-standard")
set(testbed_others "")
set(provider_name plexor-provider)
set(flush_name plexor-provider-flush)
set(testbed_name plexor-testbed)
set(provider_recommends curl)
set(flush_recommends curl)
set(testbed_recommends ca-certificates)

# ---- Debian
set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_RELEASE 1)
set(CPACK_DEBIAN_PACKAGE_SECTION admin)
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION TRUE)
# What the binaries link to; dpkg-shlibdeps works it out.
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)

# ---- RPM
set(CPACK_RPM_COMPONENT_INSTALL ON)
set(CPACK_RPM_FILE_NAME RPM-DEFAULT)
set(CPACK_RPM_PACKAGE_RELEASE 1)
set(CPACK_RPM_PACKAGE_LICENSE "not stated")
set(CPACK_RPM_PACKAGE_GROUP "System Environment/Daemons")
set(CPACK_RPM_SPEC_MORE_DEFINE "%define _build_id_links none")
# Directories that belong to the system.
set(CPACK_RPM_EXCLUDE_FROM_AUTO_FILELIST_ADDITION
    /usr/sbin
    /usr/lib/nagios /usr/lib/nagios/plugins /usr/lib/systemd /usr/lib/systemd/system
    /usr/share/bash-completion /usr/share/bash-completion/completions
    /usr/share/man /usr/share/man/man1 /usr/share/man/man5 /usr/share/man/man7 /usr/share/man/man8
    /usr/${CMAKE_INSTALL_LIBDIR} /usr/${CMAKE_INSTALL_LIBDIR}/cmpi)

foreach(component IN LISTS CPACK_COMPONENTS_ALL)
    string(TOUPPER ${component} upper)
    set(scripts provider)
    if(component STREQUAL testbed)
        set(scripts testbed)
    endif()
    set(CPACK_COMPONENT_${upper}_DESCRIPTION "${${component}_summary}\n${${component}_description}")

    set(CPACK_DEBIAN_${upper}_PACKAGE_NAME ${${component}_name})
    set(CPACK_DEBIAN_${upper}_DESCRIPTION "${${component}_summary}\n${${component}_description}")
    set(CPACK_DEBIAN_${upper}_PACKAGE_CONFLICTS "${${component}_others}")
    set(CPACK_DEBIAN_${upper}_PACKAGE_REPLACES "${${component}_others}")
    set(CPACK_DEBIAN_${upper}_PACKAGE_RECOMMENDS ${${component}_recommends})
    set(CPACK_DEBIAN_${upper}_PACKAGE_CONTROL_EXTRA
        ${packaging}/debian/${scripts}/postinst
        ${packaging}/debian/${scripts}/prerm
        ${packaging}/debian/${scripts}/postrm)

    set(CPACK_RPM_${upper}_PACKAGE_NAME ${${component}_name})
    set(CPACK_RPM_${upper}_PACKAGE_SUMMARY "${${component}_summary}")
    string(REPLACE "\n.\n" "\n\n" text "${${component}_description}")
    set(CPACK_RPM_${upper}_PACKAGE_DESCRIPTION "${text}")
    set(CPACK_RPM_${upper}_PACKAGE_CONFLICTS "${${component}_others}")
    set(CPACK_RPM_${upper}_POST_INSTALL_SCRIPT_FILE ${packaging}/rpm/${scripts}.post)
    set(CPACK_RPM_${upper}_PRE_UNINSTALL_SCRIPT_FILE ${packaging}/rpm/${scripts}.preun)
    set(CPACK_RPM_${upper}_POST_UNINSTALL_SCRIPT_FILE ${packaging}/rpm/${scripts}.postun)
endforeach()

include(CPack)
