// Begin, end and late use of an object, and the parts that end with it.
#include "object.h"

#include <algorithm>
#include <string>

namespace testbed {

bool Object::checkAlive(Entry entry) const {
    if (isAlive()) return true;
    const std::string what = std::string(entryName(entry)) + " (" + kindName(kind_) + ")";
    core_.books.objectUsed(handle(), what.c_str());
    return false;
}

void Object::begin(bool asClone) {
    isClone_ = asClone;
    if (asClone) self_ = shared_from_this();
    core_.books.objectMade(handle(), kind_, asClone);
}

void Object::end() {
    if (!alive_.exchange(false, std::memory_order_acq_rel)) return;
    const std::shared_ptr<Object> keep = shared_from_this();
    std::vector<std::shared_ptr<Object>> parts;
    {
        const std::lock_guard lock(partsMutex_);
        parts = parts_.take();
    }
    std::for_each(parts.rbegin(), parts.rend(), [](const auto& part) { part->end(); });
    core_.books.objectEnded(handle());
    drop();
    core_.quarantine.add(keep);
    self_.reset();
}

void Object::addPart(std::shared_ptr<Object> part) const {
    const std::lock_guard lock(partsMutex_);
    parts_.add(std::move(part));
}

}  // namespace testbed
