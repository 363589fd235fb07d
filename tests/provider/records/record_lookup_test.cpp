// Finding pools, drives and chassis by their identifiers.
#include "provider_fixture.h"

namespace plexortest {
namespace {

class RecordLookup : public ProviderTest {
protected:
    void SetUp() override {
        ProviderTest::SetUp();
        ctrl = attach(newController("C0"));
        // The caller holds it; a look-up that took it would never come back.
        pthread_mutex_lock(&ctrl->CtrlMutex);
    }
    void TearDown() override {
        pthread_mutex_unlock(&ctrl->CtrlMutex);
        ProviderTest::TearDown();
    }

    RaidController_t* ctrl = nullptr;
};

class PoolLookup : public RecordLookup {
protected:
    LogLine checking(const StoragePool_t* pool, const char* id) const {
        return {LOG_DEBUG, formatted("FindStoragePoolByID: checking pool %p (ID: %s)\n",
                                     static_cast<const void*>(pool), id)};
    }
    LogLine found(const StoragePool_t* pool, const char* id) const {
        return {LOG_DEBUG, formatted("FindStoragePoolByID: found pool %p with %s in list %p\n",
                                     static_cast<const void*>(pool), id,
                                     static_cast<void*>(&ctrl->__PoolList))};
    }
    LogLine missing(const char* id) const {
        return {LOG_INFO, formatted("FindStoragePoolByID: can not find pool %s in list %p\n", id,
                                    static_cast<void*>(&ctrl->__PoolList))};
    }
};

TEST_F(RecordLookup, FindsNothingWhereThereIsNoList) {
    ctrl->PoolList = ctrl->DiskList = ctrl->ChassisList = nullptr;
    EXPECT_EQ(FindStoragePoolByID(ctrl, "P0"), nullptr);
    EXPECT_EQ(FindDiskByDeviceID(ctrl, "D0"), nullptr);
    EXPECT_EQ(FindChassisByTag(ctrl, "E0"), nullptr);
    const std::string nowhere = formatted("%p\n", static_cast<void*>(nullptr));
    EXPECT_EQ(
        CapturedSyslog::linesAt(LOG_INFO),
        (std::vector<std::string>{"FindStoragePoolByID: can not find pool P0 in list " + nowhere,
                                  "FindDiskByDeviceID: can not find disk D0 in list " + nowhere,
                                  "FindChassisByTag: can not find chassis E0 in list " + nowhere}));
    ctrl->PoolList = &ctrl->__PoolList;
    ctrl->DiskList = &ctrl->__DiskList;
    ctrl->ChassisList = &ctrl->__ChassisList;
}

TEST_F(PoolLookup, StopsAtTheFirstMatch) {
    StoragePool_t* other = attach(ctrl, newPool("P0"));
    StoragePool_t* pool = attach(ctrl, newPool("P1"));
    attach(ctrl, newPool("P1"));
    EXPECT_EQ(FindStoragePoolByID(ctrl, "P1"), pool);
    EXPECT_EQ(
        CapturedSyslog::lines(),
        (std::vector<LogLine>{checking(other, "P0"), checking(pool, "P1"), found(pool, "P1")}));
}

TEST_F(PoolLookup, SaysWhatIsMissing) {
    StoragePool_t* pool = attach(ctrl, newPool("P0"));
    EXPECT_EQ(FindStoragePoolByID(ctrl, "P9"), nullptr);
    EXPECT_EQ(CapturedSyslog::lines(), (std::vector<LogLine>{checking(pool, "P0"), missing("P9")}));
}

TEST_F(PoolLookup, FindsNothingInAnEmptyList) {
    EXPECT_EQ(FindStoragePoolByID(ctrl, "P0"), nullptr);
    EXPECT_EQ(CapturedSyslog::lines(), std::vector<LogLine>{missing("P0")});
}

TEST_F(PoolLookup, FindsNothingForNull) {
    attach(ctrl, newPool("P0"));
    EXPECT_EQ(FindStoragePoolByID(ctrl, nullptr), nullptr);
    EXPECT_EQ(CapturedSyslog::lines(), std::vector<LogLine>{});
}

TEST_F(PoolLookup, ComparesWholeIDsWithTheirCase) {
    attach(ctrl, newPool("P10"));
    EXPECT_EQ(FindStoragePoolByID(ctrl, "P1"), nullptr);
    EXPECT_EQ(FindStoragePoolByID(ctrl, "p10"), nullptr);
    EXPECT_EQ(FindStoragePoolByID(ctrl, "P100"), nullptr);
    EXPECT_EQ(FindStoragePoolByID(ctrl, ""), nullptr);
    EXPECT_NE(FindStoragePoolByID(ctrl, "P10"), nullptr);
}

TEST_F(PoolLookup, ComparesTheInstanceIDNotThePoolID) {
    attach(ctrl, newPool("P0"));
    EXPECT_EQ(FindStoragePoolByID(ctrl, "Pool P0"), nullptr);
}

TEST_F(PoolLookup, PassesPoolsWithoutAnID) {
    auto* nameless = zeroed<StoragePool_t>();
    nameless->Drives = &nameless->_Drives;
    attach(ctrl, nameless);
    StoragePool_t* pool = attach(ctrl, newPool("P0"));
    EXPECT_EQ(FindStoragePoolByID(ctrl, "P0"), pool);
}

class DiskLookup : public RecordLookup {
protected:
    LogLine checking(const DiskDrive_t* disk, const char* id) const {
        return {LOG_DEBUG, formatted("FindDiskByDeviceID: checking disk %p (ID: %s)\n",
                                     static_cast<const void*>(disk), id)};
    }
    LogLine missing(const char* id) const {
        return {LOG_INFO, formatted("FindDiskByDeviceID: can not find disk %s in list %p\n", id,
                                    static_cast<void*>(&ctrl->__DiskList))};
    }
};

TEST_F(DiskLookup, StopsAtTheFirstMatch) {
    DiskDrive_t* other = attach(ctrl, newDisk("D0"));
    DiskDrive_t* disk = attach(ctrl, newDisk("D1"));
    attach(ctrl, newDisk("D1"));
    EXPECT_EQ(FindDiskByDeviceID(ctrl, "D1"), disk);
    EXPECT_EQ(CapturedSyslog::lines(),
              (std::vector<LogLine>{
                  checking(other, "D0"),
                  checking(disk, "D1"),
                  {LOG_DEBUG,
                   formatted("FindDiskByDeviceID: found disk %p with D1 in list %p\n",
                             static_cast<void*>(disk), static_cast<void*>(&ctrl->__DiskList))}}));
}

TEST_F(DiskLookup, SaysWhatIsMissing) {
    DiskDrive_t* disk = attach(ctrl, newDisk("D0"));
    EXPECT_EQ(FindDiskByDeviceID(ctrl, "D9"), nullptr);
    EXPECT_EQ(CapturedSyslog::lines(), (std::vector<LogLine>{checking(disk, "D0"), missing("D9")}));
}

TEST_F(DiskLookup, FindsNothingInAnEmptyList) {
    EXPECT_EQ(FindDiskByDeviceID(ctrl, "D0"), nullptr);
    EXPECT_EQ(CapturedSyslog::lines(), std::vector<LogLine>{missing("D0")});
}

TEST_F(DiskLookup, FindsNothingForNull) {
    attach(ctrl, newDisk("D0"));
    EXPECT_EQ(FindDiskByDeviceID(ctrl, nullptr), nullptr);
    EXPECT_EQ(CapturedSyslog::lines(), std::vector<LogLine>{});
}

TEST_F(DiskLookup, ComparesWholeIDsWithTheirCase) {
    attach(ctrl, newDisk("D10"));
    EXPECT_EQ(FindDiskByDeviceID(ctrl, "D1"), nullptr);
    EXPECT_EQ(FindDiskByDeviceID(ctrl, "d10"), nullptr);
    EXPECT_EQ(FindDiskByDeviceID(ctrl, "Disk D10"), nullptr);
    EXPECT_NE(FindDiskByDeviceID(ctrl, "D10"), nullptr);
}

class ChassisLookup : public RecordLookup {
protected:
    LogLine checking(const Chassis_t* chassis, const char* tag) const {
        return {LOG_DEBUG, formatted("FindChassisByTag: checking chassis %p (tag: %s)\n",
                                     static_cast<const void*>(chassis), tag)};
    }
    LogLine missing(const char* tag) const {
        return {LOG_INFO, formatted("FindChassisByTag: can not find chassis %s in list %p\n", tag,
                                    static_cast<void*>(&ctrl->__ChassisList))};
    }
};

TEST_F(ChassisLookup, DeniesWhatItHasFound) {
    Chassis_t* other = attach(ctrl, newChassis("C0_1"));
    Chassis_t* chassis = attach(ctrl, newChassis("C0_2"));
    EXPECT_EQ(FindChassisByTag(ctrl, "C0_2"), nullptr);
    EXPECT_EQ(CapturedSyslog::lines(),
              (std::vector<LogLine>{
                  checking(other, "C0_1"),
                  checking(chassis, "C0_2"),
                  {LOG_DEBUG, formatted("FindChassisByTag: found chassis %p with C0_2 in list %p\n",
                                        static_cast<void*>(chassis),
                                        static_cast<void*>(&ctrl->__ChassisList))},
                  missing("C0_2")}));
}

TEST_F(ChassisLookup, SaysWhatIsMissing) {
    Chassis_t* chassis = attach(ctrl, newChassis("C0_1", "1"));
    EXPECT_EQ(FindChassisByTag(ctrl, "1"), nullptr);
    EXPECT_EQ(CapturedSyslog::lines(),
              (std::vector<LogLine>{checking(chassis, "C0_1"), missing("1")}));
}

TEST_F(ChassisLookup, FindsNothingInAnEmptyListOrForNull) {
    EXPECT_EQ(FindChassisByTag(ctrl, "C0_1"), nullptr);
    EXPECT_EQ(CapturedSyslog::lines(), std::vector<LogLine>{missing("C0_1")});
    CapturedSyslog::clear();
    EXPECT_EQ(FindChassisByTag(ctrl, nullptr), nullptr);
    EXPECT_EQ(CapturedSyslog::lines(), std::vector<LogLine>{});
}

TEST_F(RecordLookup, NoLookUpNeedsMemory) {
    attach(ctrl, newPool("P0"));
    attach(ctrl, newDisk("D0"));
    const auto fault = FailAllocation::from(1);
    EXPECT_NE(FindStoragePoolByID(ctrl, "P0"), nullptr);
    EXPECT_NE(FindDiskByDeviceID(ctrl, "D0"), nullptr);
    EXPECT_EQ(fault.calls(), 0u);
}

}  // namespace
}  // namespace plexortest
