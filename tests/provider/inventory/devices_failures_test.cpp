// Devices that cannot be queued: each costs itself and no other.
#include "devices_fixture.h"

namespace plexortest {
namespace {

using testing::ElementsAre;

class DevicesFailures : public DevicesTest {
protected:
    void SetUp() override {
        DevicesTest::SetUp();
        all = addPorts(3);
    }
    /// What is queued without the device of that number.
    Texts without(std::size_t device) const {
        Texts rest = all;
        if (device < rest.size()) rest.erase(rest.begin() + static_cast<std::ptrdiff_t>(device));
        return rest;
    }
    /// Two clones for each queued device, one of the controller.
    void expectOnlyTheQueuedClones() { EXPECT_EQ(books().liveClones(), 1 + 2 * taken_.size()); }
    static bool isAdded(std::size_t device) {
        return CapturedSyslog::countContaining("Added to FIFO: ") > 0 &&
               CapturedSyslog::count(
                   "Added to FIFO: " +
                   VendorObjects::devicePath("CIM_SASSATAPort", std::to_string(device)).text() +
                   "\n") == 1;
    }

    Texts all;
};

// The allocations for one device: the item, the queue's entry.
TEST_F(DevicesFailures, EveryAllocationInTurn) {
    for (std::size_t n = 1; n <= 6; n++) {
        SCOPED_TRACE(n);
        const auto fault = FailAllocation::nth(n);
        EXPECT_EQ(walk(), 0);
        EXPECT_EQ(fault.failures(), 1u);
        EXPECT_EQ(taken(), without((n - 1) / 2));
        expectOnlyTheQueuedClones();
        // A queue that answers anything but "full" has accepted.
        EXPECT_EQ(isAdded((n - 1) / 2), n % 2 == 0);
    }
    const auto fault = FailAllocation::nth(7);
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(fault.calls(), 6u);
    EXPECT_EQ(taken(), all);
}

TEST_F(DevicesFailures, NoMemoryAtAll) {
    const auto fault = FailAllocation::from(1);
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(taken(), Texts{});
    EXPECT_EQ(fault.calls(), 3u);
    expectOnlyTheQueuedClones();
}

TEST_F(DevicesFailures, EveryCloneInTurn) {
    for (std::size_t clone = 0; clone < 6; clone++) {
        SCOPED_TRACE(clone);
        failOnly(answerNull(Entry::Clone, static_cast<int>(clone)));
        EXPECT_EQ(walk(), 0);
        EXPECT_EQ(taken(), without(clone / 2));
        expectOnlyTheQueuedClones();
    }
}

TEST_F(DevicesFailures, NoCloneAtAll) {
    failOnly(answerNull(Entry::Clone));
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(taken(), Texts{});
    expectOnlyTheQueuedClones();
}

TEST_F(DevicesFailures, ElementOfAnotherType) {
    for (std::size_t wrong = 0; wrong < 3; wrong++) {
        failOnly(wrongElement(static_cast<int>(wrong)));
        EXPECT_EQ(walk(), 0);
        EXPECT_EQ(taken(), without(wrong));
    }
}

TEST_F(DevicesFailures, NullElement) {
    for (std::size_t wrong = 0; wrong < 3; wrong++) {
        failOnly(answerNull(Entry::EnumerationGetNext, static_cast<int>(wrong)));
        EXPECT_EQ(walk(), 0);
        EXPECT_EQ(taken(), without(wrong));
    }
}

TEST_F(DevicesFailures, EnumerationThatFailsEndsTheWalk) {
    for (const Entry entry : {Entry::EnumerationHasNext, Entry::EnumerationGetNext}) {
        for (std::size_t good = 0; good < 3; good++) {
            failOnly(failingEnumeration(entry, static_cast<int>(good)));
            EXPECT_EQ(walk(), 0);
            EXPECT_EQ(taken(), Texts(all.begin(), all.begin() + static_cast<int>(good)))
                << testbed::entryName(entry);
            expectOnlyTheQueuedClones();
        }
    }
}

TEST_F(DevicesFailures, ElementThatComesWithAFailureIsNotQueued) {
    auto rule = failingEnumeration(Entry::EnumerationGetNext, 1);
    rule.keepResult = true;
    failOnly(rule);
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(taken(), Texts{"2 0"});
}

TEST_F(DevicesFailures, DeviceWithoutPath) {
    for (std::size_t device = 0; device < 3; device++) {
        failOnly(answerNull(Entry::InstanceGetObjectPath, static_cast<int>(device)));
        EXPECT_EQ(walk(), 0);
        EXPECT_EQ(taken(), without(device));
        expectOnlyTheQueuedClones();
    }
}

TEST_F(DevicesFailures, DeviceWithoutClassName) {
    for (std::size_t device = 0; device < 3; device++) {
        failOnly(answerNull(Entry::PathGetClassName, static_cast<int>(device)));
        EXPECT_EQ(walk(), 0);
        EXPECT_EQ(taken(), without(device));
        expectOnlyTheQueuedClones();
    }
}

TEST_F(DevicesFailures, ClassNameWithoutText) {
    setlogmask(LOG_UPTO(LOG_ERR));  // so that the class names are the only texts that are read
    for (std::size_t device = 0; device < 3; device++) {
        failOnly(answerNull(Entry::StringGetCharPtr, static_cast<int>(device)));
        EXPECT_EQ(walk(), 0);
        EXPECT_EQ(taken(), without(device));
    }
}

TEST_F(DevicesFailures, PropertiesAreTheBuildersBusiness) {
    const Path bare = vendor.port(card, "bare");
    for (const char* name : {"DeviceID", "ElementName", "PortType"}) unset(bare, name);
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(taken(), ElementsAre("2 0", "2 1", "2 2", "2 bare"));
}

}  // namespace
}  // namespace plexortest
