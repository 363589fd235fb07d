// What the entries of all tables of one broker share.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <atomic>
#include <mutex>

#include "arena.h"
#include "books.h"
#include "broker.h"
#include "faults.h"
#include "repository.h"
#include "result_order.h"
#include "stop_gate.h"

namespace testbed {

/// Everything that an entry needs of its broker. Lives as long as the Broker; the `hdl` of the
/// broker's handle points to it.
struct BrokerCore {
    Repository& repository;
    const BrokerOptions& options;
    Books& books;
    Faults& faults;
    ThreadArenas arenas;
    Quarantine quarantine;
    std::mutex queryMutex;  ///< held by each query when options.serialQueries
    ResultOrder order{options.orderSeed};
    StopGate stopGate{};
    std::atomic<int> preparedContexts = 0;  ///< alive

    /// Whether entries of objects have to be described to books and faults.
    bool watchesObjectCalls() const {
        return books.recordsObjectCalls() || faults.hasObjectRules();
    }
};

}  // namespace testbed
