// The function table, and the operations that are refused.
#include <cstring>
#include <functional>
#include <vector>

#include "entry_fixture.h"

namespace {

using plexortest::CapturedSyslog;
using plexortest::LogLine;

class EntryTableTest : public plexortest::EntryTest {};

TEST_F(EntryTableTest, NamesTheProviderAndItsVersions) {
    EXPECT_EQ(instMIFT__.ftVersion, 100);
    EXPECT_EQ(instMIFT__.miVersion, 100);
    EXPECT_STREQ(instMIFT__.miName, "instancePlexorProvider");
}

TEST_F(EntryTableTest, HasTheOperationsInTheirSlots) {
    EXPECT_EQ(instMIFT__.cleanup, PlexorProviderCleanup);
    EXPECT_EQ(instMIFT__.enumerateInstanceNames, PlexorProviderEnumInstanceNames);
    EXPECT_EQ(instMIFT__.enumerateInstances, PlexorProviderEnumInstances);
    EXPECT_EQ(instMIFT__.getInstance, PlexorProviderGetInstance);
    EXPECT_EQ(instMIFT__.createInstance, PlexorProviderCreateInstance);
    EXPECT_EQ(instMIFT__.modifyInstance, PlexorProviderModifyInstance);
    EXPECT_EQ(instMIFT__.deleteInstance, PlexorProviderDeleteInstance);
    EXPECT_EQ(instMIFT__.execQuery, PlexorProviderExecQuery);
}

TEST_F(EntryTableTest, TheInterfacePointsAtTheTable) {
    const CMPIInstanceMI* made = callFactory();
    ASSERT_NE(made, nullptr);
    EXPECT_EQ(made->hdl, nullptr);
    EXPECT_EQ(made->ft, &instMIFT__);
}

/// One refused operation, with the arguments of a client or with none at all.
struct Refused {
    const char* name;
    std::function<CMPIStatus(CMPIInstanceMI*, const CMPIContext*, const CMPIResult*,
                             const CMPIObjectPath*, const CMPIInstance*)>
        call;
};

const std::vector<Refused>& refusedOperations() {
    static const char* properties[] = {"ElementName", nullptr};
    static const std::vector<Refused> operations = {
        {"createInstance",
         [](auto* mi, auto* ctx, auto* result, auto* path, auto* inst) {
             return instMIFT__.createInstance(mi, ctx, result, path, inst);
         }},
        {"modifyInstance",
         [](auto* mi, auto* ctx, auto* result, auto* path, auto* inst) {
             return instMIFT__.modifyInstance(mi, ctx, result, path, inst,
                                              path != nullptr ? properties : nullptr);
         }},
        {"deleteInstance", [](auto* mi, auto* ctx, auto* result, auto* path,
                              auto*) { return instMIFT__.deleteInstance(mi, ctx, result, path); }},
        {"execQuery",
         [](auto* mi, auto* ctx, auto* result, auto* path, auto*) {
             return instMIFT__.execQuery(mi, ctx, result, path, path != nullptr ? "WQL" : nullptr,
                                         path != nullptr ? "select * from CIM_Any" : nullptr);
         }},
    };
    return operations;
}

class EntryRefusedTest : public plexortest::EntryTest {
protected:
    void SetUp() override {
        EntryTest::SetUp();
        plexortest::attach(plexortest::newController("C0"));
        NextUnloadTime = 4711;
        CapturedSyslog::clear();
    }
    void expectNothingHappened(const testbed::Broker::Collected& collected) {
        EXPECT_EQ(CapturedSyslog::lines(), std::vector<LogLine>{});
        EXPECT_TRUE(books().calls().empty());
        EXPECT_EQ(collected.doneCalls, 0);
        EXPECT_EQ(NextUnloadTime, 4711);
        EXPECT_EQ(controllers(), 1u);
    }
};

TEST_F(EntryRefusedTest, OperationsAreRefusedWithoutAnyEffect) {
    books().recordObjectCalls(true);
    testbed::Broker::Collected collected;
    CMPIResult* result = broker.makeResult(collected);
    const testbed::ObjectPath path = {"root/cimv2", "Tovexa_PlexorController", {}};
    CMPIObjectPath* cop = broker.makePath(path);
    CMPIInstance* inst = broker.makeInstance({path, {}});
    for (const Refused& operation : refusedOperations()) {
        SCOPED_TRACE(operation.name);
        const CMPIStatus status = operation.call(&mi, ctx(), result, cop, inst);
        EXPECT_EQ(status.rc, 7);
        EXPECT_EQ(status.msg, nullptr);
        expectNothingHappened(collected);
    }
}

TEST_F(EntryRefusedTest, NullArgumentsAreRefusedAlike) {
    for (const Refused& operation : refusedOperations()) {
        SCOPED_TRACE(operation.name);
        const CMPIStatus status = operation.call(nullptr, nullptr, nullptr, nullptr, nullptr);
        EXPECT_EQ(status.rc, 7);
        EXPECT_EQ(status.msg, nullptr);
        expectNothingHappened({});
    }
}

}  // namespace
