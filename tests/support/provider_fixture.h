// A provider in a process of its own making: broker, clock, log and globals as after loading.
#pragma once

#include <gtest/gtest.h>

#include <optional>
#include <string>
#include <vector>

#include "PlexorProvider.h"
#include "allocation_faults.h"
#include "broker.h"
#include "captured_syslog.h"
#include "eventually.h"
#include "records.h"
#include "repository.h"
#include "virtual_clock.h"

namespace plexortest {

/// `Broker` names the provider's global here; the class is testbed::Broker.
class ProviderTest : public ::testing::Test {
protected:
    /// The clock's time when a test begins.
    static constexpr time_t kStart = 1'700'000'000;

    explicit ProviderTest(testbed::BrokerOptions options = {});
    void SetUp() override;
    /// Stops workers that were started, releases everything the provider holds, puts every global
    /// back, and fails the test when the broker saw a misuse or a clone is left.
    void TearDown() override;

    /// What the manager passes into a call; the same for the whole test.
    CMPIContext* ctx() { return scope_->context(); }
    testbed::Books& books() { return broker.books(); }
    testbed::Faults& faults() { return broker.faults(); }

    /// A rule that refuses calls of `entry`; refine and pass it to faults().add().
    static testbed::FaultRule refusal(testbed::Entry entry, CMPIrc rc = CMPI_RC_ERR_FAILED,
                                      std::optional<std::string> message = {});

    /// A clone as records own it.
    CMPIObjectPath* clonedPath(const testbed::ObjectPath& path);
    CMPIInstance* clonedInstance(const testbed::Instance& instance);

    /// Starts the two workers on a polling interval from no option file (20 s).
    void startWorkers();
    /// Lets running work end and both workers leave; a test's own clean-up may have come before.
    void stopWorkers();

    /// Clones that the test expects to be left behind.
    void expectLeftClones(std::size_t count) { leftClones_ = count; }
    /// Misuses that the test expects the broker to have seen; the default is none.
    void expectMisuses(bool expected) { misusesExpected_ = expected; }

    testbed::Repository repository;
    testbed::Broker broker;
    CMPIInstanceMI mi = {nullptr, &instMIFT__};

private:
    std::optional<testbed::Broker::CallScope> scope_;
    std::size_t leftClones_ = 0;
    bool misusesExpected_ = false;
};

}  // namespace plexortest
