// Repeating the cleanup on more threads while none returns, with a request going on beside it.
#include "manager_stop.h"

#include <atomic>
#include <condition_variable>
#include <mutex>
#include <optional>
#include <thread>
#include <vector>

namespace testbed {

namespace {

using std::chrono::milliseconds;

constexpr std::size_t kMostStops = 9;
/// For a thread of the provider's to leave after the manager has given up.
constexpr milliseconds kLeaveLimit{10000};

/// Asks until it is destroyed.
class Meanwhile {
public:
    explicit Meanwhile(const std::function<void()>& request) {
        if (!request) return;
        thread_ = std::thread([this, request] {
            while (!over_) request();
        });
    }
    ~Meanwhile() {
        over_ = true;
        if (thread_.joinable()) thread_.join();
    }
    Meanwhile(const Meanwhile&) = delete;
    Meanwhile& operator=(const Meanwhile&) = delete;

private:
    std::atomic<bool> over_ = false;
    std::thread thread_;
};

/// Calls cleanup on a new thread, and on one more after each interval in which none has returned.
class RepeatedStop {
public:
    explicit RepeatedStop(InstanceClient client) : client_(client) {}

    CMPIrc run(milliseconds interval) {
        std::vector<std::thread> threads;
        std::unique_lock lock(mutex_);
        while (!first_) {
            if (threads.size() < kMostStops) threads.emplace_back([this] { cleanUp(); });
            returned_.wait_for(lock, interval, [&] { return first_.has_value(); });
        }
        lock.unlock();
        for (std::thread& thread : threads) thread.join();
        return *first_;
    }

private:
    void cleanUp() {
        const CMPIrc rc = InstanceClient(client_).cleanup(true);
        const std::lock_guard lock(mutex_);
        if (!first_) first_ = rc;
        returned_.notify_all();
    }

    InstanceClient client_;
    std::mutex mutex_;
    std::condition_variable returned_;
    std::optional<CMPIrc> first_;  // guarded by mutex_
};

}  // namespace

CMPIrc stopProvider(Broker& broker, const InstanceClient& client,
                    const std::function<void()>& request, milliseconds interval) {
    const BrokerOptions& options = broker.options();
    broker.beginStop();
    CMPIrc rc = CMPI_RC_OK;
    {
        const Meanwhile meanwhile(options.requestsDuringStop ? request : nullptr);
        rc = options.repeatsStop ? RepeatedStop(client).run(interval)
                                 : InstanceClient(client).cleanup(true);
    }
    broker.endStop();
    broker.waitUntilUnused(kLeaveLimit);
    return rc;
}

CMPIrc stopAndUnload(Broker& broker, ProviderLibrary& library, const std::function<void()>& request,
                     milliseconds interval) {
    const CMPIrc rc = stopProvider(broker, library.client(), request, interval);
    if (rc == CMPI_RC_OK) library.close();
    return rc;
}

}  // namespace testbed
