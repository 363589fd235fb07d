// Values that a vendor should not give: each property reader has to live with them.
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "repository.h"

namespace plexortest {

struct OddValue {
    std::string label;
    std::optional<testbed::CimValue> value;  ///< none: the property is missing
};

/// What is of no use in place of a text, a number or an array.
inline testbed::CimValue oddReference() {
    return testbed::CimValue::reference({"root/sample", "CIM_ManagedElement", {}});
}

/// In place of a number or truth value.
inline std::vector<OddValue> oddNumbers() {
    using testbed::CimValue;
    return {{"missing", {}},
            {"null of its type", CimValue::null(CMPI_uint16)},
            {"null without type", CimValue::null(CMPI_null)},
            {"text", CimValue::string("17")},
            {"null text", CimValue::null(CMPI_string)},
            {"array", CimValue::uint16Array({17})},
            {"null array", CimValue::null(CMPI_uint16A)},
            {"array of texts", CimValue::stringArray({"17"})},
            {"real", CimValue::real64(17)},
            {"reference", oddReference()}};
}

/// In place of a text.
inline std::vector<OddValue> oddTexts() {
    using testbed::CimValue;
    return {{"missing", {}},
            {"null", CimValue::null(CMPI_string)},
            {"null without type", CimValue::null(CMPI_null)},
            {"null number", CimValue::null(CMPI_uint16)},
            {"number", CimValue::uint32(17)},
            {"large number", CimValue::uint64(0xDEAD'BEEF'DEAD'BEEF)},
            {"truth value", CimValue::boolean(true)},
            {"real", CimValue::real64(1.5)},
            {"array of texts", CimValue::stringArray({"text"})},
            {"array of numbers", CimValue::uint16Array({17})},
            {"reference", oddReference()}};
}

/// In place of an array of numbers.
inline std::vector<OddValue> oddArrays() {
    using testbed::CimValue;
    return {{"missing", {}},
            {"null array", CimValue::null(CMPI_uint16A)},
            {"empty array", CimValue::array(CMPI_uint16, {})},
            {"array with a null", CimValue::array(CMPI_uint16, {CimValue::null(CMPI_uint16)})},
            {"array of texts", CimValue::stringArray({"17"})},
            {"number", CimValue::uint16(17)},
            {"large number", CimValue::uint64(0xDEAD'BEEF'DEAD'BEEF)},
            {"text", CimValue::string("17")},
            {"reference", oddReference()}};
}

}  // namespace plexortest
