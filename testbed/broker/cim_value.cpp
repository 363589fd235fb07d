// Making CIM values, comparing them and showing them as text.
#include "cim_value.h"

#include <cstdio>
#include <map>
#include <utility>

#include "cim_object.h"

namespace testbed {

namespace {

template <class... Functions>
struct Overloaded : Functions... {
    using Functions::operator()...;
};
template <class... Functions>
Overloaded(Functions...) -> Overloaded<Functions...>;

/// Texts have one type, however a provider passed them.
CMPIType storedType(CMPIType type) {
    if ((type & ~CMPI_ARRAY) != CMPI_chars) return type;
    return static_cast<CMPIType>(CMPI_string | (type & CMPI_ARRAY));
}

CimValue make(CMPIType type, CimValue::Data data) {
    return CimValue{storedType(type), false, std::move(data)};
}

std::string joined(const std::vector<CimValue>& elements) {
    std::string text = "[";
    for (const CimValue& element : elements) {
        if (text.size() > 1) text += ", ";
        text += element.text();
    }
    return text + "]";
}

std::string realText(double value) {
    char text[32];
    std::snprintf(text, sizeof text, "%.15g", value);
    return text;
}

}  // namespace

bool CimValue::operator==(const CimValue& other) const {
    if (type != other.type || isNull != other.isNull) return false;
    if (isNull) return true;
    using Reference = std::shared_ptr<const ObjectPath>;
    const auto* left = std::get_if<Reference>(&data);
    const auto* right = std::get_if<Reference>(&other.data);
    if (left && right && *left && *right) return **left == **right;
    return data == other.data;
}

CimValue CimValue::null(CMPIType type) {
    return CimValue{storedType(type), true, {}};
}

CimValue CimValue::boolean(bool value) {
    return make(CMPI_boolean, value);
}

CimValue CimValue::unsignedInteger(CMPIType type, std::uint64_t value) {
    return make(type, value);
}

CimValue CimValue::signedInteger(CMPIType type, std::int64_t value) {
    return make(type, value);
}

CimValue CimValue::uint8(std::uint8_t value) {
    return unsignedInteger(CMPI_uint8, value);
}

CimValue CimValue::uint16(std::uint16_t value) {
    return unsignedInteger(CMPI_uint16, value);
}

CimValue CimValue::uint32(std::uint32_t value) {
    return unsignedInteger(CMPI_uint32, value);
}

CimValue CimValue::uint64(std::uint64_t value) {
    return unsignedInteger(CMPI_uint64, value);
}

CimValue CimValue::real64(double value) {
    return make(CMPI_real64, value);
}

CimValue CimValue::string(std::string value) {
    return make(CMPI_string, std::move(value));
}

CimValue CimValue::reference(ObjectPath value) {
    return make(CMPI_ref, std::make_shared<const ObjectPath>(std::move(value)));
}

CimValue CimValue::array(CMPIType elementType, std::vector<CimValue> elements) {
    return make(static_cast<CMPIType>(elementType | CMPI_ARRAY), std::move(elements));
}

CimValue CimValue::uint16Array(std::initializer_list<std::uint16_t> values) {
    std::vector<CimValue> elements;
    for (std::uint16_t value : values) elements.push_back(uint16(value));
    return array(CMPI_uint16, std::move(elements));
}

CimValue CimValue::stringArray(std::initializer_list<std::string> values) {
    std::vector<CimValue> elements;
    for (const std::string& value : values) elements.push_back(string(value));
    return array(CMPI_string, std::move(elements));
}

std::string CimValue::text() const {
    if (isNull) return "<null>";
    return std::visit(Overloaded{
                          [](std::monostate) { return std::string("<null>"); },
                          [](bool value) { return std::string(value ? "true" : "false"); },
                          [](std::uint64_t value) { return std::to_string(value); },
                          [](std::int64_t value) { return std::to_string(value); },
                          [](double value) { return realText(value); },
                          [](const std::string& value) { return value; },
                          [](const std::vector<CimValue>& elements) { return joined(elements); },
                          [](const std::shared_ptr<const ObjectPath>& path) {
                              return path ? path->text() : std::string("<null>");
                          },
                      },
                      data);
}

const std::string& CimValue::asString() const {
    static const std::string none;
    const auto* value = std::get_if<std::string>(&data);
    return value && !isNull ? *value : none;
}

std::uint64_t CimValue::asUnsigned() const {
    if (isNull) return 0;
    return std::visit(Overloaded{
                          [](std::uint64_t value) { return value; },
                          [](std::int64_t value) { return static_cast<std::uint64_t>(value); },
                          [](bool value) { return std::uint64_t{value}; },
                          [](const std::vector<CimValue>& elements) {
                              return elements.empty() ? 0 : elements.front().asUnsigned();
                          },
                          [](const auto&) { return std::uint64_t{0}; },
                      },
                      data);
}

std::string typeName(CMPIType type) {
    static const std::map<CMPIType, const char*> names = {
        {CMPI_null, "null"},         {CMPI_boolean, "boolean"}, {CMPI_char16, "char16"},
        {CMPI_real32, "real32"},     {CMPI_real64, "real64"},   {CMPI_uint8, "uint8"},
        {CMPI_uint16, "uint16"},     {CMPI_uint32, "uint32"},   {CMPI_uint64, "uint64"},
        {CMPI_sint8, "sint8"},       {CMPI_sint16, "sint16"},   {CMPI_sint32, "sint32"},
        {CMPI_sint64, "sint64"},     {CMPI_ref, "reference"},   {CMPI_instance, "instance"},
        {CMPI_dateTime, "datetime"}, {CMPI_string, "string"},   {CMPI_chars, "string"},
    };
    const auto found = names.find(static_cast<CMPIType>(type & ~CMPI_ARRAY));
    if (found != names.end()) return std::string(found->second) + (type & CMPI_ARRAY ? "[]" : "");
    char text[16];
    std::snprintf(text, sizeof text, "type 0x%04x", type);
    return text;
}

}  // namespace testbed
