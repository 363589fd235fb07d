// Standard classes from a file, if one is given, then the provider's, then missing qualifiers.
#include "schema_choice.h"

#include <filesystem>

#include "schema_locator.h"
#include "served_classes.h"
#include "standard_classes.h"
#include "standard_qualifiers.h"

namespace testbed {

void defineChosenClasses(Repository& repository, const std::string& nameSpace,
                         const std::string& chosen) {
    const bool isStandard = std::filesystem::is_regular_file(chosen);
    if (isStandard) defineStandardClasses(repository, nameSpace, chosen);
    defineServedClasses(repository, nameSpace, locateSchema(isStandard ? "" : chosen));
    for (const std::string& name : repository.namespaceNames()) {
        qualifyStandardClasses(repository, name);
    }
}

}  // namespace testbed
