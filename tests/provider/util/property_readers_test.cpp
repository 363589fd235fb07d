// Reading scalar properties and keys without trusting their types.
#include "PlexorProviderUtil.h"
#include "PlexorProviderUtilManager.h"
#include "fake_instance.h"
#include "keys_fake_path.h"
#include "provider_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testbed::Entry;
using testbed::Instance;
using testbed::ObjectPath;

class PropertyReaders : public ProviderTest {
protected:
    CMPIInstance* instanceWith(CimValue value) {
        Instance instance;
        instance.path = {"root/sample", "Sample_Thing", {}};
        instance.set("P", std::move(value));
        return broker.makeInstance(instance);
    }
    /// What every reader of the property says.
    void expectNumber(const CMPIInstance* instance, CMPIUint64 number) {
        EXPECT_EQ(ReadUint64(instance, "P"), number);
        EXPECT_EQ(ReadUint16(instance, "P"), static_cast<CMPIUint16>(number));
        EXPECT_EQ(ReadUint8(instance, "P"), static_cast<CMPIUint8>(number));
        EXPECT_EQ(ReadBoolean(instance, "P"), number != 0 ? 1 : 0);
        EXPECT_EQ(ReadString(instance, "P"), nullptr);
        EXPECT_EQ(ReadArrayUint16(instance, "P"), 0);
    }
    void expectNothing(const CMPIInstance* instance) { expectNumber(instance, 0); }
};

TEST_F(PropertyReaders, NumbersOfEveryWidth) {
    expectNumber(instanceWith(CimValue::uint8(200)), 200);
    expectNumber(instanceWith(CimValue::uint16(40000)), 40000);
    expectNumber(instanceWith(CimValue::uint32(4000000000u)), 4000000000u);
    expectNumber(instanceWith(CimValue::uint64(0x123456789abcdef0)), 0x123456789abcdef0);
    expectNumber(instanceWith(CimValue::signedInteger(CMPI_sint8, 5)), 5);
    expectNumber(instanceWith(CimValue::signedInteger(CMPI_sint16, 300)), 300);
    expectNumber(instanceWith(CimValue::signedInteger(CMPI_sint32, 70000)), 70000);
    expectNumber(instanceWith(CimValue::signedInteger(CMPI_sint64, 1ll << 40)), 1ull << 40);
}

TEST_F(PropertyReaders, NegativeNumbersKeepTheirBits) {
    expectNumber(instanceWith(CimValue::signedInteger(CMPI_sint8, -1)), ~0ull);
    expectNumber(instanceWith(CimValue::signedInteger(CMPI_sint64, -2)), ~1ull);
}

TEST_F(PropertyReaders, TruthValues) {
    expectNumber(instanceWith(CimValue::boolean(true)), 1);
    expectNumber(instanceWith(CimValue::boolean(false)), 0);
}

TEST_F(PropertyReaders, EveryNumberButZeroIsTrue) {
    EXPECT_EQ(ReadBoolean(instanceWith(CimValue::uint16(256)), "P"), 1);
    EXPECT_EQ(ReadBoolean(instanceWith(CimValue::uint64(1ull << 32)), "P"), 1);
}

TEST_F(PropertyReaders, Texts) {
    const CMPIInstance* instance = instanceWith(CimValue::string("text"));
    EXPECT_STREQ(ReadString(instance, "P"), "text");
    EXPECT_EQ(ReadUint64(instance, "P"), 0u);
    EXPECT_EQ(ReadBoolean(instance, "P"), 0);
    EXPECT_EQ(ReadArrayUint16(instance, "P"), 0);
    EXPECT_STREQ(ReadString(instanceWith(CimValue::string("")), "P"), "");
}

TEST_F(PropertyReaders, NumbersAsTextsAreNoNumbers) {
    EXPECT_EQ(ReadUint16(instanceWith(CimValue::string("12")), "P"), 0);
}

TEST_F(PropertyReaders, FractionsAreNoNumbers) {
    expectNothing(instanceWith(CimValue::real64(2.5)));
}

TEST_F(PropertyReaders, NullsAreNothing) {
    for (const CMPIType type :
         {CMPI_string, CMPI_uint16, CMPI_uint64, CMPI_boolean, CMPI_uint16A, CMPI_stringA}) {
        expectNothing(instanceWith(CimValue::null(type)));
    }
}

TEST_F(PropertyReaders, AbsentPropertiesAreNothing) {
    Instance instance;
    instance.path = {"root/sample", "Sample_Thing", {}};
    instance.set("Q", CimValue::uint16(7));
    expectNothing(broker.makeInstance(instance));
}

TEST_F(PropertyReaders, WithoutAnInstanceThereIsNothing) {
    expectNothing(nullptr);
    EXPECT_NE(ReadProperty(nullptr, "P").state & CMPI_nullValue, 0);
}

TEST_F(PropertyReaders, ReferencesAreNothing) {
    expectNothing(instanceWith(CimValue::reference({"root/sample", "Sample_Thing", {}})));
}

TEST_F(PropertyReaders, ArraysAreNoScalars) {
    for (const CimValue& value :
         {CimValue::uint16Array({2, 3}), CimValue::array(CMPI_uint64, {CimValue::uint64(2)}),
          CimValue::stringArray({"text"}),
          CimValue::array(CMPI_boolean, {CimValue::boolean(true)})}) {
        const CMPIInstance* instance = instanceWith(value);
        EXPECT_EQ(ReadUint64(instance, "P"), 0u);
        EXPECT_EQ(ReadUint16(instance, "P"), 0);
        EXPECT_EQ(ReadUint8(instance, "P"), 0);
        EXPECT_EQ(ReadBoolean(instance, "P"), 0);
        EXPECT_EQ(ReadString(instance, "P"), nullptr);
    }
}

TEST_F(PropertyReaders, FirstElementsOfArrays) {
    EXPECT_EQ(ReadArrayUint16(instanceWith(CimValue::uint16Array({10, 11})), "P"), 10);
    EXPECT_EQ(ReadArrayUint16(instanceWith(CimValue::uint16Array({})), "P"), 0);
    EXPECT_EQ(ReadArrayUint16(instanceWith(CimValue::stringArray({"10"})), "P"), 0);
    EXPECT_EQ(
        ReadArrayUint16(instanceWith(CimValue::array(CMPI_uint32, {CimValue::uint32(13)})), "P"),
        13);
}

// What an instance says of no type that anybody knows is nothing, whatever its bits are.
TEST_F(PropertyReaders, UnknownTypesAreNothing) {
    for (const CMPIType type : {CMPI_ptr, CMPI_charsptr, CMPI_dateTime, CMPI_instance, CMPI_args}) {
        FakeInstance fake(dataOf(type, 1));
        expectNothing(&fake.instance);
    }
}

TEST_F(PropertyReaders, ValuesMarkedAsNoneAreNothing) {
    for (const CMPIValueState state : {CMPI_nullValue, CMPI_notFound, CMPI_badValue}) {
        FakeInstance fake(dataOf(CMPI_uint16, 7, state));
        expectNothing(&fake.instance);
    }
}

TEST_F(PropertyReaders, RefusedPropertiesAreNothing) {
    FakeInstance fake(dataOf(CMPI_uint16, 7));
    fake.rc = CMPI_RC_ERR_FAILED;
    expectNothing(&fake.instance);
}

class KeyReaders : public ProviderTest {
protected:
    CMPIObjectPath* pathWith(CimValue value) {
        ObjectPath path{"root/sample", "Sample_Thing", {}};
        path.key("K", std::move(value));
        return broker.makePath(path);
    }
};

TEST_F(KeyReaders, Texts) {
    EXPECT_STREQ(ReadKey(pathWith(CimValue::string("text")), "K"), "text");
    EXPECT_STREQ(ReadKey(pathWith(CimValue::string("text")), "k"), "text");
}

TEST_F(KeyReaders, EverythingElseIsNothing) {
    EXPECT_EQ(ReadKey(pathWith(CimValue::uint64(1)), "K"), nullptr);
    EXPECT_EQ(ReadKey(pathWith(CimValue::boolean(true)), "K"), nullptr);
    EXPECT_EQ(ReadKey(pathWith(CimValue::signedInteger(CMPI_sint32, -1)), "K"), nullptr);
    EXPECT_EQ(ReadKey(pathWith(CimValue::null(CMPI_string)), "K"), nullptr);
    EXPECT_EQ(ReadKey(pathWith(CimValue::string("text")), "Other"), nullptr);
    EXPECT_EQ(ReadKey(nullptr, "K"), nullptr);
}

TEST_F(KeyReaders, RefusedKeysAreNothing) {
    const CMPIObjectPath* path = pathWith(CimValue::string("text"));
    faults().add(refusal(Entry::PathGetKey));
    EXPECT_EQ(ReadKey(path, "K"), nullptr);
}

TEST_F(KeyReaders, KeysOfAWrongTypeAreNothing) {
    const CMPIObjectPath* path = pathWith(CimValue::string("text"));
    testbed::FaultRule rule = refusal(Entry::PathGetKey, CMPI_RC_OK);
    rule.wrongType = true;
    faults().add(rule);
    EXPECT_EQ(ReadKey(path, "K"), nullptr);
}

TEST_F(KeyReaders, ClassNames) {
    EXPECT_STREQ(ClassNameText(pathWith(CimValue::string("text"))), "Sample_Thing");
    EXPECT_EQ(ClassNameText(nullptr), nullptr);
    const CMPIObjectPath* path = pathWith(CimValue::string("text"));
    faults().add(refusal(Entry::PathGetClassName));
    EXPECT_EQ(ClassNameText(path), nullptr);
}

class BrokerObjects : public ProviderTest {
protected:
    const ObjectPath kPath{"root/sample", "Sample_Thing", {{"K", CimValue::string("1")}}};
    Instance instanceAt(const ObjectPath& path) {
        Instance instance;
        instance.path = path;
        return instance;
    }
};

TEST_F(BrokerObjects, PathOfAnInstance) {
    const CMPIObjectPath* path = InstancePath(broker.makeInstance(instanceAt(kPath)));
    ASSERT_NE(path, nullptr);
    EXPECT_EQ(testbed::Broker::toPath(path), kPath);
    EXPECT_EQ(InstancePath(nullptr), nullptr);
}

TEST_F(BrokerObjects, ClonesAreReleasedAndForgotten) {
    CMPIObjectPath* path = ClonePath(broker.makePath(kPath));
    CMPIInstance* instance = CloneInstance(broker.makeInstance(instanceAt(kPath)));
    ASSERT_NE(path, nullptr);
    ASSERT_NE(instance, nullptr);
    EXPECT_EQ(books().liveClones(), 2u);
    ReleasePath(path);
    ReleaseInstance(instance);
    EXPECT_EQ(path, nullptr);
    EXPECT_EQ(instance, nullptr);
    EXPECT_EQ(books().liveClones(), 0u);
    ReleasePath(path);
    ReleaseInstance(instance);
}

TEST_F(BrokerObjects, NullsAreNotCloned) {
    EXPECT_EQ(ClonePath(nullptr), nullptr);
    EXPECT_EQ(CloneInstance(nullptr), nullptr);
}

TEST_F(BrokerObjects, AKeyNeedsNoStatus) {
    plexortest::FakeString text("text");
    plexortest::ScriptedPath path;
    path.answer.type = CMPI_string;
    path.answer.value.string = &text;
    path.answerStatus.reset();
    EXPECT_STREQ(ReadKey(&path, "K"), "text") << "a manager may tell of failures only";
    path.answerStatus = CMPI_RC_ERR_FAILED;
    EXPECT_EQ(ReadKey(&path, "K"), nullptr);
}

TEST_F(BrokerObjects, FailedClonesAreNull) {
    const CMPIObjectPath* path = broker.makePath(kPath);
    faults().add(refusal(Entry::Clone));
    EXPECT_EQ(ClonePath(path), nullptr);
}

TEST_F(BrokerObjects, EnumerationsEndWhereTheySay) {
    const CMPIEnumeration* two =
        broker.makeInstanceEnumeration({instanceAt(kPath), instanceAt(kPath)});
    EXPECT_TRUE(HasNext(two));
    EXPECT_NE(NextInstance(two), nullptr);
    EXPECT_NE(NextInstance(two), nullptr);
    EXPECT_FALSE(HasNext(two));
    EXPECT_FALSE(HasNext(nullptr));
}

TEST_F(BrokerObjects, ElementsOfAnotherKindAreNull) {
    EXPECT_EQ(NextPath(broker.makeInstanceEnumeration({instanceAt(kPath)})), nullptr);
    EXPECT_EQ(NextInstance(broker.makePathEnumeration({kPath})), nullptr);
    EXPECT_NE(NextPath(broker.makePathEnumeration({kPath})), nullptr);
    const CMPIEnumeration* numbers = broker.makePathEnumeration({kPath});
    testbed::FaultRule rule = refusal(Entry::EnumerationGetNext, CMPI_RC_OK);
    rule.wrongType = true;
    faults().add(rule);
    EXPECT_EQ(NextPath(numbers), nullptr);
}

TEST_F(BrokerObjects, ANullPathIsPassedOver) {
    /// Three elements: a null path, a path, a null path.
    struct Paths {
        int given = 0;
        const CMPIObjectPath* second;
    };
    Paths paths{0, broker.makePath(kPath)};
    CMPIEnumerationFT table = {};
    table.hasNext = [](const CMPIEnumeration* self, CMPIStatus*) -> CMPIBoolean {
        return static_cast<const Paths*>(self->hdl)->given < 3;
    };
    table.getNext = [](const CMPIEnumeration* self, CMPIStatus*) {
        auto* of = static_cast<Paths*>(const_cast<void*>(self->hdl));
        CMPIData data = dataOf(CMPI_ref, 0);
        if (++of->given == 2) data.value.ref = const_cast<CMPIObjectPath*>(of->second);
        return data;
    };
    const CMPIEnumeration enumeration = {&paths, &table};
    EXPECT_EQ(NextPath(&enumeration), paths.second);
    EXPECT_EQ(NextPath(&enumeration), nullptr);
    EXPECT_EQ(paths.given, 3);
}

TEST_F(BrokerObjects, AThousandElementsOfAnotherKindInARowEndTheWalk) {
    const std::vector<ObjectPath> paths(1001, kPath);
    const std::vector<Instance> instances(1001, instanceAt(kPath));
    bool failed = false;
    const CMPIEnumeration* noInstances = broker.makePathEnumeration(paths);
    EXPECT_EQ(NextInstance(noInstances, &failed), nullptr);
    EXPECT_TRUE(failed) << "more than an end: what comes behind them is not known";
    EXPECT_NE(NextPath(noInstances), nullptr) << "one is left";
    EXPECT_FALSE(HasNext(noInstances));
    EXPECT_EQ(NextInstance(broker.makePathEnumeration(paths)), nullptr);
    const CMPIEnumeration* noPaths = broker.makeInstanceEnumeration(instances);
    EXPECT_EQ(NextPath(noPaths), nullptr);
    EXPECT_NE(NextInstance(noPaths), nullptr);
    EXPECT_FALSE(HasNext(noPaths));
}

TEST_F(BrokerObjects, CurrentBrokerIsTheFactorysLatest) {
    EXPECT_EQ(CurrentBroker(), broker.handle());
}

TEST_F(BrokerObjects, NothingIsFlushedWithoutAContext) {
    FlushFactoryContext(nullptr);
    ItemSpan span(nullptr);
    EXPECT_EQ(span.Context(), nullptr);
    span.End();
    EXPECT_EQ(books().count(Entry::ContextFlush), 0u);
}

}  // namespace
}  // namespace plexortest
