// Walking enumerations, in both ways at once.
#include "broker_fixture.h"

namespace testbed {
namespace {

class BrokerEnumerations : public BrokerTest {
protected:
    CMPIEnumeration* drives() {
        return broker.makeInstanceEnumeration({drive("1"), drive("2"), drive("3")});
    }
    static std::string idOf(const CMPIInstance* instance) {
        return textOf(instance->ft->getProperty(instance, "DeviceID", nullptr).value.string);
    }
    CMPIStatus status = unsetStatus();
};

TEST_F(BrokerEnumerations, NextGoesThroughAllItems) {
    CMPIEnumeration* all = drives();
    std::string ids;
    while (all->ft->hasNext(all, &status)) {
        const CMPIData data = all->ft->getNext(all, nullptr);
        EXPECT_EQ(data.type, CMPI_instance);
        EXPECT_EQ(data.state, CMPI_goodValue);
        ids += idOf(data.value.inst);
    }
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_EQ(ids, "123");
}

TEST_F(BrokerEnumerations, NextPastTheEndIsABadValueWithStatusOk) {
    CMPIEnumeration* none = broker.makeInstanceEnumeration({});
    EXPECT_FALSE(none->ft->hasNext(none, nullptr));
    const CMPIData data = none->ft->getNext(none, &status);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_EQ(data.state, CMPI_badValue);
    EXPECT_EQ(data.value.inst, nullptr);
    EXPECT_FALSE(none->ft->hasNext(none, nullptr));
}

TEST_F(BrokerEnumerations, ArrayAndNextDoNotDisturbEachOther) {
    CMPIEnumeration* all = drives();
    const CMPIInstance* first = all->ft->getNext(all, nullptr).value.inst;
    CMPIArray* array = all->ft->toArray(all, &status);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    ASSERT_EQ(array->ft->getSize(array, nullptr), 3u);
    EXPECT_EQ(array->ft->getSimpleType(array, nullptr), CMPI_instance);
    EXPECT_EQ(array->ft->getElementAt(array, 0, nullptr).value.inst, first);
    EXPECT_EQ(array->ft->getElementAt(array, 1, nullptr).value.inst,
              all->ft->getNext(all, nullptr).value.inst);
    EXPECT_TRUE(all->ft->hasNext(all, nullptr));
    EXPECT_EQ(all->ft->toArray(all, nullptr), array);
    EXPECT_EQ(array->ft->getElementAt(array, 3, nullptr).state, CMPI_badValue);
}

TEST_F(BrokerEnumerations, PathsAreReferences) {
    CMPIEnumeration* paths = broker.makePathEnumeration({drivePath("1")});
    const CMPIData data = paths->ft->getNext(paths, nullptr);
    EXPECT_EQ(data.type, CMPI_ref);
    EXPECT_EQ(Broker::toPath(data.value.ref), drivePath("1"));
}

TEST_F(BrokerEnumerations, ClonesHaveTheirOwnItems) {
    CMPIEnumeration* all = drives();
    all->ft->getNext(all, nullptr);
    CMPIEnumeration* clone = all->ft->clone(all, nullptr);
    CMPIArray* array = all->ft->toArray(all, nullptr);
    CMPIArray* arrayClone = array->ft->clone(array, nullptr);
    leaveCall();
    enterCall();
    EXPECT_EQ(idOf(clone->ft->getNext(clone, nullptr).value.inst), "2");
    EXPECT_EQ(idOf(arrayClone->ft->getElementAt(arrayClone, 0, nullptr).value.inst), "1");
    EXPECT_EQ(broker.books().liveClones(), 2u);
    EXPECT_EQ(clone->ft->release(clone).rc, CMPI_RC_OK);
    EXPECT_EQ(arrayClone->ft->release(arrayClone).rc, CMPI_RC_OK);
    EXPECT_TRUE(misuses().empty());
    leaveCall();
    EXPECT_EQ(broker.books().live(), 0u);
}

TEST_F(BrokerEnumerations, ItemsEndWithTheEnumeration) {
    CMPIEnumeration* all = drives();
    CMPIEnumeration* clone = all->ft->clone(all, nullptr);
    CMPIInstance* item = clone->ft->getNext(clone, nullptr).value.inst;
    clone->ft->release(clone);
    item->ft->getProperty(item, "DeviceID", &status);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_INVALID_HANDLE);
    expectMisuse("instance.getProperty");
}

}  // namespace
}  // namespace testbed
