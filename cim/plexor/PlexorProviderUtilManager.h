// Everything that is done because object managers differ. The rest of the provider does not know
// managers. Each adaptation acts on what the manager at hand shows, and costs one that behaves like
// the provider's own host nothing.
#pragma once

#include <atomic>

#include "PlexorProvider.h"

/// The span of one work item on a worker's thread. What the item obtains from the broker is given
/// back when the span ends:
///   - by the entry `flush` of the context table, where the build and the manager have it;
///   - by the manager's own flush function, where it exports one;
///   - everywhere else by detaching a context that was attached for this item alone. Managers of
///     that kind keep a thread's objects until its context is detached, which for a worker is
///     never.
class ItemSpan {
public:
    explicit ItemSpan(CMPIContext* workerContext);
    ItemSpan(const ItemSpan&) = delete;
    ItemSpan& operator=(const ItemSpan&) = delete;

    /// The context that the item uses.
    CMPIContext* Context() const { return own_ != nullptr ? own_ : worker_; }
    /// Gives everything back but clones. Not left to a destructor: the manager may cancel the
    /// thread in here.
    void End();

private:
    CMPIContext* worker_;
    CMPIContext* own_ = nullptr;
};

/// Gives back what the factory obtained on its attached context, where the context table has
/// `flush`. The thread is the manager's: its own flush function would take what others hold there.
void FlushFactoryContext(CMPIContext* ctx);

/// Ends a context that was prepared for a thread which could not be started.
void EndUnusedContext(CMPIContext* prepared);

/// What the instances of one class have shown about the manager's `newInstance`.
struct KeyCopying {
    std::atomic<unsigned int> copiedInLife = 0;  ///< life in which it was seen to copy the keys
};

/// Sets the instance's key properties from its path, on managers whose `newInstance` left them
/// null. A manager that was seen to copy the keys of the class is not asked again.
void CompleteKeys(CMPIInstance* inst, const CMPIObjectPath* path, KeyCopying& copying);

/// Sets element 0 of an array made for strings. Some managers refuse characters there and take a
/// string object only.
void SetFirstString(CMPIArray* array, const char* text);
