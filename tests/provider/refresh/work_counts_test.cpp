// How much a request and a refresh have the provider do: calls of the broker and of its objects,
// lines of the log that are masked but cost a call each, allocations. All grow as the drives do,
// and none faster.
#include <algorithm>
#include <ostream>
#include <random>

#include "reconcile_fixture.h"

namespace plexortest {
namespace {

struct Work {
    std::size_t calls, lines, allocations;
    bool operator==(const Work&) const = default;
};

void PrintTo(const Work& work, std::ostream* out) {
    *out << work.calls << " calls, " << work.lines << " lines, " << work.allocations
         << " allocations";
}

/// With the number of drives.
class WorkCountsTest : public ReconcileTest, public ::testing::WithParamInterface<std::size_t> {
protected:
    static constexpr const char* kDrives = "Tovexa_PlexorStorageExtent";

    void SetUp() override {
        ReconcileTest::SetUp();
        books().recordObjectCalls(true);
        arrange(idsFrom("D"));
        refresh();
        ASSERT_EQ(GetParam(), drives().size());
        // With its first instance a provider for standard managers finds out what becomes of keys.
        client().enumerateInstances(kDrives);
        // The first get after drives have come or gone makes the index of a long list.
        client().getInstance(client().enumerateInstanceNames(kDrives).paths.front());
    }

    static Ids idsFrom(const std::string& prefix) {
        Ids ids;
        for (std::size_t i = 0; i < GetParam(); i++) ids.push_back(prefix + std::to_string(i));
        return ids;
    }
    /// The vendor has these drives from now on, in that order, in one pool.
    void arrange(const Ids& ids) {
        clearVendor();
        const Path pool = addPool("pool0");
        for (const std::string& id : ids) addDrive(id, pool);
    }

    template <class Act>
    Work workOf(Act act) {
        const FailAllocation counted = FailAllocation::none();
        books().clearCalls();
        clearLog();
        const int open = setlogmask(LOG_UPTO(LOG_ERR));
        act();
        setlogmask(open);
        return {books().calls().size(), CapturedSyslog::lines().size(), counted.calls()};
    }
    /// One refresh of the drives and, before it, their pools.
    Work refresh() {
        return workOf([&] {
            setAllUpdateTimes(0);
            process(ACTION_DISK);
        });
    }

    testbed::InstanceClient client() { return {broker, &mi}; }
};

TEST_P(WorkCountsTest, ARequestForNamesMakesSixCallsALineAndAnAllocationForEachDrive) {
    const Work work = workOf([&] { client().enumerateInstanceNames(kDrives); });
    EXPECT_EQ((Work{8 + 6 * GetParam(), 5 + GetParam(), GetParam()}), work);
}

TEST_P(WorkCountsTest, ARequestForInstancesMakesSixteenCallsAndOneAllocationForEachDrive) {
    const Work work = workOf([&] { client().enumerateInstances(kDrives); });
    EXPECT_EQ((Work{8 + 16 * GetParam(), 5 + 3 * GetParam(), GetParam()}), work);
}

TEST_P(WorkCountsTest, AGetMakesAsManyCallsWhateverNumberOfDrivesThereIs) {
    const testbed::ObjectPath last = client().enumerateInstanceNames(kDrives).paths.back();
    const Work work = workOf([&] { client().getInstance(last); });
    EXPECT_EQ((Work{26, 9, 3}), work);
}

TEST_P(WorkCountsTest, ARefreshLooksAtEachDriveEquallyOftenInWhateverOrderTheResultsCome) {
    Ids ids = drives();
    const Work expected = {19 + 21 * GetParam(), 25 + 11 * GetParam(), 8};
    EXPECT_EQ(expected, refresh()) << "unchanged";
    std::reverse(ids.begin(), ids.end());
    arrange(ids);
    EXPECT_EQ(expected, refresh()) << "reversed";
    std::shuffle(ids.begin(), ids.end(), std::mt19937(1));
    arrange(ids);
    EXPECT_EQ(expected, refresh()) << "random";
}

TEST_P(WorkCountsTest, ARefreshBuildsNewDrivesWithEquallyMuchWorkForEach) {
    arrange(idsFrom("E"));
    const std::size_t largerIndex = GetParam() > 32 ? 1 : 0;
    EXPECT_EQ((Work{19 + 53 * GetParam(), 25 + 32 * GetParam(), 8 + 8 * GetParam() + largerIndex}),
              refresh());
    EXPECT_EQ(idsFrom("E"), drives());
}

INSTANTIATE_TEST_SUITE_P(Drives, WorkCountsTest, ::testing::Values(24, 48));

}  // namespace
}  // namespace plexortest
