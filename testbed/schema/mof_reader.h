// Reads MOF files, with the files that they include.
#pragma once

#include <filesystem>

#include "mof_parser.h"

namespace testbed {

/// Everything that the file and its includes declare, in the order in which a compiler meets it.
/// Names of included files are relative to the including one. Throws MofError for a file that
/// cannot be read or understood, and for one that includes itself.
MofDocument readMof(const std::filesystem::path& file);

}  // namespace testbed
