// The common part of every encapsulated object: who made it, whether it still lives, what hangs on
// it.
#pragma once

#include <atomic>
#include <memory>
#include <mutex>
#include <utility>

#include "arena.h"
#include "books.h"
#include "broker_core.h"

namespace testbed {

/// An object is a shell with a payload. At its end the payload goes, the shell stays for a while
/// (see Quarantine), so that a late use finds out that it is late.
class Object : public std::enable_shared_from_this<Object> {
public:
    Object(BrokerCore& core, ObjectKind kind) : core_(core), kind_(kind) {}
    virtual ~Object() = default;
    Object(const Object&) = delete;
    Object& operator=(const Object&) = delete;

    BrokerCore& core() const { return core_; }
    ObjectKind kind() const { return kind_; }
    bool isAlive() const { return alive_.load(std::memory_order_acquire); }
    bool isClone() const { return isClone_; }
    /// What the provider has of it: the address of its CMPI structure.
    virtual const void* handle() const = 0;
    /// Path, class and the like for the books; only called on living objects.
    virtual void describe(CallRecord&) const {}

    /// False for an ended object; notes the misuse by `entry`.
    bool checkAlive(Entry entry) const;
    /// Ends the object and all its parts. Does nothing the second time.
    void end();
    /// From now on `part` ends when this object ends, if not before.
    void addPart(std::shared_ptr<Object> part) const;

    /// Enters the new object into the books. A clone holds itself until it is released.
    void begin(bool asClone);

protected:
    /// Drops the payload. Only the shell is used afterwards.
    virtual void drop() = 0;

private:
    BrokerCore& core_;
    const ObjectKind kind_;
    std::atomic<bool> alive_ = true;
    bool isClone_ = false;
    std::shared_ptr<Object> self_;  // set in clones, which belong to nobody
    mutable std::mutex partsMutex_;
    mutable ObjectList parts_;  // guarded by partsMutex_
};

/// A new object that the calling thread's innermost scope owns.
template <class Type, class... Arguments>
Type& makeInArena(BrokerCore& core, Arguments&&... arguments) {
    auto object = std::make_shared<Type>(core, std::forward<Arguments>(arguments)...);
    object->begin(false);
    const std::shared_ptr<Arena> arena = core.arenas.current();
    (arena ? *arena : core.arenas.outside()).add(object);
    return *object;
}

/// A new object inside another one, ending with it.
template <class Type, class... Arguments>
std::shared_ptr<Type> makePart(const Object& whole, Arguments&&... arguments) {
    auto object = std::make_shared<Type>(whole.core(), std::forward<Arguments>(arguments)...);
    object->begin(false);
    whole.addPart(object);
    return object;
}

/// A new object read out of another one. It ends with that one or with the calling thread's scope,
/// whichever comes first: a provider may rely on neither.
template <class Type, class... Arguments>
Type& makeDerived(const Object& source, Arguments&&... arguments) {
    Type& object = makeInArena<Type>(source.core(), std::forward<Arguments>(arguments)...);
    source.addPart(object.shared_from_this());
    return object;
}

}  // namespace testbed
