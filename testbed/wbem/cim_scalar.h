// CIM types and single values as CIM-XML spells them.
#pragma once

#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>

#include "cim_value.h"

namespace testbed {

/// A message or a part of one that is not what CIM-XML foresees; the text is for people.
struct CimXmlError : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/// What the attribute TYPE says for a type or for its elements: "uint16", "datetime", "reference";
/// "string" for a type that CIM-XML has no name for.
std::string xmlTypeName(CMPIType type);

/// The type of that name, without regard to case; none for an unknown name.
std::optional<CMPIType> xmlTypeByName(std::string_view name);

/// A value that is neither null nor an array, as the text of VALUE or KEYVALUE.
std::string scalarText(const CimValue& value);

/// The value that a text stands for. Throws CimXmlError when the text is none of the type, or its
/// number does not fit into it.
CimValue scalarFromText(std::string_view text, CMPIType type);

/// A key without a declared type: the narrowest of uint64, sint64 and real64 that holds the number.
/// Throws CimXmlError when the text is no number.
CimValue numberFromText(std::string_view text);

}  // namespace testbed
