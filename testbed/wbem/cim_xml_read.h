// CIM values, paths and instances from elements of CIM-XML, as published servers and clients write
// them. What cannot be understood throws CimXmlError with a text for people.
#pragma once

#include <cstddef>
#include <pugixml.hpp>
#include <string>

#include "cim_object.h"
#include "cim_scalar.h"

namespace testbed {

/// Elements within elements, beyond which a message is refused.
constexpr int kDeepestNesting = 64;
/// Characters < and = in a message, of which each tag has one of the first kind and each attribute
/// one of the second: what bounds the memory that a message takes.
constexpr std::ptrdiff_t kMostMarks = 600'000;

/// Reads a message into `document`. Throws CimXmlError when it is not well-formed, nested deeper
/// than kDeepestNesting or has more than kMostMarks tags or attributes. No entity but those of XML
/// itself is expanded.
void parseXml(const std::string& text, pugi::xml_document& document);

bool isElement(pugi::xml_node node, const char* name);
/// The first child that is an element; none without one.
pugi::xml_node firstElement(pugi::xml_node node);
/// The element's text, of all its pieces, nothing trimmed.
std::string elementText(pugi::xml_node node);
/// The child of that name. Throws CimXmlError when there is none.
pugi::xml_node requiredChild(pugi::xml_node node, const char* name);
/// The attribute's value. Throws CimXmlError when there is none, or an empty one.
std::string requiredAttribute(pugi::xml_node node, const char* name);

/// The value in an element that may hold VALUE, VALUE.ARRAY or VALUE.REFERENCE; null without any.
/// `type` is without CMPI_ARRAY; `isArray` decides what an empty element is.
CimValue readValueIn(pugi::xml_node parent, CMPIType type, bool isArray);
/// PROPERTY, PROPERTY.ARRAY or PROPERTY.REFERENCE; QUALIFIER has the same form.
NamedValue readProperty(pugi::xml_node node);

/// "root/cimv2" of LOCALNAMESPACEPATH or NAMESPACEPATH.
std::string readNamespace(pugi::xml_node node);
/// INSTANCENAME; `nameSpace` is where it was said. A single key without a name gets an empty one.
ObjectPath readInstanceName(pugi::xml_node node, const std::string& nameSpace);
/// INSTANCEPATH, LOCALINSTANCEPATH, INSTANCENAME, CLASSPATH, LOCALCLASSPATH or CLASSNAME;
/// `nameSpace` counts for those that tell none.
ObjectPath readObjectPath(pugi::xml_node node, const std::string& nameSpace);
/// What VALUE.REFERENCE or OBJECTPATH holds.
ObjectPath readReference(pugi::xml_node node, const std::string& nameSpace);

/// INSTANCE; the path has namespace and class and no keys.
Instance readInstance(pugi::xml_node node, const std::string& nameSpace);
/// VALUE.NAMEDINSTANCE, VALUE.OBJECTWITHPATH, VALUE.OBJECTWITHLOCALPATH, VALUE.INSTANCEWITHPATH,
/// VALUE.OBJECT or INSTANCE itself.
Instance readNamedInstance(pugi::xml_node node, const std::string& nameSpace);

}  // namespace testbed
