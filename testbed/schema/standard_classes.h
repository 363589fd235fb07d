// A published schema of standard classes, in a repository.
#pragma once

#include <filesystem>
#include <string>

#include "repository.h"

namespace testbed {

/// Defines all classes of a MOF file and of those that it includes, in the place of classes of the
/// same names. A class may come before its superclass. Throws MofError, or std::runtime_error for a
/// superclass that nobody defines; the text is for the user.
void defineStandardClasses(Repository& repository, const std::string& nameSpace,
                           const std::filesystem::path& file);

}  // namespace testbed
