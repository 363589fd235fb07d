// A provider that does not answer, and clients that only wait: all others are served.
#include <algorithm>

#include "descriptor_limit.h"
#include "wbem_fixture.h"

namespace testbed {
namespace {

using std::chrono::seconds;

class HangingProvider : public WbemFixture {
protected:
    ~HangingProvider() override {
        release();
        http_.reset();  // with those that hang here
    }

    void release() {
        const std::lock_guard lock(mutex_);
        isReleased_ = true;
        released_.notify_all();
    }
    /// Lets the next `count` requests that reach the provider hang until the release.
    void hang(int count) {
        provider_.hook = [this, left = std::make_shared<std::atomic<int>>(count)] {
            if (--*left < 0) return;
            std::unique_lock lock(mutex_);
            hanging_++;
            released_.wait(lock, [&] { return isReleased_; });
        };
    }
    bool waitForHanging(int count) {
        for (int i = 0; i < 2000; i++) {
            {
                const std::lock_guard lock(mutex_);
                if (hanging_ >= count) return true;
            }
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        }
        return false;
    }
    std::vector<std::unique_ptr<RawClient>> send(int count, const char* className) {
        std::vector<std::unique_ptr<RawClient>> clients;
        for (int i = 0; i < count; i++) {
            clients.push_back(std::make_unique<RawClient>(port()));
            clients.back()->send(
                callRequest("EnumerateInstanceNames", classNameParameter(className)));
        }
        return clients;
    }
    int countAnswers(const std::vector<std::unique_ptr<RawClient>>& clients) {
        return static_cast<int>(std::count_if(
            clients.begin(), clients.end(),
            [](const auto& client) { return client->receive(seconds(60)).status == 200; }));
    }

    std::mutex mutex_;
    std::condition_variable released_;
    bool isReleased_ = false;  // guarded by mutex_
    int hanging_ = 0;          // guarded by mutex_
};

TEST_F(HangingProvider, SixteenRequestsHoldUpNobody) {
    hang(16);
    const auto stuck = send(16, "Served_Disk");
    ASSERT_TRUE(waitForHanging(16));
    EXPECT_EQ(countAnswers(send(100, "Local_Disk")), 100);
    EXPECT_EQ(countAnswers(send(100, "Served_Disk")), 100);
    release();
    EXPECT_EQ(countAnswers(stuck), 16);
}

TEST_F(HangingProvider, WhatNeedsNoProviderGoesOnHoweverManyHang) {
    hang(1000);
    const auto stuck = send(100, "CIM_Disk");
    ASSERT_TRUE(waitForHanging(32));
    EXPECT_EQ(countAnswers(send(100, "Local_Disk")), 100);
    EXPECT_NE(call("GetClass", classNameParameter("Served_Disk")).find("<CLASS"),
              std::string::npos);
    release();
    EXPECT_EQ(countAnswers(stuck), 100);
}

TEST_F(HangingProvider, ThousandsOfConnectionsAreServedTogether) {
    ASSERT_GE(raiseDescriptorLimit(6000), 6000U);
    // A machine with other work may take longer than clients are given to begin.
    HttpServerOptions patient;
    patient.times.request = patient.times.idle = patient.times.response = std::chrono::minutes(5);
    serve(patient);
    hang(16);
    std::vector<std::unique_ptr<RawClient>> idle, dribbling;
    for (int i = 0; i < 1000; i++) idle.push_back(std::make_unique<RawClient>(port()));
    for (int i = 0; i < 250; i++) {
        dribbling.push_back(std::make_unique<RawClient>(port()));
        dribbling.back()->send("POST");
    }
    const auto stuck = send(16, "Served_Disk");
    ASSERT_TRUE(waitForHanging(16));
    EXPECT_EQ(countAnswers(send(1000, "Served_Disk")), 1000);
    EXPECT_EQ(countAnswers(send(1000, "Local_Disk")), 1000);
    EXPECT_EQ(std::count_if(idle.begin(), idle.end(),
                            [&](auto& client) {
                                return client->send(callRequest("EnumerateClassNames", "")) &&
                                       client->receive(seconds(60)).status == 200;
                            }),
              1000);
    release();
    EXPECT_EQ(countAnswers(stuck), 16);
}

}  // namespace
}  // namespace testbed
