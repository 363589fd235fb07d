// Asks the system for the program's file.
#include "tool_directory.h"

namespace testbed {

namespace fs = std::filesystem;

fs::path toolDirectory() {
    std::error_code error;
    const fs::path tool = fs::read_symlink("/proc/self/exe", error);
    return error ? fs::current_path() : tool.parent_path();
}

}  // namespace testbed
