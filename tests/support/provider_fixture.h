// What every test of the provider starts from: a broker over an empty repository, a clock that
// stands, an empty log, a provider without inventory; and what it must leave behind.
#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "PlexorProviderCfg.h"
#include "allocation_faults.h"
#include "broker.h"
#include "captured_syslog.h"
#include "instance_client.h"
#include "repository.h"
#include "virtual_clock.h"

namespace plexortest {

inline constexpr std::time_t kStartTime = 1'000'000'000;

class ProviderTest : public ::testing::Test {
protected:
    ProviderTest();
    void SetUp() override;
    void TearDown() override;

    testbed::Broker& broker() { return *broker_; }
    testbed::Books& books() { return broker_->books(); }
    testbed::Faults& faults() { return broker_->faults(); }
    /// Context of the call scope that the test runs in.
    CMPIContext* context() { return scope_->context(); }
    const CMPIInstanceMI* mi() { return &mi_; }
    testbed::InstanceClient client() { return {*broker_, &mi_}; }

    /// An empty controller with locks and lists, owned by nobody yet.
    static RaidController_t* newController(const std::string& deviceId,
                                           const std::string& model = "");
    /// The same, appended to RaidControllerList, which releases it.
    static RaidController_t* addController(const std::string& deviceId,
                                           const std::string& model = "");

    /// For tests that leave clones behind on purpose: how many may live at the end.
    std::size_t expectedClones_ = 0;
    /// For tests of misuse by the broker's standards.
    bool allowMisuse_ = false;

    testbed::Repository repository_;

private:
    std::unique_ptr<testbed::Broker> broker_;
    std::unique_ptr<testbed::Broker::CallScope> scope_;
    CMPIInstanceMI mi_;
};

// Records with owned copies; "" gives a null string. Not in any list.
StoragePool_t* newPool(const std::string& instanceId, const std::string& poolId, bool primordial);
DiskDrive_t* newDisk(const std::string& deviceId, const std::string& name,
                     const std::string& pool = "", const std::string& chassis = "");
StorageVolume_t* newVolume(const std::string& deviceId, const std::string& elementName,
                           const std::string& fromPool = "");
SASSATAPort_t* newPort(const std::string& deviceId, const std::string& name);
Battery_t* newBattery(const std::string& deviceId);
Chassis_t* newChassis(const std::string& tag, const std::string& internalTag = "");

/// A heap copy; null for "".
char* ownedText(const std::string& text);

/// Puts the provider's exported state back to what it is right after loading. No worker may run.
void resetProviderState();

}  // namespace plexortest
