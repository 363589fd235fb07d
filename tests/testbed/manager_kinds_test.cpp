// Managers by name.
#include "manager_kinds.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <set>

namespace testbed {
namespace {

BrokerOptions chosen(const std::string& words) {
    BrokerOptions options;
    chooseManager(options, words);
    return options;
}

std::vector<std::string> on(const BrokerOptions& options) {
    std::vector<std::string> names;
    for (const ManagerBehaviour& behaviour : managerBehaviours())
        if (behaviour.isOn(options)) names.push_back(behaviour.name);
    return names;
}

std::string errorOf(const std::string& words) {
    BrokerOptions options;
    try {
        chooseManager(options, words);
    } catch (const UnknownManager& error) {
        return error.what();
    }
    return "no error";
}

TEST(ManagerKinds, HostIsTheDefault) {
    EXPECT_TRUE(on(BrokerOptions()).empty());
    EXPECT_TRUE(on(chosen("host")).empty());
}

TEST(ManagerKinds, EveryBehaviourCanBeChosenAlone) {
    for (const ManagerBehaviour& behaviour : managerBehaviours()) {
        const std::string name = behaviour.name;
        EXPECT_EQ(on(chosen(name)), std::vector<std::string>{name});
        EXPECT_TRUE(on(chosen(name + "," + name + "=off")).empty()) << name;
    }
}

TEST(ManagerKinds, KindsAndSingleBehaviours) {
    const BrokerOptions large = chosen("large,random-order=off,serial-queries");
    EXPECT_EQ(large.flush, FlushOffer::None);
    EXPECT_FALSE(large.randomOrder);
    EXPECT_TRUE(large.serialQueries);
    EXPECT_TRUE(large.instancesWithoutKeys);
    EXPECT_FALSE(large.keepsPerThread());
    const BrokerOptions small = chosen("small");
    EXPECT_TRUE(small.exportsFlush());
    EXPECT_TRUE(small.keepsPerThread());
    EXPECT_EQ(small.factoryCalls, 6);
}

// Both what large and what small does is in the worst, but for what excludes another.
TEST(ManagerKinds, WorstIsEverythingThatCanBeCombined) {
    const std::set<std::string> excluded = {"flush-function", "objects-per-thread",
                                            "attach-does-nothing", "filter-keeps-keys",
                                            "refuse-at-stop"};
    const auto worst = on(chosen("worst"));
    for (const ManagerBehaviour& behaviour : managerBehaviours())
        EXPECT_NE(excluded.count(behaviour.name),
                  static_cast<std::size_t>(std::count(worst.begin(), worst.end(), behaviour.name)))
            << behaviour.name;
}

TEST(ManagerKinds, UnknownNamesListTheKnownOnes) {
    EXPECT_EQ(
        errorOf("huge").find("unknown manager or behaviour \"huge\"; managers are host, small, "
                             "large, worst; behaviours are flush-function, "),
        0u);
    EXPECT_EQ(errorOf("no-keys=maybe"), "a behaviour is on or off, not \"maybe\"");
    EXPECT_EQ(errorOf("random-order,large").find("unknown"), 0u);
    BrokerOptions options = chosen("no-keys");
    EXPECT_THROW(chooseManager(options, "random-order,huge"), UnknownManager);
    EXPECT_FALSE(options.randomOrder);
}

TEST(ManagerKinds, NamesInScenarioFiles) {
    EXPECT_EQ(managerBehaviours()[0].memberName(), "flushFunction");
    EXPECT_EQ(managerBehaviours()[6].memberName(), "noCharsInArrays");
}

TEST(ManagerKinds, TableHasALineForEachBehaviour) {
    const std::string table = managerTable();
    EXPECT_EQ(table.find("| behaviour | host | small | large | worst |\n|---|---|---|---|---|\n"),
              0u);
    EXPECT_NE(table.find("| `no-flush`: has no flush of any kind; the context "
                         "table's flush is null | | | yes | yes |\n"),
              std::string::npos);
    EXPECT_EQ(static_cast<std::size_t>(std::count(table.begin(), table.end(), '\n')),
              managerBehaviours().size() + 2);
}

}  // namespace
}  // namespace testbed
