// Finding and loading the module with the exported flush, and pointing it at the brokers.
#include "exported_flush.h"

#include <dlfcn.h>

#include <atomic>
#include <filesystem>
#include <stdexcept>

#include "broker.h"

namespace testbed {

namespace {

namespace fs = std::filesystem;

constexpr const char* kModule = "libplexor-manager-flush.so";
constexpr const char* kDirectories[] = {".", BUILT_MODULE_DIR, INSTALLED_MODULE_DIR};

/// The directory of the program, or of the module that this code is in.
fs::path home(bool ofProgram) {
    std::error_code error;
    if (ofProgram) return fs::read_symlink("/proc/self/exe", error).parent_path();
    Dl_info here = {};
    if (dladdr(kDirectories, &here) == 0) return {};
    return fs::absolute(here.dli_fname, error).parent_path();
}

fs::path locateModule() {
    for (const bool ofProgram : {false, true}) {
        for (const char* directory : kDirectories) {
            const fs::path file = (home(ofProgram) / directory / kModule).lexically_normal();
            if (fs::exists(file)) return file;
        }
    }
    throw std::runtime_error(std::string(kModule) + " not found beside " + home(true).string());
}

std::atomic<int> exporters = 0;

void direct(void* module, void (*flush)()) {
    auto* target = static_cast<void (**)()>(dlsym(module, "plexor_manager_flush"));
    if (target != nullptr) *target = flush;
}

}  // namespace

ExportedFlush::ExportedFlush(const BrokerOptions& options) {
    if (!options.exportsFlush()) return;
    const fs::path file = locateModule();
    module_ = dlopen(file.c_str(), RTLD_NOW | RTLD_GLOBAL);
    if (module_ == nullptr) {
        throw std::runtime_error("cannot load " + file.string() + ": " + dlerror());
    }
    ++exporters;
    direct(module_, Broker::flushThreadEverywhere);
}

ExportedFlush::~ExportedFlush() {
    if (module_ == nullptr) return;
    // Somebody else may have loaded the module too, and this code may go before it does.
    if (--exporters == 0) direct(module_, nullptr);
    dlclose(module_);
}

}  // namespace testbed
