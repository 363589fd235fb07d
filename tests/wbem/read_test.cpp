// What is read: the forms that published servers and clients write, and what is refused.
#include <gtest/gtest.h>

#include "cim_xml_read.h"
#include "cim_xml_write.h"

namespace testbed {
namespace {

/// The first element of the text; the document lives until the next call.
pugi::xml_node parsed(const std::string& text) {
    static pugi::xml_document document;
    document.reset();
    parseXml(text, document);
    return document.document_element();
}

std::string failureOf(const std::function<void()>& read) {
    try {
        read();
    } catch (const CimXmlError& error) {
        return error.what();
    }
    return "no failure";
}

CimValue propertyValue(const std::string& text) {
    return readProperty(parsed(text)).second;
}

TEST(Read, Properties) {
    EXPECT_EQ(propertyValue(R"(<PROPERTY NAME="P" TYPE="uint16"><VALUE>3</VALUE></PROPERTY>)"),
              CimValue::uint16(3));
    EXPECT_EQ(propertyValue(R"(<PROPERTY NAME="P" TYPE="uint16"/>)"), CimValue::null(CMPI_uint16));
    EXPECT_EQ(propertyValue("<PROPERTY NAME='P'><QUALIFIER NAME='Q' TYPE='string'><VALUE>q</VALUE>"
                            "</QUALIFIER><VALUE> a&lt;<![CDATA[<b>]]> </VALUE></PROPERTY>"),
              CimValue::string(" a<<b> "));
    EXPECT_EQ(propertyValue("<PROPERTY NAME='P' TYPE='string'><VALUE> </VALUE></PROPERTY>"),
              CimValue::string(" "));
    EXPECT_EQ(propertyValue("<PROPERTY NAME='P' TYPE='string'><VALUE/></PROPERTY>"),
              CimValue::string(""));
    EXPECT_EQ(propertyValue("<PROPERTY.ARRAY NAME='P' TYPE='uint16'/>"),
              CimValue::null(CMPI_uint16A));
    EXPECT_EQ(
        propertyValue("<PROPERTY.ARRAY NAME='P' TYPE='uint8'>\n<VALUE.ARRAY>\n<VALUE>1</VALUE>"
                      "<VALUE.NULL/></VALUE.ARRAY></PROPERTY.ARRAY>"),
        CimValue::array(CMPI_uint8, {CimValue::uint8(1), CimValue::null(CMPI_uint8)}));
}

TEST(Read, PropertiesThatAreNone) {
    EXPECT_EQ(failureOf([] { propertyValue("<PROPERTY TYPE='string'/>"); }),
              "PROPERTY: no attribute NAME");
    EXPECT_EQ(failureOf([] { propertyValue("<PROPERTY NAME='P' TYPE='int'/>"); }),
              "PROPERTY: no type is named \"int\"");
    EXPECT_EQ(failureOf([] {
                  propertyValue("<PROPERTY NAME='P' TYPE='uint8'><VALUE>x</VALUE></PROPERTY>");
              }),
              "PROPERTY: P: \"x\" is no uint8");
}

TEST(Read, KeysOfEveryKind) {
    const ObjectPath path = readInstanceName(
        parsed("<INSTANCENAME CLASSNAME='C'>"
               "<KEYBINDING NAME='S'><KEYVALUE> x </KEYVALUE></KEYBINDING>"
               "<KEYBINDING NAME='N'><KEYVALUE VALUETYPE='numeric'> 4</KEYVALUE></KEYBINDING>"
               "<KEYBINDING NAME='T'><KEYVALUE VALUETYPE='numeric' TYPE='uint8'>5</KEYVALUE>"
               "</KEYBINDING>"
               "<KEYBINDING NAME='B'><KEYVALUE VALUETYPE='boolean'>true</KEYVALUE></KEYBINDING>"
               "<KEYBINDING NAME='E'><KEYVALUE VALUETYPE='string'/></KEYBINDING>"
               "<KEYBINDING NAME='R'><VALUE.REFERENCE><INSTANCENAME CLASSNAME='D'/>"
               "</VALUE.REFERENCE></KEYBINDING></INSTANCENAME>"),
        "root/a");
    ObjectPath expected{"root/a", "C", {}};
    expected.key("S", CimValue::string(" x ")).key("N", CimValue::uint64(4));
    expected.key("T", CimValue::uint8(5)).key("B", CimValue::boolean(true));
    expected.key("E", CimValue::string(""));
    expected.key("R", CimValue::reference({"root/a", "D", {}}));
    EXPECT_EQ(path.keys, expected.keys);
    EXPECT_EQ(path, expected);
}

TEST(Read, KeyWithoutAName) {
    const ObjectPath path = readInstanceName(
        parsed("<INSTANCENAME CLASSNAME='C'><KEYVALUE>v</KEYVALUE></INSTANCENAME>"), "n");
    ASSERT_EQ(path.keys.size(), 1U);
    EXPECT_EQ(path.keys[0], NamedValue("", CimValue::string("v")));
}

TEST(Read, KeysThatAreNone) {
    const auto failure = [](const std::string& key) {
        return failureOf([&] {
            readInstanceName(parsed("<INSTANCENAME CLASSNAME='C'>" + key + "</INSTANCENAME>"), "n");
        });
    };
    EXPECT_EQ(failure("<KEYBINDING NAME='K'/>"), "KEYBINDING: no value");
    EXPECT_EQ(failure("<KEYBINDING><KEYVALUE>v</KEYVALUE></KEYBINDING>"),
              "KEYBINDING: no attribute NAME");
    EXPECT_EQ(failure("<KEYVALUE VALUETYPE='numeric'>v</KEYVALUE>"), "\"v\" is no number");
    EXPECT_EQ(failure("<KEYVALUE VALUETYPE='odd'>v</KEYVALUE>"),
              "KEYVALUE: no kind of key is \"odd\"");
    EXPECT_EQ(failure("<VALUE.REFERENCE/>"), "VALUE.REFERENCE: no object path");
    EXPECT_EQ(failure("<VALUE.REFERENCE><X/></VALUE.REFERENCE>"), "X: is no object path");
    EXPECT_EQ(failureOf([] { readInstanceName(parsed("<INSTANCENAME/>"), "n"); }),
              "INSTANCENAME: no attribute CLASSNAME");
}

TEST(Read, ObjectPathsOfEveryForm) {
    const std::string local =
        "<LOCALNAMESPACEPATH><NAMESPACE NAME='root'/><NAMESPACE NAME='b'/></LOCALNAMESPACEPATH>";
    const std::string full = "<NAMESPACEPATH><HOST>h</HOST>" + local + "</NAMESPACEPATH>";
    const std::string instance = "<INSTANCENAME CLASSNAME='C'/>";
    const std::pair<std::string, const char*> forms[] = {
        {instance, "root/a:C"},
        {"<LOCALINSTANCEPATH>" + local + instance + "</LOCALINSTANCEPATH>", "root/b:C"},
        {"<INSTANCEPATH>" + full + instance + "</INSTANCEPATH>", "root/b:C"},
        {"<CLASSNAME NAME='C'/>", "root/a:C"},
        {"<LOCALCLASSPATH>" + local + "<CLASSNAME NAME='C'/></LOCALCLASSPATH>", "root/b:C"},
        {"<CLASSPATH>" + full + "<CLASSNAME NAME='C'/></CLASSPATH>", "root/b:C"},
    };
    for (const auto& [text, path] : forms)
        EXPECT_EQ(readObjectPath(parsed(text), "root/a").text(), path) << text;
    EXPECT_EQ(failureOf([&] {
                  readObjectPath(parsed("<INSTANCEPATH>" + instance + "</INSTANCEPATH>"), "");
              }),
              "INSTANCEPATH: no LOCALNAMESPACEPATH");
}

TEST(Read, InstancesOfEveryForm) {
    const std::string body =
        "<INSTANCE CLASSNAME='C'><QUALIFIER NAME='Q' TYPE='string'/>"
        "<PROPERTY NAME='A' TYPE='boolean'><VALUE>TRUE</VALUE></PROPERTY></INSTANCE>";
    const std::string name =
        "<INSTANCENAME CLASSNAME='c'><KEYBINDING NAME='K'><KEYVALUE>v"
        "</KEYVALUE></KEYBINDING></INSTANCENAME>";
    for (const char* element :
         {"VALUE.NAMEDINSTANCE", "VALUE.OBJECTWITHPATH", "VALUE.INSTANCEWITHPATH"}) {
        const Instance instance = readNamedInstance(
            parsed("<" + std::string(element) + ">" + name + body + "</" + element + ">"), "n");
        EXPECT_EQ(instance.path.text(), "n:c.K=\"v\"");
        EXPECT_EQ(instance.properties, std::vector<NamedValue>({{"A", CimValue::boolean(true)}}));
    }
    EXPECT_EQ(readNamedInstance(parsed(body), "n").path.text(), "n:C");
    EXPECT_EQ(failureOf([&] {
                  readNamedInstance(
                      parsed("<VALUE.NAMEDINSTANCE>" + name + "</VALUE.NAMEDINSTANCE>"), "n");
              }),
              "VALUE.NAMEDINSTANCE: no INSTANCE");
}

TEST(Read, WhatIsWrittenComesBack) {
    ObjectPath far{"root/b", "D", {}};
    far.key("Id", CimValue::uint64(7));
    Instance instance{{"root/a", "C", {}}, {}};
    instance.path.key("K", CimValue::string(" two\n\"lines\" ")).key("R", CimValue::reference(far));
    instance.set("T", CimValue::string("\ttab <&> \r\n end \r"));
    instance.set("Null", CimValue::null(CMPI_uint32));
    instance.set("NullArray", CimValue::null(CMPI_stringA));
    instance.set("Empty", CimValue::stringArray({}));
    instance.set("Holes", CimValue::array(CMPI_string,
                                          {CimValue::null(CMPI_string), CimValue::string(" ")}));
    instance.set("Real", CimValue::real64(0.1)).set("Ref", CimValue::reference(far));
    instance.set("Char", CimValue::unsignedInteger(CMPI_char16, 'x'));
    instance.set("Least", CimValue::signedInteger(CMPI_sint16, -32768));
    pugi::xml_document document;
    writeNamedInstance(document, instance);
    const Instance read = readNamedInstance(parsed(serialize(document)), "root/a");
    EXPECT_EQ(read.path, instance.path);
    EXPECT_EQ(read.properties, instance.properties);
}

TEST(Read, DocumentsThatAreRefused) {
    pugi::xml_document document;
    const std::string bad[] = {
        "",
        " ",
        "text",
        "<a>",
        "<a></b>",
        "<a/><b/>",
        std::string("<a/>\0", 5),
        "<a b=c/>",
        "<a><![CDATA[x</a>",
        "<?xml",
    };
    for (const std::string& text : bad) EXPECT_THROW(parseXml(text, document), CimXmlError) << text;
    const auto nested = [](int levels) {
        std::string text;
        for (int i = 0; i < levels; i++) text += "<a>";
        for (int i = 0; i < levels; i++) text += "</a>";
        return text;
    };
    EXPECT_NO_THROW(parseXml(nested(kDeepestNesting), document));
    EXPECT_THROW(parseXml(nested(kDeepestNesting + 1), document), CimXmlError);
    EXPECT_THROW(parseXml(nested(100000), document), CimXmlError);
}

TEST(Read, EntitiesAreNotExpanded) {
    const std::string text =
        "<!DOCTYPE a [<!ENTITY e \"boom\"><!ENTITY f SYSTEM \"file:///etc/passwd\">]>"
        "<a>&e;&f;&lt;</a>";
    EXPECT_EQ(elementText(parsed(text)), "&e;&f;<");
}

}  // namespace
}  // namespace testbed
