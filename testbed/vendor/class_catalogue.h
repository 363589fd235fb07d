// The CIM classes of the RAID profile and the vendor's subclasses of them.
#pragma once

#include <optional>
#include <span>
#include <string>
#include <string_view>

#include "repository.h"

namespace testbed {

/// An association class with the roles of its two ends.
struct AssociationRoles {
    const char* className;
    const char* leftRole;
    const char* rightRole;
};

/// A CIM class of the catalogue; `superclass` is "" for a root class.
struct CatalogueClass {
    const char* name;
    const char* superclass;
};

/// One property of a CIM class of the catalogue.
struct CatalogueProperty {
    const char* className;
    const char* name;
    CMPIType type;
    bool isKey;
};

std::span<const CatalogueClass> catalogueClasses();
std::span<const CatalogueProperty> catalogueProperties();
std::span<const AssociationRoles> catalogueAssociations();

/// A class of the vendor's own, below a CIM class of the catalogue; the prefix comes first.
struct VendorClass {
    const char* suffix;
    const char* cimClass;
};

std::span<const VendorClass> vendorClasses();

/// The roles of a CIM association class of the catalogue. Throws std::out_of_range for another.
const AssociationRoles& rolesOf(std::string_view cimAssociation);

/// The type that a CIM class or one of its superclasses declares for a property.
std::optional<CMPIType> declaredType(std::string_view cimClass, std::string_view property);

/// The CIM type of that name ("uint16", "string[]"), none for an unknown name.
std::optional<CMPIType> typeByName(std::string_view name);

/// Defines the CIM classes that a namespace lacks; those that it has are left alone.
void defineCimClasses(Repository& repository, std::string_view nameSpace);

/// Defines the CIM classes and the vendor's subclasses in a namespace.
void defineClasses(Repository& repository, std::string_view nameSpace, const std::string& prefix);

/// Defines one further class below a CIM class, unless the namespace has it already.
void defineClassBelow(Repository& repository, std::string_view nameSpace,
                      const std::string& className, const std::string& superclass);

}  // namespace testbed
