#include "load_cycle.h"

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <filesystem>
#include <mutex>
#include <thread>

#include "fast_clock.h"
#include "manager_stop.h"
#include "process_view.h"
#include "vendor.h"

namespace torture {

using testbed::InstanceClient;
using testbed::ProviderLibrary;

namespace {

using std::chrono::milliseconds;
using std::chrono::seconds;
using Clock = std::chrono::steady_clock;

constexpr int kClients = 4;
constexpr milliseconds kUseTime{30};
constexpr milliseconds kAttachTime{5};
constexpr seconds kInventoryLimit{20};
constexpr seconds kIdleTime{301};  // one more than the provider insists on
constexpr seconds kGrace{4};       // after the factory, nothing is refreshed for a while

void require(bool condition, const std::string& what) {
    if (!condition) throw CycleError(what);
}

std::string number(std::size_t value) {
    return std::to_string(value);
}

/// Answers of a query wait until the door is opened.
class Door {
public:
    void pass() {
        std::unique_lock lock(mutex_);
        waiting_++;
        changed_.notify_all();
        changed_.wait(lock, [&] { return open_; });
    }
    void open() {
        const std::lock_guard lock(mutex_);
        open_ = true;
        changed_.notify_all();
    }
    bool waitForSomebody(seconds limit) {
        std::unique_lock lock(mutex_);
        return changed_.wait_for(lock, limit, [&] { return waiting_ > 0; });
    }

private:
    std::mutex mutex_;
    std::condition_variable changed_;
    int waiting_ = 0;    // guarded by mutex_
    bool open_ = false;  // guarded by mutex_
};

}  // namespace

const char* momentName(Moment moment) {
    constexpr const char* kNames[] = {"in use", "after the idle time", "during the inventory",
                                      "at once"};
    return kNames[static_cast<int>(moment)];
}

LoadCycles::LoadCycles(const testbed::Scenario& scenario, std::string library)
    : scenario_(scenario),
      file_(std::filesystem::canonical(library).string()),
      broker_(repository_, scenario.manager) {
    testbed::buildVendor(repository_, scenario);
    broker_.books().keepCalls(false);
    broker_.faults().setLatency(milliseconds(0), milliseconds(4));
}

std::unique_ptr<ProviderLibrary> LoadCycles::load() {
    require(!isMapped(file_), "the library is mapped before it is loaded");
    auto library = std::make_unique<ProviderLibrary>(broker_, file_, "PlexorProvider");
    require(isMapped(file_), "the library is not mapped after loading");
    return library;
}

void LoadCycles::run(Moment moment) {
    const std::size_t threadsBefore = threadCount();
    if (moment == Moment::AtOnce) delayAttach();
    const auto library = load();
    if (moment != Moment::AtOnce) {
        if (moment != Moment::Inventory) waitForInventory(*library);
        askFromManyThreads(*library);
        if (moment != Moment::Inventory) checkInventory(library->client());
    }
    unload(*library, moment);
    checkGone(threadsBefore);
    checkBooks();
    broker_.faults().clear();
}

/// Makes sure that the workers are not ready yet when the manager unloads at once.
void LoadCycles::delayAttach() {
    testbed::FaultRule rule;
    rule.entry = testbed::Entry::AttachThread;
    rule.delay = kAttachTime;
    broker_.faults().add(rule);
}

void LoadCycles::waitForInventory(ProviderLibrary& library) {
    const auto* done = static_cast<const unsigned*>(library.symbol("ThreadActivityDone"));
    require(done != nullptr, "the library does not export ThreadActivityDone");
    const auto deadline = Clock::now() + kInventoryLimit;
    while (__atomic_load_n(done, __ATOMIC_ACQUIRE) == 0) {
        require(Clock::now() < deadline, "the inventory does not arrive");
        std::this_thread::sleep_for(milliseconds(1));
    }
    FastClock::skip(kGrace);
}

int LoadCycles::ask(ProviderLibrary& library) {
    InstanceClient client = library.client();
    int refused = 0;
    for (const auto& served : testbed::servedClasses())
        if (client.enumerateInstances(served.name).rc != CMPI_RC_OK) refused++;
    return refused;
}

void LoadCycles::askFromManyThreads(ProviderLibrary& library) {
    std::atomic<bool> stop = false;
    std::atomic<int> refused = 0;
    std::vector<std::thread> clients;
    for (int i = 0; i < kClients; i++)
        clients.emplace_back([&] {
            while (!stop) refused += ask(library);
        });
    std::this_thread::sleep_for(kUseTime);
    stop = true;
    for (std::thread& client : clients) client.join();
    require(refused == 0, number(static_cast<std::size_t>(refused)) + " requests were refused");
}

void LoadCycles::checkInventory(InstanceClient client) {
    std::size_t volumes = 0, drives = 0, ports = 0, batteries = 0;
    for (const auto& controller : scenario_.controllers) {
        volumes += controller.volumes.size();
        drives += controller.drives.size();
        ports += controller.ports.size();
        batteries += controller.batteries.size();
    }
    const std::size_t controllers = scenario_.controllers.size();
    const std::size_t expected[] = {controllers, controllers, volumes, drives, ports, batteries};
    std::size_t i = 0;
    for (const auto& served : testbed::servedClasses()) {
        const std::size_t found = client.enumerateInstances(served.name).instances.size();
        require(found == expected[i], std::string(served.heading) + ": " + number(found) +
                                          " instead of " + number(expected[i]));
        i++;
    }
}

void LoadCycles::unload(ProviderLibrary& library, Moment moment) {
    if (moment == Moment::IdleTimeOver) {
        require(library.unload(false) == CMPI_RC_DO_NOT_UNLOAD, "unloaded while in use");
        checkInventory(library.client());
        FastClock::skip(kIdleTime);
    }
    const CMPIrc rc = moment == Moment::IdleTimeOver
                          ? library.unload(false)
                          : testbed::stopAndUnload(broker_, library, [&] { ask(library); });
    require(rc == CMPI_RC_OK, "the unload was refused");
}

void LoadCycles::checkGone(std::size_t threadsBefore) {
    require(!isMapped(file_), "the library is still mapped after unloading");
    require(waitForThreadCount(threadsBefore, seconds(1)),
            "workers are left: " + number(threadCount()) + " threads instead of " +
                number(threadsBefore));
}

void LoadCycles::checkBooks() {
    const auto misuses = broker_.books().misuses();
    require(misuses.empty(), misuses.empty() ? "" : "misuse: " + misuses.front());
    const std::size_t clones = broker_.books().liveClones();
    require(clones == 0, number(clones) + " clones are left");
}

void LoadCycles::runStuck() {
    Door door;
    const auto library = load();
    waitForInventory(*library);
    testbed::FaultRule rule;
    rule.entry = testbed::Entry::Associators;
    rule.resultClass = "CIM_Battery";
    rule.times = 1;
    rule.hook = [&] { door.pass(); };
    broker_.faults().add(rule);
    FastClock::skip(kGrace);
    library->client().enumerateInstances("Tovexa_PlexorBattery");
    require(door.waitForSomebody(seconds(10)), "no refresh asks for batteries");

    require(library->unload(true) == CMPI_RC_OK, "the unload was refused");
    require(isMapped(file_), "the library has gone while a worker is inside it");
    door.open();
    // The worker returns into the library and ends its work function there.
    std::this_thread::sleep_for(seconds(2));
    require(isMapped(file_), "the library has gone although a worker was inside it");
    const auto misuses = broker_.books().misuses();
    require(misuses.empty(), misuses.empty() ? "" : "misuse: " + misuses.front());
}

}  // namespace torture
