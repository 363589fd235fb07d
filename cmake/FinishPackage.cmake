# Run by cpack on what it is about to pack, a directory for each component.
set(component_packages provider plexor-provider flush plexor-provider-flush testbed plexor-testbed)
file(GLOB roots "${CPACK_TEMPORARY_DIRECTORY}/*/usr")
foreach(root IN LISTS roots)
    # Directories have the builder's umask until now.
    file(CHMOD_RECURSE "${root}" DIRECTORY_PERMISSIONS
        OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ WORLD_EXECUTE)

    # Debian wants manual pages and the changelog compressed; RPM has a changelog of its own.
    file(GLOB_RECURSE compressed "${root}/share/man/*.[1578]")
    get_filename_component(component "${root}/.." ABSOLUTE)
    get_filename_component(component "${component}" NAME)
    list(FIND component_packages "${component}" place)
    math(EXPR place "${place} + 1")
    list(GET component_packages ${place} package)
    if(CPACK_GENERATOR STREQUAL "DEB")
        set(changelog "${root}/share/doc/${package}/changelog.Debian")
        configure_file("${CMAKE_CURRENT_LIST_DIR}/../packaging/changelog" "${changelog}" @ONLY)
        list(APPEND compressed "${changelog}")
    endif()
    execute_process(COMMAND gzip -9nf ${compressed} COMMAND_ERROR_IS_FATAL ANY)
endforeach()
