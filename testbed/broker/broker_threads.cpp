// Preparing a context for a thread of the provider's, attaching it and detaching it.
#include "broker_calls.h"
#include "broker_tables.h"
#include "object_context.h"

namespace testbed {

namespace {

CMPIContext* prepareAttachThread(const CMPIBroker* broker, const CMPIContext* ctx) {
    return answerUpCall<CMPIContext*>(broker, ctx, describeCall(Entry::PrepareAttachThread),
                                      nullptr, [&](BrokerCore& core, CMPIStatus&) -> CMPIContext* {
                                          std::vector<NamedValue> entries;
                                          if (ctx != nullptr) entries = objectOf(ctx).entries();
                                          // It belongs to a thread that does not exist yet, so no
                                          // thread's arena may own it.
                                          auto context = std::make_shared<ContextObject>(
                                              core, std::move(entries));
                                          context->setUser(0);
                                          context->setPrepared();
                                          context->begin(false);
                                          core.arenas.outside().add(context);
                                          return context.get();
                                      });
}

CMPIrc attach(BrokerCore& core, const CMPIContext* ctx) {
    ContextObject* context = usable(ctx, Entry::AttachThread);
    if (context == nullptr) return CMPI_RC_ERR_INVALID_HANDLE;
    if (!context->isPrepared()) {
        core.books.misuse("attachThread with a context that was not prepared");
        return CMPI_RC_ERR_FAILED;
    }
    if (core.options.attachDoesNothing) return CMPI_RC_OK;
    if (context->user() != 0) {
        core.books.misuse("attachThread with a context that is attached already");
        return CMPI_RC_ERR_FAILED;
    }
    context->setUser(threadNumber());
    core.arenas.open(Span::Attachment, context);
    return CMPI_RC_OK;
}

CMPIrc detach(BrokerCore& core, const CMPIContext* ctx) {
    ContextObject* context = usable(ctx, Entry::DetachThread);
    if (context == nullptr) return CMPI_RC_ERR_INVALID_HANDLE;
    if (core.options.attachDoesNothing) {
        context->end();
        return CMPI_RC_OK;
    }
    const std::shared_ptr<Arena> arena = core.arenas.attachedWith(context);
    if (!arena) {
        core.books.misuse("detachThread with a context that this thread is not attached with");
        return CMPI_RC_ERR_FAILED;
    }
    core.arenas.close(arena);
    arena->endAll();
    context->end();
    return CMPI_RC_OK;
}

template <Entry entry, CMPIrc (*truth)(BrokerCore&, const CMPIContext*)>
CMPIStatus attachment(const CMPIBroker* broker, const CMPIContext* ctx) {
    CMPIStatus status = statusOk;
    CallRecord record = describeCall(entry);
    record.context = ctx;
    answer<Nothing>(coreOf(broker), std::move(record), &status, [&](CMPIStatus& outcome) {
        outcome.rc = truth(coreOf(broker), ctx);
        return Nothing{};
    });
    return status;
}

}  // namespace

void fillThreadEntries(CMPIBrokerFT& table) {
    table.prepareAttachThread = prepareAttachThread;
    table.attachThread = attachment<Entry::AttachThread, attach>;
    table.detachThread = attachment<Entry::DetachThread, detach>;
}

}  // namespace testbed
