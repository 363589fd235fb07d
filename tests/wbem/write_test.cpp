// What is written, letter by letter.
#include <gtest/gtest.h>

#include "cim_xml_write.h"

namespace testbed {
namespace {

/// What write(node) appends, without line ends.
template <class Write>
std::string written(Write write) {
    pugi::xml_document document;
    write(document.append_child("X"));
    const std::string text = serialize(document);
    const std::string begin = "<?xml version=\"1.0\"?><X>";
    EXPECT_TRUE(text.starts_with(begin) && text.ends_with("</X>")) << text;
    return text.substr(begin.size(), text.size() - begin.size() - 4);
}

std::string property(const CimValue& value) {
    return written([&](pugi::xml_node node) { writeProperty(node, {"P", value}); });
}

TEST(Write, Properties) {
    EXPECT_EQ(property(CimValue::uint16(3)),
              R"(<PROPERTY NAME="P" TYPE="uint16"><VALUE>3</VALUE></PROPERTY>)");
    EXPECT_EQ(property(CimValue::null(CMPI_string)),
              R"(<PROPERTY NAME="P" TYPE="string"></PROPERTY>)");
    EXPECT_EQ(property(CimValue::string("")),
              R"(<PROPERTY NAME="P" TYPE="string"><VALUE></VALUE></PROPERTY>)");
    EXPECT_EQ(property(CimValue::uint16Array({2, 5})),
              R"(<PROPERTY.ARRAY NAME="P" TYPE="uint16"><VALUE.ARRAY><VALUE>2</VALUE>)"
              R"(<VALUE>5</VALUE></VALUE.ARRAY></PROPERTY.ARRAY>)");
    EXPECT_EQ(property(CimValue::null(CMPI_uint16A)),
              R"(<PROPERTY.ARRAY NAME="P" TYPE="uint16"></PROPERTY.ARRAY>)");
    EXPECT_EQ(property(CimValue::uint16Array({})),
              R"(<PROPERTY.ARRAY NAME="P" TYPE="uint16">)"
              R"(<VALUE.ARRAY></VALUE.ARRAY></PROPERTY.ARRAY>)");
    EXPECT_EQ(property(CimValue::null(CMPI_null)),
              R"(<PROPERTY NAME="P" TYPE="string"></PROPERTY>)");
}

TEST(Write, ArrayWithNullElements) {
    const CimValue array = CimValue::array(
        CMPI_string, {CimValue::string("a"), CimValue::null(CMPI_string), CimValue::string("")});
    EXPECT_EQ(property(array), R"(<PROPERTY.ARRAY NAME="P" TYPE="string"><VALUE.ARRAY>)"
                               R"(<VALUE>a</VALUE><VALUE.NULL></VALUE.NULL><VALUE></VALUE>)"
                               R"(</VALUE.ARRAY></PROPERTY.ARRAY>)");
}

TEST(Write, TextsAreEscapedAndFit) {
    EXPECT_EQ(property(CimValue::string("<&>\r\n\x01\xff")),
              "<PROPERTY NAME=\"P\" TYPE=\"string\"><VALUE>&lt;&amp;&gt;&#13;\n\xef\xbf\xbd"
              "\xef\xbf\xbd</VALUE></PROPERTY>");
    EXPECT_EQ(written([](pugi::xml_node node) { writeClassName(node, "a\"<\n\x02"); }),
              "<CLASSNAME NAME=\"a&quot;&lt;&#10;\xef\xbf\xbd\"></CLASSNAME>");
}

ObjectPath samplePath() {
    ObjectPath path{"root/a", "C", {}};
    path.key("S", CimValue::string("x")).key("N", CimValue::uint16(4));
    return path.key("B", CimValue::boolean(true)).key("Z", CimValue::null(CMPI_string));
}

constexpr const char* kSampleName =
    R"(<INSTANCENAME CLASSNAME="C"><KEYBINDING NAME="S"><KEYVALUE VALUETYPE="string">x)"
    R"(</KEYVALUE></KEYBINDING><KEYBINDING NAME="N"><KEYVALUE VALUETYPE="numeric">4)"
    R"(</KEYVALUE></KEYBINDING><KEYBINDING NAME="B"><KEYVALUE VALUETYPE="boolean">TRUE)"
    R"(</KEYVALUE></KEYBINDING><KEYBINDING NAME="Z"><KEYVALUE VALUETYPE="string">)"
    R"(</KEYVALUE></KEYBINDING></INSTANCENAME>)";

constexpr const char* kTypedName =
    R"(<INSTANCENAME CLASSNAME="C"><KEYBINDING NAME="S"><KEYVALUE VALUETYPE="string" )"
    R"(TYPE="string">x</KEYVALUE></KEYBINDING><KEYBINDING NAME="N"><KEYVALUE )"
    R"(VALUETYPE="numeric" TYPE="uint16">4</KEYVALUE></KEYBINDING><KEYBINDING NAME="B">)"
    R"(<KEYVALUE VALUETYPE="boolean" TYPE="boolean">TRUE</KEYVALUE></KEYBINDING>)"
    R"(<KEYBINDING NAME="Z"><KEYVALUE VALUETYPE="string" TYPE="string"></KEYVALUE>)"
    R"(</KEYBINDING></INSTANCENAME>)";

TEST(Write, Paths) {
    EXPECT_EQ(written([](pugi::xml_node node) { writeInstanceName(node, samplePath()); }),
              kSampleName);
    EXPECT_EQ(
        written([](pugi::xml_node node) { writeInstanceName(node, samplePath(), KeyTypes::Told); }),
        kTypedName);
    EXPECT_EQ(written([](pugi::xml_node node) { writeInstancePath(node, samplePath(), "h"); }),
              std::string(R"(<INSTANCEPATH><NAMESPACEPATH><HOST>h</HOST><LOCALNAMESPACEPATH>)"
                          R"(<NAMESPACE NAME="root"></NAMESPACE><NAMESPACE NAME="a"></NAMESPACE>)"
                          R"(</LOCALNAMESPACEPATH></NAMESPACEPATH>)") +
                  kTypedName + "</INSTANCEPATH>");
    EXPECT_EQ(written([](pugi::xml_node node) {
                  writeInstanceName(node, {"", "C", {}});
              }),
              R"(<INSTANCENAME CLASSNAME="C"></INSTANCENAME>)");
}

TEST(Write, References) {
    EXPECT_EQ(property(CimValue::reference({"n", "C", {}})),
              R"(<PROPERTY.REFERENCE NAME="P"><VALUE.REFERENCE><LOCALINSTANCEPATH>)"
              R"(<LOCALNAMESPACEPATH><NAMESPACE NAME="n"></NAMESPACE></LOCALNAMESPACEPATH>)"
              R"(<INSTANCENAME CLASSNAME="C"></INSTANCENAME></LOCALINSTANCEPATH>)"
              R"(</VALUE.REFERENCE></PROPERTY.REFERENCE>)");
    EXPECT_EQ(property(CimValue::reference({"", "C", {{"K", CimValue::uint8(1)}}})),
              R"(<PROPERTY.REFERENCE NAME="P"><VALUE.REFERENCE><INSTANCENAME CLASSNAME="C">)"
              R"(<KEYBINDING NAME="K"><KEYVALUE VALUETYPE="numeric" TYPE="uint8">1</KEYVALUE>)"
              R"(</KEYBINDING></INSTANCENAME></VALUE.REFERENCE></PROPERTY.REFERENCE>)");
    ObjectPath association{"", "A", {}};
    association.key("Part", CimValue::reference({"", "C", {}}));
    EXPECT_EQ(written([&](pugi::xml_node node) { writeInstanceName(node, association); }),
              R"(<INSTANCENAME CLASSNAME="A"><KEYBINDING NAME="Part"><VALUE.REFERENCE>)"
              R"(<INSTANCENAME CLASSNAME="C"></INSTANCENAME></VALUE.REFERENCE></KEYBINDING>)"
              R"(</INSTANCENAME>)");
}

TEST(Write, InstanceWithWhatItsClassKnows) {
    Instance instance{{"n", "C", {}}, {}};
    instance.set("P", CimValue::uint8(1)).set("Other", CimValue::uint8(2));
    InstanceDetails details;
    details.properties = {
        {"p", CMPI_uint8, false, "CIM_Base", {}, {{"Units", CimValue::string("s")}}}};
    details.qualifiers = {{"Version", CimValue::string("1")}};
    const auto write = [&](pugi::xml_node node) { writeNamedInstance(node, instance, details); };
    EXPECT_EQ(written(write),
              R"(<VALUE.NAMEDINSTANCE><INSTANCENAME CLASSNAME="C"></INSTANCENAME>)"
              R"(<INSTANCE CLASSNAME="C"><PROPERTY NAME="P" TYPE="uint8"><VALUE>1</VALUE>)"
              R"(</PROPERTY><PROPERTY NAME="Other" TYPE="uint8"><VALUE>2</VALUE></PROPERTY>)"
              R"(</INSTANCE></VALUE.NAMEDINSTANCE>)");
    details.withClassOrigin = details.withQualifiers = true;
    EXPECT_EQ(written(write),
              R"(<VALUE.NAMEDINSTANCE><INSTANCENAME CLASSNAME="C"></INSTANCENAME>)"
              R"(<INSTANCE CLASSNAME="C"><QUALIFIER NAME="Version" TYPE="string"><VALUE>1)"
              R"(</VALUE></QUALIFIER><PROPERTY NAME="P" TYPE="uint8" CLASSORIGIN="CIM_Base">)"
              R"(<QUALIFIER NAME="Units" TYPE="string"><VALUE>s</VALUE></QUALIFIER>)"
              R"(<VALUE>1</VALUE></PROPERTY><PROPERTY NAME="Other" TYPE="uint8"><VALUE>2)"
              R"(</VALUE></PROPERTY></INSTANCE></VALUE.NAMEDINSTANCE>)");
}

TEST(Write, Class) {
    ClassView view;
    const PropertyDefinition key{"K", CMPI_string, true, "Base", CimValue::null(CMPI_string), {}};
    const PropertyDefinition own{"V", CMPI_uint16, false, "C", CimValue::uint16(5), {}};
    const PropertyDefinition list{"L", CMPI_uint16A, false, "C", CimValue::null(CMPI_uint16A), {}};
    view.definition = {"C", "Base", {own, list}, {{"Abstract", CimValue::boolean(true)}}, false};
    view.properties = {key, own, list};
    const auto write = [&](pugi::xml_node node) { writeClass(node, view); };
    EXPECT_EQ(written(write),
              R"(<CLASS NAME="C" SUPERCLASS="Base"><PROPERTY NAME="K" TYPE="string" )"
              R"(PROPAGATED="true"></PROPERTY><PROPERTY NAME="V" TYPE="uint16"><VALUE>5</VALUE>)"
              R"(</PROPERTY><PROPERTY.ARRAY NAME="L" TYPE="uint16"></PROPERTY.ARRAY></CLASS>)");
    view.properties = {key};
    view.withQualifiers = view.withClassOrigin = true;
    EXPECT_EQ(written(write),
              R"(<CLASS NAME="C" SUPERCLASS="Base"><QUALIFIER NAME="Abstract" TYPE="boolean">)"
              R"(<VALUE>TRUE</VALUE></QUALIFIER><PROPERTY NAME="K" TYPE="string" )"
              R"(CLASSORIGIN="Base" PROPAGATED="true"><QUALIFIER NAME="Key" TYPE="boolean">)"
              R"(<VALUE>TRUE</VALUE></QUALIFIER></PROPERTY></CLASS>)");
}

}  // namespace
}  // namespace testbed
