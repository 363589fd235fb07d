// The provider's queue, worked off on the calling thread: what the workers would do, without them.
#pragma once

#include "PlexorProvider.h"
#include "broker.h"

namespace plexortest {

/// Calls an item's function as it is.
inline void runItem(CMPIContext* ctx, Thread_Args_t* item) {
    item->Func(ctx, item);
}

/// Runs what is queued, and what that queues, until nothing is left; each item in a manager call of
/// its own. The number of items. Within the sleep of an item it plays the other worker.
template <class Run = decltype(&runItem)>
int playQueue(testbed::Broker& broker, Run run = runItem) {
    int items = 0;
    while (auto* item = static_cast<Thread_Args_t*>(GetItem(&__FIFO))) {
        const testbed::Broker::CallScope scope(broker);
        items++;
        run(scope.context(), item);
    }
    return items;
}

}  // namespace plexortest
