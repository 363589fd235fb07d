// Literals of MOF and the CIM values they stand for.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "cim_value.h"

namespace testbed {

enum class MofLiteralKind { Null, Boolean, Number, String, Character, Alias };

struct MofLiteral {
    MofLiteralKind kind = MofLiteralKind::Null;
    std::string text;  ///< as MofToken has it; "true" or "false" for a boolean
};

/// One literal, or a list of them in braces.
struct MofValue {
    bool isList = false;
    std::vector<MofLiteral> literals;

    bool isNull() const { return !isList && literals[0].kind == MofLiteralKind::Null; }
};

/// The CMPI type of a MOF type name, none for an unknown one. Letter case does not matter.
std::optional<CMPIType> mofType(std::string_view name);

/// The value with a type that is declared elsewhere. None when the value does not fit it: another
/// kind of literal, a number out of range, a list for a single value.
std::optional<CimValue> typedValue(const MofValue& value, CMPIType type);

/// The value with a type that follows from the literals: boolean, string, char16, real64, and
/// uint64 or (when one is negative) sint64. An alias counts as a string. Null and empty lists are
/// strings. None for a number that cannot be read and for a list of different kinds.
std::optional<CimValue> untypedValue(const MofValue& value);

}  // namespace testbed
