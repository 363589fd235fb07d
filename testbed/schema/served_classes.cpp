// Reading the provider's MOF, and settling what each property takes over from its superclass.
#include "served_classes.h"

#include <algorithm>
#include <stdexcept>

#include "class_catalogue.h"
#include "mof_reader.h"

namespace testbed {
namespace {

[[noreturn]] void refuse(const ClassDefinition& definition, const std::string& what) {
    throw std::runtime_error("schema: " + definition.name + what);
}

const CimValue* findQualifier(const Qualifiers& qualifiers, const char* name) {
    for (const auto& [qualifier, value] : qualifiers) {
        if (sameName(qualifier, name)) return &value;
    }
    return nullptr;
}

/// Settles what a property owes to the superclass: where it comes from, and whether it is a key.
void inherit(const ClassDefinition& definition, PropertyDefinition& property,
             const std::optional<PropertyDefinition>& inherited) {
    const std::string name = "." + property.name;
    const CimValue* override = findQualifier(property.qualifiers, "Override");
    if (override != nullptr && !sameName(override->asString(), property.name)) {
        refuse(definition, name + ": Override names another property");
    }
    if (!inherited) {
        if (override != nullptr) refuse(definition, name + " overrides nothing");
        property.originClass = definition.name;
        return;
    }
    if (override == nullptr) refuse(definition, name + " is inherited and has no Override");
    if (inherited->type != property.type) {
        refuse(definition, name + " is a " + typeName(property.type) + ", the superclass has a " +
                               typeName(inherited->type));
    }
    property.originClass = inherited->originClass;
    property.isKey = property.isKey || inherited->isKey;
}

void define(Repository& repository, const std::string& nameSpace, ClassDefinition definition) {
    const std::string& superclass = definition.superclass;
    if (!superclass.empty() && !repository.hasClass(nameSpace, superclass)) {
        refuse(definition, " derives from " + superclass + ", which is not known");
    }
    for (PropertyDefinition& property : definition.properties) {
        inherit(definition, property,
                repository.findProperty(nameSpace, superclass, property.name));
    }
    const std::string name = definition.name;
    repository.defineClass(nameSpace, definition);
    const auto properties = repository.allProperties(nameSpace, name);
    if (std::none_of(properties.begin(), properties.end(),
                     [](const PropertyDefinition& property) { return property.isKey; })) {
        refuse(definition, " has no key");
    }
}

}  // namespace

void defineServedClasses(Repository& repository, const std::string& nameSpace,
                         const std::filesystem::path& directory) {
    MofDocument document = readMof(directory / kSchemaFile);
    defineCimClasses(repository, nameSpace);
    for (ClassDefinition& definition : document.classes) {
        define(repository, nameSpace, std::move(definition));
    }
}

}  // namespace testbed
