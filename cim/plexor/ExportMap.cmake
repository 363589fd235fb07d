# Writes the linker's version script: what PlexorProvider.h declares with PLEXOR_API is exported and
# nothing else. A weak symbol of the C++ library among the exports would keep the provider mapped: in
# a program without that library, the library, loaded with ours, binds its own references to it.
function(plexor_export_map header map)
    set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${header})
    file(STRINGS ${header} lines REGEX "^PLEXOR_API ")
    set(names "")
    foreach(line IN LISTS lines)
        # Locks that a declaration names are no part of it.
        string(REGEX REPLACE " PLEXOR_[A-Z_]+\\([^)]*\\)" "" line "${line}")
        if(NOT line MATCHES "[ *]([A-Za-z_]+)[[(;]")
            message(FATAL_ERROR "No name in the declaration: ${line}")
        endif()
        string(APPEND names "    ${CMAKE_MATCH_1};\n")
    endforeach()
    file(CONFIGURE OUTPUT ${map} CONTENT "{\nglobal:\n${names}local:\n    *;\n};\n" @ONLY)
endfunction()
