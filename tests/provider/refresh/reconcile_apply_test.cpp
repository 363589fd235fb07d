// What a refresh does with the devices that stay, are gone, or are new.
#include "reconcile_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;

class ReconcileApply : public ReconcileTest {
protected:
    template <class Record>
    static Record* record(const List_t* list, int index) {
        const List_Entry_t* entry = list->Head;
        while (index-- > 0) entry = entry->Next;
        return static_cast<Record*>(entry->Data);
    }
    SASSATAPort_t* port(int index) { return record<SASSATAPort_t>(ctrl->PortList, index); }

    /// Caches a port record that the vendor may or may not have.
    SASSATAPort_t* cachePort(const Path& path, const std::string& id) {
        SASSATAPort_t* made = newPort(id.c_str());
        made->PortOp = clonedPath(path);
        return attach(ctrl, made);
    }

    /// The lines about single devices, with their pointers.
    static std::vector<std::string> deviceLines() {
        std::vector<std::string> found;
        for (const std::string& line : CapturedSyslog::linesAt(LOG_DEBUG)) {
            for (const char* start :
                 {"Updating devices[", "Deleting devices[", "Adding device ops["}) {
                if (line.rfind(start, 0) == 0) found.push_back(line);
            }
        }
        return found;
    }
};

TEST_F(ReconcileApply, GoneNewAndStayingDrives) {
    const Path pool = addPool("pool0");
    const Path gone = addDrive("D0", pool);
    const Path staying = addDrive("D1", pool);
    process(100);
    ASSERT_EQ(drives(), (Ids{"D0", "D1"}));
    auto* const kept = record<DiskDrive_t>(ctrl->DiskList, 1);

    repository.remove(gone);
    repository.setProperty(staying, "OperationalStatus", CimValue::uint16Array({6}));
    addDrive("D2", pool);
    processDue(100);

    EXPECT_EQ(drives(), (Ids{"D1", "D2"}));
    EXPECT_EQ(record<DiskDrive_t>(ctrl->DiskList, 0), kept);
    EXPECT_EQ(kept->OperationalStatus, 6);
}

TEST_F(ReconcileApply, TheUpdaterGetsTheFreshInstance) {
    const Path battery = addBattery("B0");
    process(103);
    repository.setProperty(battery, "BatteryStatus", CimValue::uint16(4));
    processDue(103);

    EXPECT_EQ(record<Battery_t>(ctrl->BatteryList, 0)->BatteryStatus, 4);
    EXPECT_EQ(books().count(testbed::Entry::GetInstance), 0u);
}

TEST_F(ReconcileApply, EveryDeviceIsShownWithItsPlaceAndPointer) {
    const Path p0 = addPort("P0");
    addPort("P1");
    const Path p2 = addPort("P2");
    process(102);
    void* const cached[] = {port(0), port(1), port(2)};

    repository.remove(p0);
    repository.remove(p2);
    addPort("P3");
    addPort("P4");
    processDue(102);

    const auto lines = deviceLines();
    ASSERT_EQ(lines.size(), 5u);
    EXPECT_EQ(lines[0], formatted("Deleting devices[0]: %p\n", cached[0]));
    EXPECT_EQ(lines[1], formatted("Updating devices[1]: %p\n", cached[1]));
    EXPECT_EQ(lines[2], formatted("Deleting devices[2]: %p\n", cached[2]));
    EXPECT_EQ(lines[3].rfind("Adding device ops[1]: 0x", 0), 0u);
    EXPECT_EQ(lines[4].rfind("Adding device ops[2]: 0x", 0), 0u);
    EXPECT_EQ(ports(), (Ids{"P1", "P3", "P4"}));
}

TEST_F(ReconcileApply, TheAddedPathIsTheMatchingsOwn) {
    addPort("P0");
    processDue(102);
    std::string pointer;
    for (const std::string& line : CapturedSyslog::linesAt(LOG_DEBUG)) {
        if (line.rfind("OP 0x", 0) == 0) pointer = line.substr(3, line.find(" added") - 3);
    }
    EXPECT_EQ(deviceLines(), Ids{"Adding device ops[0]: " + pointer + "\n"});
}

TEST_F(ReconcileApply, BothCountsAreShown) {
    const Path p0 = addPort("P0");
    addPort("P1");
    processDue(102);
    EXPECT_TRUE(loggedOnce(LOG_DEBUG, "ProcessDeviceConfigChange, removecount 0, addcount 2\n"));

    // One gone, one staying, one new: two records and two results, one of them matched.
    repository.remove(p0);
    addPort("P2");
    processDue(102);
    EXPECT_TRUE(loggedOnce(LOG_DEBUG, "ProcessDeviceConfigChange, removecount 2, addcount 2\n"));

    processDue(102);
    EXPECT_TRUE(loggedOnce(LOG_DEBUG, "ProcessDeviceConfigChange, removecount 2, addcount 0\n"));
}

TEST_F(ReconcileApply, NothingOnEitherSide) {
    EXPECT_EQ(processDue(102), 0);
    EXPECT_TRUE(loggedOnce(LOG_DEBUG, "ProcessDeviceConfigChange, removecount 0, addcount 0\n"));
    EXPECT_TRUE(deviceLines().empty());
}

TEST_F(ReconcileApply, UpdatesAndDeletionsComeBeforeAdditions) {
    cachePort(addPort("P1"), "P1");
    cachePort(addPort("P9"), "P9");
    clearVendor();
    for (const char* id : {"P0", "P1", "P2"}) addPort(id);
    processDue(102);

    const auto lines = deviceLines();
    ASSERT_EQ(lines.size(), 4u);
    EXPECT_EQ(lines[0].rfind("Updating devices[0]", 0), 0u);
    EXPECT_EQ(lines[1].rfind("Deleting devices[1]", 0), 0u);
    EXPECT_EQ(lines[2].rfind("Adding device ops[0]", 0), 0u);
    EXPECT_EQ(lines[3].rfind("Adding device ops[2]", 0), 0u);
    EXPECT_EQ(ports(), (Ids{"P1", "P0", "P2"}));
}

TEST_F(ReconcileApply, EmptyCacheBuildsEveryResult) {
    addOneOfEach();
    for (const int action : {101, 102, 103, 105}) process(action);
    EXPECT_EQ(pools(), Ids{"pool0"});
    EXPECT_EQ(drives(), Ids{"D0"});
    EXPECT_EQ(volumes(), Ids{"V0"});
    EXPECT_EQ(ports(), Ids{"P0"});
    EXPECT_EQ(batteries(), Ids{"B0"});
    EXPECT_EQ(chassis(), Ids{"C0_E0"});
}

TEST_F(ReconcileApply, EmptyResultDeletesEveryRecord) {
    addOneOfEach();
    addPort("P1");
    for (const int action : {101, 102, 103, 105}) process(action);
    clearVendor();
    for (const int action : {101, 102, 103, 105}) processDue(action);

    for (const auto& left : {pools(), drives(), volumes(), ports(), batteries(), chassis()}) {
        EXPECT_EQ(left, Ids{});
    }
    EXPECT_EQ(books().liveClones(), 1u) << "the controller's path";
}

TEST_F(ReconcileApply, NothingChangedUpdatesEveryRecordInPlace) {
    addOneOfEach();
    for (const int action : {101, 102, 103, 105}) process(action);
    void* const records[] = {ctrl->PoolList->Head->Data, ctrl->DiskList->Head->Data,
                             ctrl->VolumeList->Head->Data};
    const std::size_t clones = books().liveClones();

    processDue(101);

    EXPECT_EQ(deviceLines(), (Ids{formatted("Updating devices[0]: %p\n", records[0]),
                                  formatted("Updating devices[0]: %p\n", records[1]),
                                  formatted("Updating devices[0]: %p\n", records[2])}));
    EXPECT_EQ(books().liveClones(), clones);
}

TEST_F(ReconcileApply, KeysThatDifferInLetterCaseReplaceTheRecord) {
    Path old = addPort("PORT-A");
    cachePort(old.key("DeviceID", CimValue::string("port-a")), "port-a");
    processDue(102);
    EXPECT_EQ(ports(), Ids{"PORT-A"});
    ASSERT_EQ(deviceLines().size(), 2u);
    EXPECT_EQ(deviceLines()[0].rfind("Deleting", 0), 0u);
    EXPECT_EQ(deviceLines()[1].rfind("Adding", 0), 0u);
}

TEST_F(ReconcileApply, OfTwoEqualRecordsTheSecondIsDeleted) {
    const Path path = addPort("P0");
    SASSATAPort_t* const first = cachePort(path, "P0");
    SASSATAPort_t* const second = cachePort(path, "P0");
    ASSERT_NE(first, second);
    processDue(102);
    EXPECT_EQ(ports(), Ids{"P0"});
    EXPECT_EQ(port(0), first);
}

TEST_F(ReconcileApply, ARejectedDeviceDoesNotStopTheOthers) {
    const Path rejected = addPort("P0");
    repository.eraseProperty(rejected, "DeviceID");
    addPort("P1");
    EXPECT_EQ(processDue(102), 0);
    EXPECT_EQ(ports(), Ids{"P1"});
    EXPECT_EQ(ctrl->PortUpdateTime, kStart);
}

TEST_F(ReconcileApply, ADeviceThatCannotBeDeletedIsOfferedAgain) {
    const Path path = addPort("P0");
    process(102);
    SASSATAPort_t* const port0 = port(0);
    repository.remove(path);
    // Unlinks the record while it is being matched, behind the back of the deletion.
    testbed::FaultRule unlink;
    unlink.entry = testbed::Entry::PathGetKey;
    unlink.times = 1;
    unlink.hook = [&] { RemoveEntryFromListByKey(ctrl->PortList, port0); };
    faults().add(unlink);

    EXPECT_EQ(processDue(102), 0);

    EXPECT_EQ(std::string(port0->DeviceID), "P0") << "the record is not released";
    EXPECT_EQ(ctrl->PortUpdateTime, kStart);
    AddEntryAtListTail(ctrl->PortList, port0);
    processDue(102);
    EXPECT_EQ(deviceLines(),
              Ids{formatted("Deleting devices[0]: %p\n", static_cast<void*>(port0))});
    EXPECT_EQ(ports(), Ids{});
}

TEST_F(ReconcileApply, OnlyPathsThatRecordsKeepAreCloned) {
    addPort("P0");
    addBattery("B0");
    const std::size_t before = books().liveClones();
    process(102);
    process(103);
    EXPECT_EQ(books().liveClones(), before + 2);
    for (int round = 0; round < 5; round++) {
        processDue(102);
        processDue(103);
    }
    EXPECT_EQ(books().liveClones(), before + 2);
}

TEST_F(ReconcileApply, PoolsAndChassisKeepTheValuesOfTheirBuild) {
    const Path pool = addPool("pool0");
    const Path enclosure = addChassis("C0_E0");
    process(104);
    process(105);
    repository.setProperty(pool, "RemainingManagedSpace", CimValue::uint64(1));
    repository.setProperty(enclosure, "OperationalStatus", CimValue::uint16Array({6}));
    processDue(104);
    processDue(105);
    EXPECT_EQ(record<StoragePool_t>(ctrl->PoolList, 0)->RemainingManagedSpace, 400u);
    EXPECT_EQ(record<Chassis_t>(ctrl->ChassisList, 0)->OperationalStatus, 2);
}

}  // namespace
}  // namespace plexortest
