// Volumes that are turned away, and what a failed query or allocation of a build leaves behind.
#include "odd_values.h"
#include "volume_fixture.h"
#include "watched_calls.h"
#include "worker_harness.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testbed::Entry;
using testing::ElementsAre;
using testing::ElementsAreArray;
using testing::IsEmpty;

class VolumeBuildFailures : public VolumeTest {
protected:
    const std::string kNoPool = "No pool associated with volume " + kVolume + "\n";

    void expectTurnedAway() {
        EXPECT_EQ(buildTurnedAway(), -1);
        expectNothingCached();
        EXPECT_EQ(CapturedSyslog::count(kNoPool), 1u);
    }
};

TEST_F(VolumeBuildFailures, SettingQueryFailingIsLoggedAndLivedWith) {
    faults().add(along("CIM_ElementSettingData",
                       refusal(Entry::Associators, CMPI_RC_ERR_FAILED, "vendor is busy")));
    ASSERT_EQ(buildVolume(), 0);
    EXPECT_EQ(volume()->RaidLevel, nullptr);
    EXPECT_STREQ(volume()->FromPool, "P1");
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR),
                ElementsAre("Associators " + kVolume +
                            " (assocClass: CIM_ElementSettingData, resultClass: "
                            "CIM_StorageSetting) failed, status: rc 1, msg vendor is busy"));
}

TEST_F(VolumeBuildFailures, SettingQueryAnsweringNullIsSilent) {
    faults().add(along("CIM_ElementSettingData", answerNull(Entry::Associators)));
    ASSERT_EQ(buildVolume(), 0);
    EXPECT_EQ(volume()->RaidLevel, nullptr);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR), IsEmpty());
}

TEST_F(VolumeBuildFailures, SettingQueryFailingDespiteAResultIsNotUsed) {
    faults().add(along("CIM_ElementSettingData", refusalWithResult(Entry::Associators)));
    ASSERT_EQ(buildVolume(), 0);
    EXPECT_EQ(volume()->RaidLevel, nullptr);
}

TEST_F(VolumeBuildFailures, PoolQueryFailingTurnsTheVolumeAway) {
    faults().add(along("CIM_AllocatedFromStoragePool",
                       refusal(Entry::AssociatorNames, CMPI_RC_ERR_NOT_FOUND, {})));
    expectTurnedAway();
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR),
                ElementsAre("AssociatorNames " + kVolume +
                                " (assocClass: CIM_AllocatedFromStoragePool, resultClass: "
                                "CIM_StoragePool) failed, status: rc 6, msg NULL",
                            kNoPool));
    EXPECT_EQ(CapturedSyslog::countContaining("found a pool instance"), 0u);
}

// The pool was not asked for: nothing can be said of the volume, and nothing stays behind.
TEST_F(VolumeBuildFailures, AStopBeforeThePoolQueryLeavesNothing) {
    faults().add(
        along("CIM_ElementSettingData", watch(Entry::Associators, [] { quiesceWorkers(); })));
    EXPECT_EQ(buildVolume(), -1);
    expectNothingCached();
    EXPECT_EQ(books().count(Entry::AssociatorNames), 0u);
    EXPECT_EQ(books().liveClones(), 0u);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR), IsEmpty());
}

TEST_F(VolumeBuildFailures, PoolQueryAnsweringNullTurnsTheVolumeAway) {
    faults().add(along("CIM_AllocatedFromStoragePool", answerNull(Entry::AssociatorNames)));
    expectTurnedAway();
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR), ElementsAre(kNoPool));
}

TEST_F(VolumeBuildFailures, PoolQueryFailingDespiteAResultTurnsTheVolumeAway) {
    faults().add(along("CIM_AllocatedFromStoragePool", refusalWithResult(Entry::AssociatorNames)));
    expectTurnedAway();
}

TEST_F(VolumeBuildFailures, NoPoolTurnsTheVolumeAway) {
    repository.remove(poolPath_);
    expectTurnedAway();
    Texts lines = logLines();
    lines.erase(lines.begin(), lines.end() - 3);
    EXPECT_THAT(lines,
                ElementsAre("DEBUG BuildVolumeInfo, CIM Query - AssociatorNames: " + kVolume +
                                " (assocClass: CIM_AllocatedFromStoragePool, resultClass: "
                                "CIM_StoragePool)",
                            "ERR " + kNoPool, "DEBUG BuildVolumeInfo, EXIT(-1).\n"));
}

TEST_F(VolumeBuildFailures, TurnedAwayLeavesCopiesAndCloneBehind) {
    repository.remove(poolPath_);
    books().recordObjectCalls(true);
    int freed = 0;
    {
        const FreeWatch watch([&freed](const void*) { freed++; });
        expectTurnedAway();
    }
    EXPECT_EQ(freed, 1) << "the record";
    EXPECT_EQ(books().liveClones(), 1u);
    EXPECT_EQ(books().count(Entry::Release), 0u);
    EXPECT_EQ(CapturedSyslog::countContaining("deleted\n"), 0u);
}

TEST_F(VolumeBuildFailures, PoolWithoutAnIdentifierIsFoundAndStillTurnsTheVolumeAway) {
    repository.remove(poolPath_);
    const std::optional<CimValue> keys[] = {
        {}, CimValue::null(CMPI_string), CimValue::uint32(0xDEAD'BEEF)};
    for (const auto& key : keys) {
        SCOPED_TRACE(key ? key->text() : "missing");
        Path path{"root/sample", "Sample_StoragePool", {{"Other", CimValue::string("x")}}};
        if (key) path.key("InstanceID", *key);
        repository.put({path, {}});
        vendor.tie("CIM_AllocatedFromStoragePool", path, objects_.volume);
        CapturedSyslog::clear();
        expectTurnedAway();
        EXPECT_TRUE(logged(LOG_DEBUG, "BuildVolumeInfo: found a pool instance\n"));
        repository.dissociate("Sample_AllocatedFromStoragePool", path, objects_.volume);
    }
}

TEST_F(VolumeBuildFailures, CloneMissingMeansNoPool) {
    faults().add(answerNull(Entry::Clone, 0));
    EXPECT_EQ(
        [&] {
            DeliberateLeaks leaks;
            return buildVolume();
        }(),
        -1);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR),
                ElementsAre("No pool associated with volume NULL\n"));
    EXPECT_EQ(CapturedSyslog::countContaining("\nVolumeOp: NULL\n"), 1u);
    expectNothingCached();
}

TEST_F(VolumeBuildFailures, ElementsOfAnotherTypeAreNeverFollowed) {
    testbed::FaultRule rule;
    rule.entry = Entry::EnumerationGetNext;
    rule.wrongType = true;
    faults().add(rule);
    expectTurnedAway();
}

TEST_F(VolumeBuildFailures, AnElementOfAnotherTypeGivesWayToTheNext) {
    const VendorVolume other = vendor.volume(card, "V2", poolPath_, "RAID0");
    vendor.tie("CIM_ElementSettingData", objects_.volume, other.setting);
    vendor.tie("CIM_AllocatedFromStoragePool", vendor.pool(card, "P2"), objects_.volume);
    const std::pair<const char*, const char*> expected[] = {{"RAID0", "P1"}, {"RAID6", "P2"}};
    for (int wrong = 0; wrong < 2; wrong++) {
        testbed::FaultRule rule;
        rule.entry = Entry::EnumerationGetNext;
        rule.wrongType = true;
        rule.skip = wrong;
        rule.times = 1;
        faults().clear();
        faults().add(rule);
        ASSERT_EQ(buildVolume(), 0);
        EXPECT_STREQ(volume()->RaidLevel, expected[wrong].first);
        EXPECT_STREQ(volume()->FromPool, expected[wrong].second);
        ASSERT_EQ(DeleteVolume(ctrl, volume()), 0);
    }
}

// Allocations.

struct VolumeAllocation {
    const char* label;
    std::size_t number;
    int result;
    bool leavesCopies;
    std::vector<std::string> complaints;
};

const VolumeAllocation kVolumeAllocations[] = {
    {"Record",
     1,
     -2,
     false,
     {"ERR BuildVolumeInfo, failed to allocate memory for StorageVolume_t\n"}},
    {"DeviceId",
     2,
     -1,
     false,
     {"WARNING strdup() failed to duplicate string V1\n", "ERR NULL DeviceID"}},
    {"ElementName", 3, 0, false, {"WARNING strdup() failed to duplicate string Volume V1\n"}},
    {"Name", 4, 0, false, {"WARNING strdup() failed to duplicate string Name V1\n"}},
    {"RaidLevel", 5, 0, false, {"WARNING strdup() failed to duplicate string RAID6\n"}},
    {"FromPool",
     6,
     -1,
     true,
     {"WARNING strdup() failed to duplicate string P1\n", "ERR No pool associated"}},
    {"ListEntry", 7, -2, true, {"ERR BuildVolumeInfo: failed to add volume to list, rc -2.\n"}},
};

class VolumeBuildMemory : public VolumeTest, public testing::WithParamInterface<VolumeAllocation> {
protected:
    Texts complaints() {
        Texts found;
        for (std::string line : logLines()) {
            if (line.starts_with("DEBUG")) continue;
            for (const char* suffix : {" for volume ", " with volume "})
                line = line.substr(0, line.find(suffix));
            found.push_back(line);
        }
        return found;
    }
};

TEST_P(VolumeBuildMemory, HasThisOutcome) {
    const VolumeAllocation& failing = GetParam();
    {
        const auto fault = FailAllocation::nth(failing.number);
        EXPECT_EQ(failing.leavesCopies ? buildTurnedAway() : buildVolume(), failing.result);
        EXPECT_EQ(fault.failures(), 1u);
    }
    EXPECT_THAT(complaints(), ElementsAreArray(failing.complaints));
    EXPECT_EQ(logLines().back(),
              "DEBUG BuildVolumeInfo, EXIT(" + std::to_string(failing.result) + ").\n");
    EXPECT_EQ(books().liveClones(), failing.leavesCopies || failing.result == 0 ? 1u : 0u);
    EXPECT_EQ(CapturedSyslog::countContaining("deleted\n"),
              std::string(failing.label) == "DeviceId" ? 1u : 0u);
    if (failing.result != 0) return expectNothingCached();

    const std::string label = failing.label;
    ASSERT_NE(volume(), nullptr);
    EXPECT_EQ(volume()->ElementName == nullptr, label == "ElementName");
    EXPECT_EQ(volume()->Name == nullptr, label == "Name");
    EXPECT_EQ(volume()->RaidLevel == nullptr, label == "RaidLevel");
    EXPECT_STREQ(volume()->FromPool, "P1");
    EXPECT_EQ(volume()->OperationalStatus, 3);
    EXPECT_EQ(ctrl->VolumeUpdateTime, kStart);
}

INSTANTIATE_TEST_SUITE_P(Volume, VolumeBuildMemory, testing::ValuesIn(kVolumeAllocations),
                         [](const auto& given) { return given.param.label; });

TEST_F(VolumeBuildFailures, MemoryRunningOutForGoodTurnsTheVolumeAway) {
    for (const VolumeAllocation& first : kVolumeAllocations) {
        SCOPED_TRACE(first.label);
        const bool beforeTheCopies = first.number <= 2;
        const auto fault = FailAllocation::from(first.number);
        EXPECT_LT(beforeTheCopies ? buildVolume() : buildTurnedAway(), 0);
        expectNothingCached();
    }
}

TEST_F(VolumeBuildFailures, AllocationsAreAllInTheTable) {
    const auto count = FailAllocation::none();
    ASSERT_EQ(buildVolume(), 0);
    EXPECT_EQ(count.calls(), std::size(kVolumeAllocations));
}

TEST_F(VolumeBuildFailures, ListFailureIsLoggedWithoutTheLock) {
    watchLog();
    {
        const auto fault = FailAllocation::nth(7);
        EXPECT_EQ(buildTurnedAway(), -2);
    }
    Texts lines = logWithLock(names());
    lines.erase(lines.begin(), lines.end() - 3);
    EXPECT_THAT(lines,
                ElementsAre("held DEBUG Adding data <?> to the list <volumes> at the tail\n",
                            "free ERR BuildVolumeInfo: failed to add volume to list, rc -2.\n",
                            "free DEBUG BuildVolumeInfo, EXIT(-2).\n"));
}

// Values.

struct VolumeNumber {
    const char* property;
    bool isArray;
    std::uint64_t (*value)(const StorageVolume_t* volume);
};

#define VOLUME_NUMBER(name, isArray)                                                    \
    VolumeNumber {                                                                      \
#name, isArray,                                                                 \
            [](const StorageVolume_t* volume) -> std::uint64_t { return volume->name; } \
    }

constexpr VolumeNumber kVolumeNumbers[] = {
    VOLUME_NUMBER(NumberOfBlocks, false),
    VOLUME_NUMBER(ConsumableBlocks, false),
    VOLUME_NUMBER(DataRedundancy, false),
    VOLUME_NUMBER(PackageRedundancy, false),
    VOLUME_NUMBER(NameFormat, false),
    VOLUME_NUMBER(NameNameSpace, false),
    VOLUME_NUMBER(IsBasedOnUnderlyingRedundancy, false),
    VOLUME_NUMBER(DeltaReservation, false),
    VOLUME_NUMBER(Primordial, false),
    VOLUME_NUMBER(OperationalStatus, true),
    VOLUME_NUMBER(ExtentStatus, true),
};
#undef VOLUME_NUMBER

class VolumeBuildValues : public VolumeTest, public testing::WithParamInterface<VolumeNumber> {};

TEST_P(VolumeBuildValues, CountAsZeroWhenOdd) {
    for (const OddValue& odd : GetParam().isArray ? oddArrays() : oddNumbers()) {
        SCOPED_TRACE(odd.label);
        give(objects_.volume, GetParam().property, odd);
        ASSERT_EQ(buildVolume(), 0);
        EXPECT_EQ(GetParam().value(volume()), 0u);
        EXPECT_STREQ(volume()->FromPool, "P1");
        ASSERT_EQ(DeleteVolume(ctrl, volume()), 0);
    }
}

INSTANTIATE_TEST_SUITE_P(Volume, VolumeBuildValues, testing::ValuesIn(kVolumeNumbers),
                         [](const auto& given) { return given.param.property; });

TEST_F(VolumeBuildFailures, OddTextsAreNull) {
    for (const OddValue& odd : oddTexts()) {
        SCOPED_TRACE(odd.label);
        give(objects_.volume, "ElementName", odd);
        give(objects_.volume, "Name", odd);
        give(objects_.setting, "ElementName", odd);
        ASSERT_EQ(buildVolume(), 0);
        EXPECT_EQ(volume()->ElementName, nullptr);
        EXPECT_EQ(volume()->Name, nullptr);
        EXPECT_EQ(volume()->RaidLevel, nullptr);
        ASSERT_EQ(DeleteVolume(ctrl, volume()), 0);
    }
}

}  // namespace
}  // namespace plexortest
