// Up-calls into the repository.
#include "broker_fixture.h"

namespace testbed {
namespace {

class BrokerQueries : public BrokerTest {
protected:
    explicit BrokerQueries(BrokerOptions options = {}) : BrokerTest(std::move(options)) {
        for (const char* id : {"1", "2"}) {
            repository.put(drive(id).set("Capacity", CimValue::uint64(7)));
            cool(id, "F");
        }
        repository.put(fan("F"));
    }

    CMPICount sizeOf(CMPIEnumeration* enumeration) {
        CMPIArray* array = enumeration->ft->toArray(enumeration, nullptr);
        return array->ft->getSize(array, nullptr);
    }
    CMPIEnumeration* associators(const ObjectPath& source, const char* assocClass,
                                 const char* resultClass) {
        status = unsetStatus();
        return calls().associators(handle(), context(), broker.makePath(source), assocClass,
                                   resultClass, nullptr, nullptr, nullptr, &status);
    }
    CMPIEnumeration* enumerate(CMPIObjectPath* path, const char** properties = nullptr) {
        status = unsetStatus();
        return calls().enumerateInstances(handle(), context(), path, properties, &status);
    }

    CMPIStatus status = unsetStatus();
};

TEST_F(BrokerQueries, EnumerateInstancesAndNames) {
    EXPECT_EQ(sizeOf(enumerate(classPath("cim_device"))), 3u);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    CMPIEnumeration* names =
        calls().enumerateInstanceNames(handle(), context(), classPath("CIM_Drive"), nullptr);
    EXPECT_EQ(sizeOf(names), 2u);
    EXPECT_EQ(names->ft->getNext(names, nullptr).type, CMPI_ref);
}

TEST_F(BrokerQueries, EnumerateUnknownClassOrNamespace) {
    EXPECT_EQ(enumerate(classPath("CIM_Unknown")), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_INVALID_CLASS);
    EXPECT_EQ(enumerate(classPath("CIM_Drive", "root/unknown")), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_INVALID_NAMESPACE);
    EXPECT_EQ(enumerate(nullptr), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_INVALID_PARAMETER);
    EXPECT_EQ(
        calls().enumerateInstanceNames(handle(), context(), classPath("CIM_Unknown"), &status),
        nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_INVALID_CLASS);
}

TEST_F(BrokerQueries, PropertyListLimitsWhatComes) {
    const char* names[] = {"capacity", nullptr};
    CMPIEnumeration* drives = enumerate(classPath("CIM_Drive"), names);
    const CMPIInstance* instance = drives->ft->getNext(drives, nullptr).value.inst;
    EXPECT_EQ(instance->ft->getPropertyCount(instance, nullptr), 1u);
    EXPECT_EQ(instance->ft->getProperty(instance, "Capacity", nullptr).value.uint64, 7u);
    EXPECT_EQ(Broker::toInstance(instance).path, drivePath("1"));
    EXPECT_TRUE(broker.books().queries().back().hasPropertyList);
}

TEST_F(BrokerQueries, GetInstanceFindsByPath) {
    const CMPIInstance* found =
        calls().getInstance(handle(), context(), broker.makePath(drivePath("2")), nullptr, &status);
    ASSERT_NE(found, nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_EQ(Broker::toInstance(found).path, drivePath("2"));
}

TEST_F(BrokerQueries, GetInstanceWithoutAHitHasAMessageObject) {
    EXPECT_EQ(
        calls().getInstance(handle(), context(), broker.makePath(drivePath("9")), nullptr, &status),
        nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_FOUND);
    ASSERT_NE(status.msg, nullptr);
    EXPECT_STREQ(textOf(status.msg), "");
    EXPECT_EQ(calls().getInstance(handle(), context(), classPath("CIM_Drive", "root/unknown"),
                                  nullptr, &status),
              nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_INVALID_NAMESPACE);
}

TEST_F(BrokerQueries, AssociatorsWithFilters) {
    EXPECT_EQ(sizeOf(associators(fanPath("F"), nullptr, nullptr)), 2u);
    EXPECT_EQ(sizeOf(associators(fanPath("F"), "CIM_Dependency", "CIM_Drive")), 2u);
    EXPECT_EQ(sizeOf(associators(drivePath("1"), "cim_cooling", "cim_fan")), 1u);
    const CallRecord record = broker.books().queries().back();
    EXPECT_EQ(record.entry, Entry::Associators);
    EXPECT_EQ(record.path, drivePath("1").text());
    EXPECT_EQ(record.className, "Sample_Drive");
    EXPECT_EQ(record.assocClass, "cim_cooling");
    EXPECT_EQ(record.resultClass, "cim_fan");
    EXPECT_EQ(record.role, std::nullopt);
    EXPECT_EQ(record.resultRole, std::nullopt);
    EXPECT_EQ(record.thread, std::this_thread::get_id());
    EXPECT_EQ(record.context, context());
}

TEST_F(BrokerQueries, RolesAreNoted) {
    calls().associators(handle(), context(), broker.makePath(drivePath("1")), nullptr, nullptr,
                        "Dependent", "", nullptr, nullptr);
    const CallRecord record = broker.books().queries().back();
    EXPECT_EQ(record.role, "Dependent");
    EXPECT_EQ(record.resultRole, "");
}

TEST_F(BrokerQueries, UnknownClassesGiveAnEmptyEnumeration) {
    const ObjectPath stranger =
        ObjectPath{"root/sample", "CIM_Stranger", {}}.key("DeviceID", CimValue::string("1"));
    for (CMPIEnumeration* result : {associators(fanPath("F"), "CIM_Unknown", nullptr),
                                    associators(fanPath("F"), nullptr, "CIM_Unknown"),
                                    associators(stranger, nullptr, nullptr)}) {
        ASSERT_NE(result, nullptr);
        EXPECT_EQ(status.rc, CMPI_RC_OK);
        EXPECT_EQ(sizeOf(result), 0u);
    }
}

TEST_F(BrokerQueries, AssociationsInAnUnknownNamespaceFail) {
    ObjectPath source = fanPath("F");
    source.nameSpace = "root/unknown";
    const CMPIObjectPath* path = broker.makePath(source);
    EXPECT_EQ(associators(source, nullptr, nullptr), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(calls().references(handle(), context(), path, nullptr, nullptr, nullptr, &status),
              nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_FAILED);
}

TEST_F(BrokerQueries, NamesAndReferences) {
    const CMPIObjectPath* path = broker.makePath(fanPath("F"));
    CMPIEnumeration* names = calls().associatorNames(handle(), context(), path, nullptr, nullptr,
                                                     "Antecedent", "Dependent", nullptr);
    EXPECT_EQ(sizeOf(names), 2u);
    EXPECT_EQ(Broker::toPath(names->ft->getNext(names, nullptr).value.ref), drivePath("1"));

    CMPIEnumeration* references = calls().references(handle(), context(), path, "CIM_Cooling",
                                                     "antecedent", nullptr, nullptr);
    EXPECT_EQ(sizeOf(references), 2u);
    const CMPIInstance* first = references->ft->getNext(references, nullptr).value.inst;
    const CMPIData dependent = first->ft->getProperty(first, "Dependent", nullptr);
    EXPECT_EQ(Broker::toPath(dependent.value.ref), drivePath("1"));

    CMPIEnumeration* referenceNames =
        calls().referenceNames(handle(), context(), path, nullptr, nullptr, nullptr);
    EXPECT_EQ(referenceNames->ft->getNext(referenceNames, nullptr).type, CMPI_ref);
}

TEST_F(BrokerQueries, ResultsAreSnapshots) {
    CMPIEnumeration* drives = enumerate(classPath("CIM_Drive"));
    repository.setProperty(drivePath("1"), "Capacity", CimValue::uint64(8));
    repository.remove(drivePath("2"));
    EXPECT_EQ(sizeOf(drives), 2u);
    const CMPIInstance* first = drives->ft->getNext(drives, nullptr).value.inst;
    EXPECT_EQ(first->ft->getProperty(first, "Capacity", nullptr).value.uint64, 7u);
}

TEST_F(BrokerQueries, StaticInstancesShowOnlyWhatWasSet) {
    CMPIEnumeration* fans = enumerate(classPath("CIM_Fan"));
    const CMPIInstance* instance = fans->ft->getNext(fans, nullptr).value.inst;
    instance->ft->getProperty(instance, "EnabledState", &status);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_FOUND);
}

class LiveBrokerQueries : public BrokerQueries {
protected:
    static BrokerOptions live() {
        BrokerOptions options;
        options.allProperties = true;
        return options;
    }
    LiveBrokerQueries() : BrokerQueries(live()) {}
};

TEST_F(LiveBrokerQueries, AbsentPropertiesOfTheClassAreNull) {
    CMPIEnumeration* fans = enumerate(classPath("CIM_Fan"));
    const CMPIInstance* instance = fans->ft->getNext(fans, nullptr).value.inst;
    const CMPIData data = instance->ft->getProperty(instance, "EnabledState", &status);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_EQ(data.state, CMPI_nullValue);
    EXPECT_EQ(data.type, CMPI_uint16);
    instance->ft->getProperty(instance, "Unheard", &status);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_FOUND);
}

}  // namespace
}  // namespace testbed
