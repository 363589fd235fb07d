// The array, requests to the provider, and what must be left of it.
#include "world.h"

#include "scenario_parser.h"
#include "vendor.h"

namespace schedules {
namespace {

/// The key that names an object of the class.
std::string nameOf(const testbed::ObjectPath& path) {
    const char* key = path.className == World::kControllers ? "Name" : "DeviceID";
    const testbed::CimValue* value = path.findKey(key);
    require(value != nullptr && !value->isNull, "an object of " + path.className + " has no name");
    return value->asString();
}

}  // namespace

void require(bool holds, const std::string& what) {
    if (!holds) throw Finding(what);
}

World::World() : broker_(repository_) {
    testbed::buildVendor(repository_, testbed::readScenario(SCENARIO));
    broker_.books().keepCalls(false);
    for (int i = 0; i < 4; i++) drives_.insert("tvxStorageExtC0_32_" + std::to_string(i));
    volumes_ = {"tvxStorageVolumeC0_0"};
    controllers_ = {"tvxControllerC0"};
}

void World::callFactory() {
    const testbed::Broker::CallScope scope(broker_);
    const CMPIInstanceMI* provider =
        PlexorProvider_Create_InstanceMI(broker_.handle(), scope.context(), nullptr);
    require(provider != nullptr, "the factory gives nothing");
}

CMPIrc World::cleanUp(bool terminating) {
    return testbed::InstanceClient(broker_, &provider_).cleanup(terminating);
}

std::set<std::string> World::names(const std::string& className) {
    const auto response =
        testbed::InstanceClient(broker_, &provider_).enumerateInstanceNames(className);
    require(response.rc == CMPI_RC_OK, "a request for names fails");
    std::set<std::string> names;
    for (const auto& path : response.paths) {
        require(names.insert(nameOf(path)).second, "a name comes twice");
    }
    requireKnown(className, names);
    return names;
}

std::set<std::string> World::instances(const std::string& className) {
    const auto response =
        testbed::InstanceClient(broker_, &provider_).enumerateInstances(className);
    require(response.rc == CMPI_RC_OK, "a request for instances fails");
    std::set<std::string> names;
    for (const auto& instance : response.instances) {
        const testbed::CimValue* title = instance.find("ElementName");
        require(title != nullptr && !title->asString().empty(), "an instance without its title");
        require(names.insert(nameOf(instance.path)).second, "an instance comes twice");
    }
    requireKnown(className, names);
    return names;
}

const std::set<std::string>& World::all(const std::string& className) const {
    if (className == kDrives) return drives_;
    return className == kVolumes ? volumes_ : controllers_;
}

void World::requireKnown(const std::string& className, const std::set<std::string>& names) const {
    for (const std::string& name : names) {
        require(all(className).contains(name), className + " " + name + " is not in the array");
    }
}

void World::pullDrive() {
    for (const auto& drive : repository_.enumerate("root/sample", "CIM_DiskDrive")) pulled_ = drive;
    repository_.remove(pulled_.path);
}

void World::returnDrive() {
    repository_.put(pulled_);
}

void World::requireNothingLeft() {
    require(IsListEmpty(RaidControllerList), "controllers are left");
    require(IsFifoEmpty(&__FIFO) != 0, "work is left in the queue");
    require(ActiveThreads == 0, "a worker counts as active");
    const auto misuses = broker_.books().misuses();
    require(misuses.empty(), "misuse: " + (misuses.empty() ? "" : misuses.front()));
    const std::size_t clones = broker_.books().liveClones() - acceptedClones_;
    require(clones == 0, std::to_string(clones) + " clones are left");
}

void World::acceptWhatIsLeft() {
    acceptedClones_ = broker_.books().liveClones();
}

}  // namespace schedules
