// Texts out of values, strings, statuses and paths: never by following what is no pointer.
#include "PlexorProviderUtil.h"
#include "fake_instance.h"
#include "provider_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testbed::Entry;
using testbed::ObjectPath;

class ValueTextTest : public ProviderTest {
protected:
    CMPIData string(CMPIString* text, CMPIValueState state = CMPI_goodValue) {
        CMPIData data = dataOf(CMPI_string, 0, state);
        data.value.string = text;
        return data;
    }
    static CMPIData chars(const char* text, CMPIValueState state = CMPI_goodValue) {
        CMPIData data = dataOf(CMPI_chars, 0, state);
        data.value.chars = const_cast<char*>(text);
        return data;
    }
};

TEST_F(ValueTextTest, StringsAndCharactersHaveAText) {
    EXPECT_STREQ(ValueText(string(broker.makeString("text"))), "text");
    EXPECT_STREQ(ValueText(string(broker.makeString(""))), "");
    EXPECT_STREQ(ValueText(chars("text")), "text");
}

TEST_F(ValueTextTest, KeysHaveAText) {
    EXPECT_STREQ(ValueText(chars("text", CMPI_keyValue)), "text");
    EXPECT_STREQ(ValueText(string(broker.makeString("text"), CMPI_keyValue)), "text");
}

TEST_F(ValueTextTest, StringsWithoutTextHaveNone) {
    EXPECT_EQ(ValueText(string(nullptr)), nullptr);
    EXPECT_EQ(ValueText(string(broker.makeNullString())), nullptr);
    EXPECT_EQ(ValueText(chars(nullptr)), nullptr);
}

TEST_F(ValueTextTest, ValuesThatAreNoneHaveNone) {
    for (const CMPIValueState state : {CMPI_nullValue, CMPI_notFound, CMPI_badValue}) {
        EXPECT_EQ(ValueText(chars("text", state)), nullptr);
        EXPECT_EQ(ValueText(string(broker.makeString("text"), state)), nullptr);
        EXPECT_EQ(ValueText(dataOf(CMPI_string, 1, state)), nullptr);
    }
}

// The value 1 would be a wild pointer.
TEST_F(ValueTextTest, ValuesOfEveryOtherTypeHaveNone) {
    for (const CMPIType type :
         {CMPI_null,        CMPI_boolean,  CMPI_char16, CMPI_real32,   CMPI_real64,  CMPI_uint8,
          CMPI_uint16,      CMPI_uint32,   CMPI_uint64, CMPI_sint8,    CMPI_sint16,  CMPI_sint32,
          CMPI_sint64,      CMPI_instance, CMPI_ref,    CMPI_args,     CMPI_class,   CMPI_filter,
          CMPI_enumeration, CMPI_dateTime, CMPI_ptr,    CMPI_charsptr, CMPI_stringA, CMPI_charsA,
          CMPI_uint16A,     CMPI_uint64A}) {
        EXPECT_EQ(ValueText(dataOf(type, 1)), nullptr) << testbed::typeName(type);
        EXPECT_EQ(ValueText(dataOf(type, 1, CMPI_keyValue)), nullptr) << testbed::typeName(type);
    }
}

TEST_F(ValueTextTest, StringObjectHasItsText) {
    EXPECT_STREQ(StringText(broker.makeString("text")), "text");
    EXPECT_EQ(StringText(broker.makeNullString()), nullptr);
    EXPECT_EQ(StringText(nullptr), nullptr);
}

TEST_F(ValueTextTest, StatusHasItsMessageOrTheWordNull) {
    EXPECT_STREQ(StatusText({CMPI_RC_ERR_FAILED, broker.makeString("broken")}), "broken");
    EXPECT_STREQ(StatusText({CMPI_RC_ERR_FAILED, nullptr}), "NULL");
    EXPECT_STREQ(StatusText({CMPI_RC_ERR_FAILED, broker.makeNullString()}), "NULL");
}

class PathTextTest : public ProviderTest {
protected:
    const ObjectPath kPath{"root/sample", "Sample_Battery", {{"DeviceID", CimValue::string("B0")}}};
};

TEST_F(PathTextTest, IsWhatThePathSays) {
    EXPECT_STREQ(PathText(LOG_DEBUG, broker.makePath(kPath)), kPath.text().c_str());
}

TEST_F(PathTextTest, IsTheWordNullWithoutAPath) {
    EXPECT_STREQ(PathText(LOG_DEBUG, nullptr), "NULL");
    setlogmask(LOG_UPTO(LOG_ERR));
    EXPECT_STREQ(PathText(LOG_DEBUG, nullptr), "NULL");
}

TEST_F(PathTextTest, IsTheWordNullWhenThePathRefuses) {
    const CMPIObjectPath* path = broker.makePath(kPath);
    faults().add(refusal(Entry::PathToString));
    EXPECT_STREQ(PathText(LOG_DEBUG, path), "NULL");
}

TEST_F(PathTextTest, IsNotMadeForLinesThatNobodySees) {
    const CMPIObjectPath* path = broker.makePath(kPath);
    books().recordObjectCalls(true);
    setlogmask(LOG_UPTO(LOG_INFO));
    EXPECT_STREQ(PathText(LOG_DEBUG, path), "");
    EXPECT_EQ(books().count(Entry::PathToString), 0u);
    EXPECT_STREQ(PathText(LOG_INFO, path), kPath.text().c_str());
    EXPECT_EQ(books().count(Entry::PathToString), 1u);
}

TEST_F(PathTextTest, LogMaskDecidesWhatIsSeen) {
    setlogmask(LOG_UPTO(LOG_WARNING));
    EXPECT_TRUE(LogEnabled(LOG_ERR));
    EXPECT_TRUE(LogEnabled(LOG_WARNING));
    EXPECT_FALSE(LogEnabled(LOG_INFO));
    EXPECT_FALSE(LogEnabled(LOG_DEBUG));
    EXPECT_EQ(setlogmask(0), LOG_UPTO(LOG_WARNING));
}

}  // namespace
}  // namespace plexortest
