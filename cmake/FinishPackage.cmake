# Run by cpack on what it is about to pack.

# Directories have the builder's umask until now.
file(CHMOD_RECURSE "${CPACK_TEMPORARY_DIRECTORY}/usr" DIRECTORY_PERMISSIONS
    OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ WORLD_EXECUTE)

# Debian wants manual pages and the changelog compressed.
file(GLOB_RECURSE pages "${CPACK_TEMPORARY_DIRECTORY}/*.[1578]")
list(FILTER pages INCLUDE REGEX "/man/man[1578]/")
set(changelog "${CPACK_TEMPORARY_DIRECTORY}/usr/share/doc/${CPACK_PACKAGE_NAME}/changelog.Debian")
configure_file("${CMAKE_CURRENT_LIST_DIR}/../docs/package/changelog" "${changelog}" @ONLY)
execute_process(COMMAND gzip -9nf ${pages} "${changelog}" COMMAND_ERROR_IS_FATAL ANY)
