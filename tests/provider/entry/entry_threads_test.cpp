// A manager that calls the factory once for each class, on a thread for each, and requests
// meanwhile.
#include <atomic>
#include <string>
#include <thread>
#include <vector>

#include "entry_fixture.h"
#include "real_waits.h"
#include "worker_harness.h"

namespace {

using plexortest::CapturedSyslog;
using plexortest::Gate;
using plexortest::GateOpener;
using testbed::Entry;

constexpr const char* kClasses[] = {"Tovexa_PlexorController",    "Tovexa_PlexorSoftwareIdentity",
                                    "Tovexa_PlexorStorageVolume", "Tovexa_PlexorStorageExtent",
                                    "Tovexa_PlexorSASSATAPort",   "Tovexa_PlexorBattery"};

/// Threads that are joined on every way out.
class Crew {
public:
    ~Crew() { join(); }
    void add(std::function<void()> work) { threads_.emplace_back(std::move(work)); }
    void join() {
        for (std::thread& thread : threads_) thread.join();
        threads_.clear();
    }

private:
    std::vector<std::thread> threads_;
};

class EntryThreadsTest : public plexortest::EntryTest {
protected:
    void SetUp() override {
        EntryTest::SetUp();
        presentVendor();
    }
    /// The factory, called by the manager on any thread.
    CMPIInstanceMI* callFactoryHere() {
        const testbed::Broker::CallScope scope(broker);
        return PlexorProvider_Create_InstanceMI(broker.handle(), scope.context(), nullptr);
    }
    /// Holds the first initialisation while it asks for the profiles; then `rc` is the answer.
    void holdFirst(Gate& gate, CMPIrc rc = CMPI_RC_OK) {
        testbed::FaultRule rule;
        rule.entry = Entry::EnumerateInstances;
        rule.className = "CIM_RegisteredProfile";
        rule.rc = rc;
        rule.times = 1;
        rule.hook = [&gate] { gate.pass(); };
        faults().add(rule);
    }
    /// What one class's thread got.
    struct Outcome {
        CMPIInstanceMI* mi = nullptr;
        std::size_t controllers = 0;
    };
    /// Calls the factory for six classes at once; each then asks for the controllers.
    void callForAllClasses(Crew& crew, std::vector<Outcome>& outcomes, std::atomic<int>& returned) {
        outcomes.resize(std::size(kClasses));
        for (Outcome& outcome : outcomes) {
            crew.add([this, &outcome, &returned] {
                outcome.mi = callFactoryHere();
                ++returned;
                testbed::InstanceClient client(broker, outcome.mi);
                outcome.controllers =
                    client.enumerateInstanceNames("Tovexa_PlexorController").paths.size();
            });
        }
    }
    static void expectOneControllerFor(const std::vector<Outcome>& outcomes) {
        for (const Outcome& outcome : outcomes) {
            EXPECT_EQ(outcome.mi, outcomes.front().mi);
            EXPECT_EQ(outcome.controllers, 1u);
        }
    }
    /// All six are inside the factory, and none has come out of it.
    static void expectAllWait(const std::atomic<int>& returned) {
        EXPECT_TRUE(plexortest::eventually(
            [] { return CapturedSyslog::count("PlexorInit: ENTER...\n") == 6; }));
        // Long enough for one that does not wait to get out.
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
        EXPECT_EQ(returned, 0);
    }
};

TEST_F(EntryThreadsTest, LaterCallsWaitForTheFirstInitialisation) {
    Gate gate;
    holdFirst(gate);
    std::vector<Outcome> outcomes;
    std::atomic<int> returned = 0;
    Crew crew;
    const GateOpener opener(gate);
    callForAllClasses(crew, outcomes, returned);
    ASSERT_TRUE(gate.awaitArrivals(1));
    expectAllWait(returned);

    gate.open();
    crew.join();
    expectOneControllerFor(outcomes);
    EXPECT_EQ(controllers(), 1u);
    EXPECT_EQ(CapturedSyslog::count("InitSystemInfo: entering...\n"), 1u);
    EXPECT_EQ(CapturedSyslog::count("PlexorInit: EXIT\n"), 1u);
    EXPECT_EQ(CapturedSyslog::count("InitPlexorThreads: thread 0 created\n"), 1u);
    EXPECT_EQ(CapturedSyslog::countContaining("PlexorProvider: built on "), 6u);
}

TEST_F(EntryThreadsTest, WhenTheFirstFailsTheNextTriesAndTheOthersWaitForIt) {
    Gate gate;
    holdFirst(gate, CMPI_RC_ERR_FAILED);
    std::vector<Outcome> outcomes;
    std::atomic<int> returned = 0;
    std::atomic<CMPIInstanceMI*> failed = nullptr;
    Crew crew;
    const GateOpener opener(gate);
    crew.add([&] { failed = callFactoryHere(); });
    ASSERT_TRUE(gate.awaitArrivals(1));
    callForAllClasses(crew, outcomes, returned);
    EXPECT_TRUE(plexortest::eventually(
        [] { return CapturedSyslog::count("PlexorInit: ENTER...\n") == 7; }));
    EXPECT_EQ(returned, 0);

    gate.open();
    crew.join();
    EXPECT_EQ(failed, outcomes.front().mi);
    expectOneControllerFor(outcomes);
    EXPECT_EQ(CapturedSyslog::count("InitSystemInfo: entering...\n"), 2u);
    EXPECT_EQ(CapturedSyslog::count("PlexorInit: EXIT\n"), 2u);
    EXPECT_EQ(initialized(), 1);
}

// A vendor that, asked for its profiles, asks the manager for computer systems: the manager calls
// the factory, then asks the provider, and only then answers.
class EntryNestedTest : public EntryThreadsTest {
protected:
    void SetUp() override {
        EntryThreadsTest::SetUp();
        vendor.controller("C1", vendor.profile());
    }
    /// Does `call` in the middle of the search for controllers, when the first is in the list.
    void whileTheVendorAnswers(std::function<void()> call) {
        testbed::FaultRule rule;
        rule.entry = Entry::Associators;
        rule.assocClass = "CIM_Realizes";
        rule.keepResult = true;
        rule.skip = 1;
        rule.times = 1;
        rule.hook = std::move(call);
        faults().add(rule);
    }
    std::size_t controllersFor(CMPIInstanceMI* provider) {
        testbed::InstanceClient client(broker, provider);
        const testbed::Response names = client.enumerateInstanceNames("Tovexa_PlexorController");
        const testbed::Response systems = client.enumerateInstances("Tovexa_PlexorController");
        EXPECT_EQ(names.rc, CMPI_RC_OK);
        EXPECT_EQ(systems.rc, CMPI_RC_OK);
        EXPECT_EQ(systems.instances.size(), names.paths.size());
        return names.paths.size();
    }
};

TEST_F(EntryNestedTest, OnTheSameThreadItDoesNotWait) {
    const plexortest::HurriedWaits hurry(plexortest::HurriedWaits::Conditions);
    std::size_t seen = 99;
    CMPIInstanceMI* nested = nullptr;
    whileTheVendorAnswers([&] {
        nested = callFactoryHere();
        seen = controllersFor(nested);
    });
    EXPECT_EQ(callFactoryHere(), nested);
    EXPECT_EQ(seen, 0u);
    EXPECT_EQ(controllersFor(nested), 2u);
    EXPECT_EQ(CapturedSyslog::count("InitSystemInfo: entering...\n"), 1u);
}

TEST_F(EntryNestedTest, OnAnotherThreadItDoesNotWaitForEver) {
    const plexortest::HurriedWaits hurry(plexortest::HurriedWaits::Conditions);
    std::size_t seen = 99;
    CMPIInstanceMI* nested = nullptr;
    whileTheVendorAnswers([&] {
        std::thread([&] {
            nested = callFactoryHere();
            seen = controllersFor(nested);
        }).join();
    });
    EXPECT_EQ(callFactoryHere(), nested);
    EXPECT_EQ(seen, 0u);
    EXPECT_EQ(controllersFor(nested), 2u);
    EXPECT_EQ(CapturedSyslog::count("InitSystemInfo: entering...\n"), 1u);
    EXPECT_EQ(plexortest::HurriedWaits::otherWaits().front(), std::chrono::seconds(30));
}

// For the thread sanitizer, too: nothing but the provider itself orders these threads.
TEST_F(EntryThreadsTest, FactoriesAndRequestsAtOnce) {
    CapturedSyslog::discard(true);
    for (int round = 0; round < 5; round++) {
        std::atomic<int> missed = 0;
        {
            Crew crew;
            for (const char* className : kClasses) {
                crew.add([this, className, &missed] {
                    testbed::InstanceClient client(broker, callFactoryHere());
                    for (int i = 0; i < 3; i++) {
                        if (client.enumerateInstances(className).rc != 0) ++missed;
                        if (client.enumerateInstanceNames(className).rc != 0) ++missed;
                        if (client.enumerateInstances(kClasses[1]).instances.size() != 1) ++missed;
                    }
                });
            }
        }
        EXPECT_EQ(missed, 0);
        EXPECT_EQ(controllers(), 1u);
        unloadAndForget();
    }
}

}  // namespace
