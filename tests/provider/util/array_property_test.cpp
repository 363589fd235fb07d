// The first element of an array property, and the operational status that is read with it.
#include "fake_instance.h"
#include "provider_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testbed::Instance;

class ArrayProperty : public ProviderTest {
protected:
    /// An instance with that value as OperationalStatus.
    CMPIInstance* instanceWith(CimValue value) {
        Instance instance;
        instance.path = {"root/cimv2", "Sample_Thing", {}};
        instance.set("OperationalStatus", std::move(value));
        return broker.makeInstance(instance);
    }
    static CMPIValue read(const CMPIInstance* instance) {
        return GetArrayProperty(instance, "OperationalStatus");
    }
    static void expectZero(const CMPIValue& value) {
        EXPECT_EQ(value.uint64, 0u);
        EXPECT_EQ(value.array, nullptr);
    }
};

TEST_F(ArrayProperty, IsItsFirstElement) {
    EXPECT_EQ(read(instanceWith(CimValue::uint16Array({7}))).uint16, 7);
    EXPECT_EQ(read(instanceWith(CimValue::uint16Array({10, 11, 12}))).uint16, 10);
    EXPECT_EQ(read(instanceWith(CimValue::uint16Array({65535, 1}))).uint16, 65535);
}

TEST_F(ArrayProperty, MayHaveAnyElementType) {
    EXPECT_EQ(
        read(instanceWith(CimValue::array(CMPI_uint64, {CimValue::uint64(1ull << 40)}))).uint64,
        1ull << 40);
    EXPECT_EQ(read(instanceWith(CimValue::array(CMPI_uint32, {CimValue::uint32(70000)}))).uint32,
              70000u);
    EXPECT_EQ(read(instanceWith(CimValue::array(CMPI_boolean, {CimValue::boolean(true)}))).boolean,
              1);
}

TEST_F(ArrayProperty, OfStringsIsAString) {
    const CMPIValue value = read(instanceWith(CimValue::stringArray({"first", "second"})));
    ASSERT_NE(value.string, nullptr);
    EXPECT_STREQ(value.string->ft->getCharPtr(value.string, nullptr), "first");
}

TEST_F(ArrayProperty, IsFoundByItsName) {
    Instance instance;
    instance.path = {"root/cimv2", "Sample_Thing", {}};
    instance.set("ExtentStatus", CimValue::uint16Array({3}));
    instance.set("Classifications", CimValue::uint16Array({10}));
    const CMPIInstance* both = broker.makeInstance(instance);
    EXPECT_EQ(GetArrayProperty(both, "ExtentStatus").uint16, 3);
    EXPECT_EQ(GetArrayProperty(both, "Classifications").uint16, 10);
    expectZero(GetArrayProperty(both, "OperationalStatus"));
}

TEST_F(ArrayProperty, IsZeroWithoutAnArray) {
    expectZero(read(instanceWith(CimValue::null(CMPI_uint16A))));
    expectZero(read(instanceWith(CimValue::null(CMPI_uint16))));
    expectZero(read(instanceWith(CimValue::null(CMPI_string))));
}

// A number where an array is expected must not be taken for a pointer.
TEST_F(ArrayProperty, IsZeroForAScalar) {
    expectZero(read(instanceWith(CimValue::uint16(2))));
    expectZero(read(instanceWith(CimValue::uint64(0x7fff12345678))));
    expectZero(read(instanceWith(CimValue::boolean(true))));
    expectZero(read(instanceWith(CimValue::string("2"))));
    expectZero(read(instanceWith(CimValue::real64(2.0))));
}

TEST_F(ArrayProperty, IsZeroWhenEmpty) {
    expectZero(read(instanceWith(CimValue::array(CMPI_uint16, {}))));
    expectZero(read(instanceWith(CimValue::array(CMPI_string, {}))));
}

TEST_F(ArrayProperty, IsZeroWhenItsFirstElementIsNull) {
    expectZero(read(instanceWith(
        CimValue::array(CMPI_uint16, {CimValue::null(CMPI_uint16), CimValue::uint16(3)}))));
}

TEST_F(ArrayProperty, IsZeroWithoutAnInstance) {
    expectZero(read(nullptr));
}

TEST_F(ArrayProperty, IsZeroWhenTheInstanceRefuses) {
    const CMPIInstance* instance = instanceWith(CimValue::uint16Array({2}));
    faults().add(refusal(testbed::Entry::InstanceGetProperty));
    expectZero(read(instance));
}

// What counts is the array itself, not what is said about it.
TEST_F(ArrayProperty, IsReadWhateverTheStatus) {
    FakeArray array(dataOf(CMPI_uint16, 6));
    FakeInstance instance(dataOf(CMPI_uint16A, array));
    instance.rc = CMPI_RC_ERR_FAILED;
    EXPECT_EQ(read(&instance.instance).uint16, 6);
    EXPECT_EQ(array.asked, 1);
}

TEST_F(ArrayProperty, IsReadWhateverTheNullState) {
    FakeArray array(dataOf(CMPI_uint16, 6));
    FakeInstance instance(dataOf(CMPI_uint16A, array, CMPI_nullValue));
    EXPECT_EQ(read(&instance.instance).uint16, 6);
}

TEST_F(ArrayProperty, ElementCountsWhateverItsStatus) {
    FakeArray array(dataOf(CMPI_uint16, 6));
    array.rc = CMPI_RC_ERR_FAILED;
    FakeInstance instance(dataOf(CMPI_uint16A, array));
    EXPECT_EQ(read(&instance.instance).uint16, 6);
}

TEST_F(ArrayProperty, NumbersOfEveryScalarTypeAreNeverPointers) {
    for (const CMPIType type :
         {CMPI_boolean, CMPI_char16, CMPI_real32, CMPI_real64, CMPI_uint8, CMPI_uint16, CMPI_uint32,
          CMPI_uint64, CMPI_sint8, CMPI_sint16, CMPI_sint32, CMPI_sint64, CMPI_null}) {
        FakeInstance instance(dataOf(type, 1));
        expectZero(read(&instance.instance));
    }
}

TEST_F(ArrayProperty, ObjectsOfOtherKindsAreNoArrays) {
    for (const CMPIType type : {CMPI_string, CMPI_chars, CMPI_dateTime, CMPI_ref, CMPI_instance}) {
        FakeInstance instance(dataOf(type, 1));
        expectZero(read(&instance.instance));
    }
}

TEST_F(ArrayProperty, NeedsNoMemory) {
    const CMPIInstance* instance = instanceWith(CimValue::uint16Array({2}));
    const auto fault = FailAllocation::from(1);
    EXPECT_EQ(read(instance).uint16, 2);
    EXPECT_EQ(GetOperationalStatus(instance), 2);
    EXPECT_EQ(fault.calls(), 0u);
}

class OperationalStatusProperty : public ArrayProperty {};

TEST_F(OperationalStatusProperty, IsTheFirstElement) {
    EXPECT_EQ(GetOperationalStatus(instanceWith(CimValue::uint16Array({6}))), 6);
    EXPECT_EQ(GetOperationalStatus(instanceWith(CimValue::uint16Array({2, 6}))), 2);
    EXPECT_EQ(GetOperationalStatus(instanceWith(CimValue::uint16Array({32768}))), 32768);
}

TEST_F(OperationalStatusProperty, TakesNumbersOfOtherWidths) {
    EXPECT_EQ(GetOperationalStatus(instanceWith(CimValue::array(CMPI_uint8, {CimValue::uint8(5)}))),
              5);
    EXPECT_EQ(
        GetOperationalStatus(instanceWith(CimValue::array(CMPI_uint32, {CimValue::uint32(12)}))),
        12);
    EXPECT_EQ(GetOperationalStatus(
                  instanceWith(CimValue::array(CMPI_uint64, {CimValue::uint64(0x10003)}))),
              3);
}

TEST_F(OperationalStatusProperty, IsZeroWithoutAnArray) {
    EXPECT_EQ(GetOperationalStatus(instanceWith(CimValue::null(CMPI_uint16A))), 0);
    EXPECT_EQ(GetOperationalStatus(instanceWith(CimValue::uint16(2))), 0);
    EXPECT_EQ(GetOperationalStatus(instanceWith(CimValue::array(CMPI_uint16, {}))), 0);
    EXPECT_EQ(GetOperationalStatus(nullptr), 0);
    Instance without;
    without.path = {"root/cimv2", "Sample_Thing", {}};
    EXPECT_EQ(GetOperationalStatus(broker.makeInstance(without)), 0);
}

TEST_F(OperationalStatusProperty, IsZeroForTexts) {
    EXPECT_EQ(GetOperationalStatus(instanceWith(CimValue::stringArray({"OK"}))), 0);
}

}  // namespace
}  // namespace plexortest
