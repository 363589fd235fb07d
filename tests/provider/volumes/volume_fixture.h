// A volume with its setting and pool; no pool is cached.
#pragma once

#include <string>

#include "deliberate_leaks.h"
#include "device_fixture.h"

namespace plexortest {

class VolumeTest : public DeviceTest {
protected:
    const std::string kVolume =
        "root/sample:Sample_StorageVolume.SystemCreationClassName=\"Sample_ComputerSystem\","
        "SystemName=\"sample\",CreationClassName=\"Sample_StorageVolume\",DeviceID=\"V1\"";

    void SetUp() override {
        using testbed::CimValue;
        DeviceTest::SetUp();
        poolPath_ = vendor.pool(card, "P1");
        objects_ = vendor.volume(card, "V1", poolPath_, "RAID6");
        const Path& path = objects_.volume;
        repository.setProperty(path, "NumberOfBlocks", CimValue::uint64(0x3'0000'0001));
        repository.setProperty(path, "ConsumableBlocks", CimValue::uint64(0x8000'0000'0000'0002));
        repository.setProperty(path, "DataRedundancy", CimValue::uint16(4));
        repository.setProperty(path, "PackageRedundancy", CimValue::uint16(5));
        repository.setProperty(path, "NameFormat", CimValue::uint16(6));
        repository.setProperty(path, "NameNameSpace", CimValue::uint16(7));
        repository.setProperty(path, "DeltaReservation", CimValue::uint8(200));
        repository.setProperty(path, "OperationalStatus", CimValue::uint16Array({3, 11}));
        repository.setProperty(path, "ExtentStatus", CimValue::uint16Array({12, 1}));
    }

    int buildVolume() { return build(BuildVolumeInfo, objects_.volume); }
    /// A build that ends behind the reading of the pool: the volume's copies and its clone stay
    /// behind on purpose.
    int buildTurnedAway() {
        DeliberateLeaks leaks;
        expectLeftClones(++leftBehind_);
        return buildVolume();
    }
    int updateVolume(CMPIInstance* fresh) {
        return update(CheckAndUpdateVolumeInfo, volume(), fresh);
    }
    int updateVolume() { return updateVolume(instanceAt(objects_.volume)); }
    StorageVolume_t* volume() const { return firstOf<StorageVolume_t>(ctrl->VolumeList); }

    AddressNames names() const {
        AddressNames known = {{ctrl->VolumeList, "volumes"}};
        if (volume() != nullptr) known.emplace_back(volume(), "volume");
        return known;
    }

    void expectNothingCached() {
        EXPECT_EQ(ctrl->VolumeList->Size, 0u);
        EXPECT_EQ(ctrl->VolumeList->Head, nullptr);
        EXPECT_EQ(ctrl->VolumeUpdateTime, 0);
    }

    VendorVolume objects_;
    Path poolPath_;

private:
    std::size_t leftBehind_ = 0;
};

}  // namespace plexortest
