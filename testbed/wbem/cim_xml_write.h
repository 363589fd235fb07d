// CIM values, paths, instances and classes as elements of CIM-XML. Each function appends to
// `parent`; texts are made fit for XML on the way.
#pragma once

#include <pugixml.hpp>
#include <string>
#include <string_view>
#include <vector>

#include "cim_object.h"
#include "repository.h"

namespace testbed {

/// What an instance's element says beyond the values: what its class knows of them.
struct InstanceDetails {
    std::vector<PropertyDefinition> properties;  ///< of the class, own and inherited
    Qualifiers qualifiers;                       ///< of the class
    bool withQualifiers = false;                 ///< QUALIFIER elements
    bool withClassOrigin = false;                ///< CLASSORIGIN attributes
};

/// A class as GetClass shows it.
struct ClassView {
    ClassDefinition definition;                  ///< its properties: those it does not inherit
    std::vector<PropertyDefinition> properties;  ///< those to show
    std::vector<MethodDefinition> methods;       ///< those to show
    bool withQualifiers = false;
    bool withClassOrigin = false;
};

/// VALUE, VALUE.ARRAY or VALUE.REFERENCE, whose keys tell their types; nothing for a null value.
void writeValue(pugi::xml_node parent, const CimValue& value);
/// PROPERTY, PROPERTY.ARRAY or PROPERTY.REFERENCE, whose node is returned.
pugi::xml_node writeProperty(pugi::xml_node parent, const NamedValue& property);
void writeQualifier(pugi::xml_node parent, const NamedValue& qualifier);

void writeLocalNamespacePath(pugi::xml_node parent, std::string_view nameSpace);
void writeNamespacePath(pugi::xml_node parent, std::string_view nameSpace, std::string_view host);
void writeClassName(pugi::xml_node parent, std::string_view className);
/// Whether keys tell their CIM type. A client that has only guessed it from a text must not.
enum class KeyTypes { Told, Untold };
void writeInstanceName(pugi::xml_node parent, const ObjectPath& path,
                       KeyTypes types = KeyTypes::Untold);
void writeLocalInstancePath(pugi::xml_node parent, const ObjectPath& path);
void writeInstancePath(pugi::xml_node parent, const ObjectPath& path, std::string_view host);

void writeInstance(pugi::xml_node parent, const Instance& instance,
                   const InstanceDetails& details = {});
/// VALUE.NAMEDINSTANCE
void writeNamedInstance(pugi::xml_node parent, const Instance& instance,
                        const InstanceDetails& details = {});
/// VALUE.OBJECTWITHPATH
void writeObjectWithPath(pugi::xml_node parent, const Instance& instance, std::string_view host,
                         const InstanceDetails& details = {});
void writeClass(pugi::xml_node parent, const ClassView& view);

/// The document as it travels: UTF-8 with an XML declaration, nothing added to texts.
std::string serialize(const pugi::xml_document& document);

}  // namespace testbed
