// Appending values, keys, qualifiers and class members, and writing the document out.
#include "cim_xml_write.h"

#include <algorithm>

#include "cim_scalar.h"
#include "xml_text.h"

namespace testbed {
namespace {

using Elements = std::vector<CimValue>;
using Reference = std::shared_ptr<const ObjectPath>;

void addText(pugi::xml_node node, const std::string& text) {
    node.append_child(pugi::node_pcdata).set_value(text.c_str());
}

void addAttribute(pugi::xml_node node, const char* name, std::string_view value) {
    node.append_attribute(name) = xmlText(value).c_str();
}

const Reference* referenceIn(const CimValue& value) {
    const auto* reference = std::get_if<Reference>(&value.data);
    return reference && *reference ? reference : nullptr;
}

/// VALUE.REFERENCE tells the namespace when there is one to tell.
void writeReference(pugi::xml_node parent, const ObjectPath& path, KeyTypes types) {
    pugi::xml_node node = parent.append_child("VALUE.REFERENCE");
    if (!path.nameSpace.empty()) {
        node = node.append_child("LOCALINSTANCEPATH");
        writeLocalNamespacePath(node, path.nameSpace);
    }
    writeInstanceName(node, path, types);
}

void writeArray(pugi::xml_node parent, const Elements& elements) {
    pugi::xml_node array = parent.append_child("VALUE.ARRAY");
    for (const CimValue& element : elements) {
        if (element.isNull) {
            array.append_child("VALUE.NULL");
        } else {
            addText(array.append_child("VALUE"), scalarText(element));
        }
    }
}

const char* keyValueType(const CimValue& value) {
    if (value.isNull || value.isArray()) return "string";
    if (value.type == CMPI_boolean) return "boolean";
    return (value.type & (CMPI_INTEGER | CMPI_REAL)) != 0 && (value.type & CMPI_ENC) == 0
               ? "numeric"
               : "string";
}

void writeKey(pugi::xml_node parent, const NamedValue& key, KeyTypes types) {
    pugi::xml_node binding = parent.append_child("KEYBINDING");
    addAttribute(binding, "NAME", key.first);
    if (const Reference* reference = referenceIn(key.second)) {
        writeReference(binding, **reference, types);
        return;
    }
    pugi::xml_node node = binding.append_child("KEYVALUE");
    addAttribute(node, "VALUETYPE", keyValueType(key.second));
    if (types == KeyTypes::Told) addAttribute(node, "TYPE", xmlTypeName(key.second.type));
    // A key that was never given a value reaches clients as an empty text.
    addText(node, key.second.isNull ? std::string() : scalarText(key.second));
}

const PropertyDefinition* findDefinition(const std::vector<PropertyDefinition>& properties,
                                         std::string_view name) {
    const auto found =
        std::find_if(properties.begin(), properties.end(),
                     [&](const PropertyDefinition& entry) { return sameName(entry.name, name); });
    return found == properties.end() ? nullptr : &*found;
}

void writeQualifiers(pugi::xml_node parent, const Qualifiers& qualifiers) {
    for (const NamedValue& qualifier : qualifiers) writeQualifier(parent, qualifier);
}

const char* propertyElement(const CimValue& value) {
    if (value.isArray()) return "PROPERTY.ARRAY";
    return value.type == CMPI_ref ? "PROPERTY.REFERENCE" : "PROPERTY";
}

/// The element of a property without what stands in it.
pugi::xml_node openProperty(pugi::xml_node parent, const std::string& name, const CimValue& value) {
    pugi::xml_node node = parent.append_child(propertyElement(value));
    addAttribute(node, "NAME", name);
    if (value.type != CMPI_ref) addAttribute(node, "TYPE", xmlTypeName(value.type));
    return node;
}

void writeInstanceProperty(pugi::xml_node parent, const NamedValue& property,
                           const InstanceDetails& details) {
    pugi::xml_node node = openProperty(parent, property.first, property.second);
    const PropertyDefinition* known = findDefinition(details.properties, property.first);
    if (known && details.withClassOrigin) addAttribute(node, "CLASSORIGIN", known->originClass);
    if (known && details.withQualifiers) writeQualifiers(node, known->qualifiers);
    writeValue(node, property.second);
}

void writeClassProperty(pugi::xml_node parent, const PropertyDefinition& property,
                        const ClassView& view) {
    CimValue value = property.defaultValue;
    if (value.isNull) value = CimValue::null(property.type);
    pugi::xml_node node = openProperty(parent, property.name, value);
    if (!property.referenceClass.empty()) {
        addAttribute(node, "REFERENCECLASS", property.referenceClass);
    }
    if (view.withClassOrigin) addAttribute(node, "CLASSORIGIN", property.originClass);
    if (!findDefinition(view.definition.properties, property.name)) {
        addAttribute(node, "PROPAGATED", "true");
    }
    if (view.withQualifiers) {
        if (property.isKey) writeQualifier(node, {"Key", CimValue::boolean(true)});
        writeQualifiers(node, property.qualifiers);
    }
    writeValue(node, value);
}

const char* parameterElement(const ParameterDefinition& parameter) {
    const bool isArray = (parameter.type & CMPI_ARRAY) != 0;
    if ((parameter.type & ~CMPI_ARRAY) == CMPI_ref) {
        return isArray ? "PARAMETER.REFARRAY" : "PARAMETER.REFERENCE";
    }
    return isArray ? "PARAMETER.ARRAY" : "PARAMETER";
}

void writeParameter(pugi::xml_node parent, const ParameterDefinition& parameter,
                    bool withQualifiers) {
    pugi::xml_node node = parent.append_child(parameterElement(parameter));
    addAttribute(node, "NAME", parameter.name);
    if ((parameter.type & ~CMPI_ARRAY) != CMPI_ref) {
        addAttribute(node, "TYPE", xmlTypeName(parameter.type));
    } else if (!parameter.referenceClass.empty()) {
        addAttribute(node, "REFERENCECLASS", parameter.referenceClass);
    }
    if (withQualifiers) writeQualifiers(node, parameter.qualifiers);
}

void writeMethod(pugi::xml_node parent, const MethodDefinition& method, const ClassView& view) {
    pugi::xml_node node = parent.append_child("METHOD");
    addAttribute(node, "NAME", method.name);
    addAttribute(node, "TYPE", xmlTypeName(method.type));
    if (view.withClassOrigin) addAttribute(node, "CLASSORIGIN", method.originClass);
    const auto& own = view.definition.methods;
    if (std::none_of(own.begin(), own.end(), [&](const MethodDefinition& entry) {
            return sameName(entry.name, method.name);
        })) {
        addAttribute(node, "PROPAGATED", "true");
    }
    if (view.withQualifiers) writeQualifiers(node, method.qualifiers);
    for (const ParameterDefinition& parameter : method.parameters) {
        writeParameter(node, parameter, view.withQualifiers);
    }
}

/// Line ends of the carriage return kind survive only as character references.
struct TextWriter : pugi::xml_writer {
    std::string text;
    void write(const void* data, std::size_t size) override {
        for (const char byte : std::string_view(static_cast<const char*>(data), size)) {
            if (byte == '\r') {
                text += "&#13;";
            } else {
                text += byte;
            }
        }
    }
};

}  // namespace

void writeValue(pugi::xml_node parent, const CimValue& value) {
    if (value.isNull) return;
    if (const auto* elements = std::get_if<Elements>(&value.data)) {
        writeArray(parent, *elements);
    } else if (const Reference* reference = referenceIn(value)) {
        writeReference(parent, **reference, KeyTypes::Told);
    } else {
        addText(parent.append_child("VALUE"), scalarText(value));
    }
}

pugi::xml_node writeProperty(pugi::xml_node parent, const NamedValue& property) {
    const pugi::xml_node node = openProperty(parent, property.first, property.second);
    writeValue(node, property.second);
    return node;
}

void writeQualifier(pugi::xml_node parent, const NamedValue& qualifier) {
    pugi::xml_node node = parent.append_child("QUALIFIER");
    addAttribute(node, "NAME", qualifier.first);
    addAttribute(node, "TYPE", xmlTypeName(qualifier.second.type));
    writeValue(node, qualifier.second);
}

void writeLocalNamespacePath(pugi::xml_node parent, std::string_view nameSpace) {
    pugi::xml_node node = parent.append_child("LOCALNAMESPACEPATH");
    while (!nameSpace.empty()) {
        const std::size_t end = std::min(nameSpace.find('/'), nameSpace.size());
        if (end > 0) addAttribute(node.append_child("NAMESPACE"), "NAME", nameSpace.substr(0, end));
        nameSpace.remove_prefix(std::min(end + 1, nameSpace.size()));
    }
}

void writeNamespacePath(pugi::xml_node parent, std::string_view nameSpace, std::string_view host) {
    pugi::xml_node node = parent.append_child("NAMESPACEPATH");
    addText(node.append_child("HOST"), xmlText(host));
    writeLocalNamespacePath(node, nameSpace);
}

void writeClassName(pugi::xml_node parent, std::string_view className) {
    addAttribute(parent.append_child("CLASSNAME"), "NAME", className);
}

void writeInstanceName(pugi::xml_node parent, const ObjectPath& path, KeyTypes types) {
    pugi::xml_node node = parent.append_child("INSTANCENAME");
    addAttribute(node, "CLASSNAME", path.className);
    for (const NamedValue& key : path.keys) writeKey(node, key, types);
}

void writeLocalInstancePath(pugi::xml_node parent, const ObjectPath& path) {
    const pugi::xml_node node = parent.append_child("LOCALINSTANCEPATH");
    writeLocalNamespacePath(node, path.nameSpace);
    writeInstanceName(node, path, KeyTypes::Told);
}

void writeInstancePath(pugi::xml_node parent, const ObjectPath& path, std::string_view host) {
    const pugi::xml_node node = parent.append_child("INSTANCEPATH");
    writeNamespacePath(node, path.nameSpace, host);
    writeInstanceName(node, path, KeyTypes::Told);
}

void writeInstance(pugi::xml_node parent, const Instance& instance,
                   const InstanceDetails& details) {
    pugi::xml_node node = parent.append_child("INSTANCE");
    addAttribute(node, "CLASSNAME", instance.path.className);
    if (details.withQualifiers) writeQualifiers(node, details.qualifiers);
    for (const NamedValue& property : instance.properties) {
        writeInstanceProperty(node, property, details);
    }
}

void writeNamedInstance(pugi::xml_node parent, const Instance& instance,
                        const InstanceDetails& details) {
    const pugi::xml_node node = parent.append_child("VALUE.NAMEDINSTANCE");
    writeInstanceName(node, instance.path, KeyTypes::Told);
    writeInstance(node, instance, details);
}

void writeObjectWithPath(pugi::xml_node parent, const Instance& instance, std::string_view host,
                         const InstanceDetails& details) {
    const pugi::xml_node node = parent.append_child("VALUE.OBJECTWITHPATH");
    writeInstancePath(node, instance.path, host);
    writeInstance(node, instance, details);
}

void writeClass(pugi::xml_node parent, const ClassView& view) {
    pugi::xml_node node = parent.append_child("CLASS");
    addAttribute(node, "NAME", view.definition.name);
    if (!view.definition.superclass.empty()) {
        addAttribute(node, "SUPERCLASS", view.definition.superclass);
    }
    if (view.withQualifiers) {
        if (view.definition.isAssociation) {
            writeQualifier(node, {"Association", CimValue::boolean(true)});
        }
        writeQualifiers(node, view.definition.qualifiers);
    }
    for (const PropertyDefinition& property : view.properties) {
        writeClassProperty(node, property, view);
    }
    for (const MethodDefinition& method : view.methods) writeMethod(node, method, view);
}

std::string serialize(const pugi::xml_document& document) {
    // There are clients that do not take <PROPERTY/> for a property without a value.
    constexpr unsigned kFormat = pugi::format_raw | pugi::format_no_empty_element_tags;
    TextWriter writer;
    document.save(writer, "", kFormat, pugi::encoding_utf8);
    return std::move(writer.text);
}

}  // namespace testbed
