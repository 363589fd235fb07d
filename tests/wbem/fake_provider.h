// A provider that answers what a test wants and notes what it was asked.
#pragma once

#include <cmpift.h>

#include <functional>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

#include "broker.h"
#include "instance_client.h"

namespace testbed {

class FakeProvider {
public:
    explicit FakeProvider(Broker& broker);
    FakeProvider(const FakeProvider&) = delete;
    FakeProvider& operator=(const FakeProvider&) = delete;

    InstanceClient client() { return InstanceClient(broker_, &mi_); }

    // What it answers, whatever the class. To be set before it is asked.
    std::vector<Instance> instances;
    CMPIrc rc = CMPI_RC_OK;
    std::string message;
    std::function<void()> hook;  ///< run by each request, on its thread

    struct Question {
        ObjectPath path;
        PropertyList properties;
    };
    std::vector<Question> questions() const;

private:
    static CMPIStatus names(CMPIInstanceMI*, const CMPIContext*, const CMPIResult*,
                            const CMPIObjectPath*);
    static CMPIStatus enumerate(CMPIInstanceMI*, const CMPIContext*, const CMPIResult*,
                                const CMPIObjectPath*, const char**);
    static CMPIStatus get(CMPIInstanceMI*, const CMPIContext*, const CMPIResult*,
                          const CMPIObjectPath*, const char**);
    static FakeProvider& of(CMPIInstanceMI* mi) {
        return *const_cast<FakeProvider*>(static_cast<const FakeProvider*>(mi->hdl));
    }
    void note(const CMPIObjectPath* path, const char** properties);
    CMPIStatus status();

    Broker& broker_;
    CMPIInstanceMIFT table_ = {};
    CMPIInstanceMI mi_;
    mutable std::mutex mutex_;
    std::vector<Question> questions_;  // guarded by mutex_
};

}  // namespace testbed
