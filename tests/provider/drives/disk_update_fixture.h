// A drive that was built, with the log and the calls of its build forgotten and some time gone by.
#pragma once

#include "disk_fixture.h"

namespace plexortest {

class DiskUpdateTest : public DiskTest {
protected:
    void SetUp() override {
        DiskTest::SetUp();
        ASSERT_EQ(buildDisk(), 0);
        goOnLater();
    }

    void setStatus(std::uint16_t operational, std::uint16_t extent) {
        using testbed::CimValue;
        repository.setProperty(objects_.drive, "OperationalStatus",
                               CimValue::uint16Array({operational}));
        repository.setProperty(objects_.extent, "ExtentStatus", CimValue::uint16Array({extent}));
    }

    /// Everything that an update may change is as it was after the build, but for the stamp.
    void expectUnchanged() {
        EXPECT_EQ(disk()->OperationalStatus, 5);
        EXPECT_EQ(disk()->ExtentStatus, 16);
        EXPECT_STREQ(disk()->Pool, "P1");
        EXPECT_THAT(members(pool_), testing::ElementsAre("D1"));
        EXPECT_EQ(ctrl->DiskUpdateTime, kLater);
        EXPECT_EQ(disk()->LastUpdateTime, kStart);
    }

    const std::string kGetDrive =
        "DEBUG CheckAndUpdateDiskInfo, CIM Query - GetInstance: " + kDrive;
    const std::string kGetExtent =
        "DEBUG CheckAndUpdateDiskInfo, CIM Query - GetInstance: " + kExtent;
    const std::string kGetPools =
        "DEBUG CheckAndUpdateDiskInfo, CIM Query - AssociatorNames: " + kExtent +
        " (assocClass: CIM_ConcreteComponent, resultClass: "
        "CIM_StoragePool)";
};

}  // namespace plexortest
