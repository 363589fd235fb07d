#include "bench_clients.h"

namespace bench {

using Clock = std::chrono::steady_clock;

MixedRequests::MixedRequests(testbed::InstanceClient client) : client_(client) {
    for (const auto& served : testbed::servedClasses()) {
        paths_.push_back(client_.enumerateInstanceNames(served.name).paths);
        if (paths_.back().empty()) throw BenchError(std::string("no instances of ") + served.name);
    }
}

std::chrono::nanoseconds MixedRequests::next() {
    const std::size_t classIndex = count_ % paths_.size();
    const std::size_t operation = count_ / paths_.size() % 3;
    const auto& paths = paths_[classIndex];
    const testbed::ObjectPath& path = paths[count_ % paths.size()];
    count_++;

    const auto start = Clock::now();
    const testbed::Response response = operation == 0
                                           ? client_.enumerateInstanceNames(path.className)
                                       : operation == 1 ? client_.enumerateInstances(path.className)
                                                        : client_.getInstance(path);
    const auto end = Clock::now();
    if (response.rc != CMPI_RC_OK)
        throw BenchError(path.text() + ": status " + std::to_string(response.rc));
    return end - start;
}

}  // namespace bench
