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

TEST_F(ClassOperations, AssociationsSayWhatTheyAre) {
    PropertyDefinition part{"Part", CMPI_ref, true, "Vendor_Owns", CimValue::null(CMPI_ref), {}};
    part.referenceClass = "Vendor_Disk";
    repository_.defineClass("root/cimv2", {"Vendor_Owns", "", {part}, {}, true});
    EXPECT_EQ(get("//CLASS/QUALIFIER/@NAME", "Vendor_Owns"), Names{"Association"});
    EXPECT_EQ(get("//PROPERTY.REFERENCE/@REFERENCECLASS", "Vendor_Owns"), Names{"Vendor_Disk"});
    EXPECT_EQ(get("//PROPERTY.REFERENCE/QUALIFIER/@NAME", "Vendor_Owns"), Names{"Key"});
}

TEST_F(ClassOperations, MethodsAreDescribed) {
    ClassDefinition definition = *repository_.findClass("root/cimv2", "CIM_Disk");
    definition.methods = {
        {"Reset",
         CMPI_uint32,
         "CIM_Disk",
         {{"Mode", CMPI_uint16, "", {{"In", CimValue::boolean(true)}}},
          {"Names", CMPI_stringA, "", {}},
          {"Job", CMPI_ref, "CIM_Thing", {}},
          {"Others", static_cast<CMPIType>(CMPI_ref | CMPI_ARRAY), "CIM_Disk", {}}},
         {{"Description", CimValue::string("Begins anew.")}}}};
    repository_.defineClass("root/cimv2", definition);
    EXPECT_EQ(get("//METHOD/@TYPE", "CIM_Disk"), Names{"uint32"});
    EXPECT_EQ(get("//METHOD/*[self::PARAMETER or self::PARAMETER.ARRAY]/@TYPE", "CIM_Disk"),
              (Names{"uint16", "string"}));
    EXPECT_EQ(get("//PARAMETER.REFERENCE/@REFERENCECLASS", "CIM_Disk"), Names{"CIM_Thing"});
    EXPECT_EQ(get("//PARAMETER.REFARRAY/@NAME", "CIM_Disk"), Names{"Others"});
    EXPECT_EQ(get("//METHOD//QUALIFIER/@NAME", "CIM_Disk"), (Names{"Description", "In"}));
    EXPECT_EQ(get("//METHOD", "Served_Disk").size(), 0U);
    EXPECT_EQ(
        get("//METHOD[@PROPAGATED='true']/@CLASSORIGIN", "Served_Disk",
            valueParameter("LocalOnly", "FALSE") + valueParameter("IncludeClassOrigin", "TRUE")),
        Names{"CIM_Disk"});
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
