// A broker that behaves as a list of names says; see manager_kinds.h.
#pragma once

#include "broker_fixture.h"
#include "manager_kinds.h"

namespace testbed {

inline BrokerOptions managerWith(const std::string& words) {
    BrokerOptions options;
    chooseManager(options, words);
    return options;
}

/// `manager` begins anew with other behaviour, in a manager call.
class ManagerTest : public testing::Test {
protected:
    /// What BrokerTest makes available of its broker.
    class Manager : public BrokerTest {
    public:
        explicit Manager(const std::string& words) : BrokerTest(managerWith(words)) {}
        void TestBody() override {}
        using BrokerTest::broker;
        using BrokerTest::calls;
        using BrokerTest::classPath;
        using BrokerTest::context;
        using BrokerTest::cool;
        using BrokerTest::drive;
        using BrokerTest::drivePath;
        using BrokerTest::fan;
        using BrokerTest::fanPath;
        using BrokerTest::handle;
        using BrokerTest::leaveCall;
        using BrokerTest::makers;
        using BrokerTest::misuses;
        using BrokerTest::repository;
    };
};

}  // namespace testbed
