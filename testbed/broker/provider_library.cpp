// Opening the library, calling its factories, and the cleanup before it is closed.
#include "provider_library.h"

#include <dlfcn.h>

#include <thread>
#include <vector>

namespace testbed {

ProviderLibrary::ProviderLibrary(Broker& broker, const std::string& file,
                                 const std::string& providerName)
    : broker_(broker), flush_(broker.options()), factoryName_(providerName + "_Create_InstanceMI") {
    library_ = dlopen(file.c_str(), RTLD_NOW | RTLD_LOCAL);
    if (library_ == nullptr) throw LoadError("cannot load " + file + ": " + dlerror());

    factory_ = reinterpret_cast<decltype(factory_)>(dlsym(library_, factoryName_.c_str()));
    if (factory_ == nullptr) {
        dlclose(library_);
        throw LoadError(file + " has no factory " + factoryName_);
    }
    mi_ = callFactories();
    if (mi_ == nullptr) {
        dlclose(library_);
        throw LoadError(factoryName_ + " returned no instance interface");
    }
}

ProviderLibrary::~ProviderLibrary() {
    close();
}

InstanceClient ProviderLibrary::client() {
    return InstanceClient(broker_, mi_);
}

CMPIInstanceMI* ProviderLibrary::callFactories() {
    const auto calls = static_cast<std::size_t>(broker_.options().factoryCalls);
    if (calls == 1) return callFactory();
    std::vector<CMPIInstanceMI*> given(calls);
    std::vector<std::thread> threads;
    for (CMPIInstanceMI*& mi : given) threads.emplace_back([&] { mi = callFactory(); });
    for (std::thread& thread : threads) thread.join();
    return given.front();
}

CMPIInstanceMI* ProviderLibrary::callFactory() {
    const Broker::CallScope scope(broker_);
    CMPIStatus status = {CMPI_RC_OK, nullptr};
    return factory_(broker_.handle(), scope.context(), &status);
}

CMPIrc ProviderLibrary::unload(bool terminating) {
    const CMPIrc rc = client().cleanup(terminating);
    if (rc != CMPI_RC_OK) return rc;
    close();
    return rc;
}

void ProviderLibrary::close() {
    if (library_ != nullptr) dlclose(library_);
    library_ = nullptr;
    factory_ = nullptr;
    mi_ = nullptr;
}

void* ProviderLibrary::symbol(const char* name) const {
    return library_ ? dlsym(library_, name) : nullptr;
}

}  // namespace testbed
