// What a built volume's record holds, what its build asks of the broker and writes to the log.
#include "volume_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testbed::Entry;
using testing::ElementsAre;
using testing::ElementsAreArray;
using testing::IsEmpty;

class VolumeBuild : public VolumeTest {};

TEST_F(VolumeBuild, HoldsWhatTheVendorSays) {
    ASSERT_EQ(buildVolume(), 0);
    ASSERT_EQ(ctrl->VolumeList->Size, 1u);
    EXPECT_EQ(testbed::Broker::toPath(volume()->VolumeOp), objects_.volume);
    EXPECT_STREQ(volume()->DeviceID, "V1");
    EXPECT_STREQ(volume()->ElementName, "Volume V1");
    EXPECT_STREQ(volume()->RaidLevel, "RAID6");
    EXPECT_STREQ(volume()->Name, "Name V1");
    EXPECT_EQ(volume()->NameFormat, 6);
    EXPECT_EQ(volume()->NameNameSpace, 7);
    EXPECT_EQ(volume()->ExtentStatus, 12);
    EXPECT_EQ(volume()->OperationalStatus, 3);
    EXPECT_EQ(volume()->NumberOfBlocks, 0x3'0000'0001u);
    EXPECT_EQ(volume()->ConsumableBlocks, 0x8000'0000'0000'0002u);
    EXPECT_EQ(volume()->DataRedundancy, 4);
    EXPECT_EQ(volume()->PackageRedundancy, 5);
    EXPECT_EQ(volume()->IsBasedOnUnderlyingRedundancy, 1);
    EXPECT_EQ(volume()->DeltaReservation, 200);
    EXPECT_EQ(volume()->Primordial, 0);
    EXPECT_STREQ(volume()->FromPool, "P1");
}

TEST_F(VolumeBuild, SeesBothTruthValues) {
    repository.setProperty(objects_.volume, "Primordial", CimValue::boolean(true));
    repository.setProperty(objects_.volume, "IsBasedOnUnderlyingRedundancy",
                           CimValue::boolean(false));
    ASSERT_EQ(buildVolume(), 0);
    EXPECT_EQ(volume()->Primordial, 1);
    EXPECT_EQ(volume()->IsBasedOnUnderlyingRedundancy, 0);
}

TEST_F(VolumeBuild, LeavesStripeLengthAndUpdateFlagAlone) {
    repository.setProperty(objects_.volume, "ExtentStripeLength", CimValue::uint16(64));
    ASSERT_EQ(buildVolume(), 0);
    EXPECT_EQ(volume()->ExtentStripeLength, 0);
    EXPECT_EQ(volume()->UpdateEnabled, 0);
}

TEST_F(VolumeBuild, OwnsCopiesAndOneClone) {
    ASSERT_EQ(buildVolume(), 0);
    EXPECT_EQ(books().liveClones(), 1u);
    broker.flushThread();
    EXPECT_EQ(testbed::Broker::toPath(volume()->VolumeOp), objects_.volume);
    EXPECT_STREQ(volume()->ElementName, "Volume V1");
    EXPECT_STREQ(volume()->RaidLevel, "RAID6");
    EXPECT_STREQ(volume()->Name, "Name V1");
    EXPECT_STREQ(volume()->FromPool, "P1");
}

TEST_F(VolumeBuild, ReadsThePropertiesInOrder) {
    books().recordObjectCalls(true);
    ASSERT_EQ(buildVolume(), 0);
    EXPECT_THAT(propertiesRead("Sample_StorageVolume"),
                ElementsAre("DeviceID", "ElementName", "NumberOfBlocks", "ConsumableBlocks",
                            "DataRedundancy", "PackageRedundancy", "Name", "NameFormat",
                            "NameNameSpace", "IsBasedOnUnderlyingRedundancy", "DeltaReservation",
                            "Primordial", "OperationalStatus", "ExtentStatus"));
}

TEST_F(VolumeBuild, AsksTwoQueriesInOrder) {
    ASSERT_EQ(buildVolume(), 0);
    EXPECT_THAT(brokerCalls(),
                ElementsAre("associators " + kVolume + " CIM_ElementSettingData/CIM_StorageSetting",
                            "associatorNames " + kVolume +
                                " CIM_AllocatedFromStoragePool/CIM_StoragePool"));
}

TEST_F(VolumeBuild, LogsEveryStepInOrder) {
    ASSERT_EQ(buildVolume(), 0);
    const Texts expected = {
        "DEBUG BuildVolumeInfo, ENTER...\n",
        "DEBUG BuildVolumeInfo, CIM Query - Associators: " + kVolume +
            " (assocClass: CIM_ElementSettingData, resultClass: CIM_StorageSetting)",
        "DEBUG \nVolumeOp: " + kVolume +
            "\n"
            "\tElementName       - Volume V1\n"
            "\tDeviceID          - V1\n"
            "\tRaidLevel         - RAID6\n"
            "\tNumberOfBlocks    - 12884901889\n"
            "\tConsumableBlocks  - 9223372036854775810\n"
            "\tDataRedundancy    - 4\n"
            "\tPackageRedundancy - 5\n"
            "\tNameFormat        - 6\n"
            "\tName              - Name V1\n"
            "\tNameNameSpace     - 7\n"
            "\tIsBasedOnUnderlyingRedundancy - 1\n"
            "\tDeltaReservation  - 200\n"
            "\tPrimordial        - 0\n"
            "\tOperationalStatus - 3\n",
        "DEBUG BuildVolumeInfo, CIM Query - AssociatorNames: " + kVolume +
            " (assocClass: CIM_AllocatedFromStoragePool, resultClass: CIM_StoragePool)",
        "DEBUG BuildVolumeInfo: found a pool instance\n",
        "DEBUG Adding data <volume> to the list <volumes> at the tail\n",
        "DEBUG Data <volume> added to the list <volumes>, size 1\n",
        "DEBUG BuildVolumeInfo: volume <volume> added to the list\n",
        "DEBUG BuildVolumeInfo, EXIT(0).\n",
    };
    EXPECT_THAT(logLines(names()), ElementsAreArray(expected));
}

TEST_F(VolumeBuild, StampsTheRecordBeforeThePoolIsAskedFor) {
    faults().add(watch(Entry::Associators, [] { VirtualClock::advance(3); }));
    faults().add(watch(Entry::AssociatorNames, [] { VirtualClock::advance(40); }));
    ASSERT_EQ(buildVolume(), 0);
    EXPECT_EQ(volume()->LastUpdateTime, kStart + 3);
    EXPECT_EQ(ctrl->VolumeUpdateTime, kStart + 43);
}

TEST_F(VolumeBuild, WithoutSettingHasNoRaidLevelAndSaysNothing) {
    repository.remove(objects_.setting);
    ASSERT_EQ(buildVolume(), 0);
    EXPECT_EQ(volume()->RaidLevel, nullptr);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR), IsEmpty());
    EXPECT_EQ(CapturedSyslog::countContaining("\tRaidLevel         - (null)\n"), 1u);
}

TEST_F(VolumeBuild, TakesTheFirstOfSeveralSettings) {
    const VendorVolume other = vendor.volume(card, "V2", {}, "RAID1");
    vendor.tie("CIM_ElementSettingData", objects_.volume, other.setting);
    ASSERT_EQ(buildVolume(), 0);
    EXPECT_STREQ(volume()->RaidLevel, "RAID6");
}

TEST_F(VolumeBuild, TakesTheFirstOfSeveralPools) {
    const Path second = vendor.pool(card, "P2");
    vendor.tie("CIM_AllocatedFromStoragePool", second, objects_.volume);
    attach(ctrl, newPool("P2"));
    ASSERT_EQ(buildVolume(), 0);
    EXPECT_STREQ(volume()->FromPool, "P1");
    EXPECT_EQ(CapturedSyslog::countContaining("found a pool instance"), 1u);
}

TEST_F(VolumeBuild, TakesThePoolFromThePathWithoutLookingItUp) {
    repository.setProperty(poolPath_, "InstanceID", CimValue::string("property"));
    StoragePool_t* pool = attach(ctrl, newPool("P1"));
    ASSERT_EQ(buildVolume(), 0);
    EXPECT_STREQ(volume()->FromPool, "P1");
    EXPECT_THAT(members(pool), IsEmpty());
    EXPECT_EQ(CapturedSyslog::countContaining("FindStoragePoolByID"), 0u);
}

TEST_F(VolumeBuild, HoldsTheLockForTheInsertionOnly) {
    watchLock();
    watchLog();
    ASSERT_EQ(buildVolume(), 0);
    EXPECT_GT(watchedCalls_, 14);
    EXPECT_EQ(heldCalls_, 0);
    Texts held;
    for (const std::string& line : logWithLock(names()))
        if (line.starts_with("held")) held.push_back(line);
    EXPECT_THAT(held,
                ElementsAre("held DEBUG Adding data <volume> to the list <volumes> at the tail\n",
                            "held DEBUG Data <volume> added to the list <volumes>, size 1\n"));
    EXPECT_TRUE(isFree(ctrl->CtrlMutex));
}

TEST_F(VolumeBuild, NeedsNoInterface) {
    EXPECT_EQ(BuildVolumeInfo(nullptr, ctx(), ctrl, instanceAt(objects_.volume),
                              broker.makePath(objects_.volume)),
              0);
    EXPECT_NE(volume(), nullptr);
}

}  // namespace
}  // namespace plexortest
