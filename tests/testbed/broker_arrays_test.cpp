// Arrays that a provider makes and reads.
#include "broker_fixture.h"

namespace testbed {
namespace {

class BrokerArrays : public BrokerTest {
protected:
    CMPIArray* newArray(CMPICount count, CMPIType type) {
        return makers().newArray(handle(), count, type, &status);
    }
    CMPIStatus status = unsetStatus();
};

TEST_F(BrokerArrays, NewElementsAreNull) {
    const CMPIArray* array = newArray(2, CMPI_uint16);
    EXPECT_EQ(array->ft->getSize(array, nullptr), 2u);
    EXPECT_EQ(array->ft->getSimpleType(array, nullptr), CMPI_uint16);
    const CMPIData data = array->ft->getElementAt(array, 1, &status);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_EQ(data.state, CMPI_nullValue);
}

TEST_F(BrokerArrays, ElementZeroOfAnEmptyArrayIsABadValueWithStatusOk) {
    const CMPIArray* array = newArray(0, CMPI_uint16);
    EXPECT_EQ(array->ft->getSize(array, nullptr), 0u);
    const CMPIData data = array->ft->getElementAt(array, 0, &status);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_EQ(data.state, CMPI_badValue);
    EXPECT_EQ(data.value.uint64, 0u);
}

TEST_F(BrokerArrays, ElementsNeedTheArraysType) {
    CMPIArray* array = newArray(1, CMPI_uint16);
    const CMPIUint16 fitting = 5;
    const CMPIUint32 other = 5;
    EXPECT_EQ(array->ft->setElementAt(array, 0, asValue(&other), CMPI_uint32).rc,
              CMPI_RC_ERR_FAILED);
    EXPECT_EQ(array->ft->setElementAt(array, 0, asValue("5"), CMPI_chars).rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(array->ft->setElementAt(array, 0, asValue(&fitting), CMPI_uint16).rc, CMPI_RC_OK);
    EXPECT_EQ(array->ft->setElementAt(array, 1, asValue(&fitting), CMPI_uint16).rc,
              CMPI_RC_ERR_NO_SUCH_PROPERTY);
    EXPECT_EQ(array->ft->getElementAt(array, 0, nullptr).value.uint16, 5);
}

TEST_F(BrokerArrays, StringArrayTakesCharactersAndStrings) {
    CMPIArray* array = newArray(3, CMPI_string);
    CMPIString* text = broker.makeString("two");
    EXPECT_EQ(array->ft->setElementAt(array, 0, asValue("one"), CMPI_chars).rc, CMPI_RC_OK);
    EXPECT_EQ(array->ft->setElementAt(array, 1, asValue(&text), CMPI_string).rc, CMPI_RC_OK);
    EXPECT_STREQ(textOf(array->ft->getElementAt(array, 0, nullptr).value.string), "one");
    EXPECT_STREQ(textOf(array->ft->getElementAt(array, 1, nullptr).value.string), "two");
    const CMPIData missing = array->ft->getElementAt(array, 2, nullptr);
    EXPECT_EQ(missing.state, CMPI_nullValue);
    EXPECT_EQ(textOf(missing.value.string), nullptr);
}

TEST_F(BrokerArrays, ElementTypeComesWithoutTheFlag) {
    EXPECT_EQ(newArray(1, CMPI_uint16A), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_INVALID_PARAMETER);
}

TEST_F(BrokerArrays, EmptyArrayPropertyIsPresent) {
    const CMPIInstance* instance =
        broker.makeInstance(drive("1").set("List", CimValue::uint16Array({})));
    const CMPIData data = instance->ft->getProperty(instance, "List", &status);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_EQ(data.state, CMPI_goodValue);
    ASSERT_NE(data.value.array, nullptr);
    EXPECT_EQ(data.value.array->ft->getSize(data.value.array, nullptr), 0u);
}

TEST_F(BrokerArrays, CloneIsIndependent) {
    CMPIArray* array = newArray(1, CMPI_string);
    array->ft->setElementAt(array, 0, asValue("before"), CMPI_chars);
    CMPIArray* clone = array->ft->clone(array, nullptr);
    array->ft->setElementAt(array, 0, asValue("after"), CMPI_chars);
    EXPECT_STREQ(textOf(clone->ft->getElementAt(clone, 0, nullptr).value.string), "before");
    EXPECT_EQ(clone->ft->release(clone).rc, CMPI_RC_OK);
}

}  // namespace
}  // namespace testbed
