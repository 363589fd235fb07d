#include "broker.h"

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

/// The brokers that exist. Never destroyed, so that no order of destruction matters.
struct Registry {
    std::mutex mutex;
    std::vector<Broker*> brokers;  // guarded by mutex
};

Registry& registry() {
    static auto* const instance = new Registry;
    return *instance;
}

std::vector<NamedValue> callEntries() {
    return {{"CMPIInitNameSpace", CimValue::string("root/cimv2")},
            {"CMPIInvocationFlags", CimValue::uint32(0)}};
}

}  // namespace

struct Broker::Tables {
    BrokerCore core;
    CMPIBrokerFT entries;
    CMPIBroker handle;

    explicit Tables(Broker& broker)
        : core{broker.repository_, broker.options_, broker.books_, broker.faults_, {}, {}, {}},
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
    const std::lock_guard lock(registry().mutex);
    registry().brokers.push_back(this);
}

Broker::~Broker() {
    {
        const std::lock_guard lock(registry().mutex);
        std::erase(registry().brokers, this);
    }
    // Clones stay: a provider that did not release them has leaked them.
    tables_->core.arenas.endAll();
}

const CMPIBroker* Broker::handle() const {
    return &tables_->handle;
}

Broker::CallScope::CallScope(Broker& broker)
    : broker_(broker), arena_(broker.tables_->core.arenas.open(nullptr)) {
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
    const std::shared_ptr<Arena> arena = tables_->core.arenas.current();
    if (arena) arena->flush();
}

void Broker::flushThreadEverywhere() {
    const std::lock_guard lock(registry().mutex);
    for (Broker* broker : registry().brokers) {
        if (!broker->tables_->core.arenas.current()) continue;
        broker->books_.record(describeCall(Entry::ContextFlush));
        broker->flushThread();
    }
}

ObjectPath Broker::toPath(const CMPIObjectPath* path) {
    return readPath(path, Entry::OtherObjectCall).value_or(ObjectPath());
}

Instance Broker::toInstance(const CMPIInstance* instance) {
    const InstanceObject* object = usable(instance, Entry::OtherObjectCall);
    return object ? object->content() : Instance();
}

}  // namespace testbed
