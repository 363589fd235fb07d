// Choices drawn from an input's bytes: the same bytes make the same choices, and few of them matter
// once they have run out.
#pragma once

#include <array>
#include <cstdint>
#include <cstring>
#include <string>
#include <string_view>

#include "cim_object.h"

namespace fuzz {

class InputBytes {
public:
    explicit InputBytes(std::string_view bytes) : rest_(bytes) {}

    bool isEmpty() const { return rest_.empty(); }
    /// 0 when nothing is left.
    std::uint8_t byte() {
        if (rest_.empty()) return 0;
        const char first = rest_.front();
        rest_.remove_prefix(1);
        return static_cast<std::uint8_t>(first);
    }
    /// A number from 0 to `below` - 1, which is at most 256.
    unsigned draw(unsigned below) { return byte() % below; }
    bool flag() { return (byte() & 1) != 0; }
    template <class Number>
    Number number() {
        std::array<unsigned char, sizeof(Number)> bytes{};
        for (unsigned char& place : bytes) place = byte();
        Number number;
        std::memcpy(&number, bytes.data(), sizeof number);
        return number;
    }
    /// One element of an array.
    template <class List>
    const auto& pick(const List& list) {
        return list[draw(static_cast<unsigned>(std::size(list)))];
    }
    /// Up to 255 bytes, none of them 0.
    std::string text() {
        std::string text(rest_.substr(0, byte()));
        rest_.remove_prefix(std::min(text.size(), rest_.size()));
        for (char& c : text) {
            if (c == '\0') c = '_';
        }
        return text;
    }
    /// A value of any type, null at times.
    testbed::CimValue value();

private:
    std::string_view rest_;
};

inline testbed::CimValue InputBytes::value() {
    using testbed::CimValue;
    constexpr CMPIType kTypes[] = {CMPI_boolean, CMPI_uint8,  CMPI_uint16,  CMPI_uint32,
                                   CMPI_uint64,  CMPI_string, CMPI_uint16A, CMPI_stringA,
                                   CMPI_sint64,  CMPI_real64, CMPI_ref,     CMPI_null};
    switch (draw(14)) {
        case 0:
            return CimValue::null(pick(kTypes));
        case 1:
            return CimValue::boolean(flag());
        case 2:
            return CimValue::uint8(byte());
        case 3:
            return CimValue::uint16(number<std::uint16_t>());
        case 4:
            return CimValue::uint32(number<std::uint32_t>());
        case 5:
            return CimValue::uint64(number<std::uint64_t>());
        case 6:
            return CimValue::signedInteger(CMPI_sint64, number<std::int64_t>());
        case 7:
            return CimValue::real64(number<std::int32_t>() / 3.0);
        case 8:
            return CimValue::reference({"root/sample", "CIM_ManagedElement", {}});
        case 9:
            return CimValue::uint16Array({number<std::uint16_t>(), byte()});
        case 10:
            return CimValue::uint16Array({});
        case 11:
            return CimValue::stringArray({text(), text()});
        default:
            return CimValue::string(text());
    }
}

}  // namespace fuzz
