// The factory's own context, when the broker has none to give or does not attach the thread.
#include "entry_fixture.h"

namespace {

using plexortest::CapturedSyslog;
using plexortest::LogLine;
using plexortest::WorkersHeld;
using testbed::Entry;

class EntryContextTest : public plexortest::EntryTest {
protected:
    void SetUp() override {
        EntryTest::SetUp();
        vendor.host();
        vendor.controller("C0", vendor.profile());
    }
    /// The broker gives no context in the calls from the `skip`-th on, `times` times.
    void giveNoContext(int skip, int times) {
        testbed::FaultRule rule;
        rule.entry = Entry::PrepareAttachThread;
        rule.nullResult = true;
        rule.skip = skip;
        rule.times = times;
        faults().add(rule);
    }
};

TEST_F(EntryContextTest, WithoutAContextOfItsOwnTheManagersServes) {
    giveNoContext(0, 1);
    const WorkersHeld held;
    EXPECT_NE(callFactory(), nullptr);
    EXPECT_EQ(initialized(), 1);
    EXPECT_EQ(controllers(), 1u);
    // Nothing was attached, so there is nothing to flush and to detach.
    EXPECT_EQ(countHere(Entry::AttachThread), 0u);
    EXPECT_EQ(countHere(Entry::ContextFlush), 0u);
    EXPECT_EQ(countHere(Entry::DetachThread), 0u);
    EXPECT_EQ(linesHere().back(), (LogLine{LOG_DEBUG, "PlexorInit: EXIT\n"}));
}

TEST_F(EntryContextTest, WithoutAContextOfItsOwnAFailureIsOne) {
    repository.clearInstances();
    giveNoContext(0, 1);
    EXPECT_NE(callFactory(), nullptr);
    EXPECT_EQ(initialized(), 0);
    EXPECT_TRUE(plexortest::logged(LOG_ERR, "Cannot get system info, rc -100\n"));
    EXPECT_EQ(linesHere().back(), (LogLine{LOG_DEBUG, "PlexorInit: EXIT\n"}));
}

// A worker without a context would take the thread's objects for nobody's; it is not started.
TEST_F(EntryContextTest, OneWorkerWithoutAContextLeavesTheOther) {
    for (const int missing : {0, 1}) {
        SCOPED_TRACE(missing);
        CapturedSyslog::clear();
        giveNoContext(1 + missing, 1);
        callFactory();
        EXPECT_TRUE(
            plexortest::loggedInOrder({{LOG_DEBUG, "InitPlexorThreads: thread 0 created\n"},
                                       {LOG_DEBUG, "InitPlexorThreads: thread 1 created\n"}}));
        EXPECT_TRUE(inventoryTaken());
        EXPECT_EQ(PlexorThreads[missing], 0u);
        EXPECT_NE(PlexorThreads[1 - missing], 0u);
        unloadAndForget();
        faults().clear();
    }
}

TEST_F(EntryContextTest, WithoutAnyContextRequestsAreStillServed) {
    giveNoContext(0, -1);
    testbed::InstanceClient client(broker, callFactory());
    EXPECT_EQ(initialized(), 1);
    EXPECT_EQ(client.enumerateInstances("Tovexa_PlexorController").instances.size(), 1u);
    EXPECT_EQ(client.enumerateInstances("Tovexa_PlexorBattery").rc, 0);
    EXPECT_EQ(client.cleanup(true), 0);
}

// The status of attachThread is not looked at. This broker then finds everything on that context
// wrong, and says so in its books.
TEST_F(EntryContextTest, RefusedAttachmentStopsNothing) {
    expectMisuses(true);
    testbed::FaultRule rule = refusal(Entry::AttachThread);
    rule.times = 1;
    faults().add(rule);
    const WorkersHeld held;
    callFactory();
    EXPECT_EQ(initialized(), 1);
    EXPECT_EQ(controllers(), 1u);
    EXPECT_EQ(countHere(Entry::ContextFlush), 1u);
    EXPECT_EQ(countHere(Entry::DetachThread), 1u);
}

TEST_F(EntryContextTest, RefusedDetachmentStopsNothing) {
    testbed::FaultRule rule = refusal(Entry::DetachThread);
    rule.times = 1;
    rule.keepResult = true;
    faults().add(rule);
    const WorkersHeld held;
    callFactory();
    EXPECT_EQ(initialized(), 1);
    EXPECT_EQ(linesHere().back(), (LogLine{LOG_DEBUG, "PlexorInit: EXIT\n"}));
}

// Nothing that belongs to the prepared context is used after it was given back.
TEST_F(EntryContextTest, TheContextIsNotUsedAfterDetach) {
    const WorkersHeld held;
    callFactory();
    const std::vector<Entry> calls = upCalls();
    EXPECT_EQ(calls.back(), Entry::DetachThread);
    EXPECT_EQ(books().misuses(), std::vector<std::string>{});
}

}  // namespace
