// Giving back what an item obtained, where the manager exports a function for that.
#include "PlexorProviderUtilManager.h"
#include "refresh_fixture.h"

namespace {

int flushes = 0;

}  // namespace

/// The manager's, for the thread that calls it.
extern "C" void tool_mm_flush() {
    ++flushes;
}

namespace plexortest {
namespace {

using testbed::BrokerOptions;
using testbed::Entry;

class ExportedFlushTest : public ProviderTest {
protected:
    explicit ExportedFlushTest(BrokerOptions options = withoutEntry())
        : ProviderTest(std::move(options)) {}

    void SetUp() override {
        ProviderTest::SetUp();
        books().clearCalls();
        flushes = 0;
    }
    /// Begins and ends an item on the test's own context.
    void runItem() {
        ItemSpan span(ctx());
        EXPECT_EQ(span.Context(), ctx());
        EXPECT_EQ(flushes, 0);
        span.End();
        EXPECT_EQ(span.Context(), ctx());
    }

private:
    static BrokerOptions withoutEntry() {
        BrokerOptions options;
        options.flush = testbed::FlushOffer::OwnFunction;
        return options;
    }
};

TEST_F(ExportedFlushTest, AnItemEndsWithItAndNeedsNoContextOfItsOwn) {
    runItem();
    EXPECT_EQ(flushes, 1);
    EXPECT_EQ(books().count(Entry::PrepareAttachThread), 0u);
    EXPECT_EQ(books().count(Entry::AttachThread), 0u);
    EXPECT_EQ(books().count(Entry::DetachThread), 0u);
}

TEST_F(ExportedFlushTest, TheFactoryLeavesItAlone) {
    FlushFactoryContext(ctx());
    EXPECT_EQ(flushes, 0) << "it would take what others hold on the manager's thread";
}

TEST_F(ExportedFlushTest, WithoutAContextThereIsNothingToGiveBack) {
    ItemSpan span(nullptr);
    span.End();
    EXPECT_EQ(flushes, 0);
}

class FlushEntryTest : public ExportedFlushTest {
protected:
    FlushEntryTest() : ExportedFlushTest(BrokerOptions()) {}
};

TEST_F(FlushEntryTest, ComesBeforeTheFunction) {
    if (!kContextHasFlush) GTEST_SKIP() << "this build knows no such entry";
    runItem();
    EXPECT_EQ(flushes, 0);
    EXPECT_EQ(books().count(Entry::ContextFlush), 1u);
    FlushFactoryContext(ctx());
    EXPECT_EQ(books().count(Entry::ContextFlush), 2u);
    EXPECT_EQ(books().count(Entry::DetachThread), 0u);
}

}  // namespace
}  // namespace plexortest
