// A CMPI broker of version 100 over a repository: the tables a provider calls.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <chrono>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "books.h"
#include "broker_options.h"
#include "faults.h"
#include "repository.h"

namespace testbed {

class Arena;

/// One broker. Must outlive the provider that uses it. Thread-safe as a broker has to be.
class Broker {
public:
    explicit Broker(Repository& repository, BrokerOptions options = {});
    ~Broker();
    Broker(const Broker&) = delete;
    Broker& operator=(const Broker&) = delete;

    const CMPIBroker* handle() const;
    Repository& repository() { return repository_; }
    const BrokerOptions& options() const { return options_; }
    Books& books() { return books_; }
    Faults& faults() { return faults_; }

    /// A manager's call into a provider on this thread: gives the context, and ends every object
    /// that is made on this thread meanwhile when it is destroyed. May be nested.
    class CallScope {
    public:
        explicit CallScope(Broker& broker);
        ~CallScope();
        CallScope(const CallScope&) = delete;
        CallScope& operator=(const CallScope&) = delete;
        CMPIContext* context() const { return context_; }

    private:
        Broker& broker_;
        CMPIContext* context_;
        std::shared_ptr<Arena> arena_;
    };

    // Objects for tests and requests; they belong to the innermost scope (or attached thread).
    CMPIObjectPath* makePath(const ObjectPath& path);
    CMPIInstance* makeInstance(const Instance& instance);
    CMPIEnumeration* makeInstanceEnumeration(const std::vector<Instance>& instances);
    CMPIEnumeration* makePathEnumeration(const std::vector<ObjectPath>& paths);
    CMPIString* makeString(const std::string& text);
    /// A string object whose text pointer is NULL.
    CMPIString* makeNullString();

    /// What a result object collected.
    struct Collected {
        std::vector<Instance> instances;
        std::vector<ObjectPath> paths;
        int doneCalls = 0;
    };
    /// A result object that fills `collected`, which must outlive the scope.
    CMPIResult* makeResult(Collected& collected);

    /// Ends everything that the calling thread obtained and did not clone (what flush does).
    void flushThread();
    /// The same for every broker of the process that exports its flush and has objects of the
    /// thread; noted as Entry::ContextFlush.
    static void flushThreadEverywhere();

    /// From now on the manager stops (see WhileStopping), until endStop.
    void beginStop();
    void endStop();

    /// Waits until no prepared context is left, thus no thread of a provider's. False when some are
    /// left after `limit`.
    bool waitUntilUnused(std::chrono::milliseconds limit);

    /// What a manager call, an attachment or a thread of the provider's keeps at this moment.
    struct Kept {
        std::thread::id thread;
        const void* context;  ///< that the thread attached with; NULL for a call or a whole thread
        std::size_t objects;  ///< without contexts and results
    };
    std::vector<Kept> kept();

    static ObjectPath toPath(const CMPIObjectPath* path);
    static Instance toInstance(const CMPIInstance* instance);

private:
    std::function<void(std::size_t)> threadEnd();

    Repository& repository_;
    BrokerOptions options_;
    Books books_;
    Faults faults_;
    struct Tables;
    std::unique_ptr<Tables> tables_;
};

}  // namespace testbed
