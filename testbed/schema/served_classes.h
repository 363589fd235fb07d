// The provider's classes, as its schema defines them, in a repository.
#pragma once

#include <filesystem>
#include <string>

#include "repository.h"

namespace testbed {

/// File that names all classes of the provider; it lies in the schema's directory.
inline constexpr const char* kSchemaFile = "Tovexa_Plexor.mof";

/// Defines the provider's classes from the MOF in `directory`, and below them whatever standard
/// classes the namespace lacks. Property by property it is as particular as a manager's compiler:
/// the superclass must be there, an override must name a property that is inherited and keep its
/// type, and a class must have a key. Throws MofError or std::runtime_error; the text is for the
/// user.
void defineServedClasses(Repository& repository, const std::string& nameSpace,
                         const std::filesystem::path& directory);

}  // namespace testbed
