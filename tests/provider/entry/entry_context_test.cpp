// The factory's own context, when the broker has none to give or does not attach the thread.
#include "entry_fixture.h"
#include "refresh_fixture.h"

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
    EXPECT_EQ(countHere(Entry::ContextFlush), plexortest::kContextHasFlush ? 1u : 0u);
    EXPECT_EQ(countHere(Entry::DetachThread), 1u);

    std::vector<std::string> misuses;
    for (const char* call :
         {"enumerateInstances", "enumerateInstances", "associators", "associators", "associators",
          "associators", "prepareAttachThread", "prepareAttachThread", "context.flush"}) {
        if (std::string(call) == "context.flush" && !plexortest::kContextHasFlush) continue;
        misuses.push_back(std::string("up-call with a context that no thread has attached with: ") +
                          call);
    }
    misuses.push_back("detachThread with a context that this thread is not attached with");
    EXPECT_EQ(books().misuses(), misuses);
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

TEST_F(EntryContextTest, EverythingIsAskedOnTheContextThatWasAttached) {
    const WorkersHeld held;
    callFactory();
    std::vector<testbed::CallRecord> calls = books().calls();
    std::erase_if(calls, [](const auto& call) {
        const bool needsNone = call.entry == Entry::NewObjectPath;
        const bool isPlainFlush =
            call.entry == Entry::ContextFlush && !plexortest::kContextHasFlush;
        return call.thread != std::this_thread::get_id() || needsNone || isPlainFlush;
    });
    ASSERT_GT(calls.size(), 9u);
    EXPECT_EQ(calls[0].entry, Entry::PrepareAttachThread);
    EXPECT_EQ(calls[0].context, ctx());
    EXPECT_EQ(calls[1].entry, Entry::AttachThread);
    EXPECT_EQ(calls.back().entry, Entry::DetachThread);
    const void* const own = calls[1].context;
    EXPECT_NE(own, ctx());
    for (std::size_t i = 2; i < calls.size(); i++) {
        EXPECT_EQ(calls[i].context, own) << testbed::entryName(calls[i].entry) << ", call " << i;
    }
}

}  // namespace
