// Reading integers, reals and texts, and fitting them to a CIM type.
#include "mof_value.h"

#include <algorithm>
#include <charconv>
#include <limits>

#include "cim_object.h"

namespace testbed {
namespace {

struct IntegerRange {
    CMPIType type;
    std::uint64_t largest;
    std::uint64_t largestNegative;  ///< as a positive number
};

constexpr IntegerRange kIntegers[] = {
    {CMPI_uint8, 0xff, 0},
    {CMPI_uint16, 0xffff, 0},
    {CMPI_uint32, 0xffffffff, 0},
    {CMPI_uint64, std::numeric_limits<std::uint64_t>::max(), 0},
    {CMPI_sint8, 0x7f, 0x80},
    {CMPI_sint16, 0x7fff, 0x8000},
    {CMPI_sint32, 0x7fffffff, 0x80000000},
    {CMPI_sint64, 0x7fffffffffffffff, 0x8000000000000000},
    {CMPI_char16, 0xffff, 0},
};

const IntegerRange* rangeOf(CMPIType type) {
    const auto* found = std::find_if(std::begin(kIntegers), std::end(kIntegers),
                                     [&](const IntegerRange& row) { return row.type == type; });
    return found == std::end(kIntegers) ? nullptr : found;
}

struct Integer {
    bool isNegative = false;
    std::uint64_t magnitude = 0;
};

/// All of the text as a number to that base; none for anything else and for more than 64 bits.
std::optional<std::uint64_t> digits(std::string_view text, int base) {
    std::uint64_t number = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number, base);
    if (error != std::errc() || end != text.data() + text.size()) return std::nullopt;
    return number;
}

/// Decimal, 0x…, 0… (octal) or …b (binary).
std::optional<Integer> integerOf(std::string_view text) {
    Integer result;
    if (!text.empty() && (text[0] == '+' || text[0] == '-')) {
        result.isNegative = text[0] == '-';
        text.remove_prefix(1);
    }
    int base = 10;
    if (text.size() > 2 && text[0] == '0' && (text[1] | 0x20) == 'x') {
        base = 16;
        text.remove_prefix(2);
    } else if (text.size() > 1 && (text.back() | 0x20) == 'b') {
        base = 2;
        text.remove_suffix(1);
    } else if (text.size() > 1 && text[0] == '0') {
        base = 8;
    }
    const auto magnitude = digits(text, base);
    if (!magnitude) return std::nullopt;
    result.magnitude = *magnitude;
    return result;
}

std::optional<double> realOf(std::string_view text) {
    if (!text.empty() && text[0] == '+') text.remove_prefix(1);
    double number = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    if (error != std::errc() || end != text.data() + text.size()) return std::nullopt;
    return number;
}

std::optional<CimValue> integerValue(const Integer& integer, const IntegerRange& range) {
    const std::uint64_t limit = integer.isNegative ? range.largestNegative : range.largest;
    if (integer.magnitude > limit) return std::nullopt;
    const std::uint64_t bits = integer.isNegative ? 0 - integer.magnitude : integer.magnitude;
    if (range.largestNegative == 0) return CimValue::unsignedInteger(range.type, bits);
    return CimValue::signedInteger(range.type, static_cast<std::int64_t>(bits));
}

std::optional<CimValue> numberValue(const MofLiteral& literal, CMPIType type) {
    if (const IntegerRange* range = rangeOf(type)) {
        const auto integer = integerOf(literal.text);
        return integer ? integerValue(*integer, *range) : std::nullopt;
    }
    const auto real = realOf(literal.text);
    if (!real) return std::nullopt;
    return CimValue{type, false, *real};
}

/// `type` is no array.
std::optional<CimValue> typedLiteral(const MofLiteral& literal, CMPIType type) {
    const bool isReal = type == CMPI_real32 || type == CMPI_real64;
    switch (literal.kind) {
        case MofLiteralKind::Null:
            return CimValue::null(type);
        case MofLiteralKind::Boolean:
            if (type == CMPI_boolean) return CimValue::boolean(literal.text == "true");
            return std::nullopt;
        case MofLiteralKind::String:
            if (type == CMPI_string) return CimValue::string(literal.text);
            if (type == CMPI_dateTime) return CimValue{type, false, literal.text};
            return std::nullopt;
        case MofLiteralKind::Alias:
            if (type == CMPI_string) return CimValue::string(literal.text);
            return std::nullopt;
        case MofLiteralKind::Character:
            if (type == CMPI_char16) return numberValue(literal, type);
            return std::nullopt;
        case MofLiteralKind::Number:
            if (isReal || (rangeOf(type) && type != CMPI_char16)) return numberValue(literal, type);
            return std::nullopt;
    }
    return std::nullopt;
}

/// The type of those that untypedValue knows.
CMPIType naturalType(const MofLiteral& literal) {
    switch (literal.kind) {
        case MofLiteralKind::Boolean:
            return CMPI_boolean;
        case MofLiteralKind::Character:
            return CMPI_char16;
        case MofLiteralKind::Number:
            if (!integerOf(literal.text)) return CMPI_real64;
            return literal.text[0] == '-' ? CMPI_sint64 : CMPI_uint64;
        default:
            return CMPI_string;
    }
}

}  // namespace

std::optional<CMPIType> mofType(std::string_view name) {
    static constexpr CMPIType kTypes[] = {
        CMPI_boolean, CMPI_string, CMPI_dateTime, CMPI_char16, CMPI_uint8,
        CMPI_uint16,  CMPI_uint32, CMPI_uint64,   CMPI_sint8,  CMPI_sint16,
        CMPI_sint32,  CMPI_sint64, CMPI_real32,   CMPI_real64,
    };
    for (const CMPIType type : kTypes) {
        if (sameName(typeName(type), name)) return type;
    }
    return std::nullopt;
}

std::optional<CimValue> typedValue(const MofValue& value, CMPIType type) {
    const bool isArray = (type & CMPI_ARRAY) != 0;
    if (value.isNull()) return CimValue::null(type);
    if (value.isList != isArray) return std::nullopt;
    const auto elementType = static_cast<CMPIType>(type & ~CMPI_ARRAY);
    std::vector<CimValue> elements;
    for (const MofLiteral& literal : value.literals) {
        auto element = typedLiteral(literal, elementType);
        if (!element) return std::nullopt;
        elements.push_back(std::move(*element));
    }
    if (!isArray) return elements.front();
    return CimValue::array(elementType, std::move(elements));
}

std::optional<CimValue> untypedValue(const MofValue& value) {
    CMPIType type = CMPI_null;
    for (const MofLiteral& literal : value.literals) {
        if (literal.kind == MofLiteralKind::Null) continue;
        const CMPIType natural = naturalType(literal);
        // One negative number makes the others signed too.
        if (type == CMPI_null || (type == CMPI_uint64 && natural == CMPI_sint64)) type = natural;
    }
    if (type == CMPI_null) type = CMPI_string;
    return typedValue(value, static_cast<CMPIType>(value.isList ? type | CMPI_ARRAY : type));
}

}  // namespace testbed
