// What differs between object managers, in one place.
#include "PlexorProviderUtilManager.h"

#include "PlexorProviderUtil.h"
#include "PlexorProviderUtilLife.h"

// Exported by one manager for providers whose context table has no flush; does the same for the
// calling thread. Elsewhere the weak reference stays null.
extern "C" void tool_mm_flush(void) __attribute__((weak));

namespace {

#if defined(PLEXOR_CONTEXT_FLUSH) && PLEXOR_CONTEXT_FLUSH

std::atomic<bool> __MissTold = false;
std::atomic<unsigned int> __MissedInLife = 0;  // life whose manager has a null entry

/// The build for a host that has the entry may be loaded by a manager that has not; that is said
/// once.
bool HasFlushEntry(const CMPIContext* ctx) {
    if (ctx->ft->flush != nullptr) return true;
    __MissedInLife = PresentLife();
    if (!__MissTold.exchange(true)) {
        syslog(LOG_ERR,
               "%s: the manager's context table has no flush: this build of the provider is for "
               "another manager\n",
               "PlexorProvider");
    }
    return false;
}

/// True after a flush by the context's own entry.
bool FlushByEntry(CMPIContext* ctx) {
    if (!HasFlushEntry(ctx)) return false;
    ctx->ft->flush(ctx);
    return true;
}

/// Whether this manager is one of those that the standard build is for.
bool IsStandardManager() {
    return __MissedInLife == PresentLife();
}

#else

bool FlushByEntry(CMPIContext*) {
    return false;
}

bool HasFlushEntry(const CMPIContext*) {
    return false;
}

bool IsStandardManager() {
    return true;
}

#endif

/// Whether the property is there without a value. One that the instance does not have at all is not
/// missed: where the manager does not know the class, nobody promises its clients that property.
bool ReadsNull(const CMPIInstance* inst, const char* property) {
    CMPIStatus status = {CMPI_RC_OK, nullptr};
    const CMPIData data = inst->ft->getProperty(inst, property, &status);
    return status.rc == CMPI_RC_OK && (data.state & CMPI_nullValue) != 0 &&
           (data.state & CMPI_notFound) != CMPI_notFound;
}

/// Sets key number `index` where the instance lacks it. False when nothing was to be set.
bool CompleteKey(CMPIInstance* inst, const CMPIObjectPath* path, unsigned int index) {
    CMPIString* name = nullptr;
    CMPIStatus status = {CMPI_RC_OK, nullptr};
    const CMPIData key = path->ft->getKeyAt(path, index, &name, &status);
    const char* property = StringText(name);
    if (status.rc != CMPI_RC_OK || property == nullptr || !ReadsNull(inst, property)) return false;
    const char* text = ValueText(key);
    if (text == nullptr) return false;  // null in the path, too
    // CMPI_chars values are passed as the address of the characters.
    inst->ft->setProperty(inst, property, reinterpret_cast<const CMPIValue*>(text), CMPI_chars);
    return true;
}

}  // namespace

ItemSpan::ItemSpan(CMPIContext* workerContext) : worker_(workerContext) {
    if (worker_ == nullptr || HasFlushEntry(worker_) || tool_mm_flush != nullptr) return;
    const CMPIBroker* broker = CurrentBroker();
    own_ = broker->bft->prepareAttachThread(broker, worker_);
    if (own_ != nullptr) broker->bft->attachThread(broker, own_);
}

void ItemSpan::End() {
    if (own_ != nullptr) {
        const CMPIBroker* broker = CurrentBroker();
        broker->bft->detachThread(broker, own_);
        own_ = nullptr;
        return;
    }
    if (worker_ == nullptr || FlushByEntry(worker_)) return;
    if (tool_mm_flush != nullptr) tool_mm_flush();
}

void FlushFactoryContext(CMPIContext* ctx) {
    if (ctx != nullptr) FlushByEntry(ctx);
}

void EndUnusedContext(CMPIContext* prepared) {
    // The interface ends a prepared context by detaching it, on a thread that was attached with it.
    const CMPIBroker* broker = CurrentBroker();
    broker->bft->attachThread(broker, prepared);
    broker->bft->detachThread(broker, prepared);
}

void CompleteKeys(CMPIInstance* inst, const CMPIObjectPath* path, KeyCopying& copying) {
    if (!IsStandardManager()) return;
    const unsigned int life = PresentLife();
    if (copying.copiedInLife == life) return;
    bool copied = true;
    const unsigned int count = path->ft->getKeyCount(path, nullptr);
    for (unsigned int i = 0; i < count; i++) {
        if (CompleteKey(inst, path, i)) copied = false;
    }
    if (copied) copying.copiedInLife = life;
}

void SetFirstString(CMPIArray* array, const char* text) {
    const CMPIStatus status =
        array->ft->setElementAt(array, 0, reinterpret_cast<const CMPIValue*>(text), CMPI_chars);
    if (status.rc == CMPI_RC_OK || !IsStandardManager()) return;
    const CMPIBroker* broker = CurrentBroker();
    CMPIValue value;
    memset(&value, 0, sizeof value);
    value.string = broker->eft->newString(broker, text, nullptr);
    if (value.string != nullptr) array->ft->setElementAt(array, 0, &value, CMPI_string);
}
