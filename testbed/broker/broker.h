// A CMPI broker of version 100 over a repository: the tables a provider calls.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "books.h"
#include "faults.h"
#include "repository.h"

namespace testbed {

/// Behaviours in which real object managers differ.
struct BrokerOptions {
    std::string name = "plexor-testbed";
    /// Instances show every property of their class, absent ones as null with status OK (a live
    /// provider); otherwise absent properties answer status 6 (a static repository).
    bool allProperties = false;
    /// One mutex around all up-calls of the process.
    bool serialQueries = false;
    /// For classes that are known: setProperty is refused for a property that the class lacks (12)
    /// and for another type than the declared one (13); a result does not take a path, or an
    /// instance with a path, that lacks a key or has one of another type (4).
    bool strictProperties = false;
    /// attachThread fails, prepareAttachThread gives NULL, and the like are made with Faults.
};

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
    /// The same for every broker of the process on which the thread is in a call or attached; noted
    /// as Entry::ContextFlush.
    static void flushThreadEverywhere();

    static ObjectPath toPath(const CMPIObjectPath* path);
    static Instance toInstance(const CMPIInstance* instance);

private:
    Repository& repository_;
    BrokerOptions options_;
    Books books_;
    Faults faults_;
    struct Tables;
    std::unique_ptr<Tables> tables_;
};

}  // namespace testbed
