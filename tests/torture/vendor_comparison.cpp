#include "vendor_comparison.h"

#include <algorithm>
#include <map>

#include "cache_state.h"
#include "response_check.h"

namespace torture {

using modeltest::ControllerState;
using modeltest::DriveState;
using modeltest::PoolState;
using testbed::ControllerDescription;
using testbed::ServedClass;

namespace {

struct ExpectedDevice {
    bool required = true;
    std::map<std::string, std::uint64_t> values;
};
using Expected = std::map<std::string, ExpectedDevice>;

bool hasPool(const ControllerDescription& controller, const std::vector<std::string>& ids) {
    return std::any_of(ids.begin(), ids.end(), [&](const std::string& id) {
        return testbed::findById(controller.pools, id) != nullptr;
    });
}

void expectDevices(Expected& expected, const ServedClass& served,
                   const ControllerDescription& controller) {
    const std::string heading = served.heading;
    const auto add = [&](const std::string& id, ExpectedDevice device) {
        expected[identityOf(served, controller.id, id)] = std::move(device);
    };
    if (!served.isDevice) add("", {});
    if (heading == "Volumes") {
        for (const auto& volume : controller.volumes)
            add(volume.id, {hasPool(controller, volume.pools),
                            {{"NumberOfBlocks", volume.blocks},
                             {"ConsumableBlocks", volume.consumableBlocks},
                             {"OperationalStatus", volume.operationalStatus},
                             {"ExtentStatus", volume.extentStatus}}});
    } else if (heading == "Drives") {
        for (const auto& drive : controller.drives)
            if (!drive.noMedia)
                add(drive.id, {hasPool(controller, drive.pools),
                               {{"NumberOfBlocks", drive.blocks},
                                {"OperationalStatus", drive.operationalStatus}}});
    } else if (heading == "Ports") {
        // A port's status is what it was when the port was found.
        for (const auto& port : controller.ports)
            add(port.id, {true, {{"PortType", port.portType}}});
    } else if (heading == "Batteries") {
        for (const auto& battery : controller.batteries)
            add(battery.id, {true,
                             {{"OperationalStatus", battery.operationalStatus},
                              {"BatteryStatus", battery.batteryStatus}}});
    }
}

void compareValues(const std::string& id, const ExpectedDevice& device,
                   const testbed::Instance& instance, Failures& failures) {
    for (const auto& [name, value] : device.values) {
        const testbed::CimValue* found = instance.find(name);
        const std::string text = found != nullptr ? found->text() : "nothing";
        if (found == nullptr || found->asUnsigned() != value)
            failures.add(id + ": " + name + " is " + text + " instead of " + std::to_string(value));
    }
}

void compareClass(testbed::InstanceClient& client, const ServedClass& served,
                  const testbed::Scenario& scenario, Failures& failures) {
    Expected expected;
    for (const auto& controller : scenario.controllers) expectDevices(expected, served, controller);

    const testbed::Response response = client.enumerateInstances(served.name);
    const auto ids = identitiesIn(served, response);
    const auto twice = std::adjacent_find(ids.begin(), ids.end());
    if (twice != ids.end()) failures.add(*twice + " is there twice");
    for (const auto& [id, device] : expected)
        if (device.required && !std::binary_search(ids.begin(), ids.end(), id))
            failures.add(id + " is lost");
    for (const auto& instance : response.instances) {
        const std::string id = instance.path.findKey(served.identityKey)->asString();
        const auto device = expected.find(id);
        if (device == expected.end())
            failures.add(id + " is answered but not in the array");
        else
            compareValues(id, device->second, instance, failures);
    }
}

/// The last part of a pool's InstanceID.
std::string poolName(const std::string& instanceId) {
    return instanceId.substr(instanceId.rfind(':') + 1);
}

void comparePools(const ControllerDescription& controller, const ControllerState& cached,
                  Failures& failures) {
    std::vector<std::string> wanted, found;
    for (const auto& pool : controller.pools) wanted.push_back(pool.id);
    for (const PoolState& pool : cached.pools) found.push_back(poolName(pool.instanceId));
    std::sort(wanted.begin(), wanted.end());
    std::sort(found.begin(), found.end());
    if (wanted != found) failures.add(controller.id + ": the pools differ:\n" + describe(cached));
}

void compareMembers(const ControllerState& cached, const PoolState& pool, Failures& failures) {
    std::vector<std::string> drives;
    for (const DriveState& drive : cached.drives)
        if (drive.pool == pool.instanceId) drives.push_back(drive.id);
    std::vector<std::string> members = pool.members;
    std::sort(drives.begin(), drives.end());
    std::sort(members.begin(), members.end());
    if (members != drives)
        failures.add("pool " + pool.instanceId + " and its drives disagree:\n" + describe(cached));
}

/// Those that the drive may be cached with: the first that exists, or any when the manager gives
/// them in any order.
std::vector<std::string> poolsOf(const testbed::DriveDescription& drive,
                                 const ControllerDescription& controller, bool anyOrder) {
    std::vector<std::string> pools = drive.pools;
    std::erase_if(pools, [&](const std::string& id) {
        return testbed::findById(controller.pools, id) == nullptr;
    });
    if (!anyOrder && pools.size() > 1) pools.resize(1);
    return pools;
}

void compareDrives(const ControllerDescription& controller, const ControllerState& cached,
                   bool anyOrder, Failures& failures) {
    for (const DriveState& drive : cached.drives) {
        const auto* truth = testbed::findById(controller.drives, drive.id);
        if (truth == nullptr) continue;  // the answers have told of it
        const std::vector<std::string> pools = poolsOf(*truth, controller, anyOrder);
        const std::string pool = drive.pool ? poolName(*drive.pool) : "";
        if (!pools.empty() && std::find(pools.begin(), pools.end(), pool) == pools.end())
            failures.add("drive " + drive.id + " is not in pool " + pools.front() + ":\n" +
                         describe(cached));
        if (drive.extentStatus != truth->extentStatus)
            failures.add("drive " + drive.id + " has an old extent status:\n" + describe(cached));
    }
}

}  // namespace

void compareAnswers(testbed::InstanceClient& client, const testbed::Scenario& scenario,
                    Failures& failures) {
    for (const ServedClass& served : testbed::servedClasses())
        compareClass(client, served, scenario, failures);
}

void compareCache(const testbed::Scenario& scenario, bool anyOrder, Failures& failures) {
    for (const ControllerState& cached : modeltest::readCache()) {
        const auto* controller = scenario.findController(cached.id);
        if (controller == nullptr) {
            failures.add("controller " + cached.id + " is not in the array");
            continue;
        }
        comparePools(*controller, cached, failures);
        compareDrives(*controller, cached, anyOrder, failures);
        for (const PoolState& pool : cached.pools) compareMembers(cached, pool, failures);
    }
}

}  // namespace torture
