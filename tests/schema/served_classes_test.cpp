// The provider's classes, as they lie in a repository.
#include "served_classes.h"

#include <map>
#include <set>

#include "class_catalogue.h"
#include "inventory.h"
#include "mof_error.h"
#include "mof_reader.h"
#include "schema_space.h"
#include "scratch_directory.h"

namespace testbed {
namespace {

std::set<std::string> keysOf(const Repository& repository, const std::string& className) {
    std::set<std::string> keys;
    for (const PropertyDefinition& property : repository.allProperties(kSpace, className))
        if (property.isKey) keys.insert(property.name);
    return keys;
}

std::string typeOf(const Repository& repository, const char* className, const char* property) {
    const auto found = repository.findProperty(kSpace, className, property);
    return found ? typeName(found->type) : "none";
}

class ServedClasses : public ::testing::Test {
protected:
    void SetUp() override { defineServedClasses(repository_, kSpace, SCHEMA_DIR); }

    Repository repository_;
};

TEST_F(ServedClasses, AllSixAreThereWithTheirSuperclassesAndKeys) {
    const std::set<std::string> device = {"CreationClassName", "DeviceID",
                                          "SystemCreationClassName", "SystemName"};
    const std::map<std::string, std::pair<std::string, std::set<std::string>>> expected = {
        {"Tovexa_PlexorController", {"CIM_ComputerSystem", {"CreationClassName", "Name"}}},
        {"Tovexa_PlexorSoftwareIdentity", {"CIM_SoftwareIdentity", {"InstanceID"}}},
        {"Tovexa_PlexorStorageVolume", {"CIM_StorageVolume", device}},
        {"Tovexa_PlexorStorageExtent", {"CIM_StorageExtent", device}},
        {"Tovexa_PlexorSASSATAPort", {"CIM_NetworkPort", device}},
        {"Tovexa_PlexorBattery", {"CIM_Battery", device}},
    };
    ASSERT_EQ(expected.size(), servedClasses().size());
    for (const ServedClass& served : servedClasses()) {
        const auto& [superclass, keys] = expected.at(served.name);
        EXPECT_TRUE(repository_.isA(kSpace, served.name, superclass)) << served.name;
        EXPECT_TRUE(repository_.isA(kSpace, served.name, "CIM_ManagedElement")) << served.name;
        EXPECT_EQ(keysOf(repository_, served.name), keys) << served.name;
    }
}

TEST_F(ServedClasses, TypesAreTheInheritedOnes) {
    EXPECT_EQ(typeOf(repository_, "Tovexa_PlexorStorageVolume", "NumberOfBlocks"), "uint64");
    EXPECT_EQ(typeOf(repository_, "Tovexa_PlexorStorageVolume", "ExtentStatus"), "uint16[]");
    EXPECT_EQ(typeOf(repository_, "Tovexa_PlexorStorageVolume", "DeltaReservation"), "uint8");
    EXPECT_EQ(typeOf(repository_, "Tovexa_PlexorStorageVolume", "namenamespace"), "uint16");
    EXPECT_EQ(typeOf(repository_, "Tovexa_PlexorStorageExtent", "BlockSize"), "uint64");
    EXPECT_EQ(typeOf(repository_, "Tovexa_PlexorController", "OtherIdentifyingInfo"), "string[]");
    EXPECT_EQ(typeOf(repository_, "Tovexa_PlexorController", "NameFormat"), "string");
    EXPECT_EQ(typeOf(repository_, "Tovexa_PlexorSoftwareIdentity", "IsEntity"), "boolean");
    EXPECT_EQ(typeOf(repository_, "Tovexa_PlexorSASSATAPort", "PortType"), "uint16");
}

TEST_F(ServedClasses, ABlockSizeIsThereEvenIfTheManagerRefusesTheProviders) {
    const auto blockSize =
        repository_.findProperty(kSpace, "Tovexa_PlexorStorageExtent", "BlockSize");
    ASSERT_TRUE(blockSize);
    EXPECT_EQ(blockSize->defaultValue, CimValue::uint64(512));
}

TEST_F(ServedClasses, QualifiersAndOriginsAreKept) {
    const auto battery = repository_.findClass(kSpace, "Tovexa_PlexorBattery");
    ASSERT_TRUE(battery);
    std::map<std::string, std::string> texts;
    for (const auto& [name, value] : battery->qualifiers) texts[name] = value.text();
    EXPECT_EQ(texts["Provider"], "cmpi:PlexorProvider");
    EXPECT_EQ(texts["Version"], "1.0.0");
    EXPECT_NE(texts["Description"], "");
    const auto health = repository_.findProperty(kSpace, "Tovexa_PlexorBattery", "HealthState");
    EXPECT_EQ(health->originClass, "CIM_ManagedSystemElement");
    std::map<std::string, CimValue> values(health->qualifiers.begin(), health->qualifiers.end());
    EXPECT_EQ(values["ValueMap"], CimValue::stringArray({"0", "5", "20", "30"}));
}

TEST_F(ServedClasses, DefiningThemAgainChangesNothing) {
    const auto before = repository_.classNames(kSpace);
    defineServedClasses(repository_, kSpace, SCHEMA_DIR);
    EXPECT_EQ(repository_.classNames(kSpace), before);
}

TEST_F(ServedClasses, TheStandardAssociationsAreKnownAsSuch) {
    for (const char* name : {"CIM_SystemDevice", "CIM_Component", "CIM_Dependency"})
        EXPECT_TRUE(repository_.findClass(kSpace, name)->isAssociation) << name;
    EXPECT_FALSE(repository_.findClass(kSpace, "CIM_LogicalDevice")->isAssociation);
}

struct Mistake {
    const char* mof;
    const char* complaint;
};

class SchemaMistakes : public ::testing::TestWithParam<Mistake> {};

TEST_P(SchemaMistakes, AreRefused) {
    const ScratchDirectory scratch;
    scratch.write(kSchemaFile, GetParam().mof);
    Repository repository;
    try {
        defineServedClasses(repository, kSpace, scratch.path());
        FAIL() << "taken";
    } catch (const std::runtime_error& error) {
        EXPECT_EQ(std::string(error.what()), GetParam().complaint);
    }
}

const Mistake kMistakes[] = {
    {"class A : CIM_Carrot { [Key] string K; };",
     "schema: A derives from CIM_Carrot, which is not known"},
    {"class A { string P; };", "schema: A has no key"},
    {"class A : CIM_Battery { string BatteryStatus; };",
     "schema: A.BatteryStatus is inherited and has no Override"},
    {"class A : CIM_Battery { [Override(\"BatteryStatus\")] uint8 BatteryStatus; };",
     "schema: A.BatteryStatus is a uint8, the superclass has a uint16"},
    {"class A : CIM_Battery { [Override(\"Charge\")] uint16 Charge; };",
     "schema: A.Charge overrides nothing"},
    {"class A : CIM_Battery { [Override(\"Name\")] string Caption; };",
     "schema: A.Caption: Override names another property"},
};

INSTANTIATE_TEST_SUITE_P(All, SchemaMistakes, ::testing::ValuesIn(kMistakes));

TEST(SchemaDirectory, AnInheritedKeyStaysAKey) {
    const ScratchDirectory scratch;
    scratch.write(kSchemaFile,
                  "class A : CIM_Battery { [Override(\"DeviceID\")] string DeviceID; };");
    Repository repository;
    defineServedClasses(repository, kSpace, scratch.path());
    EXPECT_TRUE(repository.findProperty(kSpace, "A", "DeviceID")->isKey);
}

TEST(SchemaDirectory, MissingOnesAreNamed) {
    Repository repository;
    EXPECT_THROW(defineServedClasses(repository, kSpace, "/nowhere"), MofError);
}

TEST(RegistrationInstances, NameEachClassOnce) {
    const MofDocument document = readMof(SCHEMA_DIR "/registration/PlexorProviderModule.mof");
    std::multiset<std::string> registered;
    std::map<std::string, int> kinds;
    for (const Instance& instance : document.instances) {
        ++kinds[instance.path.className];
        if (instance.path.className != "PG_ProviderCapabilities") continue;
        registered.insert(instance.find("ClassName")->asString());
        EXPECT_EQ(instance.find("ProviderName")->asString(), "PlexorProvider");
        EXPECT_EQ(*instance.find("Namespaces"), CimValue::stringArray({kSpace}));
        EXPECT_EQ(instance.find("ProviderType")->asUnsigned(), 2u);
    }
    std::multiset<std::string> served;
    for (const ServedClass& each : servedClasses()) served.insert(each.name);
    EXPECT_EQ(registered, served);
    EXPECT_EQ(kinds["PG_ProviderModule"], 1);
    EXPECT_EQ(kinds["PG_Provider"], 1);
}

}  // namespace
}  // namespace testbed
