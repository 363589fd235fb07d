// The identity of the host, as read from its computer system.
#include <stdlib.h>

#include "provider_fixture.h"
#include "vendor_objects.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testbed::Entry;
using testbed::ObjectPath;

class HostIdentity : public ProviderTest {
protected:
    void SetUp() override {
        ProviderTest::SetUp();
        hostPath_ = vendor.host("host-uuid");
    }

    const ObjectPath& host() const { return hostPath_; }
    int init() { return InitSystemInfo(&mi, ctx()); }

    static void expectNames(const char* system, const char* hostName, const char* className) {
        EXPECT_STREQ(GetSystemName(), system);
        EXPECT_STREQ(GetHostName(), hostName);
        EXPECT_STREQ(GetSystemClassName(), className);
    }

    const LogLine kEntering = {LOG_DEBUG, "InitSystemInfo: entering...\n"};
    VendorObjects vendor{repository};

    /// The line that announces the query.
    LogLine query() const {
        const ObjectPath path{"root/cimv2", "OMC_UnitaryComputerSystem", {}};
        return {LOG_DEBUG, "InitSystemInfo, CIM Query - EnumInstances: " + path.text()};
    }

private:
    ObjectPath hostPath_;
};

TEST_F(HostIdentity, IsUnknownBeforeItIsRead) {
    expectNames(nullptr, nullptr, nullptr);
}

TEST_F(HostIdentity, IsReadFromTheComputerSystem) {
    EXPECT_EQ(init(), 0);
    expectNames("host-uuid", "host", "OMC_UnitaryComputerSystem");
    EXPECT_EQ(CapturedSyslog::lines(),
              (std::vector<LogLine>{kEntering,
                                    query(),
                                    {LOG_DEBUG,
                                     "SYSTEM INFO: HostName host, SystemName host-uuid, "
                                     "SystemClassName OMC_UnitaryComputerSystem\n"}}));
}

TEST_F(HostIdentity, IsAskedForOnceWithoutAPropertyList) {
    init();
    const auto queries = books().queries();
    ASSERT_EQ(queries.size(), 1u);
    EXPECT_EQ(queries[0].entry, Entry::EnumerateInstances);
    EXPECT_EQ(queries[0].className, "OMC_UnitaryComputerSystem");
    EXPECT_EQ(queries[0].path, (ObjectPath{"root/cimv2", "OMC_UnitaryComputerSystem", {}}).text());
    EXPECT_FALSE(queries[0].hasPropertyList);
    EXPECT_EQ(books().count(Entry::NewObjectPath), 1u);
}

TEST_F(HostIdentity, SecondReadingAsksNothing) {
    ASSERT_EQ(init(), 0);
    const std::size_t calls = books().calls().size();
    CapturedSyslog::clear();
    repository.setProperty(host(), "ElementName", CimValue::string("renamed"));
    EXPECT_EQ(init(), 0);
    EXPECT_EQ(books().calls().size(), calls);
    expectNames("host-uuid", "host", "OMC_UnitaryComputerSystem");
    EXPECT_EQ(CapturedSyslog::lines(), std::vector<LogLine>{kEntering});
}

TEST_F(HostIdentity, FirstOfTwoInstancesCounts) {
    vendor.host("second-host");
    EXPECT_EQ(init(), 0);
    EXPECT_STREQ(GetSystemName(), "host-uuid");
}

TEST_F(HostIdentity, MissingElementNameLeavesTheHostNameOut) {
    repository.eraseProperty(host(), "ElementName");
    EXPECT_EQ(init(), 0);
    expectNames("host-uuid", nullptr, "OMC_UnitaryComputerSystem");
}

TEST_F(HostIdentity, MissingClassNameIsLeftOut) {
    repository.eraseProperty(host(), "CreationClassName");
    EXPECT_EQ(init(), 0);
    expectNames("host-uuid", "host", nullptr);
}

TEST_F(HostIdentity, WithoutASystemNameItIsReadAgain) {
    repository.eraseProperty(host(), "Name");
    EXPECT_EQ(init(), 0);
    expectNames(nullptr, "host", "OMC_UnitaryComputerSystem");

    repository.setProperty(host(), "Name", CimValue::string("late"));
    EXPECT_EQ(init(), 0);
    expectNames("late", "host", "OMC_UnitaryComputerSystem");
    EXPECT_EQ(books().count(Entry::EnumerateInstances), 2u);
}

TEST_F(HostIdentity, NullTextsAreLeftOut) {
    for (const char* name : {"Name", "ElementName", "CreationClassName"}) {
        repository.setProperty(host(), name, CimValue::null(CMPI_string));
    }
    EXPECT_EQ(init(), 0);
    expectNames(nullptr, nullptr, nullptr);
}

TEST_F(HostIdentity, ValuesThatAreNoTextsAreLeftOut) {
    repository.setProperty(host(), "Name", CimValue::uint64(0x1234));
    repository.setProperty(host(), "ElementName", CimValue::boolean(true));
    repository.setProperty(host(), "CreationClassName", CimValue::stringArray({"array"}));
    EXPECT_EQ(init(), 0);
    expectNames(nullptr, nullptr, nullptr);
}

TEST_F(HostIdentity, TextsAreOnlyArgumentsNeverFormats) {
    repository.setProperty(host(), "ElementName", CimValue::string("%s%n%d"));
    EXPECT_EQ(init(), 0);
    EXPECT_STREQ(GetHostName(), "%s%n%d");
    EXPECT_EQ(CapturedSyslog::countContaining("HostName %s%n%d, SystemName host-uuid"), 1u);
}

TEST_F(HostIdentity, FailedCopyIsLoggedAndLeavesTheNameOut) {
    const struct {
        const char* text;
        const char* (*get)();
    } names[] = {{"host-uuid", GetSystemName},
                 {"host", GetHostName},
                 {"OMC_UnitaryComputerSystem", GetSystemClassName}};
    for (const auto& failing : names) {
        ReleaseSystemInfo();
        CapturedSyslog::clear();
        const auto fault = FailAllocation::strdupOf(failing.text);
        EXPECT_EQ(init(), 0);
        EXPECT_TRUE(logged(LOG_WARNING,
                           formatted("strdup() failed to duplicate string %s\n", failing.text)));
        for (const auto& name : names) {
            EXPECT_STREQ(name.get(), name.text == failing.text ? nullptr : name.text);
        }
    }
}

TEST_F(HostIdentity, PathThatCannotBeMadeEndsTheReading) {
    faults().add(refusal(Entry::NewObjectPath, CMPI_RC_ERR_FAILED, "no path today"));
    EXPECT_EQ(init(), -2);
    EXPECT_EQ(
        CapturedSyslog::lines(),
        (std::vector<LogLine>{kEntering, {LOG_ERR, "InitSystemInfo: rc 1, msg no path today\n"}}));
    EXPECT_TRUE(books().queries().empty());
    expectNames(nullptr, nullptr, nullptr);
}

TEST_F(HostIdentity, PathRefusedWithoutAMessageSaysNull) {
    faults().add(refusal(Entry::NewObjectPath, CMPI_RC_ERR_ACCESS_DENIED));
    EXPECT_EQ(init(), -2);
    EXPECT_TRUE(logged(LOG_ERR, "InitSystemInfo: rc 2, msg NULL\n"));
}

TEST_F(HostIdentity, NoPathAndNoErrorIsNoHost) {
    testbed::FaultRule rule = refusal(Entry::NewObjectPath, CMPI_RC_OK);
    rule.nullResult = true;
    faults().add(rule);
    EXPECT_EQ(init(), -100);
    EXPECT_TRUE(loggedInOrder({{LOG_DEBUG, "InitSystemInfo, CIM Query - EnumInstances: NULL"},
                               {LOG_ERR, "InitSystemInfo: no instance found. rc 0\n"}}));
}

TEST_F(HostIdentity, RefusedQueryIsNoHost) {
    faults().add(refusal(Entry::EnumerateInstances, CMPI_RC_ERR_FAILED, "try later"));
    EXPECT_EQ(init(), -100);
    EXPECT_EQ(CapturedSyslog::lines(),
              (std::vector<LogLine>{
                  kEntering,
                  query(),
                  {LOG_ERR, "InitSystemInfo: no instance found. rc 1, msg try later\n"}}));
    expectNames(nullptr, nullptr, nullptr);
}

TEST_F(HostIdentity, RefusedQueryWithoutAMessageIsNoHost) {
    faults().add(refusal(Entry::EnumerateInstances, CMPI_RC_ERR_INVALID_CLASS));
    EXPECT_EQ(init(), -100);
    EXPECT_TRUE(logged(LOG_ERR, "InitSystemInfo: no instance found. rc 5\n"));
}

TEST_F(HostIdentity, InstancesOfARefusedQueryDoNotCount) {
    testbed::FaultRule rule = refusal(Entry::EnumerateInstances, CMPI_RC_ERR_FAILED);
    rule.keepResult = true;
    faults().add(rule);
    EXPECT_EQ(init(), -100);
    expectNames(nullptr, nullptr, nullptr);
}

TEST_F(HostIdentity, EmptyResultIsNoHost) {
    repository.remove(host());
    EXPECT_EQ(init(), -100);
    EXPECT_TRUE(logged(LOG_ERR, "InitSystemInfo: no instance found. rc 0\n"));
}

TEST_F(HostIdentity, NullResultIsNoHost) {
    testbed::FaultRule rule = refusal(Entry::EnumerateInstances, CMPI_RC_OK);
    rule.nullResult = true;
    faults().add(rule);
    EXPECT_EQ(init(), -100);
    EXPECT_TRUE(logged(LOG_ERR, "InitSystemInfo: no instance found. rc 0\n"));
}

TEST_F(HostIdentity, ResultThatIsNoInstanceIsNoHost) {
    testbed::FaultRule rule = refusal(Entry::EnumerationGetNext, CMPI_RC_OK);
    rule.wrongType = true;
    faults().add(rule);
    EXPECT_EQ(init(), -100);
    expectNames(nullptr, nullptr, nullptr);
}

TEST_F(HostIdentity, ElementOfAnotherTypeGivesWayToTheNext) {
    vendor.host("second-host");
    testbed::FaultRule rule = refusal(Entry::EnumerationGetNext, CMPI_RC_OK);
    rule.wrongType = true;
    rule.times = 1;
    faults().add(rule);
    EXPECT_EQ(init(), 0);
    EXPECT_STREQ(GetSystemName(), "second-host");
}

TEST_F(HostIdentity, ItsNamesAreReadInTheirOrder) {
    books().recordObjectCalls(true);
    ASSERT_EQ(init(), 0);
    std::vector<std::string> names;
    for (const testbed::CallRecord& call : books().calls()) {
        if (call.entry == Entry::InstanceGetProperty) names.push_back(call.name.value_or(""));
    }
    EXPECT_EQ(names, (std::vector<std::string>{"Name", "ElementName", "CreationClassName"}));
}

// The line is written all the same; the system log shows a null text in its own way.
TEST_F(HostIdentity, MissingNamesAreMissingFromTheLine) {
    const std::pair<const char*, const char*> lines[] = {
        {"Name",
         "SYSTEM INFO: HostName host, SystemName NULL, "
         "SystemClassName OMC_UnitaryComputerSystem\n"},
        {"ElementName",
         "SYSTEM INFO: HostName NULL, SystemName NULL, "
         "SystemClassName OMC_UnitaryComputerSystem\n"},
        {"CreationClassName",
         "SYSTEM INFO: HostName NULL, SystemName NULL, SystemClassName NULL\n"}};
    for (const auto& [name, line] : lines) {
        repository.eraseProperty(host(), name);
        EXPECT_EQ(init(), 0);
        EXPECT_TRUE(logged(LOG_DEBUG, line));
    }
}

TEST_F(HostIdentity, FailedReadingMayBeRetried) {
    const int rule = faults().add(refusal(Entry::EnumerateInstances));
    EXPECT_EQ(init(), -100);
    faults().remove(rule);
    EXPECT_EQ(init(), 0);
    expectNames("host-uuid", "host", "OMC_UnitaryComputerSystem");
}

TEST_F(HostIdentity, IsReadAfreshAfterItsRelease) {
    ASSERT_EQ(init(), 0);
    ReleaseSystemInfo();
    expectNames(nullptr, nullptr, nullptr);
    repository.setProperty(host(), "ElementName", CimValue::string("renamed"));
    EXPECT_EQ(init(), 0);
    expectNames("host-uuid", "renamed", "OMC_UnitaryComputerSystem");
}

TEST_F(HostIdentity, MayBeReleasedTwiceAndBeforeItIsRead) {
    ReleaseSystemInfo();
    init();
    ReleaseSystemInfo();
    ReleaseSystemInfo();
    expectNames(nullptr, nullptr, nullptr);
}

TEST_F(HostIdentity, WhatTheBrokerGaveIsNotReleased) {
    books().recordObjectCalls(true);
    init();
    EXPECT_EQ(books().count(Entry::Release), 0u);
    EXPECT_EQ(books().count(Entry::Clone), 0u);
}

TEST_F(HostIdentity, SurvivesEveryFailingAllocation) {
    const std::size_t allocations = forEachFailingAllocation([&](std::size_t) {
        ReleaseSystemInfo();
        EXPECT_EQ(init(), 0);
    });
    EXPECT_EQ(allocations, 3u);
    expectNames("host-uuid", "host", "OMC_UnitaryComputerSystem");
}

}  // namespace
}  // namespace plexortest
