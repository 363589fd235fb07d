// The properties of a logical volume; its name is tested in render_volume_name_test.cpp.
#include "render_volume_fixture.h"

namespace plexortest {
namespace {

class RenderVolume : public RenderVolumeTest {
protected:
    void SetUp() override {
        RenderVolumeTest::SetUp();
        setText(volume->Name, "600508B1001C");
        volume->OperationalStatus = 2;
        volume->NameFormat = 9;
        volume->NameNameSpace = 99;
        volume->NumberOfBlocks = 4000000000;
        volume->ConsumableBlocks = 3999999999;
        volume->IsBasedOnUnderlyingRedundancy = 1;
        volume->DataRedundancy = 2;
        volume->DeltaReservation = 100;
        volume->Primordial = 0;
        volume->ExtentStatus = 14;
        volume->PackageRedundancy = 77;
        volume->ExtentStripeLength = 78;
    }
    /// What is set for the volume as it is after SetUp when that is its name.
    static std::vector<PropertyCall> rowsWithName(const std::string& name) {
        return {
            charsRow("ElementName", name),
            charsRow("Caption", name),
            uint16ArrayRow("OperationalStatus", 2),
            uint16Row("HealthState", 5),
            uint16Row("NameFormat", 9),
            charsRow("Name", "600508B1001C"),
            uint16Row("NameNameSpace", 2),
            uint64Row("BlockSize", 512),
            uint64Row("NumberOfBlocks", 4000000000),
            uint64Row("ConsumableBlocks", 3999999999),
            booleanRow("IsBasedOnUnderlyingRedundancy", true),
            booleanRow("NoSinglePointOfFailure", true),
            uint16Row("DataRedundancy", 2),
            uint8Row("DeltaReservation", 100),
            booleanRow("Primordial", false),
            uint16ArrayRow("ExtentStatus", 14),
        };
    }
};

TEST_F(RenderVolume, SetsEveryPropertyInOrder) {
    givePool({"d1", "d2"});
    setText(volume->RaidLevel, "RAID1");
    setText(volume->ElementName, "data");
    EXPECT_EQ(rowsWithName("RAID1 data Logical Volume 1 on controller C0, Drives(d1,d2) - OPTIMAL"),
              rows());
}

TEST_F(RenderVolume, WithoutPoolAllPropertiesAreSetAndOneErrorIsLogged) {
    CapturedSyslog::clear();
    EXPECT_EQ(rowsWithName("Logical Volume 1 on controller C0 - OPTIMAL"), rows());
    const std::vector<std::string> errors = {
        "FillVolumeInstance: Cannot get physical drive info for logical volume 1\n"};
    EXPECT_EQ(errors, CapturedSyslog::linesAt(LOG_ERR));
}

TEST_F(RenderVolume, NameNameSpaceFollowsTheNameFormat) {
    // Index: NameFormat.
    constexpr CMPIUint16 kNameSpaces[] = {0, 1, 2, 2, 3, 4, 1, 7, 7, 2, 1, 1};
    for (CMPIUint16 format = 0; format < 12; format++) {
        volume->NameFormat = format;
        EXPECT_EQ(std::to_string(kNameSpaces[format]), value("NameNameSpace"))
            << "format " << format;
        EXPECT_EQ(std::to_string(format), value("NameFormat"));
    }
    for (const CMPIUint16 format : {12, 13, 256 + 1, 65535}) {
        volume->NameFormat = format;
        EXPECT_EQ("0", value("NameNameSpace")) << "format " << format;
        EXPECT_EQ(std::to_string(format), value("NameFormat"));
    }
}

TEST_F(RenderVolume, HealthFollowsTheStatus) {
    // Index: OperationalStatus.
    constexpr CMPIUint16 kHealth[] = {0, 0, 5, 10, 0, 0, 30, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0};
    for (CMPIUint16 status = 0; status <= 18; status++) {
        volume->OperationalStatus = status;
        EXPECT_EQ(std::to_string(kHealth[status]), value("HealthState")) << "status " << status;
        EXPECT_EQ("uint16[1]{0:uint16 " + std::to_string(status) + "}", value("OperationalStatus"));
    }
    volume->OperationalStatus = 65535;
    EXPECT_EQ("0", value("HealthState"));
}

TEST_F(RenderVolume, ExtremeNumbersArePassedOn) {
    volume->NumberOfBlocks = 0xFFFFFFFFFFFFFFFFu;
    volume->ConsumableBlocks = 0xFFFFFFFFFFFFFFFEu;
    volume->DataRedundancy = 65535;
    volume->DeltaReservation = 255;
    volume->ExtentStatus = 65534;
    EXPECT_EQ("18446744073709551615", value("NumberOfBlocks"));
    EXPECT_EQ("18446744073709551614", value("ConsumableBlocks"));
    EXPECT_EQ("65535", value("DataRedundancy"));
    EXPECT_EQ("255", value("DeltaReservation"));
    EXPECT_EQ("uint16[1]{0:uint16 65534}", value("ExtentStatus"));
}

TEST_F(RenderVolume, FlagsAreTheRecordsExceptNoSinglePointOfFailure) {
    volume->IsBasedOnUnderlyingRedundancy = 0;
    volume->Primordial = 1;
    EXPECT_EQ("false", value("IsBasedOnUnderlyingRedundancy"));
    EXPECT_EQ("true", value("NoSinglePointOfFailure"));
    EXPECT_EQ("true", value("Primordial"));
}

TEST_F(RenderVolume, AMissingNameIsSetAsNull) {
    setText(volume->Name, nullptr);
    EXPECT_EQ(kNullText, value("Name"));
    setText(volume->Name, "");
    EXPECT_EQ("", value("Name"));
}

TEST_F(RenderVolume, TheNamePropertyIsNeverCut) {
    const std::string name(65536, 'N');
    setText(volume->Name, name.c_str());
    EXPECT_EQ(name, value("Name"));
    setText(volume->Name, "%s%n");
    EXPECT_EQ("%s%n", value("Name"));
}

TEST_F(RenderVolume, HasNoTraceLines) {
    StoragePool_t* pool = attach(ctrl, newPool("pool1"));
    attach(ctrl, newDisk("d1"));
    addMember(pool, "d1");
    setText(volume->FromPool, "pool1");
    CapturedSyslog::clear();
    rows();
    EXPECT_EQ(0u, CapturedSyslog::countContaining("FillVolumeInstance"));
    EXPECT_TRUE(CapturedSyslog::linesAt(LOG_ERR).empty());
}

TEST_F(RenderVolume, WithoutArraysEverythingElseIsSet) {
    EXPECT_EQ(withoutArrays(rows()), rowsWithoutArraysToHave(FillVolumeInstance, ctrl, volume));
}

}  // namespace
}  // namespace plexortest
