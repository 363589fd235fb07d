// Each behaviour of a manager alone, beside what the host's manager does: objects and answers.
#include <algorithm>

#include "manager_fixture.h"
#include "provider_library.h"

namespace testbed {
namespace {

class ManagerAnswers : public ManagerTest {
protected:
    static CMPIValueState stateOfNewKey(const std::string& words) {
        Manager manager(words);
        CMPIInstance* instance = manager.makers().newInstance(
            manager.handle(), manager.broker.makePath(Manager::drivePath("d1")), nullptr);
        return instance->ft->getProperty(instance, "DeviceID", nullptr).state;
    }
};

TEST_F(ManagerAnswers, NewInstanceWithoutKeys) {
    EXPECT_EQ(stateOfNewKey("host"), CMPI_goodValue);
    EXPECT_EQ(stateOfNewKey("no-keys"), CMPI_nullValue);
}

TEST_F(ManagerAnswers, CharactersInAnArrayOfStrings) {
    for (const bool refused : {false, true}) {
        Manager manager(refused ? "no-chars-in-arrays" : "host");
        CMPIArray* array = manager.makers().newArray(manager.handle(), 2, CMPI_string, nullptr);
        EXPECT_EQ(array->ft->setElementAt(array, 0, asValue("text"), CMPI_chars).rc,
                  refused ? CMPI_RC_ERR_TYPE_MISMATCH : CMPI_RC_OK);
        EXPECT_STREQ(textOf(array->ft->getElementAt(array, 0, nullptr).value.string),
                     refused ? "" : "text");
        const CMPIString* string = manager.broker.makeString("object");
        EXPECT_EQ(array->ft->setElementAt(array, 0, asValue(&string), CMPI_string).rc, CMPI_RC_OK);
        EXPECT_STREQ(textOf(array->ft->getElementAt(array, 0, nullptr).value.string), "object");
    }
}

/// What a client receives of a drive after a filter that has no list of keys.
Instance filteredDrive(Broker& broker, const Instance& drive) {
    Broker::Collected collected;
    CMPIResult* result = broker.makeResult(collected);
    CMPIInstance* instance = broker.makeInstance(drive);
    const char* wanted[] = {"Capacity", nullptr};
    instance->ft->setPropertyFilter(instance, wanted, nullptr);
    result->ft->returnInstance(result, instance);
    return collected.instances.at(0);
}

TEST_F(ManagerAnswers, KeysUnderAPropertyFilter) {
    const struct {
        const char* words;
        bool hasProperty, hasKey;
    } kCases[] = {{"host", false, true},
                  {"filter-drops-names", false, false},
                  {"filter-keeps-keys", true, true}};
    for (const auto& [words, hasProperty, hasKey] : kCases) {
        Manager manager(words);
        const Instance received = filteredDrive(manager.broker, Manager::drive("d1"));
        EXPECT_EQ(received.find("DeviceID") != nullptr, hasProperty) << words;
        EXPECT_EQ(received.path.findKey("DeviceID") != nullptr, hasKey) << words;
    }
}

using Ids = std::vector<std::string>;

Ids idsIn(CMPIEnumeration* found) {
    Ids ids;
    while (found->ft->hasNext(found, nullptr))
        ids.push_back(Broker::toInstance(found->ft->getNext(found, nullptr).value.inst)
                          .path.findKey("DeviceID")
                          ->asString());
    return ids;
}

TEST_F(ManagerAnswers, AnotherOrderEachTime) {
    for (const bool random : {false, true}) {
        Manager manager(random ? "random-order" : "host");
        for (int i = 10; i < 40; i++) manager.repository.put(Manager::drive(std::to_string(i)));
        for (int i = 10; i < 40; i++) manager.cool(std::to_string(i), "f1");
        manager.repository.put(Manager::fan("f1"));
        const auto enumerate = [&] {
            return idsIn(manager.calls().enumerateInstances(manager.handle(), manager.context(),
                                                            manager.classPath("CIM_Drive"), nullptr,
                                                            nullptr));
        };
        const auto walk = [&] {
            return idsIn(manager.calls().associators(
                manager.handle(), manager.context(),
                manager.broker.makePath(Manager::fanPath("f1")), "CIM_Cooling", "CIM_Drive",
                nullptr, nullptr, nullptr, nullptr));
        };
        for (const auto& ask : {std::function<Ids()>(enumerate), std::function<Ids()>(walk)}) {
            Ids first = ask(), second = ask();
            EXPECT_EQ(first.size(), 30u);
            EXPECT_EQ(first != second, random);
            std::sort(first.begin(), first.end());
            std::sort(second.begin(), second.end());
            EXPECT_EQ(first, second);
        }
    }
}

std::string hostOf(CMPIObjectPath* path) {
    return textOf(path->ft->getHostname(path, nullptr));
}

TEST_F(ManagerAnswers, PathsWithAHostName) {
    for (const bool withHost : {false, true}) {
        Manager manager(withHost ? "host-in-paths" : "host");
        manager.repository.put(Manager::drive("1"));
        const std::string expected = withHost ? "manager.example.com" : "";
        CMPIEnumeration* names = manager.calls().enumerateInstanceNames(
            manager.handle(), manager.context(), manager.classPath("CIM_Drive"), nullptr);
        CMPIObjectPath* path = names->ft->getNext(names, nullptr).value.ref;
        EXPECT_EQ(hostOf(path), expected);
        CMPIObjectPath* clone = path->ft->clone(path, nullptr);
        EXPECT_EQ(hostOf(clone), expected);
        // The vendor's provider answers for such a path.
        CMPIInstance* instance = manager.calls().getInstance(manager.handle(), manager.context(),
                                                             clone, nullptr, nullptr);
        ASSERT_NE(instance, nullptr);
        EXPECT_EQ(hostOf(instance->ft->getObjectPath(instance, nullptr)), expected);
        clone->ft->release(clone);
    }
}

TEST_F(ManagerAnswers, StaticRepositoryFindsNothingForAHost) {
    Repository repository;
    BrokerOptions options = managerWith("host-in-paths");
    options.staticNamespaces = {"root/sample"};
    repository.defineClass("root/sample", {"CIM_Fan", "", {}});
    repository.put(ManagerTest::Manager::fan("1"));
    Broker broker(repository, options);
    const Broker::CallScope scope(broker);
    const CMPIBrokerFT& calls = *broker.handle()->bft;
    CMPIObjectPath* path = broker.makePath(Manager::fanPath("1"));
    EXPECT_NE(calls.getInstance(broker.handle(), scope.context(), path, nullptr, nullptr), nullptr);
    path->ft->setHostname(path, "manager.example.com");
    CMPIStatus status = unsetStatus();
    EXPECT_EQ(calls.getInstance(broker.handle(), scope.context(), path, nullptr, &status), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_NOT_FOUND);
    CMPIEnumeration* found = calls.associators(broker.handle(), scope.context(), path, nullptr,
                                               nullptr, nullptr, nullptr, nullptr, &status);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_FALSE(found->ft->hasNext(found, nullptr));
}

TEST_F(ManagerAnswers, UnknownClassesInAWalk) {
    for (const bool fails : {false, true}) {
        Manager manager(fails ? "unknown-class-fails" : "host");
        const auto walk = [&](const char* source, const char* association, const char* result) {
            CMPIStatus status = unsetStatus();
            CMPIEnumeration* found = manager.calls().associators(
                manager.handle(), manager.context(), manager.classPath(source), association, result,
                nullptr, nullptr, nullptr, &status);
            EXPECT_EQ(found == nullptr, status.rc != CMPI_RC_OK);
            return status.rc;
        };
        const CMPIrc expected = fails ? CMPI_RC_ERR_INVALID_CLASS : CMPI_RC_OK;
        EXPECT_EQ(walk("CIM_Unheard", nullptr, nullptr), expected);
        EXPECT_EQ(walk("CIM_Fan", "CIM_Unheard", nullptr), expected);
        EXPECT_EQ(walk("CIM_Fan", nullptr, "CIM_Unheard"), expected);
        EXPECT_EQ(walk("CIM_Fan", "CIM_Cooling", "CIM_Drive"), CMPI_RC_OK);
    }
}

TEST_F(ManagerAnswers, DanglingReferences) {
    for (const bool fails : {false, true}) {
        Manager manager(fails ? "dangling-fails" : "host");
        manager.repository.put(Manager::fan("f1"));
        manager.repository.put(Manager::drive("1"));
        manager.cool("1", "f1");
        const auto walk = [&] {
            CMPIStatus status = unsetStatus();
            manager.calls().associatorNames(manager.handle(), manager.context(),
                                            manager.broker.makePath(Manager::fanPath("f1")),
                                            "CIM_Cooling", nullptr, nullptr, nullptr, &status);
            return status.rc;
        };
        EXPECT_EQ(walk(), CMPI_RC_OK);
        manager.cool("gone", "f1");
        EXPECT_EQ(walk(), fails ? CMPI_RC_ERR_NOT_FOUND : CMPI_RC_OK);
    }
}

TEST_F(ManagerAnswers, KeysThatReadAsNumbers) {
    for (const bool asNumbers : {false, true}) {
        Manager manager(asNumbers ? "numeric-keys" : "host");
        ProviderLibrary library(manager.broker, SAMPLE_PROVIDER, "Sample");
        ObjectPath path = Manager::drivePath("12");
        path.key("Name", CimValue::string("12a"));
        // The sample answers with the path's text.
        EXPECT_EQ(library.client().getInstance(path).message,
                  asNumbers ? R"(root/sample:Sample_Drive.DeviceID=12,Name="12a")"
                            : R"(root/sample:Sample_Drive.DeviceID="12",Name="12a")");
    }
}

TEST_F(ManagerAnswers, FactoryCallsForEachClass) {
    for (const bool perClass : {false, true}) {
        Manager manager(perClass ? "factory-per-class" : "host");
        ProviderLibrary library(manager.broker, SAMPLE_PROVIDER, "Sample");
        EXPECT_EQ(*static_cast<const std::atomic<int>*>(library.mi()->hdl), perClass ? 6 : 1);
    }
}

}  // namespace
}  // namespace testbed
