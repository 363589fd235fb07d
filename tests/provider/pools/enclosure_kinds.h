// The two kinds of record that a worker builds inline, pools and enclosures, for tests of what
// they have in common.
#pragma once

#include <string>
#include <vector>

#include "pools_fixture.h"

namespace plexortest {

/// What one failing allocation makes of a build.
struct EnclosureShortage {
    std::size_t allocation;
    int result;
    std::vector<std::string> lines;  ///< between the first and the last
};

struct PoolKind {
    using Record = StoragePool_t;
    static constexpr const char* name = "Pool";
    static constexpr BuildFunc_t build = BuildSinglePoolInfo;
    static constexpr auto walk = BuildPoolInfo;
    static constexpr List_t* RaidController_t::*list = &RaidController_t::PoolList;
    static constexpr time_t RaidController_t::*updateTime = &RaidController_t::PoolUpdateTime;
    static constexpr pthread_mutex_t RaidController_t::*classMutex =
        &RaidController_t::PoolCfgMutex;
    static constexpr CMPIObjectPath* Record::*op = &Record::PoolOp;
    static constexpr char* Record::*key = &Record::InstanceID;
    static constexpr const char* keyName = "InstanceID";
    static constexpr const char* id = "P1";  ///< of the device that most tests build
    static constexpr const char* function = "BuildSinglePoolInfo";
    static constexpr const char* dump = "\nPoolOp: ";
    static constexpr const char* rejected = "NULL InstanceID or PoolID for pool ";
    static constexpr const char* added = "BuildSinglePoolInfo: pool ";
    static constexpr const char* notAdded =
        "BuildSinglePoolInfo: failed to add pool to list, rc -2.\n";
    static constexpr const char* released = "Pool Pool P1 deleted\n";
    static std::vector<std::string> mandatory() { return {"InstanceID", "PoolID"}; }
    static std::vector<std::string> properties() {
        return {"InstanceID", "PoolID",           "TotalManagedSpace", "RemainingManagedSpace",
                "Primordial", "OperationalStatus"};
    }
    static std::vector<EnclosureShortage> shortages(const std::string& rejectedLine) {
        return {{1, -2, {"BuildSinglePoolInfo, failed to allocate memory for StoragePool_t\n"}},
                {2, -1, {"strdup() failed to duplicate string P1\n", rejectedLine}},
                {3, -1, {"strdup() failed to duplicate string Pool P1\n", rejectedLine}},
                {4, -2, {notAdded}}};
    }
    static testbed::ObjectPath make(VendorObjects& objects, const VendorController& controller,
                                    const std::string& deviceId) {
        return objects.pool(controller, deviceId);
    }
};

struct ChassisKind {
    using Record = Chassis_t;
    static constexpr const char* name = "Chassis";
    static constexpr BuildFunc_t build = BuildSingleChassisInfo;
    static constexpr auto walk = BuildChassisInfo;
    static constexpr List_t* RaidController_t::*list = &RaidController_t::ChassisList;
    static constexpr time_t RaidController_t::*updateTime = &RaidController_t::ChassisUpdateTime;
    static constexpr pthread_mutex_t RaidController_t::*classMutex =
        &RaidController_t::ChassisCfgMutex;
    static constexpr CMPIObjectPath* Record::*op = &Record::ChassisOp;
    static constexpr char* Record::*key = &Record::Tag;
    static constexpr const char* keyName = "Tag";
    static constexpr const char* id = "C0_E";
    static constexpr const char* function = "BuildSingleChassisInfo";
    static constexpr const char* dump = "\nChassisOp: ";
    static constexpr const char* rejected = "NULL tag for chassis ";
    static constexpr const char* added = "BuildSingleChassisInfo: chassis ";
    static constexpr const char* notAdded =
        "BuildSingleChassisInfo: failed to add chassis to list, rc -2.\n";
    static constexpr const char* released = "Chassis C0_E deleted\n";
    static std::vector<std::string> mandatory() { return {"Tag"}; }
    static std::vector<std::string> properties() { return {"Tag", "OperationalStatus"}; }
    /// The third is the internal tag, without which the chassis is cached.
    static std::vector<EnclosureShortage> shortages(const std::string& rejectedLine) {
        return {{1, -2, {"BuildSingleChassisInfo, failed to allocate memory for Chassis_t\n"}},
                {2, -1, {"strdup() failed to duplicate string C0_E\n", rejectedLine}},
                {4, -2, {notAdded}}};
    }
    static testbed::ObjectPath make(VendorObjects& objects, const VendorController& controller,
                                    const std::string& tag) {
        return objects.chassis(controller, tag);
    }
};

using EnclosureKinds = testing::Types<PoolKind, ChassisKind>;

/// A vendor's device of the kind with the kind's id, and what becomes of it.
template <class Kind>
class EnclosureKindTest : public EnclosureTest {
protected:
    using Record = typename Kind::Record;

    void SetUp() override {
        EnclosureTest::SetUp();
        path_ = make(Kind::id);
    }

    Path make(const std::string& id) { return Kind::make(vendor, card, id); }
    int build(const Path& path) {
        return Kind::build(&mi, ctx(), ctrl, instanceAt(path), broker.makePath(path));
    }
    int build() { return build(path_); }
    std::vector<Record*> records() const { return recordsOf<Record>(ctrl->*Kind::list); }
    /// The key of each cached record.
    Texts keys() const {
        Texts found;
        for (const Record* record : records()) found.push_back(record->*Kind::key);
        return found;
    }
    time_t updateTime() const { return ctrl->*Kind::updateTime; }

    static LogLine enter() { return debugLine(std::string(Kind::function) + ", enter...\n"); }
    static LogLine exiting(int rc) {
        return debugLine(formatted("%s, EXIT(%d).\n", Kind::function, rc));
    }
    std::string rejected() const { return Kind::rejected + path_.text() + "\n"; }

    /// No record, no clone but the controller's, no time stamp.
    void expectNothingLeft() {
        EXPECT_THAT(records(), testing::IsEmpty());
        EXPECT_EQ(books().liveClones(), 1u);
        EXPECT_EQ(updateTime(), 0);
        EXPECT_TRUE(isFree(ctrl->CtrlMutex));
    }

    Path path_;
};

}  // namespace plexortest
