// One CIM value as it travels between provider, repository and client.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <cstdint>
#include <memory>
#include <string>
#include <variant>
#include <vector>

namespace testbed {

struct ObjectPath;

/// A typed CIM value. `type` is a CMPI type code; texts always have CMPI_string (or CMPI_stringA),
/// whatever type they were set with. Values are plain data and may be copied between threads.
struct CimValue {
    using Data =
        std::variant<std::monostate, bool, std::uint64_t, std::int64_t, double, std::string,
                     std::vector<CimValue>, std::shared_ptr<const ObjectPath>>;

    CMPIType type = CMPI_null;
    bool isNull = true;
    Data data;

    bool operator==(const CimValue& other) const;

    bool isArray() const { return (type & CMPI_ARRAY) != 0; }

    static CimValue null(CMPIType type);
    static CimValue boolean(bool value);
    static CimValue unsignedInteger(CMPIType type, std::uint64_t value);
    static CimValue signedInteger(CMPIType type, std::int64_t value);
    static CimValue uint8(std::uint8_t value);
    static CimValue uint16(std::uint16_t value);
    static CimValue uint32(std::uint32_t value);
    static CimValue uint64(std::uint64_t value);
    static CimValue real64(double value);
    static CimValue string(std::string value);
    static CimValue reference(ObjectPath value);
    /// `elementType` without the array flag; every element has that type or is null.
    static CimValue array(CMPIType elementType, std::vector<CimValue> elements);
    static CimValue uint16Array(std::initializer_list<std::uint16_t> values);
    static CimValue stringArray(std::initializer_list<std::string> values);

    /// The value as people read it ("RAID5", "[2]", "true"); "<null>" for a null value.
    std::string text() const;
    /// The text of a string value; "" for everything else.
    const std::string& asString() const;
    /// The number of an integer or boolean value (first element of an array); 0 for everything
    /// else.
    std::uint64_t asUnsigned() const;
};

/// The CIM name of a type code: "uint16", "string[]", …; "type 0x…" for an unknown one.
std::string typeName(CMPIType type);

}  // namespace testbed
