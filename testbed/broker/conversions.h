// Between plain CIM values and what passes through the function tables.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <optional>
#include <string>
#include <vector>

#include "cim_value.h"

namespace testbed {

class Object;

/// The value as a data item. Strings, arrays and references become objects derived from `source`.
CMPIData toData(const Object& source, const CimValue& value);

/// Reads a value that a caller passed with that type. For CMPI_chars `value` is the address of the
/// characters, for all others of a variable or of the union; NULL is a null value. The code is not
/// OK for a type that cannot be stored and for an ended object.
CMPIrc readValue(const CMPIValue* value, CMPIType type, CimValue& result);

/// True for integers and reals, not for arrays of them.
bool isNumeric(CMPIType type);

/// A NULL-terminated list of names; nothing for a NULL list.
std::optional<std::vector<std::string>> readNames(const char** names);

}  // namespace testbed
