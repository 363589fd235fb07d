// Keys of every type that a client can send. A value that is not a text is never followed.
#include <string>
#include <vector>

#include "keys_fixture.h"
#include "serve_fixture.h"

namespace {

using plexortest::CapturedSyslog;
using plexortest::FakeString;
using plexortest::LogLine;
using plexortest::refusedKey;
using plexortest::ScriptedPath;
using plexortest::SplitKey;
using testbed::CimValue;

using Lines = std::vector<LogLine>;

constexpr CMPIType kNoTextTypes[] = {
    CMPI_null,          CMPI_boolean,  CMPI_char16,        CMPI_real32,      CMPI_real64,
    CMPI_uint8,         CMPI_uint16,   CMPI_uint32,        CMPI_uint64,      CMPI_sint8,
    CMPI_sint16,        CMPI_sint32,   CMPI_sint64,        CMPI_instance,    CMPI_ref,
    CMPI_args,          CMPI_class,    CMPI_filter,        CMPI_enumeration, CMPI_dateTime,
    CMPI_ptr,           CMPI_charsptr, CMPI_booleanA,      CMPI_char16A,     CMPI_real32A,
    CMPI_real64A,       CMPI_uint8A,   CMPI_uint16A,       CMPI_uint32A,     CMPI_uint64A,
    CMPI_sint8A,        CMPI_sint16A,  CMPI_sint32A,       CMPI_sint64A,     CMPI_instanceA,
    CMPI_refA,          CMPI_stringA,  CMPI_charsA,        CMPI_dateTimeA,   CMPI_charsptrA,
    CMPI_SIMPLE,        CMPI_REAL,     CMPI_UINT,          CMPI_SINT,        CMPI_INTEGER,
    CMPI_ENC,           CMPI_ARRAY,    CMPI_integerString, CMPI_realString,  CMPI_numericString,
    CMPI_booleanString, 0xffff,
};

/// An address that nobody may read.
constexpr CMPIUint64 kWild = 0x5a5a5a5a5a5aULL;

class KeysTypesTest : public plexortest::KeysTest {
protected:
    static CMPIData wildData(CMPIType type, CMPIValueState state) {
        CMPIData data = {};
        data.type = type;
        data.state = state;
        data.value.uint64 = kWild;
        return data;
    }
    /// Both functions refuse the key and say nothing.
    void expectSilentRefusal(const CMPIData& data) {
        ScriptedPath path;
        path.answer = data;
        EXPECT_EQ(splitController(path.handle()), refusedKey(-3));
        EXPECT_EQ(splitDevice(path.handle(), "tvxPort"), refusedKey(-3));
        EXPECT_EQ(path.asked, (std::vector<std::string>{"Name", "DeviceID"}));
        EXPECT_EQ(CapturedSyslog::lines(), Lines{});
    }
};

TEST_F(KeysTypesTest, ValuesOfOtherTypesAreNeverFollowed) {
    for (const CMPIType type : kNoTextTypes) {
        SCOPED_TRACE("type " + std::to_string(type));
        expectSilentRefusal(wildData(type, CMPI_keyValue));
        expectSilentRefusal(wildData(type, CMPI_goodValue));
    }
}

TEST_F(KeysTypesTest, TextsWithoutAValueAreNeverFollowed) {
    for (const CMPIType type : {CMPI_string, CMPI_chars}) {
        for (const CMPIValueState state : {CMPI_nullValue, CMPI_badValue, CMPI_notFound}) {
            SCOPED_TRACE("type " + std::to_string(type) + ", state " + std::to_string(state));
            expectSilentRefusal(wildData(type, state));
            expectSilentRefusal(wildData(type, static_cast<CMPIValueState>(state | CMPI_keyValue)));
        }
    }
}

TEST_F(KeysTypesTest, NullPointersAreRefused) {
    for (const CMPIType type : {CMPI_string, CMPI_chars}) {
        CMPIData data = wildData(type, CMPI_keyValue);
        data.value.uint64 = 0;
        expectSilentRefusal(data);
    }
}

TEST_F(KeysTypesTest, StringObjectWithoutTextIsRefused) {
    FakeString empty(nullptr);
    CMPIData data = wildData(CMPI_string, CMPI_keyValue);
    data.value.string = &empty;
    expectSilentRefusal(data);
}

TEST_F(KeysTypesTest, StringObjectsAndCharactersAreTexts) {
    FakeString string("tvxPort12_5");
    static char chars[] = "tvxPort12_5";
    ScriptedPath path;
    path.answer = wildData(CMPI_string, CMPI_keyValue);
    path.answer.value.string = &string;
    EXPECT_EQ(splitDevice(path.handle(), "tvxPort"), (SplitKey{0, "12", "5"}));
    path.answer = wildData(CMPI_chars, CMPI_keyValue);
    path.answer.value.chars = chars;
    EXPECT_EQ(splitDevice(path.handle(), "tvxPort"), (SplitKey{0, "12", "5"}));
}

/// Keys as they come over the network, through the broker and the whole request.
class KeysFromClientsTest : public plexortest::ServeTest {
protected:
    void SetUp() override {
        ServeTest::SetUp();
        RaidController_t* ctrl = plexortest::attach(plexortest::newController("C0"));
        for (const plexortest::DeviceClass& device : plexortest::kDeviceClasses) {
            device.cache(ctrl, "d1");
        }
        CapturedSyslog::clear();
    }

    /// The class's path for C0 (and its device d1), with another value of the key that names it.
    static testbed::ObjectPath pathWithKey(const std::string& className, CimValue value) {
        testbed::ObjectPath path = {"root/cimv2", className, {}};
        path.key(keyName(className), std::move(value));
        return path;
    }
    static std::string keyName(const std::string& className) {
        if (className == plexortest::kController) return "Name";
        return className == plexortest::kSoftwareIdentity ? "InstanceID" : "DeviceID";
    }
};

TEST_F(KeysFromClientsTest, KeysThatAreNoTextNameNothing) {
    const testbed::ObjectPath other = {"root/cimv2", "Tovexa_Other", {}};
    const std::vector<CimValue> values = {
        CimValue::uint8(1),
        CimValue::uint16(0xffff),
        CimValue::uint32(7),
        CimValue::uint64(kWild),
        CimValue::signedInteger(CMPI_sint8, -1),
        CimValue::signedInteger(CMPI_sint64, -1),
        CimValue::boolean(true),
        CimValue::boolean(false),
        CimValue::real64(1e300),
        CimValue::reference(other),
        CimValue::stringArray({"tvxControllerC0", "tvxPortC0_d1"}),
        CimValue::uint16Array({1, 2}),
        CimValue::null(CMPI_string),
        CimValue::null(CMPI_uint32),
        CimValue::null(CMPI_ref),
    };
    for (const std::string& className : plexortest::servedClasses()) {
        for (const CimValue& value : values) {
            SCOPED_TRACE(className + " " + testbed::typeName(value.type) + " " + value.text());
            CapturedSyslog::clear();
            const testbed::ObjectPath path = pathWithKey(className, value);
            const testbed::Response response = client().getInstance(path);
            EXPECT_EQ(response.rc, 6);
            EXPECT_EQ(response.doneCalls, 0);
            EXPECT_TRUE(response.instances.empty());
            EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR),
                      (std::vector<std::string>{"Object path " + path.text() + " invalid\n"}));
        }
    }
}

TEST_F(KeysFromClientsTest, TextKeysOfTheSamePathsAreFound) {
    for (const plexortest::DeviceClass& device : plexortest::kDeviceClasses) {
        const testbed::Response response = client().getInstance(
            pathWithKey(device.name, CimValue::string(std::string(device.prefix) + "C0_d1")));
        EXPECT_EQ(response.rc, 0) << device.name;
        EXPECT_EQ(response.instances.size(), 1u) << device.name;
    }
}

// What the test bed's broker itself can be made to answer instead of the key.
TEST_F(KeysFromClientsTest, BrokersThatAnswerSomethingElseAreRefused) {
    for (const std::string& className : plexortest::servedClasses()) {
        for (const bool wrongType : {true, false}) {
            SCOPED_TRACE(className + (wrongType ? ": a number" : ": nothing"));
            testbed::FaultRule rule;
            rule.entry = testbed::Entry::PathGetKey;
            rule.wrongType = wrongType;
            rule.nullResult = !wrongType;
            const int id = faults().add(rule);
            const testbed::Response response =
                client().getInstance(pathWithKey(className, CimValue::string("tvxPortC0_d1")));
            faults().remove(id);
            EXPECT_EQ(response.rc, 6);
            EXPECT_TRUE(response.instances.empty());
        }
    }
}

// The order in which a client writes the keys, and keys that are none of the class's, are nothing
// to the provider.
TEST_F(KeysFromClientsTest, OtherKeysAreNotLookedAt) {
    testbed::ObjectPath path =
        pathWithKey("Tovexa_PlexorSASSATAPort", CimValue::string("tvxPortC0_d1"));
    path.key("SystemName", CimValue::uint64(kWild));
    path.key("CreationClassName", CimValue::boolean(true));
    const testbed::Response response = client().getInstance(path);
    EXPECT_EQ(response.rc, 0);
    EXPECT_EQ(response.instances.size(), 1u);
}

}  // namespace
