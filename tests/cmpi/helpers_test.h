/*
 * Status helpers, flag tests, cloning, messages. Included once for the inline and once for the
 * macro form, under another FORM each.
 */
#include <gtest/gtest.h>

#include <cstdarg>
#include <string>

#include "fake_tables.h"

static std::string g_text;
static CMPIString g_madeString;

static CMPIString* MakeString(const CMPIBroker*, const char* text, CMPIStatus*) {
    g_text = text;
    return &g_madeString;
}

TEST(FORM, StatusHelpers) {
    Fake f;
    f.eft.newString = MakeString;
    CMPIString string{};
    CMPIStatus status{CMPI_RC_ERR_FAILED, &string};

    CMSetStatus(&status, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(status.msg, nullptr);

    CMSetStatusWithString(&status, CMPI_RC_ERR_FAILED, &string);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(status.msg, &string);

    CMSetStatusWithChars(f.samples.broker, &status, CMPI_RC_ERR_INVALID_CLASS, "bad class");
    EXPECT_EQ(status.rc, CMPI_RC_ERR_INVALID_CLASS);
    EXPECT_EQ(status.msg, &g_madeString);
    EXPECT_EQ(g_text, "bad class");

    CMSetStatusWithChars(nullptr, &status, CMPI_RC_ERR_FAILED, "nobody to make it");
    EXPECT_EQ(status.rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(status.msg, nullptr);
}

TEST(FORM, StatusHelpersTakeNull) {
    Fake f;
    f.eft.newString = MakeString;
    CMPIStatus* none = nullptr;
    g_text = "untouched";
    CMSetStatus(none, CMPI_RC_OK);
    CMSetStatusWithString(none, CMPI_RC_OK, nullptr);
    CMSetStatusWithChars(f.samples.broker, none, CMPI_RC_OK, "unwanted");
    EXPECT_EQ(g_text, "untouched");
}

static CMPIStatus ReturnsCode() {
    CMReturn(CMPI_RC_ERR_TYPE_MISMATCH);
}

static CMPIStatus ReturnsString(CMPIString* string) {
    CMReturnWithString(CMPI_RC_ERR_INVALID_QUERY, string);
}

static CMPIStatus ReturnsChars(const CMPIBroker* broker) {
    CMReturnWithChars(broker, CMPI_RC_ERR_ALREADY_EXISTS, "twice");
}

TEST(FORM, Returns) {
    Fake f;
    f.eft.newString = MakeString;
    CMPIString string{};
    EXPECT_EQ(ReturnsCode().rc, CMPI_RC_ERR_TYPE_MISMATCH);
    EXPECT_EQ(ReturnsCode().msg, nullptr);
    EXPECT_EQ(ReturnsString(&string).rc, CMPI_RC_ERR_INVALID_QUERY);
    EXPECT_EQ(ReturnsString(&string).msg, &string);
    EXPECT_EQ(ReturnsChars(&f.broker).rc, CMPI_RC_ERR_ALREADY_EXISTS);
    EXPECT_EQ(ReturnsChars(&f.broker).msg, &g_madeString);
    EXPECT_EQ(g_text, "twice");
    EXPECT_EQ(ReturnsChars(nullptr).msg, nullptr);
}

TEST(FORM, FlagTests) {
    CMPIData data{};
    EXPECT_FALSE(CMIsNullValue(data));
    EXPECT_FALSE(CMIsKeyValue(data));
    EXPECT_FALSE(CMIsArray(data));
    data.state = CMPI_nullValue;
    EXPECT_TRUE(CMIsNullValue(data));
    EXPECT_FALSE(CMIsKeyValue(data));
    data.state = CMPI_keyValue;
    EXPECT_FALSE(CMIsNullValue(data));
    EXPECT_TRUE(CMIsKeyValue(data));
    data.type = CMPI_stringA;
    EXPECT_TRUE(CMIsArray(data));

    CMPIString string{};
    const CMPIString* present = &string;
    const CMPIString* absent = nullptr;
    EXPECT_FALSE(CMIsNullObject(present));
    EXPECT_TRUE(CMIsNullObject(absent));
}

TEST(FORM, CloneAndRelease) {
    Fake f;
    Record<1>(f.pathFt.clone);
    Record<2>(f.pathFt.release);
    EXPECT_EQ(Word(CMClone(f.samples.path, f.samples.status)), std::uintptr_t{kResult});
    EXPECT_EQ(g_call.line, 1);
    EXPECT_EQ(g_call.arguments, Words(f.samples.path, f.samples.status));
    EXPECT_EQ(Word(CMRelease(f.samples.path)), std::uintptr_t{kResult});
    EXPECT_EQ(g_call.line, 2);
    EXPECT_EQ(g_call.arguments, Words(f.samples.path));
}

TEST(FORM, CharPtrAsksTheTable) {
    Fake f;
    Record<3>(f.stringFt.getCharPtr);
    EXPECT_EQ(Word(CMGetCharPtr(f.samples.string)), std::uintptr_t{kResult});
    EXPECT_EQ(g_call.line, 3);
    EXPECT_EQ(g_call.arguments, Words(f.samples.string, static_cast<CMPIStatus*>(nullptr)));
}

TEST(FORM, BrokerData) {
    Fake f;
    f.bft.brokerCapabilities = CMPI_MB_Indications;
    f.bft.brokerVersion = CMPIVersion200;
    f.bft.brokerName = "a name";
    EXPECT_EQ(CBGetCapabilities(f.samples.broker), unsigned{CMPI_MB_Indications});
    EXPECT_EQ(CBBrokerVersion(f.samples.broker), CMPIVersion200);
    EXPECT_STREQ(CBBrokerName(f.samples.broker), "a name");
}

/* Reads the inserts back in the types that the lists promise. */
static std::string ReadInserts(CMPICount count, va_list inserts) {
    std::string text;
    for (CMPICount i = 0; i < count; ++i) {
        switch (va_arg(inserts, int)) {
            case CMPI_sint32:
                text += std::to_string(va_arg(inserts, long));
                break;
            case CMPI_uint32:
                text += std::to_string(va_arg(inserts, unsigned long));
                break;
            case CMPI_sint64:
                text += std::to_string(va_arg(inserts, long long));
                break;
            case CMPI_uint64:
                text += std::to_string(va_arg(inserts, unsigned long long));
                break;
            case CMPI_real64:
                text += std::to_string(va_arg(inserts, double));
                break;
            case CMPI_boolean:
                text += va_arg(inserts, int) ? "yes" : "no";
                break;
            case CMPI_chars:
                text += va_arg(inserts, char*);
                break;
            case CMPI_string:
                text += va_arg(inserts, CMPIString*) == &g_madeString ? "made" : "other";
                break;
            default:
                return text + "unknown type";
        }
        text += ' ';
    }
    return text;
}

static CMPIString* ReadMessage(const CMPIBroker*, const char* id, const char* text, CMPIStatus*,
                               CMPICount count, ...) {
    va_list inserts;
    va_start(inserts, count);
    g_text = std::string(id) + ":" + text + ":" + ReadInserts(count, inserts);
    va_end(inserts);
    return &g_madeString;
}

static CMPIString* ReadMessage2(const CMPIBroker*, const char* id, CMPIMsgFileHandle handle,
                                const char* text, CMPIStatus*, CMPICount count, ...) {
    va_list inserts;
    va_start(inserts, count);
    g_text = std::string(id) + "@" + static_cast<const char*>(handle) + ":" + text + ":" +
             ReadInserts(count, inserts);
    va_end(inserts);
    return &g_madeString;
}

TEST(FORM, MessagesCarryTheirInserts) {
    Fake f;
    f.eft.getMessage = ReadMessage;
    f.eft.getMessage2 = ReadMessage2;
    char text[] = "text";
    char file[] = "file";
    EXPECT_EQ(CMGetMessage(&f.broker, "id", "default", nullptr, CMFmtArgs0()), &g_madeString);
    EXPECT_EQ(g_text, "id:default:");
    CMGetMessage(
        &f.broker, "id", "d", nullptr,
        CMFmtArgs8(CMFmtSint(-1), CMFmtUint(2u), CMFmtSint64(-3), CMFmtUint64(4u), CMFmtReal(0.5),
                   CMFmtBoolean(1), CMFmtChars(text), CMFmtString(&g_madeString)));
    EXPECT_EQ(g_text, "id:d:-1 2 -3 4 0.500000 yes text made ");
    CMGetMessage2(&f.broker, "id", file, "d", nullptr, CMFmtArgs2(CMFmtSint(5), CMFmtSint(6)));
    EXPECT_EQ(g_text, "id@file:d:5 6 ");
}
