// Clients that ask for everything all the time.
#pragma once

#include <atomic>
#include <cstdint>
#include <random>
#include <thread>
#include <vector>

#include "instance_client.h"
#include "response_check.h"

namespace torture {

/// Whether the provider has finished its initial inventory.
bool inventoryDone();

class Clients {
public:
    /// All must outlive the clients.
    Clients(testbed::InstanceClient client, const ResponseCheck& check, unsigned seed);
    ~Clients() { stop(); }

    void start(int threads);
    void stop();
    std::uint64_t completed() const { return completed_; }

private:
    void run(unsigned seed);
    void ask(std::mt19937& random, std::vector<testbed::ObjectPath>& known);

    testbed::InstanceClient client_;
    const ResponseCheck& check_;
    unsigned seed_;
    std::atomic<bool> stop_ = false;
    std::atomic<std::uint64_t> completed_ = 0;
    std::vector<std::thread> threads_;
};

}  // namespace torture
