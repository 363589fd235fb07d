#include "response_check.h"

#include <algorithm>

namespace torture {

using testbed::ControllerDescription;
using testbed::ObjectPath;
using testbed::Response;
using testbed::ServedClass;

namespace {

template <typename Description>
std::vector<std::string> idsOf(const std::vector<Description>& list) {
    std::vector<std::string> ids;
    for (const Description& item : list) ids.push_back(item.id);
    return ids;
}

std::vector<std::string> deviceIds(const ControllerDescription& controller,
                                   const std::string& heading) {
    if (heading == "Volumes") return idsOf(controller.volumes);
    if (heading == "Drives") return idsOf(controller.drives);
    if (heading == "Ports") return idsOf(controller.ports);
    return idsOf(controller.batteries);
}

std::string identity(const ServedClass& served, const ObjectPath& path) {
    const testbed::CimValue* key = path.findKey(served.identityKey);
    return key != nullptr ? key->asString() : "";
}

}  // namespace

std::string identityOf(const ServedClass& served, const std::string& controllerId,
                       const std::string& deviceId) {
    return served.prefix + controllerId + (served.isDevice ? "_" + deviceId : "");
}

std::vector<std::string> identitiesIn(const ServedClass& served, const Response& response) {
    std::vector<std::string> ids;
    for (const ObjectPath& path : response.paths) ids.push_back(identity(served, path));
    for (const auto& instance : response.instances) ids.push_back(identity(served, instance.path));
    std::sort(ids.begin(), ids.end());
    return ids;
}

ResponseCheck::ResponseCheck(Failures& failures, const testbed::Scenario& scenario)
    : failures_(failures) {
    const ControllerDescription& steadyOne = scenario.controllers.back();
    for (const ServedClass& served : testbed::servedClasses()) {
        SteadyIds expected = {served.name, !served.isDevice, {}};
        if (served.isDevice) {
            for (const std::string& id : deviceIds(steadyOne, served.heading))
                expected.ids.push_back(identityOf(served, steadyOne.id, id));
        } else {
            for (const auto& controller : scenario.controllers)
                expected.ids.push_back(identityOf(served, controller.id, ""));
        }
        std::sort(expected.ids.begin(), expected.ids.end());
        steady_.push_back(std::move(expected));
    }
}

const ResponseCheck::SteadyIds& ResponseCheck::steady(const ServedClass& served) const {
    return *std::find_if(steady_.begin(), steady_.end(), [&](const SteadyIds& expected) {
        return expected.className == served.name;
    });
}

void ResponseCheck::status(const char* operation, const std::string& what,
                           const Response& response) const {
    if (response.rc != CMPI_RC_OK)
        failures_.add(std::string(operation) + " of " + what + ": status " +
                      std::to_string(response.rc));
    else if (response.doneCalls != 1)
        failures_.add(std::string(operation) + " of " + what + ": returnDone called " +
                      std::to_string(response.doneCalls) + " times");
}

void ResponseCheck::enumeration(const ServedClass& served, const Response& response,
                                bool complete) const {
    status("enumeration", served.name, response);
    const auto ids = identitiesIn(served, response);
    const auto twice = std::adjacent_find(ids.begin(), ids.end());
    if (twice != ids.end()) failures_.add(*twice + " is twice in one response");

    const SteadyIds& expected = steady(served);
    if (!complete && !expected.always) return;
    for (const std::string& id : expected.ids)
        if (!std::binary_search(ids.begin(), ids.end(), id))
            failures_.add(id + " is missing in a response");
}

void ResponseCheck::get(const ServedClass& served, const ObjectPath& path,
                        const Response& response) const {
    const std::string id = identity(served, path);
    const SteadyIds& expected = steady(served);
    const bool mayBeGone = !std::binary_search(expected.ids.begin(), expected.ids.end(), id);
    if (response.rc == CMPI_RC_ERR_NOT_FOUND && mayBeGone) return;
    status("get", id, response);
    if (response.instances.size() != 1)
        failures_.add("get of " + id + ": " + std::to_string(response.instances.size()) +
                      " instances");
    else if (identity(served, response.instances[0].path) != id)
        failures_.add("get of " + id + " answers with another device");
}

}  // namespace torture
