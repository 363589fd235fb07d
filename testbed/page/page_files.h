// The page's own files, compiled in.
#pragma once

#include <span>
#include <string_view>

namespace testbed {

struct PageFile {
    std::string_view target;  ///< "/page.css"
    std::string_view type;    ///< for Content-Type
    std::string_view content;
};

std::span<const PageFile> pageFiles();

}  // namespace testbed
