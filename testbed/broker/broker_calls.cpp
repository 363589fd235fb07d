// Admitting an up-call by its thread and context, and the call's entry in the books.
#include "broker_calls.h"

#include <string>

#include "object_context.h"
#include "object_path.h"

namespace testbed {

namespace {

void noteMisuse(BrokerCore& core, const char* what, Entry entry) {
    core.books.misuse(std::string(what) + ": " + entryName(entry));
}

}  // namespace

void admitUpCall(BrokerCore& core, Entry entry) {
    if (core.options.attachDoesNothing || core.arenas.isEntered()) return;
    noteMisuse(core, "up-call on a thread that is not attached and not in a manager call", entry);
}

bool admitUpCall(BrokerCore& core, const CMPIContext* ctx, Entry entry) {
    admitUpCall(core, entry);
    if (ctx == nullptr) {
        noteMisuse(core, "up-call without a context", entry);
        return true;
    }
    const ContextObject* context = usable(ctx, entry);
    if (context == nullptr) return false;
    if (core.options.attachDoesNothing) return true;
    if (context->user() == 0) {
        noteMisuse(core, "up-call with a context that no thread has attached with", entry);
    } else if (context->user() != threadNumber()) {
        noteMisuse(core, "up-call with another thread's context", entry);
    }
    return true;
}

std::optional<ObjectPath> readPath(const CMPIObjectPath* path, Entry entry) {
    const PathObject* object = usable(path, entry);
    return object ? std::optional(object->content()) : std::nullopt;
}

CallRecord describeCall(Entry entry, const std::optional<ObjectPath>& path) {
    CallRecord record;
    record.entry = entry;
    record.thread = std::this_thread::get_id();
    if (path) {
        record.path = path->text();
        record.className = path->className;
    }
    return record;
}

}  // namespace testbed
