// Building the records of the controllers behind the profiles.
#include "controller_fixture.h"

namespace plexortest {
namespace {

using testbed::Broker;
using testbed::CimValue;
using testing::ElementsAre;
using testing::IsEmpty;

class ControllerBuild : public ControllerTest {};

TEST_F(ControllerBuild, NoProfile) {
    EXPECT_EQ(build(), 0);
    EXPECT_THAT(controllers(), IsEmpty());
    EXPECT_THAT(books().calls(), IsEmpty());
}

TEST_F(ControllerBuild, ProfileWithoutControllers) {
    const Path profile = addProfile();
    EXPECT_EQ(build(), 0);
    EXPECT_THAT(controllers(), IsEmpty());
    EXPECT_THAT(brokerCalls(), ElementsAre("associators " + profile.text() +
                                           " CIM_ElementConformsToProfile/CIM_PortController"));
}

TEST_F(ControllerBuild, EveryFieldIsFilled) {
    const VendorController card = addFullController(addProfile(), "C0");
    set(card.package, "HealthState", CimValue::uint16(15));
    set(card.system, "OperationalStatus", CimValue::uint16Array({3, 2}));
    ASSERT_EQ(build(), 0);
    ASSERT_EQ(controllers().size(), 1u);
    const RaidController_t* ctrl = controllers().front();
    EXPECT_STREQ(ctrl->DeviceID, "C0");
    EXPECT_STREQ(ctrl->Model, "Model C0");
    EXPECT_STREQ(ctrl->FirmwareVersion, "FW-C0");
    EXPECT_STREQ(ctrl->BiosVersion, "BIOS-C0");
    EXPECT_STREQ(ctrl->DriverVersion, "DRV-C0");
    EXPECT_STREQ(ctrl->BundleVersion, "PKG-C0");
    EXPECT_EQ(ctrl->HealthState, 15);
    EXPECT_EQ(ctrl->OperationalStatus, 3);
    EXPECT_EQ(Broker::toPath(ctrl->PortControllerOp), card.port);
    EXPECT_EQ(Broker::toPath(ctrl->ControllerOp), card.system);
}

TEST_F(ControllerBuild, OnlyTheControllersOwnTimeIsSet) {
    addFullController(addProfile(), "C0");
    VirtualClock::set(1'234'567'890);
    ASSERT_EQ(build(), 0);
    const RaidController_t* ctrl = controllers().front();
    EXPECT_EQ(ctrl->ControllerUpdateTime, 1'234'567'890);
    for (const time_t time :
         {ctrl->ChassisUpdateTime, ctrl->PoolUpdateTime, ctrl->VolumeUpdateTime,
          ctrl->DiskUpdateTime, ctrl->PortUpdateTime, ctrl->BatteryUpdateTime}) {
        EXPECT_EQ(time, 0);
    }
    EXPECT_EQ(ctrl->UpdateEnabled, 0);
}

TEST_F(ControllerBuild, ItsTimeIsThatOfTheCompletedRecord) {
    addFullController(addProfile(), "C0");
    // Every property of every object takes its second.
    faults().add(watch(Entry::InstanceGetProperty, [] { VirtualClock::advance(1); }));
    ASSERT_EQ(build(), 0);
    EXPECT_GT(VirtualClock::now(), kStart + 4);
    EXPECT_EQ(controllers().front()->ControllerUpdateTime, VirtualClock::now());
}

TEST_F(ControllerBuild, ReadsThePropertiesOfEachObjectInTheirOrder) {
    addFullController(addProfile(), "C0");
    books().recordObjectCalls(true);
    ASSERT_EQ(build(), 0);
    EXPECT_THAT(propertiesRead("Sample_PortController"), ElementsAre("DeviceID"));
    EXPECT_THAT(propertiesRead("Sample_ComputerSystem"), ElementsAre("OperationalStatus"));
    EXPECT_THAT(propertiesRead("Sample_PhysicalPackage"), ElementsAre("Model", "HealthState"));
    const std::string classes = "Classifications", version = "VersionString";
    EXPECT_THAT(
        propertiesRead("Sample_SoftwareIdentity"),
        ElementsAre(classes, version, classes, version, classes, version, classes, version));
}

TEST_F(ControllerBuild, ListsAreTheRecordsOwnAndEmpty) {
    addFullController(addProfile(), "C0");
    ASSERT_EQ(build(), 0);
    const RaidController_t* ctrl = controllers().front();
    EXPECT_EQ(ctrl->VolumeList, &ctrl->__VolumeList);
    EXPECT_EQ(ctrl->DiskList, &ctrl->__DiskList);
    EXPECT_EQ(ctrl->PoolList, &ctrl->__PoolList);
    EXPECT_EQ(ctrl->BatteryList, &ctrl->__BatteryList);
    EXPECT_EQ(ctrl->ChassisList, &ctrl->__ChassisList);
    EXPECT_EQ(ctrl->PortList, &ctrl->__PortList);
    EXPECT_EQ(ctrl->ExtentList, nullptr);
    const List_t* lists[] = {ctrl->VolumeList,   ctrl->DiskList,    ctrl->PoolList,
                             ctrl->BatteryList,  ctrl->ChassisList, ctrl->PortList,
                             &ctrl->__ExtentList};
    for (const List_t* list : lists) {
        EXPECT_EQ(list->Head, nullptr);
        EXPECT_EQ(list->Tail, nullptr);
        EXPECT_EQ(list->Size, 0u);
    }
}

TEST_F(ControllerBuild, MutexesAreReadyToUse) {
    addFullController(addProfile(), "C0");
    ASSERT_EQ(build(), 0);
    RaidController_t* ctrl = controllers().front();
    for (pthread_mutex_t* mutex :
         {&ctrl->CtrlMutex, &ctrl->DiskCfgMutex, &ctrl->VolumeCfgMutex, &ctrl->PortCfgMutex,
          &ctrl->BatteryCfgMutex, &ctrl->PoolCfgMutex, &ctrl->ChassisCfgMutex}) {
        ASSERT_EQ(pthread_mutex_lock(mutex), 0);
        EXPECT_FALSE(isFree(*mutex));
        ASSERT_EQ(pthread_mutex_unlock(mutex), 0);
    }
}

TEST_F(ControllerBuild, FourQueriesForEachController) {
    const Path profile = addProfile();
    const VendorController card = addFullController(profile, "C0");
    ASSERT_EQ(build(), 0);
    EXPECT_THAT(
        brokerCalls(),
        ElementsAre(
            "associators " + profile.text() + " CIM_ElementConformsToProfile/CIM_PortController",
            "associators " + card.port.text() + " CIM_LogicalIdentity/CIM_ComputerSystem",
            "associators " + card.port.text() + " CIM_Realizes/CIM_PhysicalPackage",
            "associators " + card.system.text() +
                " CIM_ElementSoftwareIdentity/CIM_SoftwareIdentity"));
    EXPECT_EQ(books().calls().size(), 4u);
}

TEST_F(ControllerBuild, ControllersOfAllProfilesInTheirOrder) {
    const Path first = addProfile("profile-1");
    const Path second = addProfile("profile-2");
    addFullController(second, "C2");
    addFullController(first, "C0");
    addFullController(first, "C1");
    ASSERT_EQ(build(), 0);
    EXPECT_THAT(cached(), ElementsAre("C0", "C1", "C2"));
    EXPECT_EQ(brokerCalls().size(), 2u + 3u * 3u);
}

TEST_F(ControllerBuild, ControllerOfTwoProfilesIsCachedTwice) {
    const Path first = addProfile("profile-1");
    const Path second = addProfile("profile-2");
    const VendorController card = addFullController(first, "C0");
    vendor.tie("CIM_ElementConformsToProfile", second, card.port);
    ASSERT_EQ(build(), 0);
    EXPECT_THAT(cached(), ElementsAre("C0", "C0"));
    EXPECT_NE(controllers()[0], controllers()[1]);
    EXPECT_NE(controllers()[0]->ControllerOp, controllers()[1]->ControllerOp);
}

TEST_F(ControllerBuild, OnlyAsManyProfilesAsAreCounted) {
    addFullController(addProfile("profile-1"), "C0");
    addFullController(addProfile("profile-2"), "C1");
    profiles_.Count = 1;
    ASSERT_EQ(build(), 0);
    EXPECT_THAT(cached(), ElementsAre("C0"));
}

TEST_F(ControllerBuild, ProfileWithoutPathIsPassedOver) {
    addFullController(addProfile("profile-1"), "C0");
    addFullController(addProfile("profile-2"), "C1");
    failOnly(answerNull(Entry::InstanceGetObjectPath, 0));
    ASSERT_EQ(build(), 0);
    EXPECT_THAT(cached(), ElementsAre("C1"));
    EXPECT_EQ(brokerCalls().size(), 4u);
}

TEST_F(ControllerBuild, LaterBuildingsAppend) {
    addFullController(addProfile(), "C0");
    ASSERT_EQ(build(), 0);
    ASSERT_EQ(BuildControllerInfo(&mi, ctx(), &profiles_), 0);
    EXPECT_THAT(cached(), ElementsAre("C0", "C0"));
}

TEST_F(ControllerBuild, OnlyTheFirstSystemCounts) {
    const VendorController card = addFullController(addProfile(), "C0");
    const VendorController other = vendor.controller("other");
    set(other.system, "OperationalStatus", CimValue::uint16Array({6}));
    vendor.tie("CIM_LogicalIdentity", card.port, other.system);
    ASSERT_EQ(build(), 0);
    ASSERT_THAT(cached(), ElementsAre("C0"));
    EXPECT_EQ(Broker::toPath(controllers()[0]->ControllerOp), card.system);
    EXPECT_EQ(controllers()[0]->OperationalStatus, 2);
}

TEST_F(ControllerBuild, OnlyTheFirstPackageCounts) {
    const VendorController card = addFullController(addProfile(), "C0");
    const VendorController other = vendor.controller("other");
    set(other.package, "HealthState", CimValue::uint16(30));
    vendor.tie("CIM_Realizes", other.package, card.port);
    ASSERT_EQ(build(), 0);
    EXPECT_STREQ(controllers()[0]->Model, "Model C0");
    EXPECT_EQ(controllers()[0]->HealthState, 5);
}

TEST_F(ControllerBuild, WithoutPackageModelIsAbsent) {
    const VendorController card = addFullController(addProfile(), "C0");
    ASSERT_TRUE(repository.remove(card.package));
    ASSERT_EQ(build(), 0);
    ASSERT_THAT(cached(), ElementsAre("C0"));
    EXPECT_EQ(summary(controllers()[0]), "absent FW-C0 BIOS-C0 DRV-C0 PKG-C0 0 2");
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR), IsEmpty());
}

TEST_F(ControllerBuild, WithoutSoftwareVersionsAreAbsent) {
    vendor.controller("C0", addProfile());
    ASSERT_EQ(build(), 0);
    ASSERT_THAT(cached(), ElementsAre("C0"));
    EXPECT_EQ(summary(controllers()[0]), "Model C0 absent absent absent absent 5 2");
}

TEST_F(ControllerBuild, WithoutDeviceIdItIsNotCached) {
    const Path profile = addProfile();
    const VendorController nameless = addFullController(profile, "C0");
    addFullController(profile, "C1");
    unset(nameless.port, "DeviceID");
    ASSERT_EQ(build(), 0);
    EXPECT_THAT(cached(), ElementsAre("C1"));
    EXPECT_TRUE(
        logged(LOG_ERR, "NULL DeviceID for PortController: " + nameless.port.text() + "\n"));
    // One for the profile, none for the nameless, three for the other.
    EXPECT_EQ(brokerCalls().size(), 4u);
}

TEST_F(ControllerBuild, WithoutSystemItIsNotCached) {
    const Path profile = addProfile();
    const VendorController lonely = addFullController(profile, "C0");
    addFullController(profile, "C1");
    ASSERT_TRUE(repository.remove(lonely.system));
    ASSERT_EQ(build(), 0);
    EXPECT_THAT(cached(), ElementsAre("C1"));
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR), IsEmpty());
    EXPECT_EQ(brokerCalls().size(), 5u);
}

TEST_F(ControllerBuild, RecordsOwnTheirTextsAndPaths) {
    addFullController(addProfile(), "C0");
    addFullController(addProfile("profile-2"), "C1");
    ASSERT_EQ(build(), 0);
    // Two paths each; nothing else of the broker's is kept.
    EXPECT_EQ(books().liveClones(), 4u);
    broker.flushThread();
    EXPECT_THAT(cached(), ElementsAre("C0", "C1"));
    EXPECT_EQ(summary(controllers()[1]), "Model C1 FW-C1 BIOS-C1 DRV-C1 PKG-C1 5 2");
    EXPECT_EQ(Broker::toPath(controllers()[1]->ControllerOp).findKey("Name")->asString(),
              "system-C1");
    FreeList(RaidControllerList, FreeController);
    EXPECT_EQ(books().liveClones(), 0u);
}

}  // namespace
}  // namespace plexortest
