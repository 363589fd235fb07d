// Walking from object to object.
#include "wbem_fixture.h"

namespace testbed {
namespace {

using Names = std::vector<std::string>;

class AssociationOperations : public WbemFixture {
protected:
    Names walk(const std::string& path, const std::string& method, const std::string& more = "",
               const char* className = "Vendor_Box", const char* name = "b") {
        return callFor(path, method,
                       instanceNameParameter("ObjectName", className, {{"Name", name}}) + more,
                       "root/vendor");
    }
};

constexpr const char* kFarName = "//INSTANCEPATH/INSTANCENAME/KEYBINDING/KEYVALUE";

TEST_F(AssociationOperations, AssociatorNamesTellWholePaths) {
    EXPECT_EQ(walk(kFarName, "AssociatorNames"), (Names{"d0", "d1"}));
    EXPECT_EQ(walk("//OBJECTPATH/INSTANCEPATH/NAMESPACEPATH/HOST", "AssociatorNames"),
              (Names{"box:5988", "box:5988"}));
    EXPECT_EQ(walk("(//INSTANCEPATH)[1]//NAMESPACE/@NAME", "AssociatorNames"),
              (Names{"root", "vendor"}));
}

TEST_F(AssociationOperations, FiltersAreThoseOfTheRepository) {
    EXPECT_EQ(walk(kFarName, "AssociatorNames", classNameParameter("CIM_Component", "AssocClass")),
              (Names{"d0", "d1"}));
    EXPECT_EQ(walk(kFarName, "AssociatorNames", classNameParameter("Vendor_Box", "ResultClass")),
              Names{});
    EXPECT_EQ(walk(kFarName, "AssociatorNames", valueParameter("Role", "group")),
              (Names{"d0", "d1"}));
    EXPECT_EQ(walk(kFarName, "AssociatorNames", valueParameter("Role", "Part")), Names{});
    EXPECT_EQ(walk(kFarName, "AssociatorNames", valueParameter("ResultRole", "Group")), Names{});
    EXPECT_EQ(walk(kFarName, "AssociatorNames", valueParameter("Role", "")), (Names{"d0", "d1"}));
    EXPECT_EQ(walk(kFarName, "AssociatorNames", "", "Vendor_Disk", "d1"), Names{"b"});
}

TEST_F(AssociationOperations, AssociatorsCarryPropertiesAsAskedFor) {
    EXPECT_EQ(walk("//VALUE.OBJECTWITHPATH/INSTANCE/PROPERTY/@NAME", "Associators"),
              (Names{"Name", "Size", "Name", "Size"}));
    EXPECT_EQ(walk("//PROPERTY/@NAME", "Associators", listParameter("PropertyList", {"Size"})),
              (Names{"Size", "Size"}));
    EXPECT_EQ(walk("//@CLASSORIGIN", "Associators",
                   valueParameter("IncludeClassOrigin", "TRUE") +
                       listParameter("PropertyList", {"Size"})),
              (Names{"CIM_Disk", "CIM_Disk"}));
    EXPECT_EQ(walk("//QUALIFIER/@NAME", "Associators", valueParameter("IncludeQualifiers", "TRUE")),
              (Names{"MaxLen", "MaxLen"}));
}

TEST_F(AssociationOperations, ReferencesAreAssociationInstances) {
    EXPECT_EQ(walk("//VALUE.OBJECTWITHPATH/INSTANCE/@CLASSNAME", "References"),
              (Names{"Vendor_Holds", "Vendor_Holds"}));
    EXPECT_EQ(walk("//PROPERTY.REFERENCE[@NAME='Part']//KEYVALUE", "References"),
              (Names{"d0", "d1"}));
    EXPECT_EQ(walk("//INSTANCENAME[@CLASSNAME='Vendor_Holds']/KEYBINDING[@NAME='Part']"
                   "/VALUE.REFERENCE//KEYVALUE",
                   "ReferenceNames"),
              (Names{"d0", "d1"}));
    EXPECT_EQ(walk("//INSTANCE", "References", valueParameter("Role", "Part")), Names{});
}

TEST_F(AssociationOperations, ProvidersInstancesHaveNone) {
    const std::string disk = instanceNameParameter("ObjectName", "Served_Disk", {{"Name", "s0"}});
    for (const char* method : {"Associators", "AssociatorNames", "References", "ReferenceNames"})
        EXPECT_EQ(callFor("//IRETURNVALUE/*", method, disk), Names{}) << method;
    EXPECT_TRUE(provider_.questions().empty());
}

TEST_F(AssociationOperations, ClassesOfTheWalkMustBeKnownSomewhere) {
    const std::string box = instanceNameParameter("ObjectName", "Vendor_Box", {{"Name", "b"}});
    const auto outcome = [&](const char* method, const char* parameter, const char* className) {
        return call(method, box + classNameParameter(className, parameter), "root/vendor");
    };
    EXPECT_EQ(outcome("Associators", "AssocClass", "Nothing"),
              "status 4: AssocClass: no class Nothing");
    EXPECT_EQ(outcome("AssociatorNames", "ResultClass", "Nothing"),
              "status 4: ResultClass: no class Nothing");
    EXPECT_EQ(outcome("References", "ResultClass", "Nothing"),
              "status 4: ResultClass: no class Nothing");
    EXPECT_EQ(outcome("ReferenceNames", "ResultClass", "Nothing"),
              "status 4: ResultClass: no class Nothing");
    // One of another namespace may be what a walk leads to.
    EXPECT_NE(outcome("Associators", "ResultClass", "Served_Disk").find("<IRETURNVALUE>"),
              std::string::npos);
}

TEST_F(AssociationOperations, AssociationsAreInstancesThemselves) {
    const std::string bindings =
        "(//INSTANCENAME[@CLASSNAME='Vendor_Holds']/KEYBINDING[@NAME='Part']//KEYVALUE)";
    for (const char* className : {"Vendor_Holds", "CIM_Component"})
        for (const char* method : {"EnumerateInstances", "EnumerateInstanceNames"})
            EXPECT_EQ(callFor(bindings, method, classNameParameter(className), "root/vendor"),
                      (Names{"d0", "d1"}))
                << method << " " << className;
    const auto end = [](const char* role, const char* className, const char* name) {
        return "<KEYBINDING NAME='" + std::string(role) + "'><VALUE.REFERENCE><INSTANCENAME " +
               "CLASSNAME='" + className + "'><KEYBINDING NAME='Name'><KEYVALUE>" + name +
               "</KEYVALUE></KEYBINDING></INSTANCENAME></VALUE.REFERENCE></KEYBINDING>";
    };
    const auto get = [&](const char* disk) {
        return call("GetInstance",
                    "<IPARAMVALUE NAME='InstanceName'><INSTANCENAME CLASSNAME='vendor_holds'>" +
                        end("part", "Vendor_Disk", disk) + end("Group", "Vendor_Box", "b") +
                        "</INSTANCENAME></IPARAMVALUE>",
                    "root/vendor");
    };
    EXPECT_NE(get("d1").find("<PROPERTY.REFERENCE NAME=\"Part\">"), std::string::npos) << get("d1");
    EXPECT_TRUE(get("d2").starts_with("status 6: no instance root/vendor:vendor_holds"));
    repository_.remove(vendorPath("Vendor_Disk", "d0"));
    EXPECT_EQ(
        callFor(bindings, "EnumerateInstances", classNameParameter("CIM_Component"), "root/vendor"),
        Names{"d1"});
}

TEST_F(AssociationOperations, Failures) {
    EXPECT_EQ(call("Associators", classNameParameter("Vendor_Box", "ObjectName"), "root/vendor"),
              "status 7: associations of classes are not served");
    EXPECT_EQ(call("References", instanceNameParameter("ObjectName", "X", {{"Name", "b"}})),
              "status 5: no class X in root/cimv2");
    EXPECT_EQ(call("ReferenceNames", ""), "status 4: ObjectName: is missing");
    EXPECT_EQ(call("AssociatorNames", "", "root/x"), "status 3: no namespace root/x");
}

}  // namespace
}  // namespace testbed
