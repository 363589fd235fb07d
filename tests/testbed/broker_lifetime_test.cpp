// How long objects live, and what happens to those who use them longer.
#include "broker_core.h"
#include "broker_fixture.h"
#include "object_string.h"

namespace testbed {
namespace {

class BrokerLifetime : public BrokerTest {
protected:
    CMPIStatus status = unsetStatus();
};

TEST_F(BrokerLifetime, ObjectsEndWithTheCall) {
    CMPIObjectPath* path = classPath("CIM_Drive");
    const CMPIInstance* instance = broker.makeInstance(drive("1"));
    instance->ft->getProperty(instance, "DeviceID", nullptr);
    EXPECT_GE(broker.books().live(), 4u);
    leaveCall();
    EXPECT_EQ(broker.books().live(), 0u);

    EXPECT_EQ(path->ft->getClassName(path, &status), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_INVALID_HANDLE);
    EXPECT_EQ(path->ft->addKey(path, "k", asValue("v"), CMPI_chars).rc, CMPI_RC_ERR_INVALID_HANDLE);
    EXPECT_EQ(path->ft->getKeyCount(path, nullptr), 0u);
    EXPECT_EQ(path->ft->getKey(path, "k", nullptr).state, CMPI_badValue);
    EXPECT_EQ(misuses().size(), 4u);
    EXPECT_NE(misuses()[0].find("path.getClassName"), std::string::npos);
}

TEST_F(BrokerLifetime, NestedCallsEndOnlyTheirOwn) {
    CMPIString* outer = broker.makeString("outer");
    CMPIString* inner = nullptr;
    {
        const Broker::CallScope nested(broker);
        inner = broker.makeString("inner");
        EXPECT_NE(nested.context(), context());
    }
    EXPECT_STREQ(textOf(outer), "outer");
    EXPECT_EQ(textOf(inner), nullptr);
    EXPECT_EQ(inner->hdl, nullptr);
    expectMisuse("string.getCharPtr");
}

TEST_F(BrokerLifetime, ClonesOutliveTheCallUntilReleased) {
    const CMPIInstance* instance = broker.makeInstance(drive("1"));
    CMPIInstance* clone = instance->ft->clone(instance, &status);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    leaveCall();
    EXPECT_EQ(broker.books().live(), 1u);
    EXPECT_EQ(broker.books().liveClones(), 1u);
    enterCall();
    const CMPIData data = clone->ft->getProperty(clone, "DeviceID", nullptr);
    EXPECT_STREQ(textOf(data.value.string), "1");
    EXPECT_EQ(clone->ft->release(clone).rc, CMPI_RC_OK);
    EXPECT_EQ(broker.books().liveClones(), 0u);
    EXPECT_TRUE(misuses().empty());

    EXPECT_EQ(textOf(data.value.string), nullptr);
    expectMisuse("string.getCharPtr");
}

TEST_F(BrokerLifetime, CloneOfEveryKindCanBeReleased) {
    CMPIString* string = broker.makeString("s");
    CMPIString* stringClone = string->ft->clone(string, nullptr);
    CMPIString* nothing = broker.makeNullString();
    CMPIString* nothingClone = nothing->ft->clone(nothing, nullptr);
    CMPIObjectPath* path = broker.makePath(drivePath("1"));
    CMPIObjectPath* pathClone = path->ft->clone(path, nullptr);
    EXPECT_STREQ(textOf(stringClone), "s");
    EXPECT_EQ(textOf(nothingClone), nullptr);
    EXPECT_EQ(Broker::toPath(pathClone), drivePath("1"));
    EXPECT_EQ(stringClone->ft->release(stringClone).rc, CMPI_RC_OK);
    EXPECT_EQ(nothingClone->ft->release(nothingClone).rc, CMPI_RC_OK);
    EXPECT_EQ(pathClone->ft->release(pathClone).rc, CMPI_RC_OK);
    EXPECT_TRUE(misuses().empty());
}

TEST_F(BrokerLifetime, CloneOfAFilteredInstanceStaysFiltered) {
    CMPIInstance* instance = broker.makeInstance(drive("1"));
    const char* none[] = {nullptr};
    instance->ft->setPropertyFilter(instance, none, nullptr);
    CMPIInstance* clone = instance->ft->clone(instance, nullptr);
    clone->ft->setProperty(clone, "DeviceID", asValue("1"), CMPI_chars);
    EXPECT_EQ(clone->ft->getPropertyCount(clone, nullptr), 0u);
    clone->ft->release(clone);
}

TEST_F(BrokerLifetime, ReleasingWhatIsNotACloneDoesNothing) {
    CMPIString* string = broker.makeString("kept");
    EXPECT_EQ(string->ft->release(string).rc, CMPI_RC_ERR_FAILED);
    EXPECT_STREQ(textOf(string), "kept");
    expectMisuse("not a clone (string)");
}

TEST_F(BrokerLifetime, ReleasingTwiceIsNoticed) {
    CMPIString* string = broker.makeString("s");
    CMPIString* clone = string->ft->clone(string, nullptr);
    EXPECT_EQ(clone->ft->release(clone).rc, CMPI_RC_OK);
    EXPECT_EQ(clone->ft->release(clone).rc, CMPI_RC_ERR_INVALID_HANDLE);
    expectMisuse("release");
}

TEST_F(BrokerLifetime, ReleasingAnEndedObjectIsNoticed) {
    CMPIString* string = broker.makeString("s");
    leaveCall();
    EXPECT_EQ(string->ft->release(string).rc, CMPI_RC_ERR_INVALID_HANDLE);
    EXPECT_EQ(string->ft->clone(string, &status), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_INVALID_HANDLE);
    EXPECT_EQ(misuses().size(), 2u);
}

TEST_F(BrokerLifetime, EndedArgumentsAreRefused) {
    CMPIObjectPath* path = broker.makePath(drivePath("1"));
    CMPIString* text = broker.makeString("s");
    const CMPIInstance* returned = broker.makeInstance(drive("1"));
    leaveCall();
    enterCall();
    EXPECT_EQ(makers().newInstance(handle(), path, &status), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_INVALID_PARAMETER);
    CMPIInstance* instance = broker.makeInstance(drive("1"));
    EXPECT_EQ(instance->ft->setProperty(instance, "p", asValue(&text), CMPI_string).rc,
              CMPI_RC_ERR_INVALID_HANDLE);
    Broker::Collected collected;
    CMPIResult* result = broker.makeResult(collected);
    EXPECT_EQ(result->ft->returnInstance(result, returned).rc, CMPI_RC_ERR_INVALID_PARAMETER);
    EXPECT_TRUE(collected.instances.empty());
    EXPECT_EQ(makers().toString(handle(), path, nullptr), nullptr);
    EXPECT_EQ(misuses().size(), 4u);
}

TEST_F(BrokerLifetime, EndedContextIsRefused) {
    const CMPIContext* old = context();
    leaveCall();
    enterCall();
    EXPECT_EQ(calls().enumerateInstances(handle(), old, classPath("CIM_Drive"), nullptr, &status),
              nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_INVALID_HANDLE);
    expectMisuse("enumerateInstances");
    EXPECT_EQ(calls().prepareAttachThread(handle(), old), nullptr);
}

TEST_F(BrokerLifetime, MissingContextIsNoticed) {
    EXPECT_NE(
        calls().enumerateInstances(handle(), nullptr, classPath("CIM_Drive"), nullptr, &status),
        nullptr);
    expectMisuse("without a context");
}

TEST_F(BrokerLifetime, UpCallOutsideOfACallIsNoticedAndItsResultLives) {
    leaveCall();
    CMPIString* string = makers().newString(handle(), "kept", &status);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    expectMisuse("not attached");
    enterCall();
    leaveCall();
    EXPECT_STREQ(textOf(string), "kept");
    broker.makeString("by the manager itself");
    EXPECT_EQ(misuses().size(), 1u);
}

TEST_F(BrokerLifetime, FlushInACallSparesContextAndResult) {
    Broker::Collected collected;
    CMPIResult* result = broker.makeResult(collected);
    CMPIString* string = broker.makeString("s");
    broker.flushThread();
    EXPECT_EQ(broker.books().live(), 2u);
    EXPECT_EQ(result->ft->returnDone(result).rc, CMPI_RC_OK);
    EXPECT_EQ(context()->ft->getEntryCount(context(), &status), 2u);
    EXPECT_TRUE(misuses().empty());
    EXPECT_EQ(textOf(string), nullptr);
    EXPECT_EQ(misuses().size(), 1u);
}

TEST_F(BrokerLifetime, AddressesAreNotUsedAgainSoon) {
    CMPIString* first = broker.makeString("first");
    leaveCall();
    for (int round = 0; round < 1000; ++round) {
        const Broker::CallScope call(broker);
        EXPECT_NE(broker.makeString("later"), first);
    }
    EXPECT_EQ(textOf(first), nullptr);
    EXPECT_EQ(misuses().size(), 1u);
}

TEST(QuarantineTest, KeepsTheLastEndedObjectsAndNoMore) {
    Repository repository;
    const BrokerOptions options;
    Books books;
    Faults faults;
    BrokerCore core{repository, options, books, faults, {}, {}, {}};
    auto first = std::make_shared<StringObject>(core, "first");
    const std::weak_ptr<StringObject> watched = first;
    first->begin(false);
    first->end();
    first.reset();
    for (int number = 0; number < 65535; ++number) {
        core.quarantine.add(std::make_shared<StringObject>(core, std::nullopt));
    }
    EXPECT_FALSE(watched.expired());
    core.quarantine.add(std::make_shared<StringObject>(core, std::nullopt));
    EXPECT_TRUE(watched.expired());
}

TEST(BrokerEnd, EverythingButClonesEndsWithTheBroker) {
    Repository repository;
    CMPIString* clone = nullptr;
    {
        Broker broker(repository);
        CMPIString* string = broker.makeString("outside of any call");
        clone = string->ft->clone(string, nullptr);
        EXPECT_EQ(broker.books().liveClones(), 1u);
        clone->ft->release(clone);
        EXPECT_EQ(broker.books().live(), 1u);
    }
}

}  // namespace
}  // namespace testbed
