// Parsing a message within a bounded depth, and its elements one by one.
#include "cim_xml_read.h"

#include <algorithm>
#include <string_view>
#include <vector>

#include "xml_text.h"

namespace testbed {
namespace {

struct DepthLimit : pugi::xml_tree_walker {
    bool for_each(pugi::xml_node& node) override {
        return node.type() != pugi::node_element || depth() < kDeepestNesting;
    }
};

[[noreturn]] void refuse(pugi::xml_node node, const std::string& why) {
    throw CimXmlError(xmlText(node.name()) + ": " + why);
}

CMPIType declaredType(pugi::xml_node node) {
    const pugi::xml_attribute type = node.attribute("TYPE");
    if (!type) return CMPI_string;
    const auto known = xmlTypeByName(type.value());
    if (!known) refuse(node, "no type is named \"" + xmlText(type.value()) + "\"");
    return *known;
}

CimValue readArray(pugi::xml_node node, CMPIType type) {
    std::vector<CimValue> elements;
    for (const pugi::xml_node child : node.children()) {
        if (isElement(child, "VALUE")) {
            elements.push_back(scalarFromText(elementText(child), type));
        } else if (isElement(child, "VALUE.NULL")) {
            elements.push_back(CimValue::null(type));
        } else if (isElement(child, "VALUE.REFERENCE")) {
            elements.push_back(CimValue::reference(readReference(child, "")));
        }
    }
    return CimValue::array(type, std::move(elements));
}

CimValue readKeyValue(pugi::xml_node node) {
    const std::string text = elementText(node);
    if (const pugi::xml_attribute type = node.attribute("TYPE")) {
        if (const auto known = xmlTypeByName(type.value())) return scalarFromText(text, *known);
    }
    const std::string_view kind = node.attribute("VALUETYPE").as_string("string");
    if (sameName(kind, "boolean")) return scalarFromText(text, CMPI_boolean);
    if (sameName(kind, "numeric")) return numberFromText(text);
    if (!sameName(kind, "string")) refuse(node, "no kind of key is \"" + xmlText(kind) + "\"");
    return CimValue::string(text);
}

/// The key in KEYBINDING, or the only one directly in INSTANCENAME; false when there is none.
bool readKeyIn(pugi::xml_node node, const std::string& nameSpace, CimValue& value) {
    if (const pugi::xml_node key = node.child("KEYVALUE")) {
        value = readKeyValue(key);
        return true;
    }
    const pugi::xml_node reference = node.child("VALUE.REFERENCE");
    if (reference) value = CimValue::reference(readReference(reference, nameSpace));
    return !reference.empty();
}

/// The namespace path in an object path's element.
pugi::xml_node namespacePathIn(pugi::xml_node node) {
    const pugi::xml_node path = node.child("NAMESPACEPATH");
    return path ? path : requiredChild(node, "LOCALNAMESPACEPATH");
}

}  // namespace

void parseXml(const std::string& text, pugi::xml_document& document) {
    constexpr unsigned kFlags = pugi::parse_default | pugi::parse_ws_pcdata;
    // The parser would take the end of a text for the end of the document.
    if (text.find('\0') != std::string::npos) throw CimXmlError("a NUL character in the message");
    for (const char mark : {'<', '='}) {
        if (std::count(text.begin(), text.end(), mark) > kMostMarks) {
            throw CimXmlError("more than " + std::to_string(kMostMarks) + " characters " + mark);
        }
    }
    const pugi::xml_parse_result result =
        document.load_buffer(text.data(), text.size(), kFlags, pugi::encoding_utf8);
    if (!result) {
        throw CimXmlError(std::string(result.description()) + " at byte " +
                          std::to_string(result.offset));
    }
    const auto isRoot = [](pugi::xml_node node) { return node.type() == pugi::node_element; };
    if (std::count_if(document.begin(), document.end(), isRoot) != 1) {
        throw CimXmlError("more than one element at the top");
    }
    DepthLimit limit;
    if (!document.traverse(limit)) {
        throw CimXmlError("elements nested more than " + std::to_string(kDeepestNesting) +
                          " levels deep");
    }
}

bool isElement(pugi::xml_node node, const char* name) {
    return std::string_view(node.name()) == name;
}

pugi::xml_node firstElement(pugi::xml_node node) {
    return node.find_child([](pugi::xml_node child) { return child.type() == pugi::node_element; });
}

std::string elementText(pugi::xml_node node) {
    std::string text;
    for (const pugi::xml_node child : node.children()) {
        if (child.type() == pugi::node_pcdata || child.type() == pugi::node_cdata) {
            text += child.value();
        }
    }
    return text;
}

pugi::xml_node requiredChild(pugi::xml_node node, const char* name) {
    const pugi::xml_node child = node.child(name);
    if (!child) refuse(node, std::string("no ") + name);
    return child;
}

std::string requiredAttribute(pugi::xml_node node, const char* name) {
    const std::string value = node.attribute(name).value();
    if (value.empty()) refuse(node, std::string("no attribute ") + name);
    return value;
}

CimValue readValueIn(pugi::xml_node parent, CMPIType type, bool isArray) {
    if (const pugi::xml_node reference = parent.child("VALUE.REFERENCE")) {
        return CimValue::reference(readReference(reference, ""));
    }
    pugi::xml_node array = parent.child("VALUE.ARRAY");
    if (!array) array = parent.child("VALUE.REFARRAY");
    if (array) return readArray(array, type);
    if (isArray) return CimValue::null(static_cast<CMPIType>(type | CMPI_ARRAY));
    const pugi::xml_node value = parent.child("VALUE");
    return value ? scalarFromText(elementText(value), type) : CimValue::null(type);
}

NamedValue readProperty(pugi::xml_node node) {
    std::string name = requiredAttribute(node, "NAME");
    const bool isReference = isElement(node, "PROPERTY.REFERENCE");
    const CMPIType type = isReference ? CMPI_ref : declaredType(node);
    try {
        return {std::move(name), readValueIn(node, type, isElement(node, "PROPERTY.ARRAY"))};
    } catch (const CimXmlError& error) {
        refuse(node, xmlText(name) + ": " + error.what());
    }
}

std::string readNamespace(pugi::xml_node node) {
    if (isElement(node, "NAMESPACEPATH")) {
        return readNamespace(requiredChild(node, "LOCALNAMESPACEPATH"));
    }
    std::string nameSpace;
    for (const pugi::xml_node part : node.children("NAMESPACE")) {
        if (!nameSpace.empty()) nameSpace += '/';
        nameSpace += requiredAttribute(part, "NAME");
    }
    if (nameSpace.empty()) refuse(node, "no NAMESPACE");
    return nameSpace;
}

ObjectPath readInstanceName(pugi::xml_node node, const std::string& nameSpace) {
    ObjectPath path{nameSpace, requiredAttribute(node, "CLASSNAME"), {}};
    CimValue value;
    if (readKeyIn(node, nameSpace, value)) path.keys.emplace_back("", value);
    for (const pugi::xml_node binding : node.children("KEYBINDING")) {
        if (!readKeyIn(binding, nameSpace, value)) refuse(binding, "no value");
        path.key(requiredAttribute(binding, "NAME"), value);
    }
    return path;
}

ObjectPath readObjectPath(pugi::xml_node node, const std::string& nameSpace) {
    if (isElement(node, "INSTANCENAME")) return readInstanceName(node, nameSpace);
    if (isElement(node, "CLASSNAME")) return {nameSpace, requiredAttribute(node, "NAME"), {}};
    if (isElement(node, "INSTANCEPATH") || isElement(node, "LOCALINSTANCEPATH")) {
        return readInstanceName(requiredChild(node, "INSTANCENAME"),
                                readNamespace(namespacePathIn(node)));
    }
    if (isElement(node, "CLASSPATH") || isElement(node, "LOCALCLASSPATH")) {
        return {readNamespace(namespacePathIn(node)),
                requiredAttribute(requiredChild(node, "CLASSNAME"), "NAME"),
                {}};
    }
    refuse(node, "is no object path");
}

ObjectPath readReference(pugi::xml_node node, const std::string& nameSpace) {
    const pugi::xml_node path = firstElement(node);
    if (!path) refuse(node, "no object path");
    return readObjectPath(path, nameSpace);
}

Instance readInstance(pugi::xml_node node, const std::string& nameSpace) {
    Instance instance{{nameSpace, requiredAttribute(node, "CLASSNAME"), {}}, {}};
    for (const pugi::xml_node child : node.children()) {
        if (!std::string_view(child.name()).starts_with("PROPERTY")) continue;
        NamedValue property = readProperty(child);
        instance.set(property.first, std::move(property.second));
    }
    return instance;
}

Instance readNamedInstance(pugi::xml_node node, const std::string& nameSpace) {
    if (isElement(node, "INSTANCE")) return readInstance(node, nameSpace);
    Instance instance = readInstance(requiredChild(node, "INSTANCE"), nameSpace);
    for (const pugi::xml_node child : node.children()) {
        if (child.type() != pugi::node_element || isElement(child, "INSTANCE")) continue;
        ObjectPath path = readObjectPath(child, nameSpace);
        if (!sameName(path.className, instance.path.className)) {
            refuse(node, "an instance of " + xmlText(instance.path.className) +
                             " with the name of one of " + xmlText(path.className));
        }
        instance.path = std::move(path);
        break;
    }
    return instance;
}

}  // namespace testbed
