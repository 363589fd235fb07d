// The two function tables of contexts, with and without a flush, and their entries.
#include "object_context.h"

#include <algorithm>

#include "broker_calls.h"
#include "conversions.h"
#include "object_string.h"

namespace testbed {

namespace {

CMPIData getEntry(const CMPIContext* ctx, const char* name, CMPIStatus* status) {
    return answerOn<CMPIData>(ctx, Entry::OtherObjectCall, name, status,
                              [&](ContextObject& object, CMPIStatus& outcome) {
                                  for (const auto& [entryKey, value] : object.entries()) {
                                      if (name && entryKey == name) return toData(object, value);
                                  }
                                  outcome.rc = CMPI_RC_ERR_NOT_FOUND;
                                  return dataWithout(CMPI_notFound);
                              });
}

CMPIData getEntryAt(const CMPIContext* ctx, CMPICount index, CMPIString** name,
                    CMPIStatus* status) {
    return answerOn<CMPIData>(ctx, Entry::OtherObjectCall, nullptr, status,
                              [&](ContextObject& object, CMPIStatus& outcome) {
                                  const std::vector<NamedValue> entries = object.entries();
                                  if (index >= entries.size()) {
                                      outcome.rc = CMPI_RC_ERR_NOT_FOUND;
                                      return dataWithout(CMPI_notFound);
                                  }
                                  if (name != nullptr) {
                                      *name = derivedString(object, entries[index].first);
                                  }
                                  return toData(object, entries[index].second);
                              });
}

CMPICount getEntryCount(const CMPIContext* ctx, CMPIStatus* status) {
    return answerOn<CMPICount>(ctx, Entry::OtherObjectCall, nullptr, status,
                               [](ContextObject& object, CMPIStatus&) {
                                   return static_cast<CMPICount>(object.entries().size());
                               });
}

CMPIStatus addEntry(const CMPIContext* ctx, const char* name, const CMPIValue* value,
                    CMPIType type) {
    return statusOn(ctx, Entry::OtherObjectCall, name, [&](ContextObject& object) {
        if (name == nullptr) return CMPI_RC_ERR_INVALID_PARAMETER;
        CimValue entry;
        const CMPIrc rc = readValue(value, type, entry);
        if (rc == CMPI_RC_OK) object.setEntry(name, std::move(entry));
        return rc;
    });
}

#if defined(PLEXOR_CONTEXT_FLUSH) && PLEXOR_CONTEXT_FLUSH
CMPIStatus flush(const CMPIContext* ctx) {
    return statusOn(ctx, Entry::ContextFlush, nullptr, [&](ContextObject& object) {
        if (!admitUpCall(object.core(), ctx, Entry::ContextFlush)) {
            return CMPI_RC_ERR_INVALID_HANDLE;
        }
        object.core().arenas.flush();
        return CMPI_RC_OK;
    });
}
#endif

constexpr CMPIContextFT makeTable([[maybe_unused]] bool withFlush) {
    return {
        .ftVersion = CMPI_VERSION, .release = releaseEntry<CMPIContext>,
        .clone = cloneEntry<CMPIContext>, .getEntry = getEntry, .getEntryAt = getEntryAt,
        .getEntryCount = getEntryCount, .addEntry = addEntry,
#if defined(PLEXOR_CONTEXT_FLUSH) && PLEXOR_CONTEXT_FLUSH
        .flush = withFlush ? flush : nullptr,
#endif
    };
}

constexpr CMPIContextFT tableWithFlush = makeTable(true);
constexpr CMPIContextFT tableWithoutFlush = makeTable(false);

const CMPIContextFT* tableFor(const BrokerCore& core) {
    return core.options.hasContextFlush() ? &tableWithFlush : &tableWithoutFlush;
}

}  // namespace

ContextObject::ContextObject(BrokerCore& brokerCore, std::vector<NamedValue> entries)
    : Object(brokerCore, ObjectKind::Context),
      CMPIContext{nullptr, tableFor(brokerCore)},
      user_(threadNumber()),
      entries_(std::move(entries)) {
    hdl = this;
}

std::shared_ptr<ContextObject> ContextObject::copy() const {
    return std::make_shared<ContextObject>(core(), entries());
}

std::vector<NamedValue> ContextObject::entries() const {
    const std::lock_guard lock(mutex_);
    return entries_;
}

void ContextObject::setEntry(const char* name, CimValue value) {
    const std::lock_guard lock(mutex_);
    const auto found = std::find_if(entries_.begin(), entries_.end(),
                                    [&](const NamedValue& entry) { return entry.first == name; });
    if (found != entries_.end()) {
        found->second = std::move(value);
    } else {
        entries_.emplace_back(name, std::move(value));
    }
}

void ContextObject::setPrepared() {
    isPrepared_ = true;
    ++core().preparedContexts;
}

void ContextObject::drop() {
    if (isPrepared_) --core().preparedContexts;
    const std::lock_guard lock(mutex_);
    entries_.clear();
}

}  // namespace testbed
