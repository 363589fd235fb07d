# Most of the time that a file takes to compile goes into reading headers and into instances of the
# same templates. Together they take it once, but a change of one compiles its neighbours as well:
# the presets that scripts/test builds do, whoever edits and builds again and again may not want to.
option(PLEXOR_UNITY "Compile the test bed, tests and benchmarks several files at a time" OFF)

# gcc looks for what it can throw away again and again; it has the memory not to (half a gigabyte more
# for the largest part), and is a tenth faster for it.
if(PLEXOR_UNITY AND CMAKE_CXX_COMPILER_ID STREQUAL "GNU")
    add_compile_options($<$<COMPILE_LANGUAGE:CXX>:--param=ggc-min-heapsize=4000000>)
endif()

# Compiles the targets in parts of about equal size, of 16 files at most. A file with compile
# definitions of its own stays alone. The provider is not for this: what is shipped is one object a
# file, and names that files hide from each other are part of it.
function(plexor_unity)
    if(NOT PLEXOR_UNITY)
        return()
    endif()
    foreach(target IN LISTS ARGN)
        get_target_property(sources ${target} SOURCES)
        list(FILTER sources INCLUDE REGEX "\\.cpp$")
        list(LENGTH sources count)
        math(EXPR parts "(${count} + 15) / 16")
        math(EXPR batch "(${count} + ${parts} - 1) / ${parts}")
        set_target_properties(${target} PROPERTIES UNITY_BUILD ON UNITY_BUILD_BATCH_SIZE ${batch})
    endforeach()
endfunction()
