// The directories in which the MOF files may lie, as seen from the tool.
#include "schema_locator.h"

#include <stdexcept>

#include "served_classes.h"
#include "tool_directory.h"

namespace testbed {
namespace {

namespace fs = std::filesystem;

constexpr const char* kSchemaDirectories[] = {BUILT_SCHEMA_DIR, INSTALLED_SCHEMA_DIR};

}  // namespace

fs::path locateSchema(const std::string& chosen) {
    if (!chosen.empty()) return chosen;
    const fs::path here = toolDirectory();
    for (const char* directory : kSchemaDirectories) {
        const fs::path schema = (here / directory).lexically_normal();
        if (fs::exists(schema / kSchemaFile)) return schema;
    }
    throw std::runtime_error("no " + std::string(kSchemaFile) + " beside " + here.string() +
                             "; name its directory with --schema");
}

}  // namespace testbed
