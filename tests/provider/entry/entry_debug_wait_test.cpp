// The wait for a debugger.
#include <stdlib.h>
#include <unistd.h>

#include <thread>

#include "entry_fixture.h"

namespace {

/// Whether this process is one that has more rights than whoever started it.
bool hasMoreRights = false;

}  // namespace

// In front of the C library's, which cannot be made to believe that.
extern "C" char* secure_getenv(const char* name) noexcept {
    return hasMoreRights ? nullptr : getenv(name);
}

namespace {

using plexortest::CapturedSyslog;
using plexortest::currentProcessLine;
using plexortest::formatted;
using plexortest::LogLine;
using plexortest::Sleep;
using plexortest::VirtualClock;

std::string waitingLine() {
    return formatted("Waiting for hostdbgd attach:pid=%d, ppid=%d\n", getpid(), getppid());
}

/// What a debugger does to the stopped process: no thread of it is a party to this write.
__attribute__((no_sanitize("thread"))) void pokeMark(int value) {
    waitDebug = value;
}

class EntryDebugWaitTest : public plexortest::EntryTest {
protected:
    void TearDown() override {
        unsetenv("WAIT_PROC");
        EntryTest::TearDown();
    }
    /// A debugger that attaches in the n-th second. The waiting thread does its work for it.
    void attachDuring(int second) {
        VirtualClock::onSleep([this, second](unsigned int) {
            seen.push_back(static_cast<int>(waitDebug));
            if (static_cast<int>(seen.size()) == second) waitDebug = 0;
        });
    }
    static std::vector<unsigned int> sleptHere() {
        std::vector<unsigned int> seconds;
        for (const Sleep& slept : VirtualClock::sleeps()) {
            if (slept.thread == std::this_thread::get_id()) seconds.push_back(slept.seconds);
        }
        return seconds;
    }
    std::vector<int> seen;  ///< waitDebug in each sleep
};

TEST_F(EntryDebugWaitTest, WithoutTheVariableItSaysWhereItRuns) {
    waitDebug = 1;
    callFactory();
    EXPECT_EQ(waitDebug, 0);
    EXPECT_TRUE(plexortest::logged(LOG_DEBUG, currentProcessLine()));
    EXPECT_EQ(CapturedSyslog::countContaining("Current process"), 1u);
    EXPECT_EQ(CapturedSyslog::countContaining("Waiting for hostdbgd"), 0u);
    EXPECT_EQ(sleptHere(), std::vector<unsigned int>{});
}

TEST_F(EntryDebugWaitTest, WaitsUntilTheDebuggerClearsItsMark) {
    setenv("WAIT_PROC", "1", 1);
    attachDuring(3);
    callFactory();
    EXPECT_EQ(sleptHere(), (std::vector<unsigned int>{1, 1, 1}));
    EXPECT_EQ(seen, (std::vector<int>{1, 1, 1}));
    EXPECT_EQ(CapturedSyslog::count(waitingLine()), 3u);
    EXPECT_TRUE(plexortest::loggedInOrder({{LOG_DEBUG, "PlexorInit: ENTER...\n"},
                                           {LOG_DEBUG, waitingLine()},
                                           {LOG_DEBUG, waitingLine()},
                                           {LOG_DEBUG, waitingLine()},
                                           {LOG_DEBUG, "InitSystemInfo: entering...\n"}}));
    EXPECT_EQ(CapturedSyslog::countContaining("Current process"), 0u);
}

// The line comes after the second, also after the one in which the debugger attached.
TEST_F(EntryDebugWaitTest, WaitsOneSecondAtLeast) {
    setenv("WAIT_PROC", "1", 1);
    attachDuring(1);
    callFactory();
    EXPECT_EQ(sleptHere(), (std::vector<unsigned int>{1}));
    EXPECT_EQ(CapturedSyslog::count(waitingLine()), 1u);
}

TEST_F(EntryDebugWaitTest, SleepsFirstAndSaysThenThatItWaits) {
    setenv("WAIT_PROC", "1", 1);
    std::vector<std::size_t> said;  // lines at the beginning of each sleep
    VirtualClock::onSleep([&](unsigned int) {
        said.push_back(CapturedSyslog::count(waitingLine()));
        if (said.size() == 3) waitDebug = 0;
    });
    callFactory();
    EXPECT_EQ(said, (std::vector<std::size_t>{0, 1, 2}));
    EXPECT_EQ(CapturedSyslog::count(waitingLine()), 3u);
}

TEST_F(EntryDebugWaitTest, OnlyThePresenceOfTheVariableCounts) {
    for (const char* value : {"", "0", "no"}) {
        setenv("WAIT_PROC", value, 1);
        seen.clear();
        attachDuring(2);
        callFactory();
        EXPECT_EQ(seen, (std::vector<int>{1, 1})) << '"' << value << '"';
    }
}

TEST_F(EntryDebugWaitTest, NobodyMakesAProcessWaitThatHasMoreRightsThanHe) {
    setenv("WAIT_PROC", "1", 1);
    hasMoreRights = true;
    attachDuring(2);
    callFactory();
    hasMoreRights = false;
    EXPECT_EQ(waitDebug, 0);
    EXPECT_TRUE(plexortest::logged(LOG_DEBUG, currentProcessLine()));
    EXPECT_EQ(seen, (std::vector<int>{}));
}

TEST_F(EntryDebugWaitTest, LaterCallsWaitToo) {
    presentVendor();
    callFactory();
    ASSERT_TRUE(inventoryTaken());
    CapturedSyslog::clear();
    setenv("WAIT_PROC", "1", 1);
    attachDuring(2);
    callFactory();
    EXPECT_EQ(CapturedSyslog::count(waitingLine()), 2u);
    EXPECT_EQ(seen, (std::vector<int>{1, 1}));
}

// Cleared by another thread, as by a debugger: the loop looks at the variable itself each time.
TEST_F(EntryDebugWaitTest, TheMarkIsReadAnewOnEachPass) {
    setenv("WAIT_PROC", "1", 1);
    std::thread debugger([] {
        plexortest::eventually([] { return CapturedSyslog::count(waitingLine()) >= 2; });
        pokeMark(0);
    });
    callFactory();
    debugger.join();
    EXPECT_GE(CapturedSyslog::count(waitingLine()), 2u);
}

}  // namespace
