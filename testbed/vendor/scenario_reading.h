// The pieces of which the scenario parser is made; for its own files only.
#pragma once

#include <initializer_list>
#include <string>
#include <unordered_set>

#include "json_reader.h"
#include "scenario.h"

namespace testbed {

/// A further object behind a described one, and the CIM class that it has.
struct PartName {
    const char* name;
    const char* cimClass;
};

/// Reads "properties", "keys", "omit", "omitKeys", "class", and the same below each part's name.
void readTweaks(JsonReader& reader, Described& described, const char* cimClass,
                std::initializer_list<PartName> parts = {});

/// Reads "status" or "operationalStatus", which mean the same: a word or a number.
std::uint16_t readStatus(JsonReader& reader, std::uint16_t absent = 2);

/// Reads the list `name` of a controller with one of the functions below; ids must differ.
template <typename Description>
std::vector<Description> readList(JsonReader& reader, const std::string& name,
                                  Description (*read)(const JsonPlace&,
                                                      const ControllerDescription&),
                                  const ControllerDescription& controller) {
    std::vector<Description> list;
    std::unordered_set<std::string> ids;
    for (const JsonPlace& place : reader.list(name)) {
        list.push_back(read(place, controller));
        const std::string& id = list.back().id;
        if (!ids.insert(id).second) place.fail("second \"" + id + "\"");
    }
    return list;
}

// One element each. The controller is as far as it has been read: pools and enclosures are read
// before what refers to them.
PoolDescription readPool(const JsonPlace& place, const ControllerDescription& controller);
EnclosureDescription readEnclosure(const JsonPlace& place, const ControllerDescription& controller);
DriveDescription readDrive(const JsonPlace& place, const ControllerDescription& controller);
VolumeDescription readVolume(const JsonPlace& place, const ControllerDescription& controller);
PortDescription readPort(const JsonPlace& place, const ControllerDescription& controller);
BatteryDescription readBattery(const JsonPlace& place, const ControllerDescription& controller);
OtherDescription readOther(const JsonPlace& place, const ControllerDescription& controller);

/// The software list of a controller: an object by kind, or a list.
std::vector<SoftwareDescription> readSoftware(JsonReader& reader);

FaultRule readFault(const JsonPlace& place);

/// "consequences": true, false, or an object with the times.
Consequences readConsequences(JsonReader& scenario);
/// "timeline": commands with their times, in the order of time.
std::vector<TimedCommand> readTimeline(JsonReader& scenario);

}  // namespace testbed
