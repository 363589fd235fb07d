// The test bed behind a C interface: broker, simulated array and requests for programs in C.
#include "plexor_desk.h"

#include <cstdio>
#include <exception>
#include <memory>

#include "exported_flush.h"
#include "instance_client.h"
#include "live_array.h"
#include "manager_kinds.h"
#include "scenario_parser.h"

namespace {

using testbed::Broker;
using testbed::BrokerOptions;

BrokerOptions optionsOf(const char* scenario, const char* manager) {
    BrokerOptions options = testbed::readScenario(scenario).manager;
    if (manager != nullptr) testbed::chooseManager(options, manager);
    return options;
}

void copyText(const char* text, char* buffer, size_t size) {
    if (size > 0) snprintf(buffer, size, "%s", text);
}

}  // namespace

struct plexor_desk {
    plexor_desk(const char* scenario, const char* manager)
        : broker(repository, optionsOf(scenario, manager)),
          flush(broker.options()),
          array(broker, scenario) {
        broker.books().keepCalls(false);
    }
    testbed::InstanceClient client(CMPIInstanceMI* mi) { return {broker, mi}; }

    testbed::Repository repository;
    Broker broker;
    testbed::ExportedFlush flush;
    testbed::LiveArray array;
};

struct plexor_desk_call {
    explicit plexor_desk_call(Broker& broker) : scope(broker) {}
    Broker::CallScope scope;
};

plexor_desk* plexor_desk_open(const char* scenario, const char* manager, char* error,
                              size_t error_size) {
    try {
        return new plexor_desk(scenario, manager);
    } catch (const std::exception& failure) {
        copyText(failure.what(), error, error_size);
        return nullptr;
    }
}

void plexor_desk_close(plexor_desk* desk) {
    delete desk;
}

const CMPIBroker* plexor_desk_broker(plexor_desk* desk) {
    return desk->broker.handle();
}

plexor_desk_call* plexor_desk_begin_call(plexor_desk* desk) {
    return new plexor_desk_call(desk->broker);
}

const CMPIContext* plexor_desk_context(plexor_desk_call* call) {
    return call->scope.context();
}

void plexor_desk_end_call(plexor_desk_call* call) {
    delete call;
}

long plexor_desk_enumerate(plexor_desk* desk, CMPIInstanceMI* mi, const char* class_name) {
    const testbed::Response response = desk->client(mi).enumerateInstances(class_name);
    if (response.rc != CMPI_RC_OK) return -static_cast<long>(response.rc);
    return static_cast<long>(response.instances.size());
}

int plexor_desk_get(plexor_desk* desk, CMPIInstanceMI* mi, const char* class_name, size_t index) {
    const testbed::Response names = desk->client(mi).enumerateInstanceNames(class_name);
    if (names.rc != CMPI_RC_OK) return names.rc;
    if (index >= names.paths.size()) return CMPI_RC_ERR_NOT_FOUND;
    return desk->client(mi).getInstance(names.paths[index]).rc;
}

int plexor_desk_cleanup(plexor_desk* desk, CMPIInstanceMI* mi, int terminating) {
    if (terminating != 0) desk->broker.beginStop();
    const CMPIrc rc = desk->client(mi).cleanup(terminating != 0);
    if (terminating != 0) desk->broker.endStop();
    return rc;
}

int plexor_desk_command(plexor_desk* desk, const char* command, char* error, size_t error_size) {
    try {
        desk->array.apply(command);
        return 0;
    } catch (const std::exception& failure) {
        copyText(failure.what(), error, error_size);
        return -1;
    }
}

plexor_desk_books plexor_desk_totals(plexor_desk* desk) {
    const testbed::Books& books = desk->broker.books();
    return {books.live(), books.liveClones(), books.misuses().size()};
}

int plexor_desk_defect(plexor_desk* desk, size_t index, char* text, size_t text_size) {
    const auto defects = desk->broker.books().misuses();
    if (index >= defects.size()) return -1;
    copyText(defects[index].c_str(), text, text_size);
    return 0;
}
