// How the entries of the objects' tables are answered, and clone and release for every kind.
#pragma once

#include <memory>
#include <utility>

#include "call.h"
#include "object.h"

namespace testbed {

/// The class behind a CMPI structure; every object_*.h names its own.
template <class Handle>
struct ObjectOf;

/// The object behind a handle; the object may have ended, the handle must not be NULL.
template <class Handle>
typename ObjectOf<Handle>::Type& objectOf(const Handle* handle) {
    return static_cast<typename ObjectOf<Handle>::Type&>(*const_cast<Handle*>(handle));
}

/// The same, but NULL for NULL and for an ended object, which is noted as a misuse by `entry`.
template <class Handle>
typename ObjectOf<Handle>::Type* usable(const Handle* handle, Entry entry) {
    if (handle == nullptr) return nullptr;
    auto& object = objectOf(handle);
    return object.checkAlive(entry) ? &object : nullptr;
}

/// Answers one entry of an object's table with `truth(object, outcome)`. `name` is the property or
/// key that it is about, or NULL.
template <class Result, class Handle, class Truth>
Result answerOn(const Handle* handle, Entry entry, const char* name, CMPIStatus* status,
                Truth&& truth) {
    auto* object = usable(handle, entry);
    if (object == nullptr) return refuse<Result>(status, CMPI_RC_ERR_INVALID_HANDLE);
    if (isObjectEntry(entry) && !object->core().watchesObjectCalls()) {
        CMPIStatus outcome = statusOk;
        Result result = truth(*object, outcome);
        tellOutcome(object->core(), status, outcome);
        return result;
    }
    CallRecord record;
    record.entry = entry;
    record.thread = std::this_thread::get_id();
    if (name != nullptr) record.name = name;
    object->describe(record);
    return answer<Result>(object->core(), std::move(record), status,
                          [&](CMPIStatus& outcome) { return truth(*object, outcome); });
}

/// The same for entries whose result is their status; `truth(object)` gives its code.
template <class Handle, class Truth>
CMPIStatus statusOn(const Handle* handle, Entry entry, const char* name, Truth&& truth) {
    CMPIStatus status = statusOk;
    answerOn<Nothing>(handle, entry, name, &status, [&](auto& object, CMPIStatus& outcome) {
        outcome.rc = truth(object);
        return Nothing{};
    });
    return status;
}

/// The `clone` entry of every object that has a copy().
template <class Handle>
Handle* cloneEntry(const Handle* handle, CMPIStatus* status) {
    return answerOn<Handle*>(handle, Entry::Clone, nullptr, status,
                             [](auto& object, CMPIStatus&) -> Handle* {
                                 auto copy = object.copy();
                                 copy->begin(true);
                                 return copy.get();
                             });
}

/// The `release` entry of every object.
template <class Handle>
CMPIStatus releaseEntry(Handle* handle) {
    return statusOn(handle, Entry::Release, nullptr, [](auto& object) {
        if (!object.isClone()) {
            object.core().books.misuse(std::string("release of what is not a clone (") +
                                       kindName(object.kind()) + ")");
            return CMPI_RC_ERR_FAILED;
        }
        object.end();
        return CMPI_RC_OK;
    });
}

}  // namespace testbed
