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
    EXPECT_EQ(walk(kFarName, "AssociatorNames", classNameParameter("Nothing", "AssocClass")),
              Names{});
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
    EXPECT_EQ(walk("//INSTANCE", "References", classNameParameter("Nothing", "ResultClass")),
              Names{});
}

TEST_F(AssociationOperations, ProvidersInstancesHaveNone) {
    const std::string disk = instanceNameParameter("ObjectName", "Served_Disk", {{"Name", "s0"}});
    for (const char* method : {"Associators", "AssociatorNames", "References", "ReferenceNames"})
        EXPECT_EQ(callFor("//IRETURNVALUE/*", method, disk), Names{}) << method;
    EXPECT_TRUE(provider_.questions().empty());
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
