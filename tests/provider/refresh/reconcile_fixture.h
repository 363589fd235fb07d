// One cached controller over a vendor's controller, long after the inventory was built.
#pragma once

#include <string>
#include <vector>

#include "refresh_fixture.h"

namespace plexortest {

class ReconcileTest : public RefreshTest {
protected:
    using Path = testbed::ObjectPath;

    void SetUp() override {
        RefreshTest::SetUp();
        card = vendor.controller("C0");
        system_ = card.system;
        ctrl = attach(newController("C0"));
        ctrl->ControllerOp = clonedPath(system_);
        InitCompleteTime = kStart - 1000;
        StateUpdateInterval = 20;
        clearLog();
    }

    int process(int action) { return ProcessDeviceConfigChange(&mi, ctx(), ctrl, action); }
    /// The same with every class due and a log and books that show nothing else.
    int processDue(int action) {
        setAllUpdateTimes(0);
        clearLog();
        books().clearCalls();
        return process(action);
    }

    static constexpr time_t RaidController_t::*kClassTimes[] = {
        &RaidController_t::DiskUpdateTime, &RaidController_t::VolumeUpdateTime,
        &RaidController_t::PortUpdateTime, &RaidController_t::BatteryUpdateTime,
        &RaidController_t::PoolUpdateTime, &RaidController_t::ChassisUpdateTime};

    void setAllUpdateTimes(time_t time) {
        for (auto field : kClassTimes) ctrl->*field = time;
    }

    Path addPool(const std::string& id) { return vendor.pool(card, id); }
    Path addDrive(const std::string& id, const Path& pool) {
        return vendor.drive(card, id, pool).drive;
    }
    Path addVolume(const std::string& id, const Path& pool) {
        return vendor.volume(card, id, pool).volume;
    }
    Path addPort(const std::string& id) { return vendor.port(card, id); }
    Path addBattery(const std::string& id) { return vendor.battery(card, id); }
    Path addChassis(const std::string& tag) { return vendor.chassis(card, tag); }
    /// One device of every class.
    void addOneOfEach() {
        const Path pool = addPool("pool0");
        addDrive("D0", pool);
        addVolume("V0", pool);
        addPort("P0");
        addBattery("B0");
        addChassis("C0_E0");
    }
    /// Leaves the vendor nothing but the controller.
    void clearVendor() {
        repository.clearInstances();
        vendor.controller("C0");
    }

    /// Identifiers of the records in a list, in order.
    template <class Record>
    static std::vector<std::string> ids(const List_t* list, char* Record::*id) {
        std::vector<std::string> found;
        for (const List_Entry_t* entry = list->Head; entry != nullptr; entry = entry->Next) {
            found.push_back(static_cast<Record*>(entry->Data)->*id);
        }
        return found;
    }
    std::vector<std::string> drives() const { return ids(ctrl->DiskList, &DiskDrive_t::DeviceID); }
    std::vector<std::string> volumes() const {
        return ids(ctrl->VolumeList, &StorageVolume_t::DeviceID);
    }
    std::vector<std::string> ports() const { return ids(ctrl->PortList, &SASSATAPort_t::DeviceID); }
    std::vector<std::string> batteries() const {
        return ids(ctrl->BatteryList, &Battery_t::DeviceID);
    }
    std::vector<std::string> pools() const {
        return ids(ctrl->PoolList, &StoragePool_t::InstanceID);
    }
    std::vector<std::string> chassis() const { return ids(ctrl->ChassisList, &Chassis_t::Tag); }

    /// Lists a rule for the walk over one class.
    testbed::FaultRule walkOver(const std::string& resultClass) {
        testbed::FaultRule rule;
        rule.entry = testbed::Entry::Associators;
        rule.pathContains = "system-C0";
        rule.resultClass = resultClass;
        return rule;
    }

    /// Walks from the controller: "assocClass>resultClass", in order.
    std::vector<std::string> walks() {
        std::vector<std::string> found;
        for (const testbed::CallRecord& call : books().queries()) {
            if (call.entry != testbed::Entry::Associators) continue;
            if (call.path != system_.text()) continue;
            found.push_back(call.assocClass.value_or("NULL") + ">" +
                            call.resultClass.value_or("NULL"));
            EXPECT_TRUE(asksForAll(call)) << found.back();
        }
        return found;
    }

    using Ids = std::vector<std::string>;

    /// The path of the controller's system as the log shows it.
    static constexpr const char* kSystemText =
        "root/sample:Sample_ComputerSystem.CreationClassName=\"Sample_ComputerSystem\","
        "Name=\"system-C0\"";

    VendorController card;
    Path system_;
    RaidController_t* ctrl = nullptr;
};

}  // namespace plexortest
