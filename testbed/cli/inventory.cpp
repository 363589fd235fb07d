#include "inventory.h"

#include <algorithm>

namespace testbed {
namespace {

constexpr ServedClass kServedClasses[] = {
    {"Tovexa_PlexorController", "Controllers", "Name", "tvxController", false},
    {"Tovexa_PlexorSoftwareIdentity", "Software", "InstanceID", "tovexa:ControllerSoftware", false},
    {"Tovexa_PlexorStorageVolume", "Volumes", "DeviceID", "tvxStorageVolume", true},
    {"Tovexa_PlexorStorageExtent", "Drives", "DeviceID", "tvxStorageExt", true},
    {"Tovexa_PlexorSASSATAPort", "Ports", "DeviceID", "tvxPort", true},
    {"Tovexa_PlexorBattery", "Batteries", "DeviceID", "tvxControllerBattery", true},
};

}  // namespace

std::span<const ServedClass> servedClasses() {
    return kServedClasses;
}

const ServedClass* findServedClass(const std::string& name) {
    for (const ServedClass& served : kServedClasses)
        if (sameName(served.name, name)) return &served;
    return nullptr;
}

Inventory collectInventory(InstanceClient& client, const std::vector<std::string>& classNames,
                           const std::string& nameSpace) {
    Inventory inventory;
    for (const std::string& name : classNames)
        inventory.push_back({name, client.enumerateInstances(name, {}, nameSpace)});
    return inventory;
}

bool sameAnswers(const Inventory& left, const Inventory& right) {
    return std::equal(left.begin(), left.end(), right.begin(), right.end(),
                      [](const ClassAnswer& a, const ClassAnswer& b) {
                          return a.className == b.className && a.response.rc == b.response.rc &&
                                 a.response.instances == b.response.instances;
                      });
}

}  // namespace testbed
