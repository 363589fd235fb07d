// A schema of the size and shape of a published one, made up: no word of it means anything.
#pragma once

#include <cstddef>
#include <filesystem>

namespace testbed {

struct SyntheticSchema {
    std::filesystem::path file;  ///< includes all others
    std::size_t classes = 0;
    std::size_t properties = 0;  ///< references among them
    std::size_t methods = 0;
    std::size_t parameters = 0;
    std::size_t bytes = 0;
    std::size_t files = 0;
};

/// Writes a schema of that many classes, one a file, into an empty directory: declarations of
/// qualifiers, a hierarchy ten levels deep, associations, methods, long descriptions, lists of
/// values. The same number gives the same schema.
SyntheticSchema writeSyntheticSchema(const std::filesystem::path& directory, std::size_t classes);

}  // namespace testbed
