// The classes that the option --schema chooses.
#pragma once

#include <string>

#include "repository.h"

namespace testbed {

/// What --schema takes, for the help of the commands.
inline constexpr const char* kSchemaHelp =
    "directory of the provider's classes, or a MOF file of standard classes to use below them";

/// Defines the provider's classes and all that they need. `chosen` is a directory as locateSchema
/// takes it; or a file with standard classes, such as a published schema, on top of which those of
/// the provider are defined from where locateSchema finds them. Throws MofError or
/// std::runtime_error; the text is for the user.
void defineChosenClasses(Repository& repository, const std::string& nameSpace,
                         const std::string& chosen);

}  // namespace testbed
