// Two sides to be matched: records that hold nothing but a path, and an association's results.
#pragma once

#include <deque>
#include <string>
#include <vector>

#include "refresh_fixture.h"

namespace plexortest {

class MatchTest : public RefreshTest {
protected:
    static constexpr const char* kClass = "SAMPLE_Port";

    /// A device record as the matching sees one: its path.
    struct Device {
        CMPIObjectPath* op;
    };

    static CMPIObjectPath* getOp(const void* device) {
        return static_cast<const Device*>(device)->op;
    }

    static testbed::ObjectPath pathOf(const std::string& key,
                                      const std::string& className = kClass) {
        testbed::ObjectPath path{"root/sample", className, {}};
        path.key("DeviceID", testbed::CimValue::string(key));
        return path;
    }

    static testbed::Instance instanceOf(const std::string& key,
                                        const std::string& className = kClass) {
        return {pathOf(key, className), {}};
    }

    void TearDown() override {
        FreeList(&list_, [](void*) {});
        free(devices_);
        free(ops_);
        RefreshTest::TearDown();
    }

    void* cache(const testbed::ObjectPath& path) { return cachePath(broker.makePath(path)); }
    void* cache(const std::string& key) { return cache(pathOf(key)); }
    void* cachePath(CMPIObjectPath* op) {
        records_.push_back({op});
        EXPECT_EQ(AddEntryAtListTail(&list_, &records_.back()), 0);
        return &records_.back();
    }

    CMPIEnumeration* results(const std::vector<testbed::Instance>& instances) {
        return broker.makeInstanceEnumeration(instances);
    }
    CMPIEnumeration* resultsOf(const std::vector<std::string>& keys) {
        std::vector<testbed::Instance> instances;
        for (const std::string& key : keys) instances.push_back(instanceOf(key));
        return results(instances);
    }

    /// Matches `list_` with `enums`, leaving the outcome in the members below; the log shows
    /// nothing but this call.
    int match(const CMPIEnumeration* enums, const char* keyname = "DeviceID") {
        return match(&list_, enums, keyname);
    }
    int match(const List_t* list, const CMPIEnumeration* enums, const char* keyname = "DeviceID") {
        clearLog();
        return CrossoutDuplicatedEntries(list, enums, getOp, keyname, &devices_, &ops_,
                                         &deviceCount_, &opCount_);
    }

    /// The flags of all cached entries, like "101"; nothing but 0 and 1 is known to others.
    std::string flags() const {
        std::string text;
        for (int i = 0; i < deviceCount_; i++) text += std::to_string(devices_[i].Flag);
        return text;
    }
    /// The DeviceIDs of the fresh entries that are left, "-" for a matched one.
    std::string left() {
        std::string text;
        for (int i = 0; i < opCount_; i++) {
            const auto path = ops_[i].Op ? testbed::Broker::toPath(ops_[i].Op) : pathOf("-");
            text += path.findKey("DeviceID")->asString() + " ";
        }
        return text;
    }
    static std::string keyOf(const CMPIInstance* instance) {
        if (instance == nullptr) return "none";
        return testbed::Broker::toInstance(instance).path.findKey("DeviceID")->asString();
    }

    List_t list_ = {};
    std::deque<Device> records_;
    // What a failure has to clear.
    UpdateInfo_t* devices_ = nullptr;
    NewInfo_t* ops_ = nullptr;
    int deviceCount_ = 77;
    int opCount_ = 78;
};

}  // namespace plexortest
