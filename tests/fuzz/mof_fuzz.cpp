// MOF files, as far as their classes being defined in a repository.
#include <stdexcept>

#include "fuzz_target.h"
#include "input_file.h"
#include "standard_classes.h"

namespace {

constexpr const char* kNamespace = "root/cimv2";

void lookAt(const testbed::Repository& repository, const std::string& name) {
    repository.allProperties(kNamespace, name);
    repository.allMethods(kNamespace, name);
    repository.keys(kNamespace, name);
    fuzz::require(repository.isA(kNamespace, name, name), "a class is one of its own kind");
}

}  // namespace

PLEXOR_FUZZ_HARNESS(mof) {
    static const fuzz::InputFile file;
    file.write(bytes);
    testbed::Repository repository;
    try {
        testbed::defineStandardClasses(repository, kNamespace, file.name());
        for (const std::string& name : repository.classNames(kNamespace)) lookAt(repository, name);
    } catch (const std::runtime_error& error) {
        fuzz::require(*error.what() != '\0', "a refusal has a text");
    }
}
