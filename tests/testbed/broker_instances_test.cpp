// Properties as a provider reads and sets them.
#include "broker_fixture.h"

namespace testbed {
namespace {

class BrokerInstances : public BrokerTest {
protected:
    using BrokerTest::BrokerTest;

    CMPIData read(const CMPIInstance* instance, const char* name) {
        status = unsetStatus();
        return instance->ft->getProperty(instance, name, &status);
    }
    CMPIrc set(const CMPIInstance* instance, const char* name, const void* value, CMPIType type) {
        return instance->ft->setProperty(instance, name, asValue(value), type).rc;
    }
    CMPIInstance* newDrive() {
        return makers().newInstance(handle(), classPath("CIM_Drive"), nullptr);
    }

    CMPIStatus status = unsetStatus();
};

TEST_F(BrokerInstances, AbsentPropertyIsNotFound) {
    const CMPIInstance* instance = broker.makeInstance(drive("1"));
    for (const char* name : {"Missing", static_cast<const char*>(nullptr)}) {
        const CMPIData data = read(instance, name);
        EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_FOUND);
        EXPECT_EQ(data.state, CMPI_notFound);
        EXPECT_EQ(data.value.uint64, 0u);
        EXPECT_EQ(data.value.array, nullptr);
    }
}

TEST_F(BrokerInstances, NullPropertiesByKind) {
    Instance content = drive("1");
    content.set("Number", CimValue::null(CMPI_uint16)).set("Text", CimValue::null(CMPI_string));
    content.set("List", CimValue::null(CMPI_uint16A));
    const CMPIInstance* instance = broker.makeInstance(content);

    CMPIData data = read(instance, "Number");
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_EQ(data.state, CMPI_nullValue);
    EXPECT_EQ(data.value.uint64, 0u);

    data = read(instance, "Text");
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_EQ(data.state, CMPI_nullValue);
    ASSERT_NE(data.value.string, nullptr);
    EXPECT_EQ(data.value.string->hdl, nullptr);
    EXPECT_EQ(textOf(data.value.string), nullptr);

    data = read(instance, "List");
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_EQ(data.state, CMPI_nullValue);
    EXPECT_EQ(data.type, CMPI_uint16A);
    EXPECT_EQ(data.value.array, nullptr);
}

TEST_F(BrokerInstances, ScalarReadAsArrayIsTheNumberItself) {
    const CMPIInstance* instance =
        broker.makeInstance(drive("1").set("Number", CimValue::uint16(3)));
    const CMPIData data = read(instance, "number");
    EXPECT_EQ(data.type, CMPI_uint16);
    EXPECT_EQ(reinterpret_cast<std::uintptr_t>(data.value.array), 3u);
}

TEST_F(BrokerInstances, EveryScalarTypeComesBack) {
    const CMPIInstance* instance = newDrive();
    const CMPIBoolean yes = 1;
    const CMPIUint8 u8 = 200;
    const CMPIUint16 u16 = 60000;
    const CMPIUint32 u32 = 4000000000u;
    const CMPIUint64 u64 = 18000000000000000000u;
    const CMPISint8 s8 = -5;
    const CMPISint16 s16 = -300;
    const CMPISint32 s32 = -70000;
    const CMPISint64 s64 = -5000000000;
    const CMPIReal32 r32 = 0.5f;
    const CMPIReal64 r64 = -2.25;
    EXPECT_EQ(set(instance, "boolean", &yes, CMPI_boolean), CMPI_RC_OK);
    EXPECT_EQ(set(instance, "u8", &u8, CMPI_uint8), CMPI_RC_OK);
    EXPECT_EQ(set(instance, "u16", &u16, CMPI_uint16), CMPI_RC_OK);
    EXPECT_EQ(set(instance, "u32", &u32, CMPI_uint32), CMPI_RC_OK);
    EXPECT_EQ(set(instance, "u64", &u64, CMPI_uint64), CMPI_RC_OK);
    EXPECT_EQ(set(instance, "s8", &s8, CMPI_sint8), CMPI_RC_OK);
    EXPECT_EQ(set(instance, "s16", &s16, CMPI_sint16), CMPI_RC_OK);
    EXPECT_EQ(set(instance, "s32", &s32, CMPI_sint32), CMPI_RC_OK);
    EXPECT_EQ(set(instance, "s64", &s64, CMPI_sint64), CMPI_RC_OK);
    EXPECT_EQ(set(instance, "r32", &r32, CMPI_real32), CMPI_RC_OK);
    EXPECT_EQ(set(instance, "r64", &r64, CMPI_real64), CMPI_RC_OK);
    EXPECT_EQ(read(instance, "boolean").value.boolean, yes);
    EXPECT_EQ(read(instance, "u8").value.uint8, u8);
    EXPECT_EQ(read(instance, "u16").value.uint16, u16);
    EXPECT_EQ(read(instance, "u32").value.uint32, u32);
    EXPECT_EQ(read(instance, "u64").value.uint64, u64);
    EXPECT_EQ(read(instance, "s8").value.sint8, s8);
    EXPECT_EQ(read(instance, "s16").value.sint16, s16);
    EXPECT_EQ(read(instance, "s32").value.sint32, s32);
    EXPECT_EQ(read(instance, "s64").value.sint64, s64);
    EXPECT_EQ(read(instance, "r32").value.real32, r32);
    EXPECT_EQ(read(instance, "r64").value.real64, r64);
}

TEST_F(BrokerInstances, CharactersAreTheValuePointerItselfAndCopied) {
    CMPIInstance* instance = newDrive();
    char text[] = "first";
    EXPECT_EQ(set(instance, "Name", text, CMPI_chars), CMPI_RC_OK);
    text[0] = 'F';
    const CMPIData data = read(instance, "Name");
    EXPECT_EQ(data.type, CMPI_string);
    EXPECT_STREQ(textOf(data.value.string), "first");
    EXPECT_STREQ(static_cast<const char*>(data.value.string->hdl), "first");
}

TEST_F(BrokerInstances, NullValuePointerStoresNull) {
    CMPIInstance* instance = newDrive();
    EXPECT_EQ(set(instance, "Name", nullptr, CMPI_chars), CMPI_RC_OK);
    EXPECT_EQ(read(instance, "Name").state, CMPI_nullValue);
    EXPECT_EQ(read(instance, "Name").type, CMPI_string);
    EXPECT_EQ(set(instance, "EnabledState", nullptr, CMPI_uint16), CMPI_RC_OK);
    EXPECT_EQ(read(instance, "EnabledState").state, CMPI_nullValue);
}

TEST_F(BrokerInstances, StringsAndReferencesAreCopied) {
    CMPIInstance* instance = newDrive();
    CMPIString* text = broker.makeString("copied");
    CMPIObjectPath* path = broker.makePath(drivePath("7"));
    EXPECT_EQ(set(instance, "Name", &text, CMPI_string), CMPI_RC_OK);
    EXPECT_EQ(set(instance, "Other", &path, CMPI_ref), CMPI_RC_OK);
    EXPECT_STREQ(textOf(read(instance, "Name").value.string), "copied");
    const CMPIData reference = read(instance, "Other");
    EXPECT_EQ(reference.type, CMPI_ref);
    EXPECT_EQ(Broker::toPath(reference.value.ref), drivePath("7"));
}

TEST_F(BrokerInstances, StringArraysUnderBothCodes) {
    for (const CMPIType code : {CMPIType{CMPI_charsA}, CMPIType{CMPI_stringA}}) {
        CMPIInstance* instance = newDrive();
        CMPIArray* array = makers().newArray(handle(), 1, CMPI_string, nullptr);
        array->ft->setElementAt(array, 0, asValue("one"), CMPI_chars);
        EXPECT_EQ(set(instance, "Names", &array, code), CMPI_RC_OK);
        const CMPIData data = read(instance, "Names");
        EXPECT_EQ(data.type, CMPI_stringA);
        ASSERT_NE(data.value.array, nullptr);
        const CMPIData element = data.value.array->ft->getElementAt(data.value.array, 0, nullptr);
        EXPECT_STREQ(textOf(element.value.string), "one");
    }
}

TEST_F(BrokerInstances, UnstorableTypeIsRefused) {
    CMPIInstance* instance = newDrive();
    CMPIDateTime* none = nullptr;
    EXPECT_EQ(set(instance, "When", &none, CMPI_dateTime), CMPI_RC_ERR_INVALID_DATA_TYPE);
    EXPECT_EQ(set(instance, nullptr, "x", CMPI_chars), CMPI_RC_ERR_INVALID_PARAMETER);
}

TEST_F(BrokerInstances, NewInstanceOfAKnownClassHasTheKeysOfItsPath) {
    const CMPIInstance* instance =
        makers().newInstance(handle(), broker.makePath(drivePath("7")), nullptr);
    EXPECT_EQ(Broker::toInstance(instance).find("DeviceID")->asString(), "7");
}

TEST_F(BrokerInstances, NewInstanceOfAKnownClassHasItsDefaults) {
    const CMPIInstance* instance = newDrive();
    EXPECT_EQ(instance->ft->getPropertyCount(instance, nullptr), 5u);
    EXPECT_EQ(read(instance, "EnabledState").value.uint16, 5);
    const CMPIData capacity = read(instance, "Capacity");
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_EQ(capacity.state, CMPI_nullValue);
    EXPECT_EQ(capacity.type, CMPI_uint64);
}

TEST_F(BrokerInstances, NewInstanceOfAnUnknownClassIsEmpty) {
    CMPIInstance* instance = makers().newInstance(handle(), classPath("CIM_Nothing"), &status);
    ASSERT_NE(instance, nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_EQ(instance->ft->getPropertyCount(instance, nullptr), 0u);
    EXPECT_EQ(makers().newInstance(handle(), nullptr, &status), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_INVALID_PARAMETER);
}

TEST_F(BrokerInstances, NumbersAreNotCheckedButNeverTexts) {
    CMPIInstance* instance = newDrive();
    const CMPIUint16 narrow = 3;
    EXPECT_EQ(set(instance, "Capacity", &narrow, CMPI_uint16), CMPI_RC_OK);
    EXPECT_EQ(read(instance, "Capacity").type, CMPI_uint16);
    EXPECT_EQ(set(instance, "DeviceID", &narrow, CMPI_uint16), CMPI_RC_ERR_TYPE_MISMATCH);
    EXPECT_EQ(set(instance, "Removable", "yes", CMPI_chars), CMPI_RC_OK);
    EXPECT_EQ(set(instance, "Unheard", &narrow, CMPI_uint16), CMPI_RC_OK);
    EXPECT_EQ(read(instance, "Unheard").value.uint16, 3);
}

TEST_F(BrokerInstances, FilterDropsPropertiesBeforeAndAfter) {
    CMPIInstance* instance = broker.makeInstance(drive("1").set("Capacity", CimValue::uint64(9)));
    const char* names[] = {"CAPACITY", "Name", nullptr};
    EXPECT_EQ(instance->ft->setPropertyFilter(instance, names, nullptr).rc, CMPI_RC_OK);
    EXPECT_EQ(instance->ft->getPropertyCount(instance, nullptr), 1u);
    EXPECT_EQ(set(instance, "DeviceID", "1", CMPI_chars), CMPI_RC_OK);
    EXPECT_EQ(set(instance, "Name", "n", CMPI_chars), CMPI_RC_OK);
    read(instance, "DeviceID");
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_STREQ(textOf(read(instance, "Name").value.string), "n");

    const CMPIObjectPath* path = instance->ft->getObjectPath(instance, nullptr);
    EXPECT_EQ(Broker::toPath(path), drivePath("1"));
}

TEST_F(BrokerInstances, FilterKeepsListedKeysAndLaterFiltersReplace) {
    CMPIInstance* instance = broker.makeInstance(drive("1"));
    const char* none[] = {nullptr};
    const char* keys[] = {"DeviceID", nullptr};
    instance->ft->setPropertyFilter(instance, none, keys);
    EXPECT_EQ(instance->ft->getPropertyCount(instance, nullptr), 1u);
    instance->ft->setPropertyFilter(instance, none, nullptr);
    EXPECT_EQ(instance->ft->getPropertyCount(instance, nullptr), 0u);
    instance->ft->setPropertyFilter(instance, nullptr, nullptr);
    set(instance, "Any", "x", CMPI_chars);
    EXPECT_EQ(instance->ft->getPropertyCount(instance, nullptr), 1u);
}

TEST_F(BrokerInstances, PropertiesByPosition) {
    const CMPIInstance* instance = broker.makeInstance(drive("1"));
    CMPIString* name = nullptr;
    const CMPIData data = instance->ft->getPropertyAt(instance, 0, &name, &status);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_STREQ(textOf(name), "DeviceID");
    EXPECT_STREQ(textOf(data.value.string), "1");
    instance->ft->getPropertyAt(instance, 1, nullptr, &status);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
}

TEST_F(BrokerInstances, ObjectPathCanBeReplaced) {
    CMPIInstance* instance = broker.makeInstance(drive("1"));
    EXPECT_EQ(instance->ft->setObjectPath(instance, broker.makePath(drivePath("2"))).rc,
              CMPI_RC_OK);
    EXPECT_EQ(Broker::toPath(instance->ft->getObjectPath(instance, nullptr)), drivePath("2"));
    EXPECT_EQ(Broker::toInstance(instance).find("DeviceID")->asString(), "1");
    EXPECT_EQ(instance->ft->setObjectPath(instance, nullptr).rc, CMPI_RC_ERR_INVALID_PARAMETER);
}

class StrictBrokerInstances : public BrokerInstances {
protected:
    static BrokerOptions strict() {
        BrokerOptions options;
        options.strictProperties = true;
        return options;
    }
    StrictBrokerInstances() : BrokerInstances(strict()) {}
};

TEST_F(StrictBrokerInstances, ChecksNamesAndTypesOfKnownClasses) {
    CMPIInstance* instance = newDrive();
    const CMPIUint16 narrow = 3;
    const CMPIUint64 wide = 3;
    EXPECT_EQ(set(instance, "Capacity", &narrow, CMPI_uint16), CMPI_RC_ERR_TYPE_MISMATCH);
    EXPECT_EQ(set(instance, "Capacity", &wide, CMPI_uint64), CMPI_RC_OK);
    EXPECT_EQ(set(instance, "Capacity", nullptr, CMPI_uint64), CMPI_RC_OK);
    EXPECT_EQ(set(instance, "Unheard", &wide, CMPI_uint64), CMPI_RC_ERR_NO_SUCH_PROPERTY);
    EXPECT_EQ(set(instance, "DeviceID", "text", CMPI_chars), CMPI_RC_OK);
    CMPIInstance* unknown = makers().newInstance(handle(), classPath("CIM_Nothing"), nullptr);
    EXPECT_EQ(set(unknown, "Unheard", &wide, CMPI_uint64), CMPI_RC_OK);
}

TEST_F(StrictBrokerInstances, ARefusedValueLeavesTheDefault) {
    CMPIInstance* instance = newDrive();
    const CMPIUint64 wide = 3;
    EXPECT_EQ(set(instance, "EnabledState", &wide, CMPI_uint64), CMPI_RC_ERR_TYPE_MISMATCH);
    EXPECT_EQ(*Broker::toInstance(instance).find("EnabledState"), CimValue::uint16(5));
}

TEST_F(StrictBrokerInstances, AResultTakesOnlyWhatHasItsKeys) {
    Broker::Collected collected;
    const CMPIResult* result = broker.makeResult(collected);
    const auto giveName = [&](const ObjectPath& path) {
        return result->ft->returnObjectPath(result, broker.makePath(path)).rc;
    };
    const auto giveInstance = [&](const ObjectPath& path) {
        return result->ft->returnInstance(result, broker.makeInstance({path, {}})).rc;
    };
    const ObjectPath keyless{"root/sample", "CIM_Drive", {}};
    ObjectPath numbered = keyless;
    numbered.key("deviceid", CimValue::uint64(1));
    for (const ObjectPath& path : {keyless, numbered}) {
        EXPECT_EQ(giveName(path), CMPI_RC_ERR_INVALID_PARAMETER);
        EXPECT_EQ(giveInstance(path), CMPI_RC_ERR_INVALID_PARAMETER);
    }
    EXPECT_TRUE(collected.paths.empty());
    EXPECT_TRUE(collected.instances.empty());
    EXPECT_EQ(giveName(drivePath("1")), CMPI_RC_OK);
    EXPECT_EQ(giveInstance(drivePath("1")), CMPI_RC_OK);
    EXPECT_EQ(giveName({"root/sample", "CIM_Nothing", {}}), CMPI_RC_OK);
    EXPECT_EQ(collected.paths.size(), 2u);
    EXPECT_EQ(collected.instances.size(), 1u);
}

}  // namespace
}  // namespace testbed
