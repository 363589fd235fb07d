// The four kinds of device that are built from one instance, for tests of what they have in common.
#pragma once

#include <string>

#include "device_fixture.h"

namespace plexortest {

struct DiskKind {
    using Record = DiskDrive_t;
    static constexpr const char* name = "Disk";
    static constexpr BuildFunc_t build = BuildDiskInfo;
    static constexpr UpdateFunc_t update = CheckAndUpdateDiskInfo;
    static constexpr DeleteFunc_t remove = DeleteDisk;
    static constexpr List_t* RaidController_t::*list = &RaidController_t::DiskList;
    static constexpr time_t RaidController_t::*updateTime = &RaidController_t::DiskUpdateTime;
    static constexpr CMPIObjectPath* DiskDrive_t::*op = &DiskDrive_t::DiskOp;
    static constexpr const char* cimClass = "CIM_DiskDrive";
    static constexpr const char* enter = "DEBUG BuildDiskInfo, ENTER...\n";
    static constexpr const char* noMemory =
        "ERR BuildDiskInfo, failed to allocate memory for DiskDrive_t\n";
    static constexpr const char* nullDeviceId = "ERR NULL DeviceID for disk ";
    static constexpr const char* blankReleased = "DEBUG NULL deleted\n";
    static constexpr const char* exit = "DEBUG BuildDiskInfo, EXIT(";
    static constexpr const char* updated = "DEBUG CheckAndUpdateDiskInfo, exit\n";
    static testbed::ObjectPath make(VendorObjects& vendor, const VendorController& card,
                                    const std::string& id) {
        return vendor.drive(card, id, vendor.pool(card, "P1")).drive;
    }
};

struct VolumeKind {
    using Record = StorageVolume_t;
    static constexpr const char* name = "Volume";
    static constexpr BuildFunc_t build = BuildVolumeInfo;
    static constexpr UpdateFunc_t update = CheckAndUpdateVolumeInfo;
    static constexpr DeleteFunc_t remove = DeleteVolume;
    static constexpr List_t* RaidController_t::*list = &RaidController_t::VolumeList;
    static constexpr time_t RaidController_t::*updateTime = &RaidController_t::VolumeUpdateTime;
    static constexpr CMPIObjectPath* StorageVolume_t::*op = &StorageVolume_t::VolumeOp;
    static constexpr const char* cimClass = "CIM_StorageVolume";
    static constexpr const char* enter = "DEBUG BuildVolumeInfo, ENTER...\n";
    static constexpr const char* noMemory =
        "ERR BuildVolumeInfo, failed to allocate memory for StorageVolume_t\n";
    static constexpr const char* nullDeviceId = "ERR NULL DeviceID for volume ";
    static constexpr const char* blankReleased = "DEBUG Volume NULL (NULL) deleted\n";
    static constexpr const char* exit = "DEBUG BuildVolumeInfo, EXIT(";
    static constexpr const char* updated = "DEBUG CheckAndUpdateVolumeInfo, exit\n";
    static testbed::ObjectPath make(VendorObjects& vendor, const VendorController& card,
                                    const std::string& id) {
        return vendor.volume(card, id, vendor.pool(card, "P1")).volume;
    }
};

struct PortKind {
    using Record = SASSATAPort_t;
    static constexpr const char* name = "Port";
    static constexpr BuildFunc_t build = BuildPortInfo;
    static constexpr UpdateFunc_t update = CheckAndUpdatePortInfo;
    static constexpr DeleteFunc_t remove = DeletePort;
    static constexpr List_t* RaidController_t::*list = &RaidController_t::PortList;
    static constexpr time_t RaidController_t::*updateTime = &RaidController_t::PortUpdateTime;
    static constexpr CMPIObjectPath* SASSATAPort_t::*op = &SASSATAPort_t::PortOp;
    static constexpr const char* cimClass = "CIM_SASSATAPort";
    static constexpr const char* enter = "DEBUG BuildPortInfo, ENTER...\n";
    static constexpr const char* noMemory =
        "ERR BuildPortInfo, failed to allocate memory for SASSATAPort_t\n";
    static constexpr const char* nullDeviceId = "ERR NULL DeviceID for port ";
    static constexpr const char* blankReleased = "DEBUG NULL deleted\n";
    static constexpr const char* exit = "DEBUG BuildPortInfo, EXIT(";
    static constexpr const char* updated = "DEBUG CheckAndUpdatePortInfo, exit.\n";
    static testbed::ObjectPath make(VendorObjects& vendor, const VendorController& card,
                                    const std::string& id) {
        return vendor.port(card, id);
    }
};

struct BatteryKind {
    using Record = Battery_t;
    static constexpr const char* name = "Battery";
    static constexpr BuildFunc_t build = BuildBatteryInfo;
    static constexpr UpdateFunc_t update = CheckAndUpdateBatteryInfo;
    static constexpr DeleteFunc_t remove = DeleteBattery;
    static constexpr List_t* RaidController_t::*list = &RaidController_t::BatteryList;
    static constexpr time_t RaidController_t::*updateTime = &RaidController_t::BatteryUpdateTime;
    static constexpr CMPIObjectPath* Battery_t::*op = &Battery_t::BatteryOp;
    static constexpr const char* cimClass = "CIM_Battery";
    static constexpr const char* enter = "DEBUG BuildBatteryInfo, ENTER...\n";
    static constexpr const char* noMemory =
        "ERR BuildBatteryInfo, failed to allocate memory for Battery_t\n";
    static constexpr const char* nullDeviceId = "ERR NULL DeviceID for battery ";
    static constexpr const char* blankReleased = "DEBUG Battery NULL deleted\n";
    static constexpr const char* exit = "DEBUG BuildBatteryInfo, EXIT(";
    static constexpr const char* updated = "DEBUG CheckAndUpdateBatteryInfo, exit.\n";
    static testbed::ObjectPath make(VendorObjects& vendor, const VendorController& card,
                                    const std::string& id) {
        return vendor.battery(card, id);
    }
};

using DeviceKinds = testing::Types<DiskKind, VolumeKind, PortKind, BatteryKind>;

/// A vendor's device "X1" of the kind, with what it needs around it to be accepted.
template <class Kind>
class KindTest : public DeviceTest {
protected:
    using Record = typename Kind::Record;

    void SetUp() override {
        DeviceTest::SetUp();
        path_ = Kind::make(vendor, card, "X1");
    }

    int buildIt() { return build(Kind::build, path_); }
    List_t* list() const { return ctrl->*Kind::list; }
    Record* record() const { return firstOf<Record>(list()); }
    time_t updateTime() const { return ctrl->*Kind::updateTime; }
    static std::string exitLine(int rc) { return Kind::exit + std::to_string(rc) + ").\n"; }
    std::string pathText() const { return path_.text(); }

    void expectNothingCached() {
        EXPECT_EQ(list()->Size, 0u);
        EXPECT_EQ(list()->Head, nullptr);
        EXPECT_EQ(updateTime(), 0);
        EXPECT_EQ(books().liveClones(), 0u);
    }

    /// The update times of the controller, but for the kind's own.
    std::vector<time_t> otherTimes() const {
        std::vector<time_t> times;
        for (time_t RaidController_t::*time :
             {&RaidController_t::ControllerUpdateTime, &RaidController_t::ChassisUpdateTime,
              &RaidController_t::PoolUpdateTime, &RaidController_t::VolumeUpdateTime,
              &RaidController_t::DiskUpdateTime, &RaidController_t::PortUpdateTime,
              &RaidController_t::BatteryUpdateTime})
            if (time != Kind::updateTime) times.push_back(ctrl->*time);
        return times;
    }

    Path path_;
};

}  // namespace plexortest
