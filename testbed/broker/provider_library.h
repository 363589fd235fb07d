// Loads an instance provider's shared library as an object manager does: by file and factory name.
#pragma once

#include <stdexcept>
#include <string>

#include "broker.h"
#include "exported_flush.h"
#include "instance_client.h"

namespace testbed {

/// A library that cannot be loaded, or has no such factory, or whose factory gives nothing. The
/// text is one line for the user.
struct LoadError : std::runtime_error {
    using std::runtime_error::runtime_error;
};

class ProviderLibrary {
public:
    /// Opens `file` and calls `<providerName>_Create_InstanceMI` as often as the broker's options
    /// say. Throws LoadError.
    ProviderLibrary(Broker& broker, const std::string& file, const std::string& providerName);
    /// Closes the library without calling cleanup when that has not happened.
    ~ProviderLibrary();
    ProviderLibrary(const ProviderLibrary&) = delete;
    ProviderLibrary& operator=(const ProviderLibrary&) = delete;

    InstanceClient client();
    CMPIInstanceMI* mi() const { return mi_; }
    /// Calls the factory once more, as a manager does for each further class. Thread-safe.
    CMPIInstanceMI* callFactory();
    /// cleanup and, when it answers OK, dlclose. The status of cleanup.
    CMPIrc unload(bool terminating);
    /// dlclose, without a cleanup.
    void close();
    /// An exported symbol of the library, NULL when it has none or is closed.
    void* symbol(const char* name) const;
    bool isOpen() const { return library_ != nullptr; }

private:
    CMPIInstanceMI* callFactories();

    Broker& broker_;
    ExportedFlush flush_;
    std::string factoryName_;
    void* library_ = nullptr;
    CMPIInstanceMI* (*factory_)(const CMPIBroker*, const CMPIContext*, CMPIStatus*) = nullptr;
    CMPIInstanceMI* mi_ = nullptr;
};

}  // namespace testbed
