// A thousand clients that send one byte a second do not keep the server from answering others.
#include <sys/resource.h>

#include <atomic>
#include <thread>

#include "wbem_fixture.h"

namespace testbed {
namespace {

using Clock = std::chrono::steady_clock;

/// This side of the connections needs descriptors as well.
bool allowDescriptors(rlim_t wanted) {
    rlimit limit = {};
    getrlimit(RLIMIT_NOFILE, &limit);
    if (limit.rlim_cur >= wanted) return true;
    limit.rlim_cur = std::min(wanted, limit.rlim_max);
    return setrlimit(RLIMIT_NOFILE, &limit) == 0 && limit.rlim_cur >= wanted;
}

class SlowClients : public WbemFixture {
protected:
    static constexpr int kClients = 1000;

    void SetUp() override {
        ASSERT_TRUE(allowDescriptors(3000));
        for (int i = 0; i < kClients; i++) clients_.push_back(std::make_unique<RawClient>(port()));
        drip_ = std::thread([this] { drip(); });
    }
    void TearDown() override {
        stopping_ = true;
        if (drip_.joinable()) drip_.join();
    }

    /// Each client sends a byte a second; one that is closed comes again.
    void drip() {
        for (std::size_t byte = 0; !stopping_; byte++) {
            const auto next = Clock::now() + std::chrono::seconds(1);
            for (auto& client : clients_)
                if (!client->send(request_.substr(byte % request_.size(), 1)))
                    client = std::make_unique<RawClient>(port());
            while (Clock::now() < next && !stopping_)
                std::this_thread::sleep_for(std::chrono::milliseconds(20));
        }
    }

    const std::string request_ =
        callRequest("EnumerateInstanceNames", classNameParameter("Local_Disk"));
    std::vector<std::unique_ptr<RawClient>> clients_;
    std::thread drip_;
    std::atomic<bool> stopping_ = false;
};

TEST_F(SlowClients, DoNotKeepOthersWaiting) {
    for (int i = 0; i < 20; i++) {
        const auto begin = Clock::now();
        EXPECT_TRUE(isAlive());
        EXPECT_LT(Clock::now() - begin, std::chrono::seconds(20));
        std::this_thread::sleep_for(std::chrono::milliseconds(250));
    }
}

}  // namespace
}  // namespace testbed
