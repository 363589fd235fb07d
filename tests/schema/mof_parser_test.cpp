// What the parser makes of well-formed MOF.
#include "mof_parsing.h"

namespace testbed {
namespace {

PropertyDefinition onlyProperty(const std::string& declaration) {
    const MofDocument document = parseText("class A {\n" + declaration + "\n};");
    EXPECT_EQ(document.classes.size(), 1u);
    EXPECT_EQ(document.classes[0].properties.size(), 1u);
    return document.classes[0].properties[0];
}

/// The default of a property of that type.
CimValue defaultOf(const std::string& type, const std::string& value) {
    return onlyProperty(type + " P = " + value + ";").defaultValue;
}

CimValue qualifierValue(const std::string& qualifier) {
    const Qualifiers qualifiers = onlyProperty("[" + qualifier + "] string P;").qualifiers;
    EXPECT_EQ(qualifiers.size(), 1u);
    return qualifiers[0].second;
}

TEST(MofParser, EmptyTextsDeclareNothing) {
    for (const char* text : {"", " \t\r\n", "// only this", "/* and\nthat */", "\xef\xbb\xbf"}) {
        const MofDocument document = parseText(text);
        EXPECT_TRUE(document.classes.empty());
        EXPECT_TRUE(document.instances.empty());
    }
}

TEST(MofParser, ReadsAClass) {
    const MofDocument document = parseText(R"(
        #pragma locale ("en_US")
        [Version("1.2"), Description("first " /* between */ "second")]
        class Sample_Disk as $D : CIM_Disk {
            [Key, Description("the key")] string DeviceID;
            uint16 States[];  // several
            Boolean Spare = TRUE;
            CIM_System REF Owner;
        };)");
    ASSERT_EQ(document.classes.size(), 1u);
    const ClassDefinition& disk = document.classes[0];
    EXPECT_EQ(disk.name, "Sample_Disk");
    EXPECT_EQ(disk.superclass, "CIM_Disk");
    EXPECT_FALSE(disk.isAssociation);
    const Qualifiers expected = {{"Version", CimValue::string("1.2")},
                                 {"Description", CimValue::string("first second")}};
    EXPECT_EQ(disk.qualifiers, expected);
    ASSERT_EQ(disk.properties.size(), 4u);
    EXPECT_EQ(disk.properties[0].name, "DeviceID");
    EXPECT_TRUE(disk.properties[0].isKey);
    EXPECT_EQ(disk.properties[0].qualifiers.size(), 1u);
    EXPECT_EQ(disk.properties[1].type, CMPI_uint16A);
    EXPECT_FALSE(disk.properties[1].isKey);
    EXPECT_TRUE(disk.properties[1].defaultValue.isNull);
    EXPECT_EQ(disk.properties[2].defaultValue, CimValue::boolean(true));
    EXPECT_EQ(disk.properties[3].type, CMPI_ref);
}

TEST(MofParser, KeywordsHaveNoLetterCase) {
    const MofDocument document = parseText("[ASSOCIATION] CLASS a { [KEY] UINT8 p = NULL; };");
    EXPECT_TRUE(document.classes[0].isAssociation);
    EXPECT_TRUE(document.classes[0].properties[0].isKey);
    EXPECT_EQ(document.classes[0].properties[0].type, CMPI_uint8);
}

TEST(MofParser, TypesOfProperties) {
    const std::pair<const char*, CMPIType> types[] = {
        {"uint8", CMPI_uint8},   {"uint16", CMPI_uint16},     {"uint32", CMPI_uint32},
        {"uint64", CMPI_uint64}, {"sint8", CMPI_sint8},       {"sint16", CMPI_sint16},
        {"sint32", CMPI_sint32}, {"sint64", CMPI_sint64},     {"real32", CMPI_real32},
        {"real64", CMPI_real64}, {"boolean", CMPI_boolean},   {"string", CMPI_string},
        {"char16", CMPI_char16}, {"datetime", CMPI_dateTime},
    };
    for (const auto& [name, type] : types) {
        EXPECT_EQ(onlyProperty(std::string(name) + " P;").type, type) << name;
        EXPECT_EQ(onlyProperty(std::string(name) + " P[4];").type, type | CMPI_ARRAY) << name;
    }
}

TEST(MofParser, Numbers) {
    EXPECT_EQ(defaultOf("uint64", "18446744073709551615"), CimValue::uint64(UINT64_MAX));
    EXPECT_EQ(defaultOf("sint64", "-9223372036854775808"),
              CimValue::signedInteger(CMPI_sint64, INT64_MIN));
    EXPECT_EQ(defaultOf("sint8", "-128"), CimValue::signedInteger(CMPI_sint8, -128));
    EXPECT_EQ(defaultOf("uint16", "0xFfE"), CimValue::uint16(0xffe));
    EXPECT_EQ(defaultOf("uint16", "017"), CimValue::uint16(15));
    EXPECT_EQ(defaultOf("uint16", "101b"), CimValue::uint16(5));
    EXPECT_EQ(defaultOf("uint8", "+255"), CimValue::uint8(255));
    EXPECT_EQ(defaultOf("uint8", "0"), CimValue::uint8(0));
    EXPECT_EQ(defaultOf("real64", "-1.5E+2"), CimValue::real64(-150));
    EXPECT_EQ(defaultOf("real64", ".25"), CimValue::real64(0.25));
    EXPECT_EQ(defaultOf("real64", "3"), CimValue::real64(3));
    EXPECT_EQ(defaultOf("char16", "'a'"), CimValue::unsignedInteger(CMPI_char16, 'a'));
    EXPECT_EQ(defaultOf("char16", "'\\x20AC'"), CimValue::unsignedInteger(CMPI_char16, 0x20ac));
}

TEST(MofParser, Strings) {
    EXPECT_EQ(defaultOf("string", R"("a" "b"
                                     "c")"),
              CimValue::string("abc"));
    EXPECT_EQ(defaultOf("string", R"("\"\\\t\n\x41\x20AC\xe9\x17F")"),
              CimValue::string("\"\\\t\nA\xe2\x82\xac\xc3\xa9\xc5\xbf"));
    EXPECT_EQ(defaultOf("string", R"("no // comment /* here */")"),
              CimValue::string("no // comment /* here */"));
    EXPECT_EQ(defaultOf("datetime", R"("20260101000000.000000+000")").type, CMPI_dateTime);
}

TEST(MofParser, Arrays) {
    EXPECT_EQ(onlyProperty("uint16 P[] = {1, 0x2, 3};").defaultValue,
              CimValue::uint16Array({1, 2, 3}));
    EXPECT_EQ(onlyProperty("string P[] = {\"a\" \"b\", \"c\"};").defaultValue,
              CimValue::stringArray({"ab", "c"}));
    EXPECT_EQ(onlyProperty("string P[] = {};").defaultValue, CimValue::stringArray({}));
    EXPECT_EQ(onlyProperty("string P[] = NULL;").defaultValue, CimValue::null(CMPI_stringA));
}

TEST(MofParser, Qualifiers) {
    EXPECT_EQ(qualifierValue("Required"), CimValue::boolean(true));
    EXPECT_EQ(qualifierValue("Required(false)"), CimValue::boolean(false));
    EXPECT_EQ(qualifierValue("MaxLen(256)"), CimValue::uint64(256));
    EXPECT_EQ(qualifierValue("MinValue(-1)"), CimValue::signedInteger(CMPI_sint64, -1));
    EXPECT_EQ(qualifierValue("Weight(1.5)"), CimValue::real64(1.5));
    EXPECT_EQ(qualifierValue("Units(NULL)"), CimValue::null(CMPI_string));
    EXPECT_EQ(qualifierValue("Values{\"a\", \"b\"} : ToSubclass Translatable"),
              CimValue::stringArray({"a", "b"}));
    EXPECT_EQ(qualifierValue("Values({\"a\"})"), CimValue::stringArray({"a"}));
    EXPECT_EQ(qualifierValue("Values{}"), CimValue::stringArray({}));
    EXPECT_FALSE(onlyProperty("[Key(false)] string P;").isKey);
}

TEST(MofParser, ReadsInstances) {
    const MofDocument document = parseText(R"(
        instance of Sample_Module as $M {
            Name = "module";
            Types = {2, 3};
            Mixed = {1, -2};
            Nothing = NULL;
            [Description("of this value")] Module = $M;
        };
        instance of Sample_Other {};)");
    ASSERT_EQ(document.instances.size(), 2u);
    const Instance& module = document.instances[0];
    EXPECT_EQ(module.path.className, "Sample_Module");
    EXPECT_EQ(*module.find("name"), CimValue::string("module"));
    EXPECT_EQ(*module.find("Types"),
              CimValue::array(CMPI_uint64, {CimValue::uint64(2), CimValue::uint64(3)}));
    EXPECT_EQ(*module.find("Mixed"),
              CimValue::array(CMPI_sint64, {CimValue::signedInteger(CMPI_sint64, 1),
                                            CimValue::signedInteger(CMPI_sint64, -2)}));
    EXPECT_TRUE(module.find("Nothing")->isNull);
    EXPECT_EQ(*module.find("Module"), CimValue::string("M"));
    EXPECT_TRUE(document.instances[1].properties.empty());
}

}  // namespace
}  // namespace testbed
