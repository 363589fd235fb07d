// The order in which a record's texts and paths go, and that each field is null before the next.
#include <algorithm>

#include "fake_path.h"
#include "provider_fixture.h"
#include "watched_calls.h"

namespace plexortest {
namespace {

class ReleaseOrder : public ProviderTest {
protected:
    using Names = std::vector<std::string>;

    /// A field that goes at its end, and how to tell that it is null.
    struct Field {
        std::string name;
        const void* block;
        std::function<bool()> isNull;
    };

    void text(const char* name, char*& field) {
        fields_.push_back({name, field, [&field] { return field == nullptr; }});
    }
    /// A block that no field of the record names.
    void block(const char* name, const void* address) {
        fields_.push_back({name, address, [] { return true; }});
    }
    /// Puts a path into the field that is noted when it is released.
    void path(const char* name, CMPIObjectPath*& field) {
        paths_.push_back(std::make_unique<FakePath>([this, name] { note(name); }));
        field = &paths_.back()->path;
        fields_.push_back({name, field, [&field] { return field == nullptr; }});
    }

    /// Releases the record; the names of what went, in order.
    Names released(ReleaseFunc_t release, void* record) {
        block("record", record);
        const FreeWatch watch([this](const void* freed) {
            for (const Field& field : fields_) {
                if (field.block == freed && freed != nullptr) return note(field.name);
            }
        });
        release(record);
        return went_;
    }

private:
    void note(const std::string& name) {
        for (const Field& field : fields_) {
            const bool gone = std::count(went_.begin(), went_.end(), field.name) != 0;
            if (gone) {
                EXPECT_TRUE(field.isNull()) << field.name << " when " << name << " goes";
            }
        }
        went_.push_back(name);
    }

    std::vector<Field> fields_;
    std::vector<std::unique_ptr<FakePath>> paths_;
    Names went_;
};

TEST_F(ReleaseOrder, OfAVolume) {
    StorageVolume_t* volume = newVolume("V0", "P0");
    path("VolumeOp", volume->VolumeOp);
    text("FromPool", volume->FromPool);
    text("Name", volume->Name);
    text("DeviceID", volume->DeviceID);
    text("RaidLevel", volume->RaidLevel);
    text("ElementName", volume->ElementName);
    EXPECT_EQ(released(FreeVolume, volume), (Names{"ElementName", "RaidLevel", "DeviceID", "Name",
                                                   "FromPool", "VolumeOp", "record"}));
}

TEST_F(ReleaseOrder, OfADisk) {
    DiskDrive_t* disk = newDisk("D0", "P0", "C0_1");
    path("ExtentOp", disk->ExtentOp);
    path("DiskOp", disk->DiskOp);
    text("Chassis", disk->Chassis);
    text("Pool", disk->Pool);
    text("DeviceID", disk->DeviceID);
    text("Name", disk->Name);
    text("FwVersion", disk->FwVersion);
    EXPECT_EQ(released(FreeDisk, disk), (Names{"FwVersion", "Name", "DeviceID", "Pool", "Chassis",
                                               "DiskOp", "ExtentOp", "record"}));
}

TEST_F(ReleaseOrder, OfAPort) {
    SASSATAPort_t* port = newPort("S0");
    path("PortOp", port->PortOp);
    text("DeviceID", port->DeviceID);
    text("PortName", port->PortName);
    EXPECT_EQ(released(FreePort, port), (Names{"PortName", "DeviceID", "PortOp", "record"}));
}

TEST_F(ReleaseOrder, OfABattery) {
    Battery_t* battery = newBattery("B0");
    path("BatteryOp", battery->BatteryOp);
    text("DeviceID", battery->DeviceID);
    EXPECT_EQ(released(FreeBattery, battery), (Names{"DeviceID", "BatteryOp", "record"}));
}

TEST_F(ReleaseOrder, OfAChassis) {
    Chassis_t* chassis = newChassis("C0_1", "1");
    path("ChassisOp", chassis->ChassisOp);
    text("InternalTag", chassis->InternalTag);
    text("Tag", chassis->Tag);
    EXPECT_EQ(released(FreeChassis, chassis), (Names{"Tag", "InternalTag", "ChassisOp", "record"}));
}

TEST_F(ReleaseOrder, OfAPoolItsMembersFirst) {
    StoragePool_t* pool = newPool("P0");
    addMember(pool, "D0");
    path("PoolOp", pool->PoolOp);
    text("InstanceID", pool->InstanceID);
    text("PoolID", pool->PoolID);
    block("member", pool->_Drives.Head->Data);
    EXPECT_EQ(released(FreePool, pool),
              (Names{"member", "PoolID", "InstanceID", "PoolOp", "record"}));
}

TEST_F(ReleaseOrder, OfAController) {
    RaidController_t* ctrl = newController("C0");
    path("PortControllerOp", ctrl->PortControllerOp);
    path("ControllerOp", ctrl->ControllerOp);
    text("DeviceID", ctrl->DeviceID);
    text("Model", ctrl->Model);
    text("FirmwareVersion", ctrl->FirmwareVersion);
    text("BiosVersion", ctrl->BiosVersion);
    text("DriverVersion", ctrl->DriverVersion);
    text("BundleVersion", ctrl->BundleVersion);
    EXPECT_EQ(released(FreeController, ctrl),
              (Names{"BundleVersion", "DriverVersion", "BiosVersion", "FirmwareVersion", "Model",
                     "DeviceID", "ControllerOp", "PortControllerOp", "record"}));
}

TEST_F(ReleaseOrder, OfTheHostsNames) {
    __SystemName = ownedCopy("system");
    __HostName = ownedCopy("host");
    __SystemClassName = ownedCopy("class");
    text("system name", __SystemName);
    text("host name", __HostName);
    text("class name", __SystemClassName);
    EXPECT_EQ(released([](void*) { ReleaseSystemInfo(); }, nullptr),
              (Names{"class name", "host name", "system name"}));
    EXPECT_EQ(GetSystemName(), nullptr);
}

}  // namespace
}  // namespace plexortest
