// The broker's makers, type tests and texts, and what it does not support.
#include <cerrno>
#include <cstring>

#include "broker_fixture.h"

namespace testbed {
namespace {

class BrokerFactories : public BrokerTest {
protected:
    CMPIStatus status = unsetStatus();
};

/// Whether every 8-byte entry of a table after its leading data is set.
template <class Table>
bool isComplete(const Table& table, std::size_t firstEntry) {
    const auto* bytes = reinterpret_cast<const char*>(&table);
    for (std::size_t at = firstEntry; at < sizeof table; at += sizeof(void*)) {
        void* entry = nullptr;
        std::memcpy(&entry, bytes + at, sizeof entry);
        if (entry == nullptr) return false;
    }
    return true;
}

TEST_F(BrokerFactories, EveryTableIsComplete) {
    EXPECT_TRUE(isComplete(calls(), offsetof(CMPIBrokerFT, brokerName)));
    EXPECT_TRUE(isComplete(makers(), 8));
    EXPECT_TRUE(isComplete(*handle()->xft, 8));
    Broker::Collected collected;
    EXPECT_TRUE(isComplete(*context()->ft, 8));
    EXPECT_TRUE(isComplete(*broker.makeResult(collected)->ft, 8));
    EXPECT_TRUE(isComplete(*broker.makeString("")->ft, 8));
    EXPECT_TRUE(isComplete(*broker.makePath({})->ft, 8));
    EXPECT_TRUE(isComplete(*broker.makeInstance({})->ft, 8));
    CMPIEnumeration* none = broker.makePathEnumeration({});
    EXPECT_TRUE(isComplete(*none->ft, 8));
    EXPECT_TRUE(isComplete(*none->ft->toArray(none, nullptr)->ft, 8));
}

TEST_F(BrokerFactories, SaysWhoItIs) {
    EXPECT_EQ(calls().brokerVersion, 100);
    EXPECT_STREQ(calls().brokerName, "plexor-testbed");
    EXPECT_EQ(calls().brokerCapabilities & CMPI_MB_AssociationTraversal,
              unsigned{CMPI_MB_AssociationTraversal});
}

TEST_F(BrokerFactories, StringsAreCopiedAndMayBeNull) {
    char text[] = "text";
    CMPIString* string = makers().newString(handle(), text, &status);
    text[0] = 'T';
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_STREQ(textOf(string), "text");
    EXPECT_STREQ(static_cast<const char*>(string->hdl), "text");
    EXPECT_EQ(textOf(makers().newString(handle(), nullptr, nullptr)), nullptr);
    EXPECT_EQ(textOf(broker.makeNullString()), nullptr);
}

TEST_F(BrokerFactories, ClassPathIsALooksInThePathsNamespace) {
    const auto isA = [&](CMPIObjectPath* path, const char* name) {
        status = unsetStatus();
        return makers().classPathIsA(handle(), path, name, &status) != 0;
    };
    EXPECT_TRUE(isA(classPath("sample_drive"), "CIM_Device"));
    EXPECT_FALSE(isA(classPath("CIM_Device"), "Sample_Drive"));
    EXPECT_FALSE(isA(classPath("Sample_Drive", "root/other"), "CIM_Device"));
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_FALSE(isA(classPath("CIM_Unknown"), "CIM_Device"));
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_FALSE(isA(classPath("CIM_Device"), nullptr));
    EXPECT_EQ(status.rc, CMPI_RC_ERR_INVALID_PARAMETER);
}

TEST_F(BrokerFactories, TextsAndTypesOfObjects) {
    const auto text = [&](const void* object) {
        return std::string(textOf(makers().toString(handle(), object, nullptr)));
    };
    EXPECT_EQ(text(broker.makeString("s")), "s");
    EXPECT_EQ(text(broker.makeNullString()), "");
    EXPECT_EQ(text(broker.makePath(drivePath("1"))), drivePath("1").text());
    EXPECT_EQ(text(broker.makeInstance(drive("1"))), drivePath("1").text() + " { DeviceID=1; }");
    EXPECT_EQ(text(context()), "context");

    const void* path = broker.makePath(drivePath("1"));
    EXPECT_TRUE(makers().isOfType(handle(), path, "CMPIObjectPath", nullptr));
    EXPECT_FALSE(makers().isOfType(handle(), path, "CMPIInstance", nullptr));
    EXPECT_STREQ(textOf(makers().getType(handle(), path, nullptr)), "CMPIObjectPath");
    EXPECT_TRUE(misuses().empty());

    EXPECT_EQ(makers().toString(handle(), &status, &status), nullptr);
    EXPECT_EQ(misuses().size(), 1u);
}

TEST_F(BrokerFactories, UnsupportedMakersSaySo) {
    EXPECT_EQ(makers().newArgs(handle(), &status), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_SUPPORTED);
    status = unsetStatus();
    EXPECT_EQ(makers().newDateTimeFromBinary(handle(), 1, 0, &status), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_SUPPORTED);
    status = unsetStatus();
    EXPECT_EQ(makers().newSelectExp(handle(), "q", "l", nullptr, &status), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_SUPPORTED);
    status = unsetStatus();
    EXPECT_EQ(makers().getMessage(handle(), "id", "text", &status, 0), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(makers().logMessage(handle(), CMPI_SEV_INFO, "id", "text", nullptr).rc,
              CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(makers().trace(handle(), CMPI_LEV_INFO, "id", "text", nullptr).rc,
              CMPI_RC_ERR_NOT_SUPPORTED);
}

TEST_F(BrokerFactories, UnsupportedCallsSaySo) {
    const CMPIObjectPath* path = broker.makePath(drivePath("1"));
    EXPECT_EQ(calls().createInstance(handle(), context(), path, nullptr, &status), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(calls().deleteInstance(handle(), context(), path).rc, CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(calls().deliverIndication(handle(), context(), "n", nullptr).rc,
              CMPI_RC_ERR_NOT_SUPPORTED);
    status = unsetStatus();
    calls().getProperty(handle(), context(), path, "p", &status);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(broker.books().count(Entry::Unsupported), 4u);
    EXPECT_EQ(handle()->xft->resolveFileName("x"), nullptr);
    EXPECT_EQ(handle()->xft->threadSleep(1), ENOTSUP);
}

TEST_F(BrokerFactories, ContextEntriesAreAMap) {
    const CMPIContext* ctx = context();
    const CMPICount before = ctx->ft->getEntryCount(ctx, nullptr);
    const CMPIUint32 flags = 8;
    EXPECT_EQ(ctx->ft->addEntry(ctx, "CMPIInvocationFlags", asValue(&flags), CMPI_uint32).rc,
              CMPI_RC_OK);
    EXPECT_EQ(ctx->ft->getEntryCount(ctx, nullptr), before);
    EXPECT_EQ(ctx->ft->addEntry(ctx, "Own", asValue("text"), CMPI_chars).rc, CMPI_RC_OK);
    EXPECT_EQ(ctx->ft->getEntry(ctx, "CMPIInvocationFlags", &status).value.uint32, 8u);
    CMPIString* name = nullptr;
    const CMPIData data = ctx->ft->getEntryAt(ctx, before, &name, nullptr);
    EXPECT_STREQ(textOf(name), "Own");
    EXPECT_STREQ(textOf(data.value.string), "text");
    ctx->ft->getEntry(ctx, "Missing", &status);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_FOUND);

    CMPIContext* clone = ctx->ft->clone(ctx, nullptr);
    EXPECT_EQ(clone->ft->getEntryCount(clone, nullptr), before + 1);
    EXPECT_EQ(clone->ft->release(clone).rc, CMPI_RC_OK);
}

TEST_F(BrokerFactories, ResultCollects) {
    Broker::Collected collected;
    CMPIResult* result = broker.makeResult(collected);
    result->ft->returnInstance(result, broker.makeInstance(drive("1")));
    result->ft->returnObjectPath(result, broker.makePath(drivePath("2")));
    result->ft->returnDone(result);
    EXPECT_EQ(result->ft->returnData(result, nullptr, CMPI_null).rc, CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(result->ft->returnInstance(result, nullptr).rc, CMPI_RC_ERR_INVALID_PARAMETER);
    CMPIResult* clone = result->ft->clone(result, nullptr);
    clone->ft->returnDone(clone);
    EXPECT_EQ(clone->ft->release(clone).rc, CMPI_RC_OK);
    ASSERT_EQ(collected.instances.size(), 1u);
    EXPECT_EQ(collected.instances[0], drive("1"));
    ASSERT_EQ(collected.paths.size(), 1u);
    EXPECT_EQ(collected.paths[0], drivePath("2"));
    EXPECT_EQ(collected.doneCalls, 2);
}

}  // namespace
}  // namespace testbed
