// A drive with its extent, firmware, place and pool, the pool being cached already.
#pragma once

#include <string>

#include "device_fixture.h"

namespace plexortest {

class DiskTest : public DeviceTest {
protected:
    const std::string kDrive =
        "root/sample:Sample_DiskDrive.SystemCreationClassName=\"Sample_ComputerSystem\","
        "SystemName=\"sample\",CreationClassName=\"Sample_DiskDrive\",DeviceID=\"D1\"";
    const std::string kExtent =
        "root/sample:Sample_StorageExtent.SystemCreationClassName=\"Sample_ComputerSystem\","
        "SystemName=\"sample\",CreationClassName=\"Sample_StorageExtent\",DeviceID=\"extent-D1\"";
    const std::string kPackage =
        "root/sample:Sample_PhysicalPackage.CreationClassName=\"Sample_PhysicalPackage\","
        "Tag=\"package-D1\"";
    const std::string kSlot =
        "root/sample:Sample_Slot.CreationClassName=\"Sample_Slot\",Tag=\"slot-D1\"";

    void SetUp() override {
        using testbed::CimValue;
        DeviceTest::SetUp();
        chassis_ = vendor.chassis(card, "C0_32");
        poolPath_ = vendor.pool(card, "P1");
        objects_ = vendor.drive(card, "D1", poolPath_, chassis_, 4);
        repository.setProperty(objects_.drive, "EnabledState", CimValue::uint16(3));
        repository.setProperty(objects_.drive, "OperationalStatus", CimValue::uint16Array({5, 2}));
        const Path& extent = objects_.extent;
        repository.setProperty(extent, "NumberOfBlocks", CimValue::uint64(0x1'0000'0002));
        repository.setProperty(extent, "ConsumableBlocks", CimValue::uint64(0xFFFF'FFFF'FFFF'FFFF));
        repository.setProperty(extent, "ExtentStatus", CimValue::uint16Array({16, 2}));
        pool_ = attach(ctrl, newPool("P1"));
    }

    int buildDisk() { return build(BuildDiskInfo, objects_.drive); }
    int updateDisk(CMPIInstance* fresh) { return update(CheckAndUpdateDiskInfo, disk(), fresh); }
    /// With the drive's instance as it is now.
    int updateDisk() { return updateDisk(instanceAt(objects_.drive)); }
    DiskDrive_t* disk() const { return firstOf<DiskDrive_t>(ctrl->DiskList); }

    /// Names for the addresses in the log.
    AddressNames names() const {
        AddressNames known = {{ctrl->DiskList, "disks"},
                              {ctrl->PoolList, "pools"},
                              {pool_, "pool"},
                              {pool_->Drives, "members"}};
        if (disk() != nullptr) known.emplace_back(disk(), "disk");
        if (pool_->Drives->Head != nullptr) known.emplace_back(pool_->Drives->Head->Data, "member");
        return known;
    }

    /// The drive was turned away and nothing of it is left.
    void expectNothingCached() {
        EXPECT_EQ(ctrl->DiskList->Size, 0u);
        EXPECT_EQ(ctrl->DiskList->Head, nullptr);
        EXPECT_THAT(members(pool_), testing::IsEmpty());
        EXPECT_EQ(ctrl->DiskUpdateTime, 0);
        EXPECT_EQ(books().liveClones(), 0u);
    }

    VendorDrive objects_;
    Path chassis_, poolPath_;
    StoragePool_t* pool_ = nullptr;
};

}  // namespace plexortest
