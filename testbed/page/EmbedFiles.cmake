# Writes page_files.cpp: cmake -DOUTPUT=FILE -DFILES=LIST -P EmbedFiles.cmake
set(most 102400) # bytes of all files together: the page has to come at once, wherever it is asked for
set(type_html "text/html; charset=utf-8")
set(type_css "text/css; charset=utf-8")
set(type_js "text/javascript; charset=utf-8")
set(type_svg "image/svg+xml")

set(rows "")
set(total 0)
foreach(file IN LISTS FILES)
    file(SIZE ${file} size)
    math(EXPR total "${total} + ${size}")
    file(READ ${file} content)
    get_filename_component(name ${file} NAME)
    string(REGEX REPLACE "^.*\\." "" ending ${name})
    set(target "/page/${name}")
    if(name STREQUAL "index.html")
        set(target "/")
    endif()
    string(APPEND rows "    {\"${target}\", \"${type_${ending}}\", R\"~page~(${content})~page~\"},\n")
endforeach()
if(total GREATER most)
    message(FATAL_ERROR "the page's files have ${total} bytes, more than ${most}")
endif()

file(WRITE ${OUTPUT} "// Made from the page's files.
#include \"page_files.h\"

namespace testbed {
namespace {

constexpr PageFile kFiles[] = {
${rows}};

}  // namespace

std::span<const PageFile> pageFiles() {
    return kFiles;
}

}  // namespace testbed
")
