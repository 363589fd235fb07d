# Flags that every target gets.
add_library(plexor_flags INTERFACE)
target_compile_options(plexor_flags INTERFACE
    -Wall -Wextra -Wpedantic -Wshadow -Wformat=2 -fstack-protector-strong)
target_link_libraries(plexor_flags INTERFACE Threads::Threads)

# What goes into the provider's library: hidden unless exported on purpose, and no unique symbols, which
# would keep it mapped (clang makes none).
add_library(plexor_hidden INTERFACE)
target_compile_options(plexor_hidden INTERFACE
    -fvisibility=hidden $<$<CXX_COMPILER_ID:GNU>:-fno-gnu-unique>)

# What is installed runs with rights, and reads what strangers send.
include(CheckPIESupported)
check_pie_supported(LANGUAGES C CXX)
add_link_options(-Wl,-z,relro -Wl,-z,now -Wl,-z,noexecstack)

if(PLEXOR_SANITIZE)
    add_compile_options(-fsanitize=${PLEXOR_SANITIZE} -fno-omit-frame-pointer -fno-sanitize-recover=all)
    add_link_options(-fsanitize=${PLEXOR_SANITIZE})
    # Compares the types of functions by their addresses; a library that hides its own has others.
    if(PLEXOR_SANITIZE MATCHES "undefined" AND CMAKE_CXX_COMPILER_ID MATCHES "Clang")
        add_compile_options(-fno-sanitize=function)
    endif()
elseif(CMAKE_BUILD_TYPE STREQUAL "Release")
    target_compile_definitions(plexor_flags INTERFACE _FORTIFY_SOURCE=2)
endif()
if(PLEXOR_FUZZ)
    # What is linked with libFuzzer says so itself; all other code only tells it where it has been.
    # Optimized, as an execution's time is what counts.
    add_compile_options(-fsanitize=fuzzer-no-link -O2)
    add_compile_definitions(_GLIBCXX_ASSERTIONS)
endif()
# For code that harnesses run but do not aim at: libFuzzer is not told where in it an input has been.
function(plexor_no_fuzz_guidance)
    if(PLEXOR_FUZZ)
        foreach(target IN LISTS ARGN)
            target_compile_options(${target} PRIVATE
                -fno-sanitize-coverage=edge,inline-8bit-counters,pc-table,indirect-calls,trace-cmp,stack-depth)
        endforeach()
    endif()
endfunction()
# For readers of texts: a number that is compared does not stand in an input as it is in memory. The texts
# that are compared are still told.
function(plexor_fuzz_guidance_by_texts)
    if(PLEXOR_FUZZ)
        foreach(target IN LISTS ARGN)
            target_compile_options(${target} PRIVATE -fno-sanitize-coverage=trace-cmp)
        endforeach()
    endif()
endfunction()
if(PLEXOR_COVERAGE)
    add_compile_options(-fprofile-instr-generate -fcoverage-mapping -fprofile-update=atomic)
    add_link_options(-fprofile-instr-generate)
endif()

# For the directories around the provider, whose code is not what is measured or busy: what the compiler
# saves counts for more than what it optimizes or checks. Undefined behaviour, whose checks are nearly
# half of the time that they take to compile, is looked for in the provider; in the long form of
# scripts/test everywhere.
macro(plexor_options_around)
    if(CMAKE_BUILD_TYPE STREQUAL "Release")
        add_compile_options(-O1)
    elseif(PLEXOR_SANITIZE AND NOT PLEXOR_FUZZ)
        add_compile_options(-O0)
    endif()
    if(PLEXOR_SANITIZE_PROVIDER_ONLY)
        add_compile_options(-fno-sanitize=${PLEXOR_SANITIZE_PROVIDER_ONLY})
    endif()
endmacro()
