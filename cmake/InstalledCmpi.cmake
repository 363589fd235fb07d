# Headers of an installed CMPI development package instead of cim/cmpi.
include(CheckCXXSourceCompiles)

add_library(plexor_installed_cmpi INTERFACE)
target_include_directories(plexor_installed_cmpi SYSTEM INTERFACE ${PLEXOR_CMPI_INCLUDE_DIR})
target_compile_definitions(plexor_installed_cmpi INTERFACE
    CMPI_PLATFORM_LINUX_GENERIC_GNU CMPI_VERSION=100
    $<$<BOOL:${PLEXOR_CONTEXT_FLUSH}>:PLEXOR_CONTEXT_FLUSH=1>)

if(PLEXOR_CONTEXT_FLUSH)
    set(CMAKE_REQUIRED_INCLUDES ${PLEXOR_CMPI_INCLUDE_DIR})
    set(CMAKE_REQUIRED_DEFINITIONS -DCMPI_PLATFORM_LINUX_GENERIC_GNU -DCMPI_VERSION=100
                                   -DPLEXOR_CONTEXT_FLUSH=1)
    unset(PLEXOR_CMPI_HAS_FLUSH CACHE)
    check_cxx_source_compiles("
        #include <cmpidt.h>
        #include <cmpift.h>
        int main() { return sizeof(((CMPIContextFT*)0)->flush) == 0; }" PLEXOR_CMPI_HAS_FLUSH)
    if(NOT PLEXOR_CMPI_HAS_FLUSH)
        message(FATAL_ERROR
            "The headers in ${PLEXOR_CMPI_INCLUDE_DIR} have no context entry 'flush'. "
            "Build for a standard manager with -DPLEXOR_CONTEXT_FLUSH=OFF.")
    endif()
endif()
