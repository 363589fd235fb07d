// The tool with the provider behind a manager that holds it to its schema.
#include <sys/wait.h>

#include <fstream>
#include <nlohmann/json.hpp>
#include <sstream>

#include "mof_reader.h"
#include "scratch_directory.h"

namespace testbed {
namespace {

using nlohmann::json;

std::string contentOf(const std::filesystem::path& file) {
    std::ifstream stream(file);
    std::stringstream text;
    text << stream.rdbuf();
    return text.str();
}

class StrictShow : public ::testing::Test {
protected:
    void SetUp() override {
        for (const auto& file : std::filesystem::directory_iterator(SCHEMA_DIR))
            if (file.is_regular_file())
                std::filesystem::copy(file.path(), schema_.path() / file.path().filename());
    }

    /// Replaces one text of a file of the schema by another.
    void change(const std::string& file, const std::string& from, const std::string& to) {
        std::string text = contentOf(schema_.path() / file);
        const std::size_t place = text.find(from);
        ASSERT_NE(place, std::string::npos) << from;
        schema_.write(file, text.replace(place, from.size(), to));
    }

    int show(const std::string& arguments) {
        const std::string command =
            TOOL " show --library " PROVIDER " --scenario " SCENARIO " --schema " +
            schema_.path().string() + " " + arguments + " >" + (output_.path() / "out").string() +
            " 2>" + (output_.path() / "err").string();
        const int status = std::system(command.c_str());
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }
    json answer() { return json::parse(contentOf(output_.path() / "out")); }
    std::string errors() { return contentOf(output_.path() / "err"); }

    ScratchDirectory schema_;
    ScratchDirectory output_;
};

/// Names of the properties that the schema declares for a class; others are only inherited.
std::vector<std::string> declaredBy(const MofDocument& schema, const std::string& className) {
    std::vector<std::string> names;
    for (const ClassDefinition& definition : schema.classes)
        if (definition.name == className)
            for (const PropertyDefinition& property : definition.properties)
                names.push_back(property.name);
    return names;
}

TEST_F(StrictShow, EveryDeclaredPropertyHasAValue) {
    ASSERT_EQ(show("--json"), 0) << errors();
    const MofDocument schema = readMof(SCHEMA_DIR "/Tovexa_Plexor.mof");
    const json document = answer();
    ASSERT_EQ(document.size(), 8u) << "six classes, the format and the errors";
    for (const auto& [className, instances] : document.items()) {
        if (!className.starts_with("Tovexa_")) continue;
        const auto declared = declaredBy(schema, className);
        EXPECT_GE(declared.size(), 5u) << className;
        EXPECT_FALSE(instances.empty()) << className;
        for (const json& instance : instances)
            for (const std::string& name : declared)
                EXPECT_FALSE(instance["properties"][name].is_null()) << className << "." << name;
    }
    for (const json& drive : document["Tovexa_PlexorStorageExtent"])
        EXPECT_EQ(drive["properties"]["BlockSize"], 512);
}

TEST_F(StrictShow, WhatTheSchemaForbidsDoesNotReachAClient) {
    // A property of the provider's that the class lacks, and one that it has with another type.
    change("Tovexa_PlexorBattery.mof", "CIM_Battery {", "CIM_LogicalDevice {");
    change("Tovexa_PlexorBattery.mof", "[Override(\"BatteryStatus\"),\n", "[\n");
    change("Tovexa_PlexorBattery.mof", "uint16 BatteryStatus", "uint32 BatteryStatus");
    change("Tovexa_PlexorStorageVolume.mof", "CIM_StorageVolume {", "CIM_StorageExtent {");
    change("Tovexa_PlexorStorageVolume.mof", "[Override(\"NameFormat\"),\n", "[\n");
    change("Tovexa_PlexorStorageVolume.mof", "uint16 NameFormat", "uint16 FormatOfName");
    change("Tovexa_PlexorStorageVolume.mof", "[Override(\"NameNamespace\"),\n", "[\n");
    ASSERT_EQ(show("--json"), 0) << errors();
    const json document = answer();
    const json battery = document["Tovexa_PlexorBattery"][0]["properties"];
    EXPECT_TRUE(battery["BatteryStatus"].is_null());
    EXPECT_EQ(battery["HealthState"], 5);
    const json volume = document["Tovexa_PlexorStorageVolume"][0]["properties"];
    EXPECT_FALSE(volume.contains("NameFormat"));
    EXPECT_EQ(volume["NameNamespace"], 1);
}

TEST_F(StrictShow, InstancesWithoutAKeyOfTheirClassAreLeftOut) {
    change("Tovexa_PlexorBattery.mof", "[Override(\"BatteryStatus\"),",
           "[Key, Override(\"BatteryStatus\"),");
    ASSERT_EQ(show("--json"), 0) << errors();
    EXPECT_TRUE(answer()["Tovexa_PlexorBattery"].empty());
    EXPECT_FALSE(answer()["Tovexa_PlexorSASSATAPort"].empty());
}

TEST_F(StrictShow, ASchemaThatCannotBeReadEndsTheTool) {
    change("Tovexa_PlexorBattery.mof", "class ", "clas ");
    EXPECT_EQ(show(""), 1);
    EXPECT_NE(errors().find("Tovexa_PlexorBattery.mof:4: "), std::string::npos) << errors();
    EXPECT_EQ(std::filesystem::file_size(output_.path() / "out"), 0u);
}

}  // namespace
}  // namespace testbed
