// A broker that refuses, delays and lies on request.
#include "broker_fixture.h"

namespace testbed {
namespace {

class BrokerFaults : public BrokerTest {
protected:
    BrokerFaults() {
        repository.put(drive("1"));
        repository.put(fan("F"));
        cool("1", "F");
    }
    static FaultRule rule(Entry entry, CMPIrc rc = CMPI_RC_OK) {
        FaultRule made;
        made.entry = entry;
        made.rc = rc;
        return made;
    }
    CMPIEnumeration* query(const char* className = "CIM_Drive") {
        status = unsetStatus();
        return calls().enumerateInstances(handle(), context(), classPath(className), nullptr,
                                          &status);
    }
    static std::chrono::milliseconds timeOf(const std::function<void()>& work) {
        const auto start = std::chrono::steady_clock::now();
        work();
        return std::chrono::duration_cast<std::chrono::milliseconds>(
            std::chrono::steady_clock::now() - start);
    }
    CMPIStatus status = unsetStatus();
};

TEST_F(BrokerFaults, StatusWithAndWithoutMessage) {
    FaultRule refusal = rule(Entry::EnumerateInstances, CMPI_RC_ERR_ACCESS_DENIED);
    const int id = broker.faults().add(refusal);
    EXPECT_EQ(query(), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_ACCESS_DENIED);
    EXPECT_EQ(status.msg, nullptr);
    EXPECT_EQ(broker.books().queries().back().rc, CMPI_RC_ERR_ACCESS_DENIED);

    broker.faults().remove(id);
    refusal.message = "go away";
    broker.faults().add(refusal);
    EXPECT_EQ(query(), nullptr);
    ASSERT_NE(status.msg, nullptr);
    EXPECT_STREQ(textOf(status.msg), "go away");

    broker.faults().clear();
    EXPECT_NE(query(), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
}

TEST_F(BrokerFaults, NullResultWithStatusOkAndResultWithError) {
    FaultRule nothing = rule(Entry::EnumerateInstances);
    nothing.nullResult = true;
    nothing.times = 1;
    broker.faults().add(nothing);
    EXPECT_EQ(query(), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_OK);

    FaultRule both = rule(Entry::EnumerateInstances, CMPI_RC_ERR_FAILED);
    both.keepResult = true;
    broker.faults().add(both);
    EXPECT_NE(query(), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_FAILED);
}

TEST_F(BrokerFaults, SkipsThenAppliesSoManyTimes) {
    FaultRule some = rule(Entry::EnumerateInstances, CMPI_RC_ERR_FAILED);
    some.skip = 2;
    some.times = 1;
    broker.faults().add(some);
    std::vector<CMPIrc> outcomes;
    for (int round = 0; round < 4; ++round) {
        query();
        outcomes.push_back(status.rc);
    }
    EXPECT_EQ(outcomes,
              (std::vector<CMPIrc>{CMPI_RC_OK, CMPI_RC_OK, CMPI_RC_ERR_FAILED, CMPI_RC_OK}));
}

TEST_F(BrokerFaults, FirstRuleThatHasNotRunOutDecides) {
    FaultRule first = rule(Entry::EnumerateInstances, CMPI_RC_ERR_FAILED);
    first.times = 1;
    broker.faults().add(first);
    broker.faults().add(rule(Entry::EnumerateInstances, CMPI_RC_ERR_NOT_FOUND));
    query();
    EXPECT_EQ(status.rc, CMPI_RC_ERR_FAILED);
    query();
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_FOUND);
}

TEST_F(BrokerFaults, FiltersLookAtClassesAndPath) {
    const auto walk = [&](const char* assocClass, const char* resultClass) {
        calls().associators(handle(), context(), broker.makePath(fanPath("F")), assocClass,
                            resultClass, nullptr, nullptr, nullptr, &status);
        return status.rc;
    };
    FaultRule narrow = rule(Entry::Associators, CMPI_RC_ERR_FAILED);
    narrow.className = "cim_fan";
    narrow.assocClass = "CIM_Cooling";
    narrow.resultClass = "CIM_Drive";
    narrow.pathContains = "\"F\"";
    broker.faults().add(narrow);
    EXPECT_EQ(walk("cim_cooling", "CIM_Drive"), CMPI_RC_ERR_FAILED);
    EXPECT_EQ(walk("CIM_Dependency", "CIM_Drive"), CMPI_RC_OK);
    EXPECT_EQ(walk("CIM_Cooling", nullptr), CMPI_RC_OK);
    broker.faults().clear();
    narrow.pathContains = "\"G\"";
    broker.faults().add(narrow);
    EXPECT_EQ(walk("CIM_Cooling", "CIM_Drive"), CMPI_RC_OK);
    broker.faults().clear();
    narrow.pathContains.reset();
    narrow.className = "CIM_Drive";
    broker.faults().add(narrow);
    EXPECT_EQ(walk("CIM_Cooling", "CIM_Drive"), CMPI_RC_OK);
}

TEST_F(BrokerFaults, ObjectEntriesCanFailToo) {
    const CMPIInstance* instance = broker.makeInstance(drive("1"));
    FaultRule property = rule(Entry::InstanceGetProperty, CMPI_RC_ERR_FAILED);
    property.name = "deviceid";
    broker.faults().add(property);
    CMPIData data = instance->ft->getProperty(instance, "DeviceID", &status);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(data.state, CMPI_badValue);
    instance->ft->getProperty(instance, "Other", &status);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_FOUND);

    CMPIString* string = broker.makeString("s");
    FaultRule characters = rule(Entry::StringGetCharPtr);
    characters.nullResult = true;
    broker.faults().add(characters);
    EXPECT_EQ(textOf(string), nullptr);

    CMPIObjectPath* path = broker.makePath(drivePath("1"));
    broker.faults().add(rule(Entry::PathAddKey, CMPI_RC_ERR_FAILED));
    EXPECT_EQ(path->ft->addKey(path, "K", asValue("v"), CMPI_chars).rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(path->ft->getKeyCount(path, nullptr), 1u);
    EXPECT_EQ(broker.books().count(Entry::PathAddKey), 0u);
    EXPECT_TRUE(misuses().empty());
}

TEST_F(BrokerFaults, NullValueUnderAGoodState) {
    const CMPIInstance* instance = broker.makeInstance(drive("1"));
    FaultRule nothing = rule(Entry::InstanceGetProperty);
    nothing.nullResult = true;
    broker.faults().add(nothing);
    const CMPIData data = instance->ft->getProperty(instance, "DeviceID", &status);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_EQ(data.state, CMPI_goodValue);
    EXPECT_EQ(data.type, CMPI_string);
    EXPECT_EQ(data.value.string, nullptr);
}

TEST_F(BrokerFaults, WrongTypeIsANumber) {
    const Entry entries[] = {Entry::EnumerationGetNext, Entry::ArrayGetElementAt, Entry::PathGetKey,
                             Entry::InstanceGetProperty};
    for (const Entry entry : entries) {
        FaultRule lie = rule(entry);
        lie.wrongType = true;
        broker.faults().add(lie);
    }
    CMPIEnumeration* found = query();
    CMPIArray* array = found->ft->toArray(found, nullptr);
    const CMPIObjectPath* path = broker.makePath(drivePath("1"));
    const CMPIInstance* instance = broker.makeInstance(drive("1"));
    const CMPIData items[] = {found->ft->getNext(found, nullptr),
                              array->ft->getElementAt(array, 0, nullptr),
                              path->ft->getKey(path, "DeviceID", nullptr),
                              instance->ft->getProperty(instance, "DeviceID", nullptr)};
    for (const CMPIData& data : items) EXPECT_EQ(data.type, CMPI_uint32);
}

TEST_F(BrokerFaults, FailingNextStillAdvances) {
    broker.faults().add(rule(Entry::EnumerationGetNext, CMPI_RC_ERR_FAILED));
    CMPIEnumeration* found = query();
    EXPECT_TRUE(found->ft->hasNext(found, nullptr));
    EXPECT_EQ(found->ft->getNext(found, &status).state, CMPI_badValue);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_FAILED);
    EXPECT_FALSE(found->ft->hasNext(found, nullptr));
}

TEST_F(BrokerFaults, FailingCloneGivesNullAndLeaksNothing) {
    CMPIString* string = broker.makeString("s");
    const int plain = broker.faults().add(rule(Entry::Clone));
    EXPECT_EQ(string->ft->clone(string, &status), nullptr);
    broker.faults().remove(plain);
    const int refused = broker.faults().add(rule(Entry::Clone, CMPI_RC_ERR_FAILED));
    EXPECT_EQ(string->ft->clone(string, &status), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_FAILED);
    broker.faults().remove(refused);
    FaultRule nothing = rule(Entry::Clone);
    nothing.nullResult = true;
    broker.faults().add(nothing);
    EXPECT_EQ(string->ft->clone(string, &status), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_EQ(broker.books().liveClones(), 0u);
}

TEST_F(BrokerFaults, MakersAndThreadEntriesFail) {
    for (const Entry entry : {Entry::PrepareAttachThread, Entry::AttachThread, Entry::NewObjectPath,
                              Entry::NewInstance, Entry::NewString, Entry::ClassPathIsA}) {
        broker.faults().add(rule(entry, CMPI_RC_ERR_FAILED));
    }
    EXPECT_EQ(calls().prepareAttachThread(handle(), context()), nullptr);
    EXPECT_EQ(calls().attachThread(handle(), context()).rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(makers().newObjectPath(handle(), "n", "C", nullptr), nullptr);
    EXPECT_EQ(makers().newInstance(handle(), classPath("CIM_Fan"), nullptr), nullptr);
    EXPECT_EQ(makers().newString(handle(), "s", nullptr), nullptr);
    EXPECT_FALSE(makers().classPathIsA(handle(), classPath("CIM_Fan"), "CIM_Device", nullptr));
    EXPECT_TRUE(misuses().empty());
}

TEST_F(BrokerFaults, DelayAndLatency) {
    using std::chrono::milliseconds;
    FaultRule slow = rule(Entry::EnumerateInstances);
    slow.delay = milliseconds(60);
    const int id = broker.faults().add(slow);
    EXPECT_GE(timeOf([&] { EXPECT_NE(query(), nullptr); }), milliseconds(60));
    broker.faults().remove(id);

    broker.faults().setLatency(milliseconds(30), milliseconds(40));
    EXPECT_GE(timeOf([&] { query(); }), milliseconds(30));
    for (int round = 0; round < 20; ++round) {
        const milliseconds drawn = broker.faults().drawLatency();
        EXPECT_GE(drawn, milliseconds(30));
        EXPECT_LE(drawn, milliseconds(40));
    }
}

TEST_F(BrokerFaults, WaitsEndWhenTheFaultsAreCleared) {
    FaultRule hang = rule(Entry::EnumerateInstances);
    hang.delay = std::chrono::minutes(10);
    broker.faults().add(hang);
    std::thread rescue([&] {
        while (broker.books().queries().empty()) std::this_thread::yield();
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
        broker.faults().clear();
    });
    EXPECT_LT(timeOf([&] { EXPECT_NE(query(), nullptr); }), std::chrono::minutes(1));
    rescue.join();
}

TEST_F(BrokerFaults, NothingIsWaitedForAtTheEnd) {
    FaultRule hang = rule(Entry::EnumerateInstances);
    hang.delay = std::chrono::minutes(10);
    broker.faults().add(hang);
    broker.faults().setLatency(std::chrono::minutes(10), std::chrono::minutes(10));
    broker.faults().endWaits();
    EXPECT_LT(timeOf([&] {
                  query();
                  broker.faults().clear();
                  query();
              }),
              std::chrono::minutes(1));
}

TEST_F(BrokerFaults, HookRunsBeforeTheAnswerAndMayUseTheBroker) {
    FaultRule change = rule(Entry::EnumerateInstances);
    change.times = 1;
    change.hook = [&] {
        repository.put(drive("2"));
        EXPECT_NE(query("CIM_Fan"), nullptr);
        broker.faults().clear();
    };
    broker.faults().add(change);
    CMPIEnumeration* found = query();
    CMPIArray* array = found->ft->toArray(found, nullptr);
    EXPECT_EQ(array->ft->getSize(array, nullptr), 2u);
}

TEST_F(BrokerFaults, ObjectCallsAreRecordedOnRequest) {
    const CMPIInstance* instance = broker.makeInstance(drive("1"));
    instance->ft->getProperty(instance, "DeviceID", nullptr);
    EXPECT_EQ(broker.books().count(Entry::InstanceGetProperty), 0u);
    broker.books().recordObjectCalls(true);
    instance->ft->getProperty(instance, "Missing", nullptr);
    const CallRecord record = broker.books().calls().back();
    EXPECT_EQ(record.entry, Entry::InstanceGetProperty);
    EXPECT_EQ(record.name, "Missing");
    EXPECT_EQ(record.className, "Sample_Drive");
    EXPECT_EQ(record.path, drivePath("1").text());
    EXPECT_EQ(record.rc, CMPI_RC_ERR_NOT_FOUND);
}

}  // namespace
}  // namespace testbed
