// The table of CIM types, and writing and reading numbers, truth values and characters.
#include "cim_scalar.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <limits>

#include "cim_object.h"
#include "xml_text.h"

namespace testbed {
namespace {

struct TypeName {
    CMPIType type;
    const char* name;
    std::uint64_t largest;  ///< of an integer type
};

constexpr TypeName kTypes[] = {
    {CMPI_string, "string", 0},
    {CMPI_boolean, "boolean", 0},
    {CMPI_char16, "char16", 0},
    {CMPI_uint8, "uint8", std::numeric_limits<std::uint8_t>::max()},
    {CMPI_uint16, "uint16", std::numeric_limits<std::uint16_t>::max()},
    {CMPI_uint32, "uint32", std::numeric_limits<std::uint32_t>::max()},
    {CMPI_uint64, "uint64", std::numeric_limits<std::uint64_t>::max()},
    {CMPI_sint8, "sint8", std::numeric_limits<std::int8_t>::max()},
    {CMPI_sint16, "sint16", std::numeric_limits<std::int16_t>::max()},
    {CMPI_sint32, "sint32", std::numeric_limits<std::int32_t>::max()},
    {CMPI_sint64, "sint64", std::numeric_limits<std::int64_t>::max()},
    {CMPI_real32, "real32", 0},
    {CMPI_real64, "real64", 0},
    {CMPI_dateTime, "datetime", 0},
    {CMPI_ref, "reference", 0},
};

const TypeName* findType(CMPIType type) {
    const auto* found = std::find_if(std::begin(kTypes), std::end(kTypes),
                                     [&](const TypeName& entry) { return entry.type == type; });
    return found == std::end(kTypes) ? nullptr : found;
}

CMPIType elementType(CMPIType type) {
    return static_cast<CMPIType>(type & ~CMPI_ARRAY);
}

[[noreturn]] void refuse(std::string_view text, CMPIType type) {
    throw CimXmlError("\"" + xmlText(text.substr(0, 80)) + "\" is no " + xmlTypeName(type));
}

std::string_view trimmed(std::string_view text) {
    constexpr const char* kBlanks = " \t\r\n";
    const std::size_t first = text.find_first_not_of(kBlanks);
    if (first == std::string_view::npos) return {};
    return text.substr(first, text.find_last_not_of(kBlanks) - first + 1);
}

struct Number {
    bool negative = false;
    std::uint64_t magnitude = 0;
};

/// Decimal, or hexadecimal with 0x, with or without a sign.
std::optional<Number> parseInteger(std::string_view text) {
    Number number;
    number.negative = text.starts_with('-');
    if (text.starts_with('-') || text.starts_with('+')) text.remove_prefix(1);
    const bool hex = text.starts_with("0x") || text.starts_with("0X");
    if (hex) text.remove_prefix(2);
    const char* end = text.data() + text.size();
    const auto [stop, error] = std::from_chars(text.data(), end, number.magnitude, hex ? 16 : 10);
    if (text.empty() || error != std::errc() || stop != end) return std::nullopt;
    return number;
}

/// Does not use the process's locale.
std::optional<double> parseReal(std::string_view text) {
    if (text.starts_with('+')) text.remove_prefix(1);
    double value = 0;
    const char* end = text.data() + text.size();
    const auto [stop, error] = std::from_chars(text.data(), end, value);
    if (text.empty() || error != std::errc() || stop != end) return std::nullopt;
    return value;
}

CimValue integer(std::string_view text, const TypeName& type) {
    const auto number = parseInteger(text);
    if (!number) refuse(text, type.type);
    if ((type.type & CMPI_SINT) == CMPI_SINT) {
        if (number->magnitude > type.largest + (number->negative ? 1 : 0)) refuse(text, type.type);
        const std::uint64_t bits = number->negative ? 0 - number->magnitude : number->magnitude;
        return CimValue::signedInteger(type.type, static_cast<std::int64_t>(bits));
    }
    if (number->magnitude > type.largest || (number->negative && number->magnitude != 0)) {
        refuse(text, type.type);
    }
    return CimValue::unsignedInteger(type.type, number->magnitude);
}

CimValue boolean(std::string_view text) {
    if (sameName(text, "true")) return CimValue::boolean(true);
    if (!sameName(text, "false")) refuse(text, CMPI_boolean);
    return CimValue::boolean(false);
}

CimValue character(std::string_view text) {
    const auto [first, size] = firstCharacter(text);
    if (size == 0 || size != text.size() || first > 0xffff) refuse(text, CMPI_char16);
    return CimValue::unsignedInteger(CMPI_char16, first);
}

/// The shortest decimal form that reads back as the same number; with a point, as CIM-XML has it.
template <class Real>
std::string realText(Real value) {
    if (std::isnan(value)) return "NaN";
    if (std::isinf(value)) return value < 0 ? "-INF" : "INF";
    std::array<char, 64> buffer{};
    const auto [end, error] = std::to_chars(buffer.data(), buffer.data() + buffer.size(), value);
    std::string text(buffer.data(), end);
    if (text.find('.') == std::string::npos) {
        text.insert(std::min(text.find('e'), text.size()), ".0");
    }
    return text;
}

}  // namespace

std::string xmlTypeName(CMPIType type) {
    const TypeName* known = findType(elementType(type));
    return known ? known->name : "string";
}

std::optional<CMPIType> xmlTypeByName(std::string_view name) {
    for (const TypeName& type : kTypes) {
        if (sameName(type.name, name)) return type.type;
    }
    return std::nullopt;
}

std::string scalarText(const CimValue& value) {
    if (const auto* flag = std::get_if<bool>(&value.data)) return *flag ? "TRUE" : "FALSE";
    if (const auto* real = std::get_if<double>(&value.data)) {
        return value.type == CMPI_real32 ? realText(static_cast<float>(*real)) : realText(*real);
    }
    const auto* number = std::get_if<std::uint64_t>(&value.data);
    if (number && value.type == CMPI_char16) {
        return xmlText(utf8Character(static_cast<char32_t>(*number)));
    }
    return xmlText(value.text());
}

CimValue scalarFromText(std::string_view text, CMPIType type) {
    switch (type) {
        case CMPI_string:
            return CimValue::string(std::string(text));
        case CMPI_dateTime:
            return CimValue{CMPI_dateTime, false, std::string(trimmed(text))};
        case CMPI_char16:
            return character(text);
        case CMPI_boolean:
            return boolean(trimmed(text));
        case CMPI_real32:
        case CMPI_real64: {
            const auto real = parseReal(trimmed(text));
            if (!real) refuse(text, type);
            return CimValue{type, false, *real};
        }
        default: {
            const TypeName* known = findType(type);
            if (!known || known->largest == 0) refuse(text, type);
            return integer(trimmed(text), *known);
        }
    }
}

CimValue numberFromText(std::string_view text) {
    const std::string_view digits = trimmed(text);
    if (const auto number = parseInteger(digits)) {
        if (!number->negative) return CimValue::uint64(number->magnitude);
        return scalarFromText(digits, CMPI_sint64);
    }
    const auto real = parseReal(digits);
    if (!real) throw CimXmlError("\"" + xmlText(text.substr(0, 80)) + "\" is no number");
    return CimValue::real64(*real);
}

}  // namespace testbed
