// Which registrations of the RAID profile are taken up.
#include "vendor_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;

class DiscoveryProfiles : public VendorTest {
protected:
    int discover() {
        startOver();
        return GetHHRCProfiles(&mi, ctx(), &profiles_);
    }
    void addProfiles(int count, const std::string& prefix = "P",
                     const std::string& name = kProfileName) {
        for (int i = 0; i < count; i++) vendor.profile(name, prefix + std::to_string(i));
    }
    /// InstanceIDs of the stored profiles.
    std::vector<std::string> found() {
        std::vector<std::string> ids;
        for (unsigned int i = 0; i < profiles_.Count; i++) {
            const auto* inst = static_cast<CMPIInstance*>(profiles_.Array[i]);
            ids.push_back(testbed::Broker::toInstance(inst).path.findKey("InstanceID")->asString());
        }
        return ids;
    }

    Array_t profiles_ = {77, {}};
};

TEST_F(DiscoveryProfiles, NoRegistrationAtAll) {
    EXPECT_EQ(discover(), 0);
    EXPECT_EQ(profiles_.Count, 0u);
}

TEST_F(DiscoveryProfiles, OneAmongOthersIsFound) {
    vendor.profile("Fan", "fan");
    vendor.profile(kProfileName, "raid");
    vendor.profile("Base Server", "server");
    EXPECT_EQ(discover(), 1);
    EXPECT_EQ(found(), (std::vector<std::string>{"raid"}));
}

TEST_F(DiscoveryProfiles, OnlyOthers) {
    vendor.profile("Fan", "fan");
    vendor.profile("Base Server", "server");
    EXPECT_EQ(discover(), 0);
    EXPECT_EQ(profiles_.Count, 0u);
}

TEST_F(DiscoveryProfiles, TheNameMustBeExact) {
    for (const char* name : {"Host Hardware RAID Controller ", " Host Hardware RAID Controller",
                             "Host Hardware RAID controller", "host hardware raid controller",
                             "Host Hardware RAID Controllers", "Host Hardware RAID Controlle",
                             "Host Hardware RAID", "Host  Hardware RAID Controller", ""}) {
        repository.clearInstances();
        vendor.profile(name, "P");
        EXPECT_EQ(discover(), 0) << '"' << name << '"';
    }
}

TEST_F(DiscoveryProfiles, VersionAndOrganizationSelectNothing) {
    const Path other = vendor.profile(kProfileName, "other");
    set(other, "RegisteredOrganization", CimValue::uint16(65535));
    set(other, "RegisteredVersion", CimValue::string("99.0"));
    const Path bare = vendor.profile(kProfileName, "bare");
    unset(bare, "RegisteredOrganization");
    unset(bare, "RegisteredVersion");
    EXPECT_EQ(discover(), 2);
    EXPECT_EQ(found(), (std::vector<std::string>{"other", "bare"}));
}

TEST_F(DiscoveryProfiles, StoresTheInstancesThemselves) {
    vendor.profile(kProfileName, "raid");
    ASSERT_EQ(discover(), 1);
    EXPECT_EQ(books().kindOf(profiles_.Array[0]), testbed::ObjectKind::Instance);
    EXPECT_EQ(books().liveClones(), 0u);
}

TEST_F(DiscoveryProfiles, EightFit) {
    addProfiles(8);
    EXPECT_EQ(discover(), 8);
    EXPECT_EQ(found(), (std::vector<std::string>{"P0", "P1", "P2", "P3", "P4", "P5", "P6", "P7"}));
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR), testing::IsEmpty());
}

TEST_F(DiscoveryProfiles, EightFitBehindAnyNumberOfOthers) {
    addProfiles(30, "other", "Fan");
    addProfiles(8);
    EXPECT_EQ(discover(), 8);
}

TEST_F(DiscoveryProfiles, NinthRegistrationIsTooMany) {
    addProfiles(9);
    EXPECT_EQ(discover(), -5);
    EXPECT_EQ(profiles_.Count, 8u);
    EXPECT_EQ(found().front(), "P0");
    EXPECT_EQ(found().back(), "P7");
}

TEST_F(DiscoveryProfiles, NinthElementNeedNotMatchToBeTooMany) {
    addProfiles(8);
    vendor.profile("Fan", "fan");
    EXPECT_EQ(discover(), -5);
    EXPECT_EQ(profiles_.Count, 8u);
}

TEST_F(DiscoveryProfiles, NinthElementNeedNotBeAnInstanceToBeTooMany) {
    addProfiles(8);
    vendor.profile("Fan", "fan");
    faults().add(wrongElement(8));
    EXPECT_EQ(discover(), -5);
}

TEST_F(DiscoveryProfiles, NinthElementIsNotRead) {
    addProfiles(8);
    vendor.profile(kProfileName, "last");
    books().recordObjectCalls(true);
    EXPECT_EQ(discover(), -5);
    EXPECT_EQ(books().count(Entry::EnumerationGetNext), 8u);
    EXPECT_EQ(CapturedSyslog::countContaining("CIM_RegisteredProfile: RegisteredName"), 8u);
}

TEST_F(DiscoveryProfiles, MissingArgumentsAreRefused) {
    startOver();
    EXPECT_EQ(GetHHRCProfiles(&mi, ctx(), nullptr), -1);
    EXPECT_EQ(GetHHRCProfiles(&mi, nullptr, nullptr), -1);
    EXPECT_EQ(GetHHRCProfiles(&mi, nullptr, &profiles_), -1);
    EXPECT_EQ(profiles_.Count, 77u);
    EXPECT_THAT(books().calls(), testing::IsEmpty());
}

TEST_F(DiscoveryProfiles, ManagerHandleIsNotNeeded) {
    vendor.profile(kProfileName, "raid");
    EXPECT_EQ(GetHHRCProfiles(nullptr, ctx(), &profiles_), 1);
}

TEST_F(DiscoveryProfiles, NameThatIsNoTextIsNoMatch) {
    for (const OddValue& odd : oddTexts()) {
        repository.clearInstances();
        give(vendor.profile(kProfileName, "bad"), "RegisteredName", odd);
        vendor.profile(kProfileName, "good");
        EXPECT_EQ(discover(), 1) << odd.label;
        EXPECT_EQ(found(), (std::vector<std::string>{"good"})) << odd.label;
    }
}

TEST_F(DiscoveryProfiles, OtherPropertiesMayHoldAnything) {
    for (const OddValue& odd : oddTexts()) {
        repository.clearInstances();
        give(vendor.profile(kProfileName, "bad"), "RegisteredVersion", odd);
        EXPECT_EQ(discover(), 1) << odd.label;
    }
    for (const OddValue& odd : oddNumbers()) {
        repository.clearInstances();
        give(vendor.profile(kProfileName, "bad"), "RegisteredOrganization", odd);
        EXPECT_EQ(discover(), 1) << odd.label;
    }
}

TEST_F(DiscoveryProfiles, ElementOfAnotherTypeCostsOnlyItself) {
    addProfiles(3);
    for (int wrong = 0; wrong < 3; wrong++) {
        failOnly(wrongElement(wrong));
        EXPECT_EQ(discover(), 2) << wrong;
        std::vector<std::string> expected = {"P0", "P1", "P2"};
        expected.erase(expected.begin() + wrong);
        EXPECT_EQ(found(), expected) << wrong;
    }
}

TEST_F(DiscoveryProfiles, EnumerationThatFailsEndsTheWalk) {
    addProfiles(3);
    const std::vector<std::string> all = {"P0", "P1", "P2"};
    for (int good = 0; good < 3; good++) {
        failOnly(failingEnumeration(Entry::EnumerationGetNext, good));
        EXPECT_EQ(discover(), good);
        EXPECT_EQ(found(), std::vector<std::string>(all.begin(), all.begin() + good));
    }
}

TEST_F(DiscoveryProfiles, NeedsNoMemoryOfItsOwn) {
    addProfiles(2);
    const auto fault = FailAllocation::from(1);
    EXPECT_EQ(discover(), 2);
    EXPECT_EQ(fault.calls(), 0u);
}

}  // namespace
}  // namespace plexortest
