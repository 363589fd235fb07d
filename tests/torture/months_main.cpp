// Months in somebody else's process: refreshes of an array, one after the other, the results in
// another order each time, and what the process then has in memory.
//
//   months-test [--refreshes N] [--manager KIND] [--library FILE] [--scenario FILE]
#include <dlfcn.h>
#include <pthread.h>
#include <syslog.h>

#include <CLI/CLI.hpp>
#include <atomic>
#include <chrono>
#include <iostream>
#include <stdexcept>
#include <thread>

#include "manager_option.h"
#include "process_view.h"
#include "provider_session.h"
#include "scenario_parser.h"

namespace torture {
namespace {

constexpr std::time_t kInterval = 20;
constexpr std::size_t kGrowthLimitKilobytes = 1024;
constexpr int kWarmUp = 100;

std::atomic<std::time_t> now = 1'700'000'000;

/// The library's own words, for the moment at which its workers have nothing to do.
class Workers {
public:
    explicit Workers(const std::string& library)
        : handle_(dlopen(library.c_str(), RTLD_NOW | RTLD_NOLOAD)),
          mutex_(symbol<pthread_mutex_t>("PlexorThreadMutex")),
          active_(symbol<unsigned int>("ActiveThreads")),
          queue_(dlsym(handle_, "__FIFO")),
          isEmpty_(reinterpret_cast<int (*)(void*)>(dlsym(handle_, "IsFifoEmpty"))) {}
    ~Workers() { dlclose(handle_); }
    Workers(const Workers&) = delete;
    Workers& operator=(const Workers&) = delete;

    bool areIdle() const {
        pthread_mutex_lock(mutex_);
        const bool idle = isEmpty_(queue_) != 0 && *active_ == 0;
        pthread_mutex_unlock(mutex_);
        return idle;
    }

private:
    template <typename Symbol>
    Symbol* symbol(const char* name) {
        void* address = handle_ != nullptr ? dlsym(handle_, name) : nullptr;
        if (address == nullptr) throw std::runtime_error(std::string("the library has no ") + name);
        return static_cast<Symbol*>(address);
    }

    void* handle_;
    pthread_mutex_t* mutex_;
    unsigned int* active_;
    void* queue_;
    int (*isEmpty_)(void*);
};

void refresh(testbed::ProviderSession& session, const Workers& workers) {
    now += kInterval;
    session.client().enumerateInstanceNames("Tovexa_PlexorStorageExtent");
    while (!workers.areIdle()) std::this_thread::sleep_for(std::chrono::microseconds(200));
}

/// Prints what has become of the memory; whether it is flat.
bool run(int refreshes, const std::string& file, const std::string& library,
         const std::string& manager) {
    testbed::Scenario scenario = testbed::readScenario(file);
    scenario.manager = testbed::chosenManager(scenario, manager);
    testbed::ProviderSession session(scenario, library, "PlexorProvider");
    testbed::Books& books = session.broker().books();
    books.keepCalls(false);
    if (!session.waitForInventory(std::chrono::minutes(5), "root/cimv2"))
        throw std::runtime_error("the inventory does not arrive");
    now += 10;
    const Workers workers(library);
    std::size_t settled = 0;
    for (int i = 1; i <= refreshes; i++) {
        refresh(session, workers);
        if (i == std::min(kWarmUp, refreshes)) settled = residentKilobytes();
    }
    const std::size_t resident = residentKilobytes();
    const std::size_t drives =
        session.client().enumerateInstanceNames("Tovexa_PlexorStorageExtent").paths.size();
    std::cout << refreshes << " refreshes of " << drives << " drives, manager " << manager << ": "
              << settled << " KiB resident after the first " << kWarmUp << ", " << resident
              << " at the end, " << books.live() - books.liveClones() << " objects and "
              << books.liveClones() << " clones kept" << std::endl;
    return resident <= settled + kGrowthLimitKilobytes;
}

}  // namespace
}  // namespace torture

// In front of the C library's for the provider: its days pass as this program says.
extern "C" std::time_t time(std::time_t* out) noexcept {
    const std::time_t value = torture::now;
    if (out != nullptr) *out = value;
    return value;
}

extern "C" unsigned int sleep(unsigned int) {
    std::this_thread::sleep_for(std::chrono::milliseconds(1));
    return 0;
}

int main(int argc, char** argv) {
    int refreshes = getenv("PLEXOR_LONG") != nullptr ? 100000 : 120;
    std::string library = PROVIDER, manager = "host,random-order", scenario = SCENARIO;
    CLI::App app("Refreshes an array for months");
    app.add_option("--refreshes", refreshes, "Number of refreshes")->check(CLI::Range(1, 10000000));
    app.add_option("--library", library, "The provider's library");
    app.add_option("--scenario", scenario, "The array");
    testbed::addManagerOption(app, manager);
    CLI11_PARSE(app, argc, argv);

    setlogmask(LOG_UPTO(LOG_EMERG));
    try {
        if (torture::run(refreshes, scenario, library, manager)) return EXIT_SUCCESS;
        std::cerr << "memory grows" << std::endl;
    } catch (const std::exception& error) {
        std::cerr << error.what() << std::endl;
    }
    return EXIT_FAILURE;
}
