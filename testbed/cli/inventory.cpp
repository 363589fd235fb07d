// The table of the classes that the provider serves, and what identifies and names their instances.
#include "inventory.h"

#include <algorithm>

namespace testbed {
namespace {

constexpr ServedClass kServedClasses[] = {
    {"Tovexa_PlexorController", "Controllers", "Name", "tvxController", false, "controller",
     "controllers", true},
    {"Tovexa_PlexorSoftwareIdentity", "Software", "InstanceID", "tovexa:ControllerSoftware", false,
     "software version", "software versions", false},
    {"Tovexa_PlexorStorageVolume", "Volumes", "DeviceID", "tvxStorageVolume", true, "volume",
     "volumes", true},
    {"Tovexa_PlexorStorageExtent", "Drives", "DeviceID", "tvxStorageExt", true, "drive", "drives",
     true},
    {"Tovexa_PlexorSASSATAPort", "Ports", "DeviceID", "tvxPort", true, "port", "ports", true},
    {"Tovexa_PlexorBattery", "Batteries", "DeviceID", "tvxControllerBattery", true, "battery",
     "batteries", true},
};

}  // namespace

std::span<const ServedClass> servedClasses() {
    return kServedClasses;
}

const ServedClass* findServedClass(const std::string& name) {
    for (const ServedClass& served : kServedClasses) {
        if (sameName(served.name, name)) return &served;
    }
    return nullptr;
}

std::optional<std::string> identityOf(const ServedClass& served, const Instance& instance) {
    const CimValue* key = instance.path.findKey(served.identityKey);
    if (!key) key = instance.find(served.identityKey);
    const std::string prefix = served.prefix;
    if (!key || !key->asString().starts_with(prefix)) return std::nullopt;
    return key->asString().substr(prefix.size());
}

bool belongsTo(const ServedClass& served, const std::string& identity,
               const std::string& controllerId) {
    return served.isDevice ? identity.starts_with(controllerId + "_") : identity == controllerId;
}

std::optional<std::size_t> ownerAmong(std::span<const std::string> controllerIds,
                                      const ServedClass& served, const Instance& instance) {
    const auto identity = identityOf(served, instance);
    std::optional<std::size_t> owner;
    for (std::size_t i = 0; identity && i < controllerIds.size(); i++) {
        if (!belongsTo(served, *identity, controllerIds[i])) continue;
        if (!owner || controllerIds[*owner].size() < controllerIds[i].size()) owner = i;
    }
    return owner;
}

std::string nameOf(const Instance& instance) {
    const CimValue* name = instance.find("ElementName");
    return name && !name->asString().empty() ? name->asString() : instance.path.text();
}

Inventory collectInventory(InstanceClient& client, const std::vector<std::string>& classNames,
                           const std::string& nameSpace) {
    Inventory inventory;
    for (const std::string& name : classNames) {
        inventory.push_back({name, client.enumerateInstances(name, {}, nameSpace)});
    }
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
