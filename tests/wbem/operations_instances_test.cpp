// Reading instances, from the provider and from the repository.
#include "wbem_fixture.h"

namespace testbed {
namespace {

using Names = std::vector<std::string>;
constexpr const char* kPropertyNames = "//INSTANCE/PROPERTY/@NAME";

class InstanceOperations : public WbemFixture {
protected:
    Names propertiesOf(const std::string& className, const std::string& more) {
        return callFor(kPropertyNames, "EnumerateInstances", classNameParameter(className) + more);
    }
    const std::string all_ = valueParameter("LocalOnly", "FALSE");
};

TEST_F(InstanceOperations, NamesComeFromTheProviderUnderTheClientsSpelling) {
    EXPECT_EQ(callFor("//KEYVALUE", "EnumerateInstanceNames", classNameParameter("served_DISK")),
              Names{"s0"});
    ASSERT_EQ(provider_.questions().size(), 1U);
    EXPECT_EQ(provider_.questions()[0].path.className, "served_DISK");
    EXPECT_EQ(provider_.questions()[0].path.nameSpace, "root/cimv2");
}

TEST_F(InstanceOperations, ASuperclassIsAskedForUnderTheRegisteredName) {
    EXPECT_EQ(callFor("//INSTANCENAME/@CLASSNAME", "EnumerateInstanceNames",
                      classNameParameter("CIM_thing")),
              (Names{"Served_Disk", "Local_Disk"}));
    ASSERT_EQ(provider_.questions().size(), 1U);
    EXPECT_EQ(provider_.questions()[0].path.className, "Served_Disk");
    EXPECT_EQ(
        callFor("//INSTANCE/@CLASSNAME", "EnumerateInstances", classNameParameter("CIM_Disk")),
        (Names{"Served_Disk", "Local_Disk"}));
}

TEST_F(InstanceOperations, OtherClassesDoNotReachTheProvider) {
    EXPECT_EQ(callFor("//KEYVALUE", "EnumerateInstanceNames", classNameParameter("Local_Disk")),
              Names{"l0"});
    EXPECT_EQ(callFor("//KEYVALUE", "EnumerateInstanceNames", classNameParameter("CIM_Disk"),
                      "root/vendor"),
              (Names{"d0", "d1"}));
    EXPECT_TRUE(provider_.questions().empty());
}

TEST_F(InstanceOperations, PropertyListGoesToTheProvider) {
    propertiesOf("Served_Disk", listParameter("PropertyList", {"Size", "speed"}));
    propertiesOf("Served_Disk", listParameter("PropertyList", {}));
    propertiesOf("Served_Disk", "<IPARAMVALUE NAME=\"PropertyList\"/>");
    const auto questions = provider_.questions();
    ASSERT_EQ(questions.size(), 3U);
    EXPECT_EQ(questions[0].properties, PropertyList({"Size", "speed"}));
    EXPECT_EQ(questions[1].properties, PropertyList(Names{}));
    EXPECT_EQ(questions[2].properties, PropertyList());
}

TEST_F(InstanceOperations, PropertyListRestrictsTheRepositorysInstances) {
    EXPECT_EQ(propertiesOf("Local_Disk", all_ + listParameter("PropertyList", {"SIZE", "Nothing"})),
              Names{"Size"});
    EXPECT_EQ(propertiesOf("Local_Disk", all_ + listParameter("PropertyList", {})), Names{});
}

TEST_F(InstanceOperations, LocalOnlyLeavesNothingAway) {
    const Names all = {"Name", "Caption", "Size", "Speed"};
    for (const std::string& parameter : {std::string(), valueParameter("LocalOnly", "true"), all_})
        EXPECT_EQ(propertiesOf("Served_Disk", parameter), all) << parameter;
    EXPECT_EQ(propertiesOf("Local_Disk", ""), (Names{"Name", "Caption", "Size", "Extra"}));
    EXPECT_EQ(callFor(kPropertyNames, "GetInstance",
                      instanceNameParameter("InstanceName", "Served_Disk", {{"Name", "s0"}})),
              all);
}

TEST_F(InstanceOperations, WithoutDeepInheritanceSubclassesAddNothing) {
    const std::string shallow = valueParameter("DeepInheritance", "FALSE");
    EXPECT_EQ(propertiesOf("CIM_Thing", all_ + shallow),
              (Names{"Name", "Caption", "Name", "Caption"}));
    EXPECT_EQ(propertiesOf("Served_Disk", all_ + shallow),
              (Names{"Name", "Caption", "Size", "Speed"}));
}

TEST_F(InstanceOperations, ClassOriginAndQualifiersWhenAskedFor) {
    const std::string disk = classNameParameter("Served_Disk") + all_;
    EXPECT_EQ(callFor("//@CLASSORIGIN", "EnumerateInstances", disk), Names{});
    EXPECT_EQ(callFor("//@CLASSORIGIN", "EnumerateInstances",
                      disk + valueParameter("IncludeClassOrigin", "TRUE")),
              (Names{"CIM_Thing", "CIM_Thing", "CIM_Disk", "Served_Disk"}));
    EXPECT_EQ(callFor("//QUALIFIER/@NAME", "EnumerateInstances", disk), Names{});
    EXPECT_EQ(callFor("//QUALIFIER/@NAME", "EnumerateInstances",
                      disk + valueParameter("IncludeQualifiers", "TRUE")),
              Names{"MaxLen"});
}

TEST_F(InstanceOperations, GetInstance) {
    const auto get = [&](const std::string& className, const std::string& name) {
        return callFor("//PROPERTY[@NAME='Caption']/VALUE", "GetInstance",
                       instanceNameParameter("InstanceName", className, {{"Name", name}}) + all_);
    };
    EXPECT_EQ(get("served_disk", "s0"), Names{"a served disk"});
    EXPECT_EQ(provider_.questions()[0].path.text(), "root/cimv2:served_disk.Name=\"s0\"");
    EXPECT_EQ(get("LOCAL_Disk", "l0"), Names{"a local disk"});
    EXPECT_EQ(callFor(kPropertyNames, "GetInstance",
                      instanceNameParameter("InstanceName", "Local_Disk", {{"Name", "l0"}}) + all_ +
                          listParameter("PropertyList", {"Size"})),
              Names{"Size"});
}

TEST_F(InstanceOperations, GetInstanceByAKeyWithoutAName) {
    const auto get = [&](const std::string& className, const std::string& nameSpace) {
        return call("GetInstance",
                    "<IPARAMVALUE NAME='InstanceName'><INSTANCENAME CLASSNAME='" + className +
                        "'><KEYVALUE>l0</KEYVALUE></INSTANCENAME></IPARAMVALUE>",
                    nameSpace);
    };
    EXPECT_NE(get("Local_Disk", "root/cimv2").find("Extra"), std::string::npos);
    EXPECT_EQ(get("Vendor_Holds", "root/vendor"),
              "status 4: Vendor_Holds has not exactly one key, and the key has no name");
}

TEST_F(InstanceOperations, TwoInstancesFromAGetAreOne) {
    provider_.instances.push_back(provider_.instances[0]);
    EXPECT_EQ(callFor("//INSTANCE/@CLASSNAME", "GetInstance",
                      instanceNameParameter("InstanceName", "Served_Disk", {{"Name", "s0"}})),
              Names{"Served_Disk"});
    provider_.instances.clear();
    EXPECT_EQ(
        call("GetInstance", instanceNameParameter("InstanceName", "Served_Disk", {{"Name", "s0"}})),
        "status 6: no instance root/cimv2:Served_Disk.Name=\"s0\"");
}

TEST_F(InstanceOperations, UnknownNamesHaveTheirStatus) {
    EXPECT_EQ(call("EnumerateInstances", classNameParameter("CIM_Nothing")),
              "status 5: no class CIM_Nothing in root/cimv2");
    EXPECT_EQ(call("EnumerateInstanceNames", classNameParameter("Served_Disk"), "root/vendor"),
              "status 5: no class Served_Disk in root/vendor");
    EXPECT_EQ(call("EnumerateInstances", classNameParameter("CIM_Thing"), "root/nothing"),
              "status 3: no namespace root/nothing");
    EXPECT_EQ(
        call("GetInstance", instanceNameParameter("InstanceName", "Local_Disk", {{"Name", "l1"}})),
        "status 6: no instance root/cimv2:Local_Disk.Name=\"l1\"");
    EXPECT_EQ(call("GetInstance", instanceNameParameter("InstanceName", "X", {{"Name", "l1"}})),
              "status 5: no class X in root/cimv2");
}

TEST_F(InstanceOperations, ProvidersStatusReachesTheClient) {
    const auto answer = [&](CMPIrc rc, const char* message, const char* className = "Served_Disk") {
        provider_.rc = rc;
        provider_.message = message;
        return call("EnumerateInstances", classNameParameter(className));
    };
    EXPECT_EQ(answer(CMPI_RC_ERR_ACCESS_DENIED, "not <you>"), "status 2: not <you>");
    EXPECT_EQ(answer(CMPI_RC_ERR_NOT_FOUND, ""), "status 6: CIM_ERR_NOT_FOUND");
    EXPECT_EQ(answer(static_cast<CMPIrc>(28), ""), "status 28: CIM_ERR_SERVER_IS_SHUTTING_DOWN");
    EXPECT_EQ(answer(static_cast<CMPIrc>(29), ""), "status 1: the provider answered status 29");
    EXPECT_EQ(answer(CMPI_RC_ERR_INVALID_HANDLE, "odd\x01"), "status 1: odd\xef\xbf\xbd");
    EXPECT_EQ(answer(CMPI_RC_ERR_FAILED, "broken", "CIM_Disk"), "status 1: broken");
}

TEST_F(InstanceOperations, InstanceWithoutKeysAndWithOddValues) {
    Instance odd{{"root/cimv2", "Served_Disk", {}}, {}};
    odd.set("Name", CimValue::null(CMPI_string)).set("Caption", CimValue::string("\x02\xff\r"));
    odd.set("List", CimValue::array(CMPI_string, {CimValue::null(CMPI_string)}));
    provider_.instances = {odd};
    const std::string disk = classNameParameter("Served_Disk") + all_;
    EXPECT_EQ(callFor("//INSTANCENAME/@CLASSNAME", "EnumerateInstances", disk),
              Names{"Served_Disk"});
    EXPECT_EQ(callFor("//KEYBINDING", "EnumerateInstances", disk), Names{});
    EXPECT_EQ(callFor("//PROPERTY[@NAME='Name']/VALUE", "EnumerateInstances", disk), Names{});
    EXPECT_EQ(callFor("//PROPERTY[@NAME='Caption']/VALUE", "EnumerateInstances", disk),
              Names{"\xef\xbf\xbd\xef\xbf\xbd\r"});
    EXPECT_EQ(callFor("//VALUE.NULL", "EnumerateInstances", disk).size(), 1U);
}

TEST_F(InstanceOperations, ParametersThatAreNone) {
    const std::string name = classNameParameter("Local_Disk");
    const auto ask = [&](const std::string& parameters) {
        return call("EnumerateInstances", parameters);
    };
    EXPECT_EQ(ask(""), "status 4: ClassName: is missing");
    EXPECT_EQ(ask(name + name), "status 4: ClassName: comes twice");
    EXPECT_EQ(ask(name + valueParameter("Depth", "1")),
              "status 4: Depth: is no parameter of EnumerateInstances");
    EXPECT_EQ(ask(name + valueParameter("LocalOnly", "maybe")),
              "status 4: LocalOnly: \"maybe\" is no boolean");
    EXPECT_EQ(ask(name + valueParameter("PropertyList", "Name")),
              "status 4: PropertyList: is no VALUE.ARRAY");
    EXPECT_EQ(ask(valueParameter("ClassName", "Local_Disk")),
              "status 4: ClassName: is no CLASSNAME");
    EXPECT_EQ(ask(name + classNameParameter("x", "LocalOnly")), "status 4: LocalOnly: is no VALUE");
    EXPECT_EQ(call("GetInstance", classNameParameter("Local_Disk", "InstanceName")),
              "status 4: InstanceName: names no instance");
    EXPECT_EQ(call("GetInstance", ""), "status 4: InstanceName: is missing");
    EXPECT_EQ(call("GetInstance", valueParameter("InstanceName", "x")),
              "status 4: InstanceName: VALUE: is no object path");
}

}  // namespace
}  // namespace testbed
