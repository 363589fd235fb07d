// What the search for registrations asks the broker, and what it leaves in the log.
#include "vendor_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;

using testing::ElementsAre;

const LogLine kEntering = debugLine("GetHHRCProfiles: entering...\n");
const LogLine kQuery =
    debugLine("GetHHRCProfiles, CIM Query - EnumInstances root/interop:CIM_RegisteredProfile");

class DiscoveryLog : public VendorTest {
protected:
    int discover() {
        startOver();
        return GetHHRCProfiles(&mi, ctx(), &profiles_);
    }
    static LogLine exiting(int rc) {
        return debugLine("GetHHRCProfiles: exiting, RC " + std::to_string(rc) + ".\n");
    }

    Array_t profiles_ = {};
};

TEST_F(DiscoveryLog, AsksOnceForAllRegistrations) {
    vendor.profile(kProfileName, "P0");
    vendor.profile(kProfileName, "P1");
    ASSERT_EQ(discover(), 2);
    const auto calls = books().calls();
    ASSERT_EQ(calls.size(), 2u);
    EXPECT_EQ(calls[0].entry, Entry::NewObjectPath);
    EXPECT_EQ(calls[0].path, "root/interop:CIM_RegisteredProfile");
    EXPECT_EQ(calls[1].entry, Entry::EnumerateInstances);
    EXPECT_EQ(calls[1].path, "root/interop:CIM_RegisteredProfile");
    EXPECT_FALSE(calls[1].hasPropertyList);
}

TEST_F(DiscoveryLog, OneRegistrationAndAnother) {
    vendor.profile(kProfileName, "P1");
    vendor.profile("Fan", "F");
    ASSERT_EQ(discover(), 1);
    EXPECT_THAT(
        inventoryLog(),
        ElementsAre(kEntering, kQuery,
                    debugLine("CIM_RegisteredProfile: RegisteredName Host Hardware RAID "
                              "Controller, RegisteredVersion: 1.0.0, RegisteredOrganization: 11\n"),
                    infoLine("Found a HHRC profile: "
                             "root/interop:Sample_RegisteredProfile.InstanceID=\"P1\"\n"),
                    debugLine("CIM_RegisteredProfile: RegisteredName Fan, RegisteredVersion: "
                              "1.0.0, RegisteredOrganization: 11\n"),
                    exiting(1)));
}

TEST_F(DiscoveryLog, ReadsNameOrganizationVersionInThisOrder) {
    vendor.profile(kProfileName, "P1");
    books().recordObjectCalls(true);
    ASSERT_EQ(discover(), 1);
    std::vector<std::string> read;
    for (const auto& call : books().calls()) {
        if (call.entry == Entry::InstanceGetProperty) read.push_back(call.name.value());
    }
    EXPECT_THAT(read, ElementsAre("RegisteredName", "RegisteredOrganization", "RegisteredVersion"));
}

TEST_F(DiscoveryLog, RefusedArgumentsLeaveOnlyTheTrace) {
    startOver();
    EXPECT_EQ(GetHHRCProfiles(&mi, ctx(), nullptr), -1);
    EXPECT_THAT(inventoryLog(), ElementsAre(kEntering, exiting(-1)));
    startOver();
    EXPECT_EQ(GetHHRCProfiles(&mi, nullptr, &profiles_), -1);
    EXPECT_THAT(inventoryLog(), ElementsAre(kEntering, exiting(-1)));
}

TEST_F(DiscoveryLog, PathCannotBeMade) {
    const std::pair<std::optional<std::string>, const char*> messages[] = {
        {std::nullopt, "status: rc 3, msg NULL\n"}, {"no room", "status: rc 3, msg no room\n"}};
    for (const auto& [message, text] : messages) {
        failOnly(refusal(Entry::NewObjectPath, CMPI_RC_ERR_INVALID_NAMESPACE, message));
        EXPECT_EQ(discover(), -2);
        EXPECT_THAT(inventoryLog(), ElementsAre(kEntering, errorLine(text), exiting(-2)));
        EXPECT_THAT(books().queries(), testing::IsEmpty());
    }
}

TEST_F(DiscoveryLog, NoPathInSpiteOfAnOkStatus) {
    vendor.profile(kProfileName, "P1");
    failOnly(answerNull(Entry::NewObjectPath));
    EXPECT_EQ(discover(), 0);
    EXPECT_THAT(inventoryLog(),
                ElementsAre(kEntering, debugLine("GetHHRCProfiles, CIM Query - EnumInstances NULL"),
                            exiting(0)));
}

TEST_F(DiscoveryLog, FailedEnumerationIsNoErrorResult) {
    vendor.profile(kProfileName, "P1");
    for (const QueryFailure& failure : queryFailures()) {
        SCOPED_TRACE(failure.name);
        auto rule = failure.answer;
        rule.entry = Entry::EnumerateInstances;
        failOnly(rule);
        profiles_.Count = 77;
        EXPECT_EQ(discover(), 0);
        EXPECT_EQ(profiles_.Count, 0u);
        std::vector<LogLine> expected = {kEntering, kQuery};
        if (failure.logged) {
            expected.push_back(errorLine(
                "EnumInstances root/interop:CIM_RegisteredProfile failed, " + *failure.logged));
        }
        expected.push_back(exiting(0));
        EXPECT_EQ(inventoryLog(), expected);
        EXPECT_EQ(books().queries().size(), 1u);
    }
}

TEST_F(DiscoveryLog, TooManyRegistrations) {
    for (int i = 0; i < 9; i++) vendor.profile(kProfileName, "P" + std::to_string(i));
    EXPECT_EQ(discover(), -5);
    const auto log = inventoryLog();
    ASSERT_EQ(log.size(), 2u + 8u * 2u + 2u);
    EXPECT_EQ(log[18], errorLine("GetHHRCProfiles: profile array out of range\n"));
    EXPECT_EQ(log[19], exiting(-5));
}

TEST_F(DiscoveryLog, RegistrationWithoutPath) {
    vendor.profile(kProfileName, "P1");
    failOnly(answerNull(Entry::InstanceGetObjectPath));
    EXPECT_EQ(discover(), 1);
    EXPECT_TRUE(logged(LOG_INFO, "Found a HHRC profile: NULL\n"));
}

TEST_F(DiscoveryLog, AbsentTextsArePrintedAsNull) {
    const Path bare = vendor.profile(kProfileName, "bare");
    for (const char* name : {"RegisteredName", "RegisteredVersion", "RegisteredOrganization"}) {
        unset(bare, name);
    }
    EXPECT_EQ(discover(), 0);
    EXPECT_TRUE(logged(LOG_DEBUG,
                       "CIM_RegisteredProfile: RegisteredName NULL, "
                       "RegisteredVersion: NULL, RegisteredOrganization: 0\n"));
}

TEST_F(DiscoveryLog, VendorsTextsAreNoFormats) {
    set(vendor.profile(kProfileName, "P%s"), "RegisteredVersion", CimValue::string("%n%s%d%%"));
    EXPECT_EQ(discover(), 1);
    EXPECT_TRUE(logged(LOG_DEBUG,
                       "CIM_RegisteredProfile: RegisteredName Host Hardware RAID "
                       "Controller, RegisteredVersion: %n%s%d%%, "
                       "RegisteredOrganization: 11\n"));
    EXPECT_TRUE(logged(LOG_INFO,
                       "Found a HHRC profile: "
                       "root/interop:Sample_RegisteredProfile.InstanceID=\"P%s\"\n"));
}

TEST_F(DiscoveryLog, MaskedLinesCostNoCallForTheirTexts) {
    vendor.profile(kProfileName, "P1");
    books().recordObjectCalls(true);
    setlogmask(LOG_UPTO(LOG_ERR));
    EXPECT_EQ(discover(), 1);
    EXPECT_EQ(books().count(Entry::PathToString), 0u);
    EXPECT_EQ(books().count(Entry::InstanceGetObjectPath), 0u);
}

}  // namespace
}  // namespace plexortest
