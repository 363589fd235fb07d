// Threads of the provider's own, and several threads at once.
#include <atomic>
#include <thread>
#include <utility>
#include <vector>

#include "broker_fixture.h"

extern "C" void tool_mm_flush();

namespace testbed {
namespace {

class BrokerThreads : public BrokerTest {
protected:
    explicit BrokerThreads(BrokerOptions options = {}) : BrokerTest(std::move(options)) {
        repository.put(drive("1"));
    }
    CMPIContext* prepare() { return calls().prepareAttachThread(handle(), context()); }
    template <class Work>
    void onThread(Work work) {
        std::thread(work).join();
    }
    CMPIEnumeration* query(const CMPIContext* ctx) {
        return calls().enumerateInstances(
            handle(), ctx, makers().newObjectPath(handle(), "root/sample", "CIM_Drive", nullptr),
            nullptr, nullptr);
    }
};

TEST_F(BrokerThreads, AttachedThreadKeepsItsObjectsUntilDetach) {
    CMPIContext* prepared = prepare();
    ASSERT_NE(prepared, nullptr);
    onThread([&] {
        EXPECT_EQ(calls().attachThread(handle(), prepared).rc, CMPI_RC_OK);
        const auto self = std::this_thread::get_id();
        CMPIEnumeration* found = query(prepared);
        EXPECT_TRUE(found->ft->hasNext(found, nullptr));
        EXPECT_EQ(broker.books().liveOnThread(self), 3u);
        CMPIEnumeration* clone = found->ft->clone(found, nullptr);
        EXPECT_EQ(calls().detachThread(handle(), prepared).rc, CMPI_RC_OK);
        EXPECT_EQ(broker.books().liveClones(), 1u);
        EXPECT_EQ(broker.books().liveOnThread(self), 2u);
        EXPECT_EQ(clone->ft->release(clone).rc, CMPI_RC_OK);
        EXPECT_TRUE(misuses().empty());
        EXPECT_FALSE(found->ft->hasNext(found, nullptr));
    });
    expectMisuse("enumeration.hasNext");
    EXPECT_EQ(broker.books().live(ObjectKind::Context), 1u);
}

TEST_F(BrokerThreads, CallsAreNotedWithTheirContext) {
    CMPIContext* prepared = prepare();
    onThread([&] {
        calls().attachThread(handle(), prepared);
        query(prepared);
        calls().detachThread(handle(), prepared);
    });
    std::vector<std::pair<Entry, const void*>> noted;
    for (const CallRecord& call : broker.books().calls())
        noted.push_back({call.entry, call.context});
    const std::vector<std::pair<Entry, const void*>> expected = {
        {Entry::PrepareAttachThread, context()},
        {Entry::AttachThread, prepared},
        {Entry::NewObjectPath, nullptr},
        {Entry::EnumerateInstances, prepared},
        {Entry::DetachThread, prepared}};
    EXPECT_EQ(noted, expected);
}

TEST_F(BrokerThreads, DetachEndsThePreparedContext) {
    CMPIContext* prepared = prepare();
    onThread([&] {
        calls().attachThread(handle(), prepared);
        calls().detachThread(handle(), prepared);
        EXPECT_EQ(calls().detachThread(handle(), prepared).rc, CMPI_RC_ERR_INVALID_HANDLE);
        CMPIStatus status = unsetStatus();
        prepared->ft->getEntryCount(prepared, &status);
        EXPECT_EQ(status.rc, CMPI_RC_ERR_INVALID_HANDLE);
    });
    EXPECT_EQ(misuses().size(), 2u);
}

TEST_F(BrokerThreads, PreparedContextCarriesTheEntriesAndOutlivesTheCall) {
    context()->ft->addEntry(context(), "CMPIPrincipal", asValue("root"), CMPI_chars);
    CMPIContext* prepared = prepare();
    leaveCall();
    onThread([&] {
        EXPECT_EQ(calls().attachThread(handle(), prepared).rc, CMPI_RC_OK);
        const CMPIData data = prepared->ft->getEntry(prepared, "CMPIPrincipal", nullptr);
        EXPECT_STREQ(textOf(data.value.string), "root");
        calls().detachThread(handle(), prepared);
    });
    EXPECT_TRUE(misuses().empty());
    EXPECT_EQ(broker.books().live(), 0u);
}

#if defined(PLEXOR_CONTEXT_FLUSH) && PLEXOR_CONTEXT_FLUSH
TEST_F(BrokerThreads, FlushEndsWhatTheThreadObtained) {
    CMPIContext* prepared = prepare();
    onThread([&] {
        calls().attachThread(handle(), prepared);
        const auto self = std::this_thread::get_id();
        for (int round = 0; round < 3; ++round) {
            CMPIEnumeration* found = query(prepared);
            EXPECT_TRUE(found->ft->hasNext(found, nullptr));
            EXPECT_EQ(prepared->ft->flush(prepared).rc, CMPI_RC_OK);
            EXPECT_EQ(broker.books().liveOnThread(self), 0u);
        }
        EXPECT_EQ(broker.books().count(Entry::ContextFlush), 3u);
        EXPECT_EQ(calls().detachThread(handle(), prepared).rc, CMPI_RC_OK);
        EXPECT_EQ(prepared->ft->flush(prepared).rc, CMPI_RC_ERR_INVALID_HANDLE);
    });
    EXPECT_EQ(misuses().size(), 1u);
}
#endif

class FlushFunction : public BrokerThreads {
protected:
    static BrokerOptions exporting() {
        BrokerOptions options;
        options.flush = FlushOffer::OwnFunction;
        return options;
    }
    FlushFunction() : BrokerThreads(exporting()) {}
};

TEST_F(FlushFunction, WorksOnEveryBrokerOfTheThread) {
    Repository secondRepository;
    Broker second(secondRepository, exporting());
    const Broker::CallScope secondCall(second);
    second.makeString("s");
    CMPIString* clone = nullptr;
    {
        CMPIString* string = broker.makeString("s");
        clone = string->ft->clone(string, nullptr);
    }
    const CMPIInstance* elsewhere = nullptr;
    std::atomic<bool> made = false, checked = false;
    std::thread other([&] {
        const Broker::CallScope call(broker);
        elsewhere = broker.makeInstance(drive("1"));
        made = true;
        while (!checked) std::this_thread::yield();
    });
    while (!made) std::this_thread::yield();
    tool_mm_flush();
    EXPECT_EQ(broker.books().live(ObjectKind::String), 1u);
    EXPECT_EQ(second.books().live(ObjectKind::String), 0u);
    EXPECT_EQ(Broker::toInstance(elsewhere), drive("1"));
    EXPECT_STREQ(textOf(clone), "s");
    EXPECT_EQ(broker.books().count(Entry::ContextFlush), 1u);
    EXPECT_TRUE(misuses().empty());
    clone->ft->release(clone);
    checked = true;
    other.join();
}

TEST_F(BrokerThreads, UnattachedThreadIsNoticed) {
    onThread([&] { makers().newString(handle(), "s", nullptr); });
    expectMisuse("not attached");
}

TEST_F(BrokerThreads, ThreadIdsThatReturnAreNotAttached) {
    CMPIContext* prepared = prepare();
    onThread([&] { calls().attachThread(handle(), prepared); });
    onThread([&] { makers().newString(handle(), "s", nullptr); });
    expectMisuse("not attached");
}

TEST_F(BrokerThreads, AnothersContextIsNoticed) {
    const CMPIContext* callers = context();
    CMPIContext* prepared = prepare();
    onThread([&] {
        calls().attachThread(handle(), prepared);
        query(callers);
        calls().detachThread(handle(), prepared);
    });
    expectMisuse("another thread's context");
}

TEST_F(BrokerThreads, PreparedContextIsNotForUseBeforeAttach) {
    query(prepare());
    expectMisuse("no thread has attached with");
}

TEST_F(BrokerThreads, WrongAttachments) {
    EXPECT_EQ(calls().attachThread(handle(), context()).rc, CMPI_RC_ERR_FAILED);
    CMPIContext* prepared = prepare();
    EXPECT_EQ(calls().detachThread(handle(), prepared).rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(calls().attachThread(handle(), prepared).rc, CMPI_RC_OK);
    EXPECT_EQ(calls().attachThread(handle(), prepared).rc, CMPI_RC_ERR_FAILED);
    onThread([&] { EXPECT_EQ(calls().detachThread(handle(), prepared).rc, CMPI_RC_ERR_FAILED); });
    EXPECT_EQ(calls().detachThread(handle(), prepared).rc, CMPI_RC_OK);
    EXPECT_EQ(misuses().size(), 4u);
}

TEST_F(BrokerThreads, ManagerThreadMayAttachInsideItsCall) {
    CMPIContext* prepared = prepare();
    CMPIString* callers = broker.makeString("call");
    EXPECT_EQ(calls().attachThread(handle(), prepared).rc, CMPI_RC_OK);
    CMPIString* own = makers().newString(handle(), "attached", nullptr);
    EXPECT_EQ(calls().detachThread(handle(), prepared).rc, CMPI_RC_OK);
    EXPECT_STREQ(textOf(callers), "call");
    EXPECT_TRUE(misuses().empty());
    EXPECT_EQ(textOf(own), nullptr);
}

TEST_F(BrokerThreads, ReleaseOfAPreparedContextIsNotForTheProvider) {
    CMPIContext* prepared = prepare();
    EXPECT_EQ(prepared->ft->release(prepared).rc, CMPI_RC_ERR_FAILED);
    expectMisuse("not a clone (context)");
}

TEST_F(BrokerThreads, ManyThreadsReadOneObjectAndQuery) {
    CMPIString* shared = broker.makeString("shared");
    const CMPIInstance* instance = broker.makeInstance(drive("1"));
    std::vector<std::thread> threads;
    for (int number = 0; number < 4; ++number) {
        CMPIContext* prepared = prepare();
        threads.emplace_back([&, prepared] {
            calls().attachThread(handle(), prepared);
            for (int round = 0; round < 50; ++round) {
                EXPECT_STREQ(textOf(shared), "shared");
                const CMPIData data = instance->ft->getProperty(instance, "DeviceID", nullptr);
                EXPECT_STREQ(textOf(data.value.string), "1");
                CMPIEnumeration* found = query(prepared);
                CMPIEnumeration* clone = found->ft->clone(found, nullptr);
                broker.flushThread();
                EXPECT_TRUE(clone->ft->hasNext(clone, nullptr));
                clone->ft->release(clone);
            }
            calls().detachThread(handle(), prepared);
        });
    }
    for (std::thread& thread : threads) thread.join();
    EXPECT_TRUE(misuses().empty());
    EXPECT_EQ(broker.books().count(Entry::EnumerateInstances), 200u);
    EXPECT_EQ(broker.books().liveClones(), 0u);
}

/// A slow query on one thread and a quick one on another that starts meanwhile.
class QueryOverlap : public BrokerThreads {
protected:
    static BrokerOptions serial(bool on) {
        BrokerOptions options;
        options.serialQueries = on;
        return options;
    }
    explicit QueryOverlap(bool isSerial = false) : BrokerThreads(serial(isSerial)) {}

    bool quickQueryOvertakesSlowOne() {
        std::atomic<bool> slowStarted = false;
        FaultRule slow;
        slow.entry = Entry::EnumerateInstances;
        slow.times = 1;
        slow.delay = std::chrono::milliseconds(500);
        slow.hook = [&] { slowStarted = true; };
        broker.faults().add(slow);

        CMPIContext* prepared = prepare();
        std::thread other([&] {
            calls().attachThread(handle(), prepared);
            query(prepared);
            calls().detachThread(handle(), prepared);
        });
        while (!slowStarted) std::this_thread::yield();
        // The hook comes shortly before the wait.
        std::this_thread::sleep_for(std::chrono::milliseconds(50));
        const auto start = std::chrono::steady_clock::now();
        calls().enumerateInstanceNames(handle(), context(), classPath("CIM_Drive"), nullptr);
        const bool overtook = std::chrono::steady_clock::now() - start < slow.delay / 2;
        other.join();
        return overtook;
    }
};

class SerialQueryOverlap : public QueryOverlap {
protected:
    SerialQueryOverlap() : QueryOverlap(true) {}
};

TEST_F(QueryOverlap, QuickQueryOvertakes) {
    EXPECT_TRUE(quickQueryOvertakesSlowOne());
}

TEST_F(SerialQueryOverlap, QuickQueryWaits) {
    EXPECT_FALSE(quickQueryOvertakesSlowOne());
}

}  // namespace
}  // namespace testbed
