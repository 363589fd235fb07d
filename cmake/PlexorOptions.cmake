# What an integrator chooses when configuring.
option(PLEXOR_CONTEXT_FLUSH
       "The host's CMPI context table has the entry 'flush' after 'addEntry' (OFF: any standard manager)" ON)
option(PLEXOR_BUILD_TESTBED "Build the test bed (object manager with a simulated vendor)" ON)
option(PLEXOR_BUILD_TESTS "Build the tests" ON)
option(PLEXOR_BUILD_BENCH "Build the benchmarks" ON)
set(PLEXOR_CMPI_INCLUDE_DIR "" CACHE PATH
    "Directory of an installed CMPI header set (empty: the declarations in cim/cmpi)")
set(PLEXOR_HOSTCONFIG "" CACHE STRING
    "Library of the host's option store (empty: the file-backed stand-in in cim/hostconfig)")
set(PLEXOR_SANITIZE "" CACHE STRING "Sanitizers for every target, as -fsanitize takes them")
option(PLEXOR_CHECK_LOCKS "Tell on standard error of a call without the locks that it needs" OFF)
set(PLEXOR_SANITIZE_PROVIDER_ONLY "" CACHE STRING
    "Those of PLEXOR_SANITIZE that the test bed, the tests and the benchmarks go without")
option(PLEXOR_COVERAGE "Instrument for coverage" OFF)
option(PLEXOR_FUZZ "Instrument for libFuzzer, and link the harnesses of tests/fuzz with it (clang)" OFF)

# The two builds must not be taken for one another, so their packages have names of their own. What
# `cmake --install` installs is the configured one; packages are made of both.
if(PLEXOR_CONTEXT_FLUSH)
    set(PLEXOR_PACKAGE plexor-provider-flush)
    set(PLEXOR_PROVIDER_COMPONENTS flush provider)
else()
    set(PLEXOR_PACKAGE plexor-provider)
    set(PLEXOR_PROVIDER_COMPONENTS provider)
endif()

# Installs for the provider: for the configured build, and for the package of the other one. @DOC@ in
# an argument is the documentation directory of the package.
function(plexor_install_provider)
    set(extra "")
    foreach(component IN LISTS PLEXOR_PROVIDER_COMPONENTS)
        set(package plexor-provider)
        if(component STREQUAL flush)
            set(package plexor-provider-flush)
        endif()
        string(REPLACE "@DOC@" "${CMAKE_INSTALL_DATADIR}/doc/${package}" arguments "${ARGN}")
        install(${arguments} COMPONENT ${component} ${extra})
        set(extra EXCLUDE_FROM_ALL)
    endforeach()
endfunction()
