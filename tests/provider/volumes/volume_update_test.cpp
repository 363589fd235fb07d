// Status, capacity and element name of a cached volume: watched at every update.
#include "volume_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testbed::Entry;
using testing::ElementsAre;
using testing::IsEmpty;

class VolumeUpdate : public VolumeTest {
protected:
    void SetUp() override {
        VolumeTest::SetUp();
        ASSERT_EQ(buildVolume(), 0);
        goOnLater();
    }

    void set(const char* property, const CimValue& value) {
        repository.setProperty(objects_.volume, property, value);
    }
    /// The lines between entry and exit.
    Texts changes() {
        Texts lines = logLines(names());
        EXPECT_GE(lines.size(), 2u);
        EXPECT_EQ(lines.back(), "DEBUG CheckAndUpdateVolumeInfo, exit\n");
        return {lines.begin() + 1, lines.end() - 1};
    }
    void expectUnchanged() {
        EXPECT_EQ(volume()->OperationalStatus, 3);
        EXPECT_EQ(volume()->ExtentStatus, 12);
        EXPECT_EQ(volume()->NumberOfBlocks, 0x3'0000'0001u);
        EXPECT_EQ(volume()->ConsumableBlocks, 0x8000'0000'0000'0002u);
        EXPECT_STREQ(volume()->ElementName, "Volume V1");
        EXPECT_EQ(volume()->LastUpdateTime, kStart);
        EXPECT_EQ(ctrl->VolumeUpdateTime, kLater);
    }

    const std::string kEnter = "DEBUG CheckAndUpdateVolumeInfo: ENTER. volume - Volume V1\n";
    const std::string kGet = "DEBUG CheckAndUpdateVolumeInfo, CIM Query - GetInstance: " + kVolume;
    const std::string kExit = "DEBUG CheckAndUpdateVolumeInfo, exit\n";
};

TEST_F(VolumeUpdate, OfAnUnchangedVolumeAsksAndLogsNothing) {
    ASSERT_EQ(updateVolume(), 0);
    EXPECT_THAT(logLines(), ElementsAre(kEnter, kExit));
    EXPECT_THAT(brokerCalls(), IsEmpty());
    expectUnchanged();
}

TEST_F(VolumeUpdate, WithoutAFreshInstanceFetchesIt) {
    ASSERT_EQ(updateVolume(nullptr), 0);
    EXPECT_THAT(logLines(), ElementsAre(kEnter, kGet, kExit));
    EXPECT_THAT(brokerCalls(), ElementsAre("getInstance " + kVolume));
    expectUnchanged();
}

TEST_F(VolumeUpdate, UsesTheFetchedInstance) {
    set("OperationalStatus", CimValue::uint16Array({6}));
    ASSERT_EQ(updateVolume(nullptr), 0);
    EXPECT_EQ(volume()->OperationalStatus, 6);
}

TEST_F(VolumeUpdate, OfAVolumeThatCannotBeFetchedOnlyStamps) {
    set("OperationalStatus", CimValue::uint16Array({6}));
    faults().add(refusal(Entry::GetInstance, CMPI_RC_ERR_FAILED, "offline"));
    ASSERT_EQ(updateVolume(nullptr), 0);
    EXPECT_THAT(
        logLines(),
        ElementsAre(kEnter, kGet,
                    "ERR GetInstance " + kVolume + " failed, status: rc 1, msg offline", kExit));
    expectUnchanged();
}

TEST_F(VolumeUpdate, OfAVolumeAnsweredNullOnlyStamps) {
    set("OperationalStatus", CimValue::uint16Array({6}));
    faults().add(answerNull(Entry::GetInstance));
    ASSERT_EQ(updateVolume(nullptr), 0);
    EXPECT_THAT(logLines(), ElementsAre(kEnter, kGet, kExit));
    expectUnchanged();
}

struct Change {
    const char* label;
    const char* property;
    CimValue value;
    std::string line;
};

const Change kChanges[] = {
    {"OperationalStatus", "OperationalStatus", CimValue::uint16Array({2}),
     "DEBUG CheckAndUpdateVolumeInfo: volume V1 status changed. Old opStat 3 extStat 12, new "
     "opStat "
     "2 extStat 12\n"},
    {"ExtentStatus", "ExtentStatus", CimValue::uint16Array({2}),
     "DEBUG CheckAndUpdateVolumeInfo: volume V1 status changed. Old opStat 3 extStat 12, new "
     "opStat "
     "3 extStat 2\n"},
    {"Total", "NumberOfBlocks", CimValue::uint64(0x3'0000'0002),
     "DEBUG CheckAndUpdateVolumeInfo: volume V1 capacity changed. Old total blocs 12884901889 free "
     "blocks -9223372036854775806, new total blocks 12884901890 free blocks "
     "-9223372036854775806\n"},
    {"TotalHighBits", "NumberOfBlocks", CimValue::uint64(0x4'0000'0001),
     "DEBUG CheckAndUpdateVolumeInfo: volume V1 capacity changed. Old total blocs 12884901889 free "
     "blocks -9223372036854775806, new total blocks 17179869185 free blocks "
     "-9223372036854775806\n"},
    {"Free", "ConsumableBlocks", CimValue::uint64(7),
     "DEBUG CheckAndUpdateVolumeInfo: volume V1 capacity changed. Old total blocs 12884901889 free "
     "blocks -9223372036854775806, new total blocks 12884901889 free blocks 7\n"},
    {"FreeHighBits", "ConsumableBlocks", CimValue::uint64(2),
     "DEBUG CheckAndUpdateVolumeInfo: volume V1 capacity changed. Old total blocs 12884901889 free "
     "blocks -9223372036854775806, new total blocks 12884901889 free blocks 2\n"},
    {"Name", "ElementName", CimValue::string("renamed"),
     "DEBUG CheckAndUpdateVolumeInfo: volume V1 element name changed. Old name Volume V1, new name "
     "renamed\n"},
    {"NameCase", "ElementName", CimValue::string("volume V1"),
     "DEBUG CheckAndUpdateVolumeInfo: volume V1 element name changed. Old name Volume V1, new name "
     "volume V1\n"},
    {"NameEmpty", "ElementName", CimValue::string(""),
     "DEBUG CheckAndUpdateVolumeInfo: volume V1 element name changed. Old name Volume V1, new name "
     "\n"},
    {"NameGone", "ElementName", CimValue::null(CMPI_string),
     "DEBUG CheckAndUpdateVolumeInfo: volume V1 element name changed. Old name Volume V1, new name "
     "NULL\n"},
};

class VolumeUpdateChange : public VolumeUpdate, public testing::WithParamInterface<Change> {
protected:
    /// The record as an update reads it.
    testbed::Instance seen() const {
        testbed::Instance instance;
        instance.set("OperationalStatus", CimValue::uint16Array({volume()->OperationalStatus}));
        instance.set("ExtentStatus", CimValue::uint16Array({volume()->ExtentStatus}));
        instance.set("NumberOfBlocks", CimValue::uint64(volume()->NumberOfBlocks));
        instance.set("ConsumableBlocks", CimValue::uint64(volume()->ConsumableBlocks));
        const char* name = volume()->ElementName;
        instance.set("ElementName",
                     name != nullptr ? CimValue::string(name) : CimValue::null(CMPI_string));
        return instance;
    }
};

TEST_P(VolumeUpdateChange, IsLoggedAndStoredOnce) {
    testbed::Instance expected = seen();
    expected.set(GetParam().property, GetParam().value);
    set(GetParam().property, GetParam().value);
    ASSERT_EQ(updateVolume(), 0);
    EXPECT_THAT(changes(), ElementsAre(GetParam().line));
    EXPECT_EQ(seen().properties, expected.properties);
    EXPECT_EQ(ctrl->VolumeUpdateTime, kLater);

    CapturedSyslog::clear();
    ASSERT_EQ(updateVolume(), 0);
    EXPECT_THAT(changes(), IsEmpty());
}

INSTANTIATE_TEST_SUITE_P(Volume, VolumeUpdateChange, testing::ValuesIn(kChanges),
                         [](const auto& given) { return given.param.label; });

TEST_F(VolumeUpdate, LogsAllChangesInOrderUnderOneHoldOfTheLock) {
    set("OperationalStatus", CimValue::uint16Array({6}));
    set("ExtentStatus", CimValue::uint16Array({5}));
    set("NumberOfBlocks", CimValue::uint64(10));
    set("ConsumableBlocks", CimValue::uint64(11));
    set("ElementName", CimValue::string("other"));
    watchLock();
    watchLog();
    ASSERT_EQ(updateVolume(), 0);
    EXPECT_THAT(
        logWithLock(),
        ElementsAre("free " + kEnter,
                    "held DEBUG CheckAndUpdateVolumeInfo: volume V1 status changed. Old opStat 3 "
                    "extStat 12, new opStat 6 extStat 5\n",
                    "held DEBUG CheckAndUpdateVolumeInfo: volume V1 capacity changed. Old total "
                    "blocs 12884901889 free blocks -9223372036854775806, new total blocks 10 free "
                    "blocks 11\n",
                    "held DEBUG CheckAndUpdateVolumeInfo: volume V1 element name changed. Old name "
                    "Volume V1, new name other\n",
                    "free " + kExit));
    EXPECT_EQ(watchedCalls_, 5) << "the five properties";
    EXPECT_EQ(heldCalls_, 0);
}

TEST_F(VolumeUpdate, ReadsThePropertiesInOrder) {
    books().recordObjectCalls(true);
    ASSERT_EQ(updateVolume(), 0);
    EXPECT_THAT(propertiesRead("Sample_StorageVolume"),
                ElementsAre("OperationalStatus", "ExtentStatus", "NumberOfBlocks",
                            "ConsumableBlocks", "ElementName"));
}

TEST_F(VolumeUpdate, OfANamelessVolumeThatStaysNamelessIsNoChange) {
    repository.eraseProperty(objects_.volume, "ElementName");
    ASSERT_EQ(updateVolume(), 0);
    EXPECT_EQ(volume()->ElementName, nullptr);
    CapturedSyslog::clear();
    ASSERT_EQ(updateVolume(), 0);
    EXPECT_THAT(logLines(),
                ElementsAre("DEBUG CheckAndUpdateVolumeInfo: ENTER. volume - NULL\n", kExit));
}

TEST_F(VolumeUpdate, GivesANamelessVolumeItsName) {
    repository.eraseProperty(objects_.volume, "ElementName");
    ASSERT_EQ(updateVolume(), 0);
    set("ElementName", CimValue::string("named"));
    CapturedSyslog::clear();
    ASSERT_EQ(updateVolume(), 0);
    EXPECT_STREQ(volume()->ElementName, "named");
    EXPECT_THAT(changes(), ElementsAre("DEBUG CheckAndUpdateVolumeInfo: volume V1 element name "
                                       "changed. Old name NULL, new name named\n"));
}

TEST_F(VolumeUpdate, LosesANameThatCannotBeCopied) {
    set("ElementName", CimValue::string("long name"));
    const auto fault = FailAllocation::nth(1);
    ASSERT_EQ(updateVolume(), 0);
    EXPECT_EQ(fault.failures(), 1u);
    EXPECT_EQ(volume()->ElementName, nullptr);
    EXPECT_THAT(changes(),
                ElementsAre("DEBUG CheckAndUpdateVolumeInfo: volume V1 element name changed. Old "
                            "name Volume V1, new name long name\n",
                            "WARNING strdup() failed to duplicate string long name\n"));
    EXPECT_EQ(ctrl->VolumeUpdateTime, kLater);
}

TEST_F(VolumeUpdate, OwnsItsNewName) {
    set("ElementName", CimValue::string("copied"));
    ASSERT_EQ(updateVolume(), 0);
    broker.flushThread();
    EXPECT_STREQ(volume()->ElementName, "copied");
}

TEST_F(VolumeUpdate, NeverRefreshesWhatTheBuildRead) {
    set("Name", CimValue::string("new"));
    set("DeviceID", CimValue::string("new"));
    for (const char* name : {"NameFormat", "NameNameSpace", "DataRedundancy", "PackageRedundancy"})
        set(name, CimValue::uint16(99));
    set("DeltaReservation", CimValue::uint8(99));
    set("Primordial", CimValue::boolean(true));
    set("IsBasedOnUnderlyingRedundancy", CimValue::boolean(false));
    repository.setProperty(objects_.setting, "ElementName", CimValue::string("RAID0"));
    repository.remove(poolPath_);
    ASSERT_EQ(updateVolume(), 0);
    EXPECT_THAT(changes(), IsEmpty());
    EXPECT_STREQ(volume()->Name, "Name V1");
    EXPECT_STREQ(volume()->DeviceID, "V1");
    EXPECT_STREQ(volume()->RaidLevel, "RAID6");
    EXPECT_STREQ(volume()->FromPool, "P1");
    EXPECT_EQ(volume()->NameFormat, 6);
    EXPECT_EQ(volume()->NameNameSpace, 7);
    EXPECT_EQ(volume()->DataRedundancy, 4);
    EXPECT_EQ(volume()->PackageRedundancy, 5);
    EXPECT_EQ(volume()->DeltaReservation, 200);
    EXPECT_EQ(volume()->Primordial, 0);
    EXPECT_EQ(volume()->IsBasedOnUnderlyingRedundancy, 1);
    expectUnchanged();
}

TEST_F(VolumeUpdate, WaitsForTheLockWithTheInstanceInHand) {
    set("OperationalStatus", CimValue::uint16Array({6}));
    updateWhileLockIsTaken(CheckAndUpdateVolumeInfo, volume(), nullptr, 1, [&] {
        EXPECT_EQ(volume()->OperationalStatus, 3);
        EXPECT_EQ(CapturedSyslog::countContaining("status changed"), 0u);
        EXPECT_EQ(ctrl->VolumeUpdateTime, kStart);
    });
    EXPECT_EQ(volume()->OperationalStatus, 6);
    EXPECT_EQ(ctrl->VolumeUpdateTime, kLater);
}

TEST_F(VolumeUpdate, StampsAtTheEnd) {
    faults().add(watch(Entry::InstanceGetProperty, [] { VirtualClock::advance(1); }));
    ASSERT_EQ(updateVolume(), 0);
    EXPECT_EQ(ctrl->VolumeUpdateTime, kLater + 5);
}

}  // namespace
}  // namespace plexortest
