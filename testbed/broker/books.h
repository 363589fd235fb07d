// The broker's books: every call that the provider makes, every object it holds, every misuse.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <atomic>
#include <cstddef>
#include <map>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <unordered_map>
#include <vector>

namespace testbed {

/// Every entry of the broker's and the objects' tables that can be counted or made to fail.
enum class Entry {
    PrepareAttachThread,
    AttachThread,
    DetachThread,
    EnumerateInstanceNames,
    EnumerateInstances,
    GetInstance,
    Associators,
    AssociatorNames,
    References,
    ReferenceNames,
    ClassPathIsA,
    NewInstance,
    NewObjectPath,
    NewString,
    NewArray,
    BrokerToString,
    BrokerTypeTest,  ///< isOfType and getType
    Unsupported,     ///< any broker entry that answers "not supported"
    ContextFlush,
    ResultReturnInstance,
    ResultReturnObjectPath,
    ResultReturnDone,
    StringGetCharPtr,
    ArrayGetSize,
    ArrayGetElementAt,
    ArraySetElementAt,
    EnumerationHasNext,
    EnumerationGetNext,
    EnumerationToArray,
    InstanceGetProperty,
    InstanceSetProperty,
    InstanceGetObjectPath,
    InstanceSetPropertyFilter,
    PathAddKey,
    PathGetKey,
    PathGetClassName,
    PathGetNameSpace,
    PathToString,
    Clone,
    Release,
    OtherObjectCall,  ///< entries of objects that have no name of their own here
};

const char* entryName(Entry entry);

/// True for the calls that leave the provider for the vendor: enumerate, get, associators,
/// references.
bool isQuery(Entry entry);

/// True for the entries of result, string, array, enumeration, instance and path, and for clone and
/// release of every object.
bool isObjectEntry(Entry entry);

/// One call, in the order in which the calls began.
struct CallRecord {
    Entry entry;
    std::string path;       ///< text of the path it was made on, "" without one
    std::string className;  ///< class of that path
    std::optional<std::string> assocClass;
    std::optional<std::string> resultClass;
    std::optional<std::string> role;
    std::optional<std::string> resultRole;
    std::optional<std::string> name;  ///< property, key or class name argument
    const void* context = nullptr;    ///< address of the context it was made with; may have ended
    bool hasPropertyList = false;
    std::thread::id thread;
    CMPIrc rc = CMPI_RC_OK;
};

enum class ObjectKind { Context, Result, String, Array, Enumeration, Instance, Path };

const char* kindName(ObjectKind kind);

/// Thread-safe. Object entries (see isObjectEntry) are only recorded when `recordObjectCalls` is
/// on; broker entries are always recorded.
class Books {
public:
    void recordObjectCalls(bool on);
    bool recordsObjectCalls() const { return recordObjectCalls_; }
    std::size_t record(CallRecord record);  ///< returns its index, for setRc
    void setRc(std::size_t index, CMPIrc rc);

    std::vector<CallRecord> calls() const;
    /// Only the queries (see isQuery), in order.
    std::vector<CallRecord> queries() const;
    std::size_t count(Entry entry) const;
    void clearCalls();
    /// Off: calls are only counted, not kept (for long runs).
    void keepCalls(bool on);

    void objectMade(const void* object, ObjectKind kind, bool isClone);
    /// False when the object is not alive: the misuse is recorded under `what`.
    bool objectUsed(const void* object, const char* what);
    void objectEnded(const void* object);
    /// Nothing when no object of that address is alive.
    std::optional<ObjectKind> kindOf(const void* object) const;

    /// Objects alive: all, of one kind, those that are clones, those made on one thread.
    std::size_t live() const;
    std::size_t live(ObjectKind kind) const;
    std::size_t liveClones() const;
    std::size_t liveOnThread(std::thread::id thread) const;

    void misuse(std::string what);
    /// Use after end, double release, release of what is not a clone, use on a wrong thread, …
    std::vector<std::string> misuses() const;

private:
    struct LiveObject {
        ObjectKind kind;
        bool isClone;
        std::thread::id thread;
    };

    template <class Condition>
    std::size_t countLive(Condition condition) const;

    std::atomic<bool> recordObjectCalls_ = false;
    mutable std::mutex mutex_;
    bool keepCalls_ = true;       // this and all below guarded by mutex_
    std::size_t firstIndex_ = 0;  // index of calls_.front(): grows when calls are cleared
    std::vector<CallRecord> calls_;
    std::map<Entry, std::size_t> counts_;
    std::unordered_map<const void*, LiveObject> live_;
    std::vector<std::string> misuses_;
};

}  // namespace testbed
