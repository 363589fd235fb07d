// The directories in which the library may lie, and picking the build for the manager.
#include "library_locator.h"

#include <filesystem>

#include "provider_library.h"
#include "tool_directory.h"

namespace testbed {
namespace {

namespace fs = std::filesystem;

constexpr const char* kLibraryName = "libPlexorProvider.so";
/// Below the directory of the build for the host's manager; there is none where that one is
/// standard.
constexpr const char* kStandard = "standard";
constexpr const char* kLibraryDirectories[] = {".", BUILT_PROVIDER_DIR, INSTALLED_PROVIDER_DIR};

}  // namespace

std::string locateLibrary(const std::string& chosen, const BrokerOptions& manager) {
    // A bare file name would be searched for in the system's directories.
    if (!chosen.empty()) return fs::absolute(chosen).string();
    const fs::path here = toolDirectory();
    for (const char* directory : kLibraryDirectories) {
        const fs::path file = (here / directory / kLibraryName).lexically_normal();
        const fs::path standard = file.parent_path() / kStandard / kLibraryName;
        if (!manager.hasContextFlush() && fs::exists(standard)) return standard.string();
        if (fs::exists(file)) return file.string();
    }
    throw LoadError(std::string(kLibraryName) + " not found beside " + here.string() +
                    "; name it with --library");
}

}  // namespace testbed
