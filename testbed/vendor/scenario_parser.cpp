// Reading host, vendor, controllers, profiles and manager, and files with their errors by line.
#include "scenario_parser.h"

#include <cerrno>
#include <cstring>
#include <fstream>
#include <sstream>

#include "json_document.h"
#include "manager_kinds.h"
#include "scenario_reading.h"

namespace testbed {
namespace {

using nlohmann::json;

HostDescription readHost(JsonReader& scenario) {
    HostDescription host;
    host.id = "localhost.localdomain";
    const auto place = scenario.take("host");
    if (place) {
        JsonReader reader(*place);
        host.id = reader.text("name", host.id);
        host.elementName = reader.text("elementName", host.id);
        host.absent = reader.flag("absent");
        readTweaks(reader, host, "CIM_ComputerSystem");
        reader.finish();
    }
    if (host.elementName.empty()) host.elementName = host.id;
    return host;
}

VendorDescription readVendor(JsonReader& scenario) {
    VendorDescription vendor;
    const auto place = scenario.take("vendor");
    if (!place) return vendor;
    JsonReader reader(*place);
    vendor.nameSpace = reader.text("namespace", vendor.nameSpace);
    vendor.classPrefix = reader.text("classPrefix", vendor.classPrefix);
    reader.finish();
    return vendor;
}

ControllerDescription readController(const JsonPlace& place) {
    JsonReader reader(place);
    ControllerDescription controller;
    controller.id = reader.text("id");
    controller.model = reader.text("model", "");
    controller.healthState = reader.code("health", healthStateWords(), 5);
    controller.operationalStatus = readStatus(reader);
    controller.noSystem = reader.flag("noSystem");
    controller.noPackage = reader.flag("noPackage");
    controller.software = readSoftware(reader);
    controller.pools = readList(reader, "pools", readPool, controller);
    controller.enclosures = readList(reader, "enclosures", readEnclosure, controller);
    controller.drives = readList(reader, "drives", readDrive, controller);
    controller.volumes = readList(reader, "volumes", readVolume, controller);
    controller.ports = readList(reader, "ports", readPort, controller);
    controller.batteries = readList(reader, "batteries", readBattery, controller);
    controller.others = readList(reader, "others", readOther, controller);
    readTweaks(reader, controller, "CIM_PortController",
               {{"system", "CIM_ComputerSystem"}, {"package", "CIM_PhysicalPackage"}});
    reader.finish();
    return controller;
}

std::vector<ControllerDescription> readControllers(JsonReader& scenario) {
    std::vector<ControllerDescription> controllers;
    for (const JsonPlace& place : scenario.list("controllers")) {
        controllers.push_back(readController(place));
        const ControllerDescription& latest = controllers.back();
        if (findById(controllers, latest.id) != &latest) {
            place.fail("second controller \"" + latest.id + "\"");
        }
    }
    return controllers;
}

ProfileDescription readProfile(const JsonPlace& place, const Scenario& scenario,
                               std::size_t position) {
    JsonReader reader(place);
    ProfileDescription profile;
    profile.id = std::to_string(position);
    profile.registeredName = reader.text("name");
    profile.version = reader.text("version", "1.0.0");
    profile.organization = reader.number16("organization", 11);
    if (reader.has("controllers")) profile.controllers = reader.texts("controllers");
    for (const std::string& id : profile.controllers.value_or(std::vector<std::string>{})) {
        if (!scenario.findController(id)) reader.fail("no controller \"" + id + "\"");
    }
    readTweaks(reader, profile, "CIM_RegisteredProfile");
    reader.finish();
    return profile;
}

/// What a vendor of RAID controllers registers when the scenario says nothing about it.
std::vector<ProfileDescription> usualProfiles() {
    const auto profile = [](const char* id, const char* name, const char* version,
                            std::optional<std::vector<std::string>> controllers) {
        ProfileDescription description;
        description.id = id;
        description.registeredName = name;
        description.version = version;
        description.organization = 11;
        description.controllers = std::move(controllers);
        return description;
    };
    const std::vector<std::string> nothing;
    return {profile("0", "Host Discovered Resources", "1.2.0", nothing),
            profile("1", "Host Hardware RAID Controller", "1.3.0", std::nullopt),
            profile("2", "Software Inventory", "1.0.0", nothing)};
}

std::vector<ProfileDescription> readProfiles(JsonReader& reader, const Scenario& scenario) {
    if (!reader.has("profiles")) return usualProfiles();
    std::vector<ProfileDescription> profiles;
    for (const JsonPlace& place : reader.list("profiles")) {
        profiles.push_back(readProfile(place, scenario, profiles.size()));
    }
    return profiles;
}

LatencyRange readLatency(JsonReader& scenario) {
    const auto place = scenario.take("latencyMs");
    if (!place) return {};
    if (!place->value->is_array() || place->value->size() != 2) {
        place->fail("a list of two numbers is needed here");
    }
    const std::uint64_t minimum = readNumber(place->element(0), INT32_MAX);
    const std::uint64_t maximum = readNumber(place->element(1), INT32_MAX);
    if (minimum > maximum) place->fail("the second number must not be below the first");
    return {std::chrono::milliseconds(minimum), std::chrono::milliseconds(maximum)};
}

void readManagerMembers(JsonReader reader, BrokerOptions& options) {
    if (const auto kind = reader.optionalText("kind")) setManagerKind(options, *kind);
    for (const ManagerBehaviour& behaviour : managerBehaviours()) {
        const std::string member = behaviour.memberName();
        if (reader.has(member)) behaviour.set(options, reader.flag(member));
    }
    options.name = reader.text("name", options.name);
    options.allProperties = reader.flag("allProperties");
    options.strictProperties = reader.flag("strictProperties", true);
    if (const auto seed = reader.number("orderSeed", UINT32_MAX)) {
        options.orderSeed = static_cast<std::uint32_t>(*seed);
    }
    if (reader.has("staticNamespaces")) options.staticNamespaces = reader.texts("staticNamespaces");
    reader.finish();
}

/// A manager's name, also with single behaviours, or an object with "kind" and behaviours.
BrokerOptions readManager(JsonReader& scenario) {
    BrokerOptions options;
    options.strictProperties = true;
    const auto place = scenario.take("manager");
    if (!place) return options;
    try {
        if (place->value->is_string()) {
            chooseManager(options, readText(*place));
        } else {
            readManagerMembers(JsonReader(*place), options);
        }
    } catch (const UnknownManager& error) {
        place->fail(error.what());
    }
    return options;
}

Scenario readDocument(const JsonPlace& place) {
    limitRepetitions(place);
    JsonReader reader(place);
    Scenario scenario;
    reader.take("$schema");  // for editors
    scenario.description = reader.text("description", "");
    scenario.host = readHost(reader);
    scenario.vendor = readVendor(reader);
    scenario.controllers = readControllers(reader);
    scenario.profiles = readProfiles(reader, scenario);
    for (const JsonPlace& fault : reader.list("faults")) {
        scenario.faults.push_back(readFault(fault));
    }
    scenario.latency = readLatency(reader);
    if (const auto seed = reader.number("shuffle", UINT32_MAX)) {
        scenario.shuffle = static_cast<std::uint32_t>(*seed);
    }
    scenario.manager = readManager(reader);
    scenario.consequences = readConsequences(reader);
    scenario.timeline = readTimeline(reader);
    reader.finish();
    if (!reader.has("controllers")) reader.fail("\"controllers\" is missing");
    return scenario;
}

std::string contentOf(const std::string& file) {
    std::ifstream stream(file, std::ios::binary);
    if (!stream) throw ScenarioError(file + ": " + std::strerror(errno));
    std::stringstream text;
    errno = 0;
    if (stream.peek() != EOF) text << stream.rdbuf();
    if (errno != 0) throw ScenarioError(file + ": " + std::strerror(errno));
    return text.str();
}

struct ScenarioFile {
    json document;
    Scenario scenario;
};

/// Errors tell the line.
ScenarioFile readFile(const std::string& file) {
    const std::string text = contentOf(file);
    json document = parseJson(text, file);
    try {
        Scenario scenario = readDocument({&document, file, ""});
        return {std::move(document), std::move(scenario)};
    } catch (const PlacedError& error) {
        throw ScenarioError(error.what() + (" (line " + std::to_string(lineOf(text, error.place))) +
                            ")");
    }
}

}  // namespace

Scenario scenarioOf(const json& document, const std::string& name) {
    return readDocument({&document, name, "", ElementNames::Ids});
}

Scenario parseScenario(const std::string& text, const std::string& name) {
    const json document = parseJson(text, name);
    return readDocument({&document, name, ""});
}

json readScenarioDocument(const std::string& file) {
    json document = readFile(file).document;
    expandRepetitions(document);
    return document;
}

Scenario readScenario(const std::string& file) {
    return readFile(file).scenario;
}

}  // namespace testbed
