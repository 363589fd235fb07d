// An inventory that is still arriving is never OK.
#include <gtest/gtest.h>

#include <atomic>
#include <chrono>

#include "canned_answers.h"
#include "elements.h"
#include "scripted_server.h"
#include "tool_process.h"

namespace {

using std::chrono::steady_clock;

std::string drive(const std::string& id) {
    return namedInstance(kDrive, "DeviceID", "tvxStorageExtC0_" + id, "Drive " + id + " - ONLINE",
                         2, 5);
}

std::string volume(const std::string& members) {
    return namedInstance(
        kVolume, "DeviceID", "tvxStorageVolumeC0_0",
        "RAID1 v Logical Volume 0 on controller C0, Drives(" + members + ") - OPTIMAL", 2, 5);
}

std::string controller(const std::string& id) {
    return namedInstance(kController, "Name", "tvxController" + id, "Controller " + id + " (M)", 2,
                         5);
}

class Refresh : public ::testing::Test {
protected:
    Refresh() : server([this](const std::string& request) { return answerTo(request); }) {}

    /// From the asking of that number on, the class has these instances.
    void from(int asking, const std::string& className, std::string instances) {
        changes_.push_back({asking, className, std::move(instances)});
    }
    Outcome check(const std::string& more = "--refresh 0.05") {
        asking_ = 0;
        return runTool("ask --check " + server.url() + " " + more);
    }

    ScriptedServer server;

private:
    struct Change {
        int asking;
        std::string className, instances;
    };

    std::string answerTo(const std::string& request) {
        const auto asks = [&](const std::string& className) {
            return request.find("\"" + className + "\"") != std::string::npos;
        };
        if (asks(kController)) asking_++;
        std::string answer = array_.answerTo(request);
        for (const Change& change : changes_)
            if (asks(change.className) && asking_ >= change.asking)
                answer = http(cimInstances(change.instances));
        return answer;
    }

    SmallArray array_;
    int asking_ = 0;
    std::vector<Change> changes_;
};

void expectArriving(const Outcome& outcome, const std::string& text) {
    EXPECT_EQ(outcome.status, 3);
    EXPECT_EQ(outcome.output.find("PLEXOR UNKNOWN - inventory still arriving: " + text + " | "), 0u)
        << outcome.output;
}

TEST_F(Refresh, WhatComesMeanwhileIsStillArriving) {
    from(2, kDrive, drive("d0") + drive("d1") + drive("d2"));
    expectArriving(check(), "2 drives have come within 0.05 s");
    expectArriving(check("--refresh 0.05 --expect drives=9"), "2 drives have come within 0.05 s");
    EXPECT_EQ(check("--no-refresh").status, 0);
}

TEST_F(Refresh, WhatGoesMeanwhileIsNoInventoryEither) {
    from(1, kDrive, drive("d0") + drive("d1"));
    from(2, kDrive, drive("d1"));
    expectArriving(check(), "1 drive has gone within 0.05 s");
}

TEST_F(Refresh, ReplacedDrivesAreSeen) {
    from(2, kDrive, drive("d1"));
    expectArriving(check(), "1 drive has come, 1 drive has gone within 0.05 s");
}

TEST_F(Refresh, StatesMayChange) {
    from(2, kDrive,
         namedInstance(kDrive, "DeviceID", "tvxStorageExtC0_d0", "Drive d0 - FAILED", 6, 30));
    const Outcome outcome = check();
    EXPECT_EQ(outcome.status, 2);
    EXPECT_EQ(outcome.output.find("PLEXOR CRITICAL - 1 drive failed: Drive d0 | "), 0u)
        << outcome.output;
}

TEST_F(Refresh, CriticalStaysCritical) {
    from(1, kDrive,
         namedInstance(kDrive, "DeviceID", "tvxStorageExtC0_d0", "Drive d0 - FAILED", 6, 30));
    from(2, kVolume, volume("d0,d1"));
    const Outcome outcome = check();
    EXPECT_EQ(outcome.status, 2);
    EXPECT_NE(outcome.output.find("inventory still arriving: "), std::string::npos);
    from(2, kDrive, "<SURPRISE/>");
    EXPECT_EQ(check().status, 2) << "the first asking saw it";
}

TEST_F(Refresh, MembersOfVolumesHaveToBeThere) {
    const std::string name = "RAID1 v Logical Volume 0 on controller C0 names ";
    for (const char* more : {"--refresh 0.05", "--no-refresh"}) {
        from(1, kVolume, volume("d0"));
        EXPECT_EQ(check(more).status, 0);
        from(1, kVolume, volume("3e1"));
        EXPECT_EQ(check(more).status, 0) << "slot and enclosure, which no drive tells";
        from(1, kVolume, volume("d1"));
        expectArriving(check(more), name + "drive d1, which is not there");
        from(1, kVolume, volume("3e1,4e1"));
        expectArriving(check(more), name + "2 drives, of which 1 are there");
    }
    from(1, kVolume,
         namedInstance(kVolume, "DeviceID", "tvxStorageVolumeC0_0", "v, Drives(d0,d", 2, 5));
    EXPECT_EQ(check().status, 0) << "a name that was cut";
}

TEST_F(Refresh, EachControllerHasDevices) {
    from(1, kController, controller("C0") + controller("C1"));
    expectArriving(check(), "Controller C1 (M) has no devices");
    EXPECT_EQ(check("--refresh 0.05 --ignore controller:C1").status, 0);
    EXPECT_EQ(check("--refresh 0.05 --class Tovexa_PlexorController").status, 0);
}

TEST_F(Refresh, UsuallyTakesThreeSecondsAndFitsTheTimeout) {
    auto start = steady_clock::now();
    EXPECT_EQ(check("").status, 0);
    EXPECT_GE(steady_clock::now() - start, std::chrono::seconds(3));
    start = steady_clock::now();
    EXPECT_EQ(check("--timeout 2").status, 0);
    EXPECT_LT(steady_clock::now() - start, std::chrono::seconds(3));
    EXPECT_EQ(check("--timeout 1 --refresh 1").output, "PLEXOR UNKNOWN - wrong usage\n");
}

TEST_F(Refresh, NoTimeForTheSecondAskingIsUnknown) {
    server.setPauses(std::chrono::milliseconds(200));
    const Outcome outcome = check("--timeout 2 --refresh 1.9");
    EXPECT_EQ(outcome.status, 3);
    EXPECT_NE(outcome.output.find("no time left to ask again after 1.9 s"), std::string::npos)
        << outcome.output;
}

}  // namespace
