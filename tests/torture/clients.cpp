#include "clients.h"

#include "PlexorProviderCfg.h"
#include "PlexorProviderLock.h"

namespace torture {

using testbed::ObjectPath;
using testbed::Response;
using testbed::ServedClass;

bool inventoryDone() {
    MutexGuard lock(PlexorThreadMutex);
    return ThreadActivityDone != 0;
}

Clients::Clients(testbed::InstanceClient client, const ResponseCheck& check, unsigned seed)
    : client_(client), check_(check), seed_(seed) {}

void Clients::start(int threads) {
    for (int i = 0; i < threads; i++)
        threads_.emplace_back([this, i] { run(seed_ + static_cast<unsigned>(i)); });
}

void Clients::stop() {
    stop_ = true;
    for (std::thread& thread : threads_) thread.join();
    threads_.clear();
}

void Clients::run(unsigned seed) {
    std::mt19937 random(seed);
    std::vector<ObjectPath> known;
    while (!stop_) {
        ask(random, known);
        completed_++;
        // Leaves the vendor and the workers a share of a small machine.
        std::this_thread::sleep_for(std::chrono::microseconds(random() % 2000));
    }
}

/// One request. `known`: paths that this client was given, of any class.
void Clients::ask(std::mt19937& random, std::vector<ObjectPath>& known) {
    const auto classes = testbed::servedClasses();
    const ServedClass& served = classes[random() % classes.size()];
    const bool complete = inventoryDone();
    const unsigned operation = random() % 4;
    if (operation == 0) {
        Response response = client_.enumerateInstanceNames(served.name);
        check_.enumeration(served, response, complete);
        if (!response.paths.empty()) known = std::move(response.paths);
    } else if (operation == 1) {
        check_.enumeration(served, client_.enumerateInstances(served.name), complete);
    } else if (operation == 2) {
        const std::vector<std::string> some = {"ElementName", "OperationalStatus"};
        check_.enumeration(served, client_.enumerateInstances(served.name, some), complete);
    } else if (!known.empty()) {
        const ObjectPath& path = known[random() % known.size()];
        check_.get(*testbed::findServedClass(path.className), path, client_.getInstance(path));
    }
}

}  // namespace torture
