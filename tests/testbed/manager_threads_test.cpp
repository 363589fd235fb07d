// Each behaviour of a manager alone: how long objects of threads live, and who gives them back.
#include <dlfcn.h>

#include <thread>

#include "exported_flush.h"
#include "manager_fixture.h"

namespace testbed {
namespace {

class ManagerThreads : public ManagerTest {
protected:
    static CMPIContext* prepare(Manager& manager, const CMPIContext* from) {
        return manager.calls().prepareAttachThread(manager.handle(), from);
    }
    /// Runs work(prepared context) on a thread of its own that attaches and does not detach.
    template <class Work>
    static void onAttachedThread(Manager& manager, Work work) {
        CMPIContext* prepared = prepare(manager, manager.context());
        std::thread([&] {
            manager.calls().attachThread(manager.handle(), prepared);
            work(prepared);
        }).join();
    }
    static CMPIString* make(Manager& manager) {
        return manager.makers().newString(manager.handle(), "s", nullptr);
    }
    /// What the calling thread keeps.
    static std::size_t kept(Manager& manager) {
        std::size_t objects = 0;
        for (const Broker::Kept& kept : manager.broker.kept())
            if (kept.thread == std::this_thread::get_id()) objects += kept.objects;
        return objects;
    }
};

TEST_F(ManagerThreads, EndOfANestedAttachment) {
    for (const bool perThread : {false, true}) {
        Manager manager(perThread ? "objects-per-thread" : "host");
        CMPIString* inner = nullptr;
        onAttachedThread(manager, [&](CMPIContext* outer) {
            make(manager);
            CMPIContext* nested = prepare(manager, outer);
            EXPECT_EQ(manager.calls().attachThread(manager.handle(), nested).rc, CMPI_RC_OK);
            inner = make(manager);
            CMPIString* clone = inner->ft->clone(inner, nullptr);
            EXPECT_EQ(kept(manager), 2u);
            EXPECT_EQ(manager.calls().detachThread(manager.handle(), nested).rc, CMPI_RC_OK);
            EXPECT_EQ(kept(manager), perThread ? 2u : 1u);
            EXPECT_EQ(textOf(inner) == nullptr, !perThread);
            EXPECT_STREQ(textOf(clone), "s");
            clone->ft->release(clone);
            // The outer context is the thread's again.
            EXPECT_NE(prepare(manager, outer), nullptr);
            EXPECT_EQ(manager.calls().detachThread(manager.handle(), outer).rc, CMPI_RC_OK);
            EXPECT_EQ(kept(manager), perThread ? 2u : 0u);
        });
        // Use after the scope's end is in the books.
        EXPECT_EQ(manager.misuses().size(), perThread ? 0u : 1u);
        EXPECT_EQ(manager.broker.books().live(ObjectKind::String), 0u);
    }
}

TEST_F(ManagerThreads, FlushOfAThreadThatOwnsItsObjectsReachesAllOfThem) {
    Manager manager("objects-per-thread");
    onAttachedThread(manager, [&](CMPIContext* outer) {
        make(manager);
        CMPIContext* nested = prepare(manager, outer);
        manager.calls().attachThread(manager.handle(), nested);
        make(manager);
        manager.broker.flushThread();
        EXPECT_EQ(kept(manager), 0u);
    });
    // The manager's own thread: another provider's call around this one loses its objects too.
    CMPIString* others = make(manager);
    {
        const Broker::CallScope nestedCall(manager.broker);
        manager.broker.flushThread();
    }
    EXPECT_EQ(textOf(others), nullptr);
    EXPECT_EQ(manager.misuses().size(), 1u);
}

TEST_F(ManagerThreads, AttachingThatDoesNothing) {
    for (const bool nothing : {false, true}) {
        Manager manager(nothing ? "attach-does-nothing" : "host");
        CMPIContext* prepared = prepare(manager, manager.context());
        std::thread([&] {
            make(manager);
            EXPECT_EQ(manager.misuses().size(), nothing ? 0u : 1u);
            manager.calls().attachThread(manager.handle(), prepared);
            make(manager);
            manager.calls().detachThread(manager.handle(), prepared);
            EXPECT_EQ(kept(manager), nothing ? 2u : 0u);
            prepared->ft->getEntryCount(prepared, nullptr);
        }).join();
        // Detaching ends the context, whatever attaching did.
        EXPECT_EQ(manager.misuses().size(), nothing ? 1u : 2u);
    }
}

TEST_F(ManagerThreads, ThreadThatEndsWithObjects) {
    for (const bool flushes : {false, true}) {
        for (const std::string words : {"objects-per-thread", "objects-per-thread,unflushed-end"}) {
            Manager manager(words);
            onAttachedThread(manager, [&](CMPIContext*) {
                make(manager);
                if (flushes) manager.broker.flushThread();
            });
            const bool isDefect = !flushes && words.ends_with("unflushed-end");
            EXPECT_EQ(manager.misuses(),
                      isDefect ? std::vector<std::string>(
                                     {"a thread ends with 1 objects that were not flushed"})
                               : std::vector<std::string>());
            EXPECT_EQ(manager.broker.books().live(ObjectKind::String), 0u);
        }
    }
}

/// The function as a library that is loaded now would bind it.
void (*exportedFlush())() {
    // With RTLD_DEFAULT the module would count as bound and stay.
    void* const process = dlopen(nullptr, RTLD_NOW);
    void* const function = dlsym(process, "tool_mm_flush");
    dlclose(process);
    return reinterpret_cast<void (*)()>(function);
}

TEST_F(ManagerThreads, ExportedFunctionIsThereWhileTheManagerIs) {
    EXPECT_EQ(exportedFlush(), nullptr);
    Manager manager("flush-function");
    {
        const ExportedFlush exported(manager.broker.options());
        ASSERT_NE(exportedFlush(), nullptr);
        onAttachedThread(manager, [&](CMPIContext*) {
            make(manager);
            exportedFlush()();
            EXPECT_EQ(kept(manager), 0u);
        });
    }
    EXPECT_EQ(exportedFlush(), nullptr);
}

TEST_F(ManagerThreads, ManagerWithoutAFlushExportsNone) {
    Manager manager("no-flush");
    const ExportedFlush exported(manager.broker.options());
    EXPECT_EQ(exportedFlush(), nullptr);
}

#if defined(PLEXOR_CONTEXT_FLUSH) && PLEXOR_CONTEXT_FLUSH
TEST_F(ManagerThreads, ContextEntryIsNullWhereTheFlushIsElsewhere) {
    EXPECT_NE(Manager("host").context()->ft->flush, nullptr);
    EXPECT_EQ(Manager("flush-function").context()->ft->flush, nullptr);
    EXPECT_EQ(Manager("no-flush").context()->ft->flush, nullptr);
}
#endif

}  // namespace
}  // namespace testbed
