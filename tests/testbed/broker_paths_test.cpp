// Object paths and their keys.
#include "broker_fixture.h"

namespace testbed {
namespace {

class BrokerPaths : public BrokerTest {
protected:
    CMPIStatus status = unsetStatus();
};

TEST_F(BrokerPaths, NewPathHasNamesAndNoKeys) {
    const CMPIObjectPath* path =
        makers().newObjectPath(handle(), "root/sample", "CIM_Drive", &status);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_STREQ(textOf(path->ft->getNameSpace(path, nullptr)), "root/sample");
    EXPECT_STREQ(textOf(path->ft->getClassName(path, nullptr)), "CIM_Drive");
    EXPECT_EQ(path->ft->getKeyCount(path, nullptr), 0u);
    EXPECT_NE(makers().newObjectPath(handle(), "no/where", "Nothing", &status), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
}

TEST_F(BrokerPaths, MissingKeyIsNotFound) {
    const CMPIObjectPath* path = broker.makePath(drivePath("1"));
    path->ft->getKey(path, "Missing", &status);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_FOUND);
    path->ft->getKey(path, nullptr, &status);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_FOUND);
}

TEST_F(BrokerPaths, KeysAreAddedReplacedAndReadWithoutCase) {
    CMPIObjectPath* path = classPath("CIM_Drive");
    const CMPIUint32 number = 17;
    EXPECT_EQ(path->ft->addKey(path, "DeviceID", asValue("old"), CMPI_chars).rc, CMPI_RC_OK);
    EXPECT_EQ(path->ft->addKey(path, "deviceid", asValue("new"), CMPI_chars).rc, CMPI_RC_OK);
    EXPECT_EQ(path->ft->addKey(path, "Slot", asValue(&number), CMPI_uint32).rc, CMPI_RC_OK);
    EXPECT_EQ(path->ft->getKeyCount(path, nullptr), 2u);

    CMPIData data = path->ft->getKey(path, "DEVICEID", &status);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_EQ(data.type, CMPI_string);
    EXPECT_EQ(data.state, CMPI_keyValue);
    EXPECT_STREQ(textOf(data.value.string), "new");

    CMPIString* name = nullptr;
    data = path->ft->getKeyAt(path, 1, &name, &status);
    EXPECT_STREQ(textOf(name), "Slot");
    EXPECT_EQ(data.type, CMPI_uint32);
    EXPECT_EQ(data.value.uint32, 17u);
    path->ft->getKeyAt(path, 2, nullptr, &status);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
}

TEST_F(BrokerPaths, KeyFromANullTextIsANullString) {
    CMPIObjectPath* path = classPath("CIM_Drive");
    EXPECT_EQ(path->ft->addKey(path, "DeviceID", nullptr, CMPI_chars).rc, CMPI_RC_OK);
    const CMPIData data = path->ft->getKey(path, "DeviceID", &status);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_NE(data.state & CMPI_nullValue, 0);
    ASSERT_NE(data.value.string, nullptr);
    EXPECT_EQ(textOf(data.value.string), nullptr);
}

TEST_F(BrokerPaths, BadKeysAreRefused) {
    CMPIObjectPath* path = classPath("CIM_Drive");
    EXPECT_EQ(path->ft->addKey(path, nullptr, asValue("x"), CMPI_chars).rc,
              CMPI_RC_ERR_INVALID_PARAMETER);
    EXPECT_EQ(path->ft->addKey(path, "", asValue("x"), CMPI_chars).rc,
              CMPI_RC_ERR_INVALID_PARAMETER);
}

TEST_F(BrokerPaths, PartsCanBeChangedAndTaken) {
    CMPIObjectPath* path = broker.makePath(drivePath("1"));
    CMPIObjectPath* other = classPath("CIM_Fan", "root/other");
    other->ft->setHostname(other, "host");
    path->ft->setNameSpace(path, "root/new");
    path->ft->setClassName(path, "CIM_New");
    EXPECT_STREQ(textOf(path->ft->toString(path, nullptr)), "root/new:CIM_New.DeviceID=\"1\"");

    EXPECT_EQ(path->ft->setNameSpaceFromObjectPath(path, other).rc, CMPI_RC_OK);
    EXPECT_STREQ(textOf(path->ft->getNameSpace(path, nullptr)), "root/other");
    EXPECT_STREQ(textOf(path->ft->getHostname(path, nullptr)), "");
    path->ft->setHostAndNameSpaceFromObjectPath(path, other);
    EXPECT_STREQ(textOf(path->ft->getHostname(path, nullptr)), "host");
    EXPECT_EQ(path->ft->setNameSpaceFromObjectPath(path, nullptr).rc,
              CMPI_RC_ERR_INVALID_PARAMETER);
}

TEST_F(BrokerPaths, QualifiersAreNotSupported) {
    const CMPIObjectPath* path = broker.makePath(drivePath("1"));
    path->ft->getClassQualifier(path, "q", &status);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_SUPPORTED);
    path->ft->getPropertyQualifier(path, "p", "q", &status);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_SUPPORTED);
    path->ft->getMethodQualifier(path, "m", "q", &status);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_SUPPORTED);
    path->ft->getParameterQualifier(path, "m", "p", "q", &status);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_SUPPORTED);
}

TEST_F(BrokerPaths, StatusMayBeNull) {
    CMPIObjectPath* path = broker.makePath(drivePath("1"));
    EXPECT_STREQ(textOf(path->ft->getKey(path, "DeviceID", nullptr).value.string), "1");
    EXPECT_EQ(path->ft->getKey(path, "Missing", nullptr).state, CMPI_notFound);
    EXPECT_NE(path->ft->getHostname(path, nullptr), nullptr);
}

}  // namespace
}  // namespace testbed
