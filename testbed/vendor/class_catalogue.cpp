// Looking up superclasses, properties and roles, and defining the classes in a repository.
#include "class_catalogue.h"

#include <algorithm>
#include <stdexcept>

namespace testbed {
namespace {

/// The superclass of a CIM class; "" for a root class and for what is not in the catalogue.
std::string_view superclassOf(std::string_view cimClass) {
    for (const CatalogueClass& row : catalogueClasses()) {
        if (sameName(row.name, cimClass)) return row.superclass;
    }
    return {};
}

/// True for the classes with roles and for the abstract associations above them, which have none.
bool isAssociation(std::string_view cimClass) {
    const auto associations = catalogueAssociations();
    return std::any_of(associations.begin(), associations.end(), [&](const AssociationRoles& row) {
        for (std::string_view name = row.className; !name.empty(); name = superclassOf(name)) {
            if (name == cimClass) return true;
        }
        return false;
    });
}

std::vector<PropertyDefinition> propertiesOf(const std::string& cimClass) {
    std::vector<PropertyDefinition> properties;
    for (const CatalogueProperty& row : catalogueProperties()) {
        if (cimClass != row.className) continue;
        properties.push_back(
            {row.name, row.type, row.isKey, cimClass, CimValue::null(row.type), {}});
    }
    for (const AssociationRoles& row : catalogueAssociations()) {
        if (cimClass != row.className) continue;
        for (const char* role : {row.leftRole, row.rightRole}) {
            properties.push_back({role, CMPI_ref, true, cimClass, CimValue::null(CMPI_ref), {}});
        }
    }
    return properties;
}

}  // namespace

const AssociationRoles& rolesOf(std::string_view cimAssociation) {
    for (const AssociationRoles& row : catalogueAssociations()) {
        if (cimAssociation == row.className) return row;
    }
    throw std::out_of_range("no association class " + std::string(cimAssociation));
}

std::optional<CMPIType> declaredType(std::string_view cimClass, std::string_view property) {
    for (std::string_view name = cimClass; !name.empty(); name = superclassOf(name)) {
        for (const CatalogueProperty& row : catalogueProperties()) {
            if (sameName(row.className, name) && sameName(row.name, property)) return row.type;
        }
    }
    return std::nullopt;
}

std::optional<CMPIType> typeByName(std::string_view name) {
    static constexpr CMPIType kTypes[] = {
        CMPI_boolean, CMPI_string, CMPI_uint8,  CMPI_uint16, CMPI_uint32, CMPI_uint64,
        CMPI_sint8,   CMPI_sint16, CMPI_sint32, CMPI_sint64, CMPI_real64,
    };
    for (const CMPIType type : kTypes) {
        if (sameName(typeName(type), name)) return type;
        const CMPIType array = static_cast<CMPIType>(type | CMPI_ARRAY);
        if (sameName(typeName(array), name)) return array;
    }
    return std::nullopt;
}

void defineCimClasses(Repository& repository, std::string_view nameSpace) {
    for (const CatalogueClass& row : catalogueClasses()) {
        if (repository.hasClass(nameSpace, row.name)) continue;
        repository.defineClass(
            nameSpace,
            {row.name, row.superclass, propertiesOf(row.name), {}, isAssociation(row.name)});
    }
}

void defineClasses(Repository& repository, std::string_view nameSpace, const std::string& prefix) {
    defineCimClasses(repository, nameSpace);
    for (const VendorClass& row : vendorClasses()) {
        repository.defineClass(
            nameSpace,
            {prefix + "_" + row.suffix, row.cimClass, {}, {}, isAssociation(row.cimClass)});
    }
}

void defineClassBelow(Repository& repository, std::string_view nameSpace,
                      const std::string& className, const std::string& superclass) {
    if (repository.hasClass(nameSpace, className)) return;
    const auto parent = repository.findClass(nameSpace, superclass);
    repository.defineClass(nameSpace,
                           {className, superclass, {}, {}, parent && parent->isAssociation});
}

}  // namespace testbed
