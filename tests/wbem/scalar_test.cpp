// Single values: their spelling in CIM-XML, and what is refused.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "cim_scalar.h"
#include "xml_text.h"

namespace testbed {
namespace {

struct Spelling {
    CimValue value;
    const char* text;
};

const Spelling kSpellings[] = {
    {CimValue::string(" a <b>& \"c\" "), " a <b>& \"c\" "},
    {CimValue::string(""), ""},
    {CimValue::boolean(true), "TRUE"},
    {CimValue::boolean(false), "FALSE"},
    {CimValue::uint8(255), "255"},
    {CimValue::uint16(0), "0"},
    {CimValue::uint64(18446744073709551615U), "18446744073709551615"},
    {CimValue::signedInteger(CMPI_sint8, -128), "-128"},
    {CimValue::signedInteger(CMPI_sint64, std::numeric_limits<std::int64_t>::min()),
     "-9223372036854775808"},
    {CimValue::unsignedInteger(CMPI_char16, 0x20ac), "\xe2\x82\xac"},
    {CimValue::real64(5), "5.0"},
    {CimValue::real64(-0.1), "-0.1"},
    {CimValue::real64(1e300), "1.0e+300"},
    {CimValue{CMPI_real32, false, static_cast<double>(0.1F)}, "0.1"},
    {CimValue::real64(std::numeric_limits<double>::infinity()), "INF"},
    {CimValue{CMPI_dateTime, false, std::string("20260101000000.000000+000")},
     "20260101000000.000000+000"},
};

TEST(Scalar, IsSpelledAsCimXmlHasIt) {
    for (const auto& [value, text] : kSpellings) EXPECT_EQ(scalarText(value), text);
}

TEST(Scalar, ReadsBackAsTheSameValue) {
    for (const auto& [value, text] : kSpellings) {
        const CimValue read = scalarFromText(text, value.type);
        if (value.type == CMPI_real32)
            EXPECT_FLOAT_EQ(static_cast<float>(std::get<double>(read.data)), 0.1F);
        else
            EXPECT_EQ(read, value) << text;
    }
}

TEST(Scalar, TakesWhatServersWrite) {
    EXPECT_EQ(scalarFromText("true", CMPI_boolean), CimValue::boolean(true));
    EXPECT_EQ(scalarFromText(" 17\n", CMPI_uint16), CimValue::uint16(17));
    EXPECT_EQ(scalarFromText("+0x1F", CMPI_uint8), CimValue::uint8(31));
    EXPECT_EQ(scalarFromText("+1.5E+3", CMPI_real64), CimValue::real64(1500));
    EXPECT_TRUE(std::isnan(std::get<double>(scalarFromText("NaN", CMPI_real64).data)));
}

TEST(Scalar, RefusesWhatTheTypeDoesNotHold) {
    const std::pair<const char*, CMPIType> bad[] = {
        {"256", CMPI_uint8},
        {"-1", CMPI_uint16},
        {"", CMPI_uint32},
        {"1x", CMPI_uint32},
        {"128", CMPI_sint8},
        {"-129", CMPI_sint8},
        {"--1", CMPI_sint32},
        {"1.5", CMPI_sint32},
        {"18446744073709551616", CMPI_uint64},
        {"yes", CMPI_boolean},
        {"", CMPI_boolean},
        {"1,5", CMPI_real64},
        {"++1.0", CMPI_real64},
        {"ab", CMPI_char16},
        {"", CMPI_char16},
        {"x", CMPI_ref},
        {"\xf0\x9f\x98\x80", CMPI_char16},
    };
    for (const auto& [text, type] : bad)
        EXPECT_THROW(scalarFromText(text, type), CimXmlError) << text;
}

TEST(Scalar, NumberWithoutATypeIsAsNarrowAsItCanBe) {
    EXPECT_EQ(numberFromText("18446744073709551615"), CimValue::uint64(18446744073709551615U));
    EXPECT_EQ(numberFromText("-3"), CimValue::signedInteger(CMPI_sint64, -3));
    EXPECT_EQ(numberFromText("2.5"), CimValue::real64(2.5));
    EXPECT_THROW(numberFromText("seven"), CimXmlError);
    EXPECT_THROW(numberFromText(""), CimXmlError);
}

TEST(Scalar, TypesHaveNames) {
    EXPECT_EQ(xmlTypeName(CMPI_uint16A), "uint16");
    EXPECT_EQ(xmlTypeName(CMPI_dateTime), "datetime");
    EXPECT_EQ(xmlTypeName(CMPI_null), "string");
    EXPECT_EQ(xmlTypeByName("UINT64"), CMPI_uint64);
    EXPECT_EQ(xmlTypeByName("float"), std::nullopt);
}

TEST(XmlText, ReplacesWhatNoDocumentMayHold) {
    const std::string mark = "\xef\xbf\xbd";
    EXPECT_EQ(xmlText("a\tb\nc\rd"), "a\tb\nc\rd");
    EXPECT_EQ(xmlText(std::string("\x00\x01\x1f", 3)), mark + mark + mark);
    EXPECT_EQ(xmlText("\x7f"), "\x7f");
    EXPECT_EQ(xmlText("gr\xc3\xbc\xc3\x9f \xf0\x9f\x98\x80"),
              "gr\xc3\xbc\xc3\x9f \xf0\x9f\x98\x80");
    EXPECT_EQ(xmlText("\xff"), mark);
    EXPECT_EQ(xmlText("x\xc3"), "x" + mark);      // cut short
    EXPECT_EQ(xmlText("\xc0\x80"), mark + mark);  // too long for its character
    EXPECT_EQ(xmlText("\xe0\x9f\xbf"), mark + mark + mark);
    EXPECT_EQ(xmlText("\xf0\x8f\xbf\xbf"), mark + mark + mark + mark);
    EXPECT_EQ(xmlText("\xed\xa0\x80"), mark + mark + mark);             // a surrogate
    EXPECT_EQ(xmlText("\xef\xbf\xbf"), mark);                           // U+FFFF
    EXPECT_EQ(xmlText("\xf4\x90\x80\x80"), mark + mark + mark + mark);  // beyond U+10FFFF
}

}  // namespace
}  // namespace testbed
