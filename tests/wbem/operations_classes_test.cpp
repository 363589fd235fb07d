// Reading classes.
#include "wbem_fixture.h"

namespace testbed {
namespace {

using Names = std::vector<std::string>;

class ClassOperations : public WbemFixture {
protected:
    Names get(const std::string& path, const std::string& className, const std::string& more = "") {
        return callFor(path, "GetClass", classNameParameter(className) + more);
    }
};

TEST_F(ClassOperations, GetClassIsLocalWithQualifiersByDefault) {
    EXPECT_EQ(get("//CLASS/@NAME", "cim_DISK"), Names{"CIM_Disk"});
    EXPECT_EQ(get("//CLASS/@SUPERCLASS", "CIM_Disk"), Names{"CIM_Thing"});
    EXPECT_EQ(get("//PROPERTY/@NAME", "CIM_Disk"), (Names{"Caption", "Size"}));
    EXPECT_EQ(get("//QUALIFIER/@NAME", "CIM_Thing"), (Names{"Description", "Key", "MaxLen"}));
    EXPECT_EQ(get("//@CLASSORIGIN", "CIM_Disk"), Names{});
}

TEST_F(ClassOperations, GetClassAsAskedFor) {
    const std::string all = valueParameter("LocalOnly", "FALSE");
    EXPECT_EQ(get("//PROPERTY/@NAME", "Served_Disk", all),
              (Names{"Name", "Caption", "Size", "Speed"}));
    EXPECT_EQ(get("//PROPERTY[@PROPAGATED='true']/@NAME", "CIM_Disk", all), Names{"Name"});
    EXPECT_EQ(get("//QUALIFIER", "CIM_Thing", valueParameter("IncludeQualifiers", "FALSE")),
              Names{});
    EXPECT_EQ(get("//@CLASSORIGIN", "CIM_Disk", valueParameter("IncludeClassOrigin", "TRUE")),
              (Names{"CIM_Thing", "CIM_Disk"}));
    EXPECT_EQ(get("//PROPERTY/@NAME", "Served_Disk", all + listParameter("PropertyList", {"size"})),
              Names{"Size"});
}

TEST_F(ClassOperations, EnumerateClassNames) {
    const auto names = [&](const std::string& parameters, const char* nameSpace = "root/cimv2") {
        return callFor("//CLASSNAME/@NAME", "EnumerateClassNames", parameters, nameSpace);
    };
    const std::string deep = valueParameter("DeepInheritance", "TRUE");
    EXPECT_EQ(names(""), Names{"CIM_Thing"});
    EXPECT_EQ(names("", "root/vendor"), (Names{"CIM_Thing", "CIM_Component"}));
    EXPECT_EQ(names(deep), (Names{"CIM_Thing", "CIM_Disk", "Served_Disk", "Local_Disk"}));
    EXPECT_EQ(names(classNameParameter("CIM_Thing")), Names{"CIM_Disk"});
    EXPECT_EQ(names(classNameParameter("CIM_Thing") + deep),
              (Names{"CIM_Disk", "Served_Disk", "Local_Disk"}));
    EXPECT_EQ(names(classNameParameter("Served_Disk") + deep), Names{});
}

TEST_F(ClassOperations, EnumerateClasses) {
    const std::string below = classNameParameter("CIM_Disk");
    EXPECT_EQ(callFor("//CLASS/@NAME", "EnumerateClasses", below),
              (Names{"Served_Disk", "Local_Disk"}));
    EXPECT_EQ(callFor("//PROPERTY/@NAME", "EnumerateClasses", below), Names{"Speed"});
    EXPECT_EQ(callFor("//CLASS[@NAME='Local_Disk']/PROPERTY/@NAME", "EnumerateClasses",
                      below + valueParameter("LocalOnly", "FALSE")),
              (Names{"Name", "Caption", "Size"}));
}

TEST_F(ClassOperations, Failures) {
    EXPECT_EQ(call("GetClass", classNameParameter("X")), "status 6: no class X in root/cimv2");
    EXPECT_EQ(call("GetClass", classNameParameter("X"), "root/x"), "status 3: no namespace root/x");
    EXPECT_EQ(call("EnumerateClasses", classNameParameter("X")),
              "status 5: no class X in root/cimv2");
    EXPECT_EQ(call("EnumerateClassNames", classNameParameter("X")),
              "status 5: no class X in root/cimv2");
}

}  // namespace
}  // namespace testbed
