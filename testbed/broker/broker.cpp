// Putting a broker together: its tables, the scope of a call, objects for clients, start and stop.
#include "broker.h"

#include <utility>
#include <vector>

#include "broker_calls.h"
#include "broker_core.h"
#include "broker_tables.h"
#include "object_context.h"
#include "object_enumeration.h"
#include "object_instance.h"
#include "object_path.h"
#include "object_result.h"
#include "object_string.h"

namespace testbed {

namespace {

std::vector<NamedValue> callEntries() {
    return {{"CMPIInitNameSpace", CimValue::string("root/cimv2")},
            {"CMPIInvocationFlags", CimValue::uint32(0)}};
}

}  // namespace

struct Broker::Tables {
    BrokerCore core;
    CMPIBrokerFT entries;
    CMPIBroker handle;
    Tables* next = nullptr;  ///< in the list of brokers

    // The brokers that exist, in words that need no destruction: a module with them leaves nothing.
    static constinit inline std::mutex listMutex;
    static constinit inline Tables* first = nullptr;  // guarded by listMutex, like next

    explicit Tables(Broker& broker)
        : core{broker.repository_,
               broker.options_,
               broker.books_,
               broker.faults_,
               {broker.options_.keepsPerThread(), broker.threadEnd()},
               {},
               {}},
          entries(),
          handle{&core, &entries, &factoryTable, &systemTable} {
        entries.brokerCapabilities = CMPI_MB_BasicRead | CMPI_MB_AssociationTraversal;
        entries.brokerVersion = CMPI_VERSION;
        entries.brokerName = broker.options_.name.c_str();
        fillThreadEntries(entries);
        fillQueryEntries(entries);
        fillUnsupportedEntries(entries);
    }
};

Broker::Broker(Repository& repository, BrokerOptions options)
    : repository_(repository),
      options_(std::move(options)),
      tables_(std::make_unique<Tables>(*this)) {
    const std::lock_guard lock(Tables::listMutex);
    tables_->next = std::exchange(Tables::first, tables_.get());
}

Broker::~Broker() {
    {
        const std::lock_guard lock(Tables::listMutex);
        Tables** link = &Tables::first;
        while (*link != tables_.get()) link = &(*link)->next;
        *link = tables_->next;
    }
    // Clones stay: a provider that did not release them has leaked them.
    tables_->core.arenas.endAll();
}

const CMPIBroker* Broker::handle() const {
    return &tables_->handle;
}

Broker::CallScope::CallScope(Broker& broker)
    : broker_(broker), arena_(broker.tables_->core.arenas.open(Span::Call)) {
    context_ = &makeInArena<ContextObject>(broker.tables_->core, callEntries());
}

Broker::CallScope::~CallScope() {
    broker_.tables_->core.arenas.close(arena_);
    arena_->endAll();
}

CMPIObjectPath* Broker::makePath(const ObjectPath& path) {
    return &makeInArena<PathObject>(tables_->core, path);
}

CMPIInstance* Broker::makeInstance(const Instance& instance) {
    return &makeInArena<InstanceObject>(tables_->core, instance);
}

CMPIEnumeration* Broker::makeInstanceEnumeration(const std::vector<Instance>& instances) {
    auto& enumeration = makeInArena<EnumerationObject>(tables_->core, CMPIType{CMPI_instance});
    enumeration.fill(instances);
    return &enumeration;
}

CMPIEnumeration* Broker::makePathEnumeration(const std::vector<ObjectPath>& paths) {
    auto& enumeration = makeInArena<EnumerationObject>(tables_->core, CMPIType{CMPI_ref});
    enumeration.fill(paths);
    return &enumeration;
}

CMPIString* Broker::makeString(const std::string& text) {
    return &makeInArena<StringObject>(tables_->core, text);
}

CMPIString* Broker::makeNullString() {
    return &makeInArena<StringObject>(tables_->core, std::nullopt);
}

CMPIResult* Broker::makeResult(Collected& collected) {
    return &makeInArena<ResultObject>(tables_->core, collected);
}

void Broker::flushThread() {
    tables_->core.arenas.flush();
}

void Broker::flushThreadEverywhere() {
    const std::lock_guard lock(Tables::listMutex);
    for (Tables* tables = Tables::first; tables != nullptr; tables = tables->next) {
        if (!tables->core.options.exportsFlush()) continue;
        if (!tables->core.arenas.flush()) continue;
        tables->core.books.record(describeCall(Entry::ContextFlush));
    }
}

ThreadArenas::ThreadEnd Broker::threadEnd() {
    if (!options_.keepsPerThread() && !options_.unflushedEndIsMisuse) return {};
    return [this](std::size_t objects) {
        if (objects == 0 || !options_.unflushedEndIsMisuse) return;
        books_.misuse("a thread ends with " + std::to_string(objects) +
                      " objects that were not flushed");
    };
}

void Broker::beginStop() {
    tables_->core.stopGate.close();
}

void Broker::endStop() {
    tables_->core.stopGate.open();
}

bool Broker::waitUntilUnused(std::chrono::milliseconds limit) {
    const auto deadline = std::chrono::steady_clock::now() + limit;
    while (tables_->core.preparedContexts != 0) {
        if (std::chrono::steady_clock::now() >= deadline) return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    return true;
}

std::vector<Broker::Kept> Broker::kept() {
    std::vector<Kept> list;
    for (const std::shared_ptr<Arena>& arena : tables_->core.arenas.all()) {
        list.push_back({arena->threadId(), arena->context(), arena->count()});
    }
    return list;
}

ObjectPath Broker::toPath(const CMPIObjectPath* path) {
    return readPath(path, Entry::OtherObjectCall).value_or(ObjectPath());
}

Instance Broker::toInstance(const CMPIInstance* instance) {
    const InstanceObject* object = usable(instance, Entry::OtherObjectCall);
    return object ? object->content() : Instance();
}

}  // namespace testbed
