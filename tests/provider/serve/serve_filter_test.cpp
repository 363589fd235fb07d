// How a client's property list reaches the broker's instances.
#include <string>
#include <vector>

#include "serve_fixture.h"

namespace plexortest {
namespace {

/// One setPropertyFilter call as the broker received it.
struct FilterCall {
    const char** properties;
    const char** keys;
    size_t propertiesSetBefore;
};

/// Stands between provider and broker and notes what is done to new instances.
class InstanceWatch {
public:
    InstanceWatch() : behind_(::Broker), factories_(*behind_->eft), broker_(*behind_) {
        factories_.newInstance = newInstance;
        broker_.eft = &factories_;
        current_ = this;
        ::Broker = &broker_;
    }
    ~InstanceWatch() {
        ::Broker = behind_;
        current_ = nullptr;
    }
    InstanceWatch(const InstanceWatch&) = delete;
    InstanceWatch& operator=(const InstanceWatch&) = delete;

    std::vector<FilterCall> filters;
    size_t made = 0;
    size_t propertiesSet = 0;

private:
    static CMPIInstance* newInstance(const CMPIBroker*, const CMPIObjectPath* path,
                                     CMPIStatus* status) {
        CMPIInstance* instance =
            current_->behind_->eft->newInstance(current_->behind_, path, status);
        current_->made++;
        current_->table_ = *instance->ft;
        current_->original_ = instance->ft;
        current_->table_.setPropertyFilter = setPropertyFilter;
        current_->table_.setProperty = setProperty;
        instance->ft = &current_->table_;
        return instance;
    }
    static CMPIStatus setPropertyFilter(const CMPIInstance* instance, const char** properties,
                                        const char** keys) {
        current_->filters.push_back({properties, keys, current_->propertiesSet});
        return current_->original_->setPropertyFilter(instance, properties, keys);
    }
    static CMPIStatus setProperty(const CMPIInstance* instance, const char* name,
                                  const CMPIValue* value, CMPIType type) {
        current_->propertiesSet++;
        return current_->original_->setProperty(instance, name, value, type);
    }

    static InstanceWatch* current_;
    const CMPIBroker* const behind_;
    CMPIBrokerEncFT factories_;
    CMPIBroker broker_;
    CMPIInstanceFT table_{};
    const CMPIInstanceFT* original_ = nullptr;
};

InstanceWatch* InstanceWatch::current_ = nullptr;

class ServeFilter : public ServeTest {
protected:
    void SetUp() override {
        ServeTest::SetUp();
        RaidController_t* ctrl = attach(newController("C0"));
        for (const DeviceClass& device : kDeviceClasses) device.cache(ctrl, "d1");
        result = broker.makeResult(collected);
    }
    std::vector<testbed::ObjectPath> paths() {
        std::vector<testbed::ObjectPath> all = {controllerPath("C0"), softwarePath("C0")};
        for (const DeviceClass& device : kDeviceClasses) {
            all.push_back(devicePath(device, "C0", "d1"));
        }
        return all;
    }

    testbed::Broker::Collected collected;
    CMPIResult* result = nullptr;
};

TEST_F(ServeFilter, IsTheClientsListWithoutKeysBeforeAnyPropertyIsSet) {
    const char* list[] = {"Caption", nullptr};
    for (const testbed::ObjectPath& path : paths()) {
        for (const bool get : {false, true}) {
            InstanceWatch watch;
            CMPIObjectPath* asked = broker.makePath(path);
            const CMPIStatus status =
                get ? PlexorProviderGetInstance(&mi, ctx(), result, asked, list)
                    : PlexorProviderEnumInstances(&mi, ctx(), result, asked, list);
            EXPECT_EQ(CMPI_RC_OK, status.rc);
            EXPECT_EQ(1u, watch.made);
            ASSERT_EQ(1u, watch.filters.size()) << path.text();
            EXPECT_EQ(list, watch.filters[0].properties);
            EXPECT_EQ(nullptr, watch.filters[0].keys);
            EXPECT_EQ(0u, watch.filters[0].propertiesSetBefore);
            // What the list leaves out is set all the same: it is the broker that drops it.
            EXPECT_LT(3u, watch.propertiesSet);
        }
    }
}

TEST_F(ServeFilter, IsNotSetWithoutAList) {
    for (const testbed::ObjectPath& path : paths()) {
        InstanceWatch watch;
        CMPIObjectPath* asked = broker.makePath(path);
        PlexorProviderEnumInstances(&mi, ctx(), result, asked, nullptr);
        PlexorProviderGetInstance(&mi, ctx(), result, asked, nullptr);
        EXPECT_EQ(2u, watch.made);
        EXPECT_TRUE(watch.filters.empty());
    }
}

TEST_F(ServeFilter, IsSetOnEveryInstance) {
    RaidController_t* second = attach(newController("C1"));
    attach(second, newPort("d1"));
    attach(second, newPort("d2"));
    const char* list[] = {nullptr};
    InstanceWatch watch;
    PlexorProviderEnumInstances(
        &mi, ctx(), result, broker.makePath({"root/cimv2", "Tovexa_PlexorSASSATAPort", {}}), list);
    EXPECT_EQ(3u, watch.made);
    EXPECT_EQ(3u, watch.filters.size());
}

}  // namespace
}  // namespace plexortest
