// A scenario: a host's RAID controllers in the terms of those who run them, as plain data.
#pragma once

#include <chrono>
#include <cstdint>
#include <map>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "broker.h"
#include "cim_object.h"
#include "faults.h"

namespace testbed {

/// A scenario that cannot be used. The text is one line: file, place in the file, what is wrong.
struct ScenarioError : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/// What a scenario changes in a CIM object beyond its kind's own members.
struct Tweaks {
    std::string className;               ///< "": the vendor's class for that kind
    std::vector<NamedValue> properties;  ///< added, or in place of the usual values
    std::vector<NamedValue> keys;        ///< the same for the object path
    std::vector<std::string> omit;       ///< properties left out
    std::vector<std::string> omitKeys;   ///< keys left out of the object path
    bool operator==(const Tweaks&) const = default;
};

/// Everything that a scenario describes has an identifier and can be tweaked, and so can the
/// further objects ("parts") that stand behind it, by the part's name.
struct Described {
    std::string id;
    Tweaks tweaks;
    std::map<std::string, Tweaks> parts;

    /// The tweaks of a part; none for a part that the scenario does not mention.
    const Tweaks& part(const std::string& name) const;
    bool operator==(const Described&) const = default;
};

/// The host itself; `id` is its name.
struct HostDescription : Described {
    std::string elementName;
    bool absent = false;  ///< the host's computer system cannot be found
};

/// A registered profile; `id` is its place in the list.
struct ProfileDescription : Described {
    std::string registeredName;
    std::string version;
    std::uint16_t organization = 0;
    /// Controllers that conform to it; absent: all of them.
    std::optional<std::vector<std::string>> controllers;
    bool operator==(const ProfileDescription&) const = default;
};

struct SoftwareDescription : Described {
    std::vector<std::uint16_t> classifications;
    std::string version;
    bool operator==(const SoftwareDescription&) const = default;
};

/// Capacities in bytes.
struct PoolDescription : Described {
    bool primordial = false;
    std::vector<std::string> members;  ///< drives in their places; empty: those that name the pool
    std::uint64_t total = 0;
    std::uint64_t remaining = 0;
    std::uint16_t operationalStatus = 0;
    bool operator==(const PoolDescription&) const = default;
};

/// A drive enclosure; `id` is its number or its tag, as the scenario names it.
struct EnclosureDescription : Described {
    std::string tag;
    std::uint16_t operationalStatus = 0;
    bool operator==(const EnclosureDescription&) const = default;
};

/// Capacities in blocks of 512 bytes.
struct DriveDescription : Described {
    std::string name;
    std::string interface = "SAS";  ///< SAS or SATA; decides the vendor's class
    std::optional<std::uint16_t> slot;
    std::string enclosure;           ///< an enclosure's id, "" without one
    std::vector<std::string> pools;  ///< ids of pools, in the order of the associations
    std::optional<std::string> firmware;
    std::uint64_t blocks = 0;
    std::uint64_t consumableBlocks = 0;
    std::uint16_t enabledState = 0;
    std::uint16_t operationalStatus = 0;
    std::uint16_t extentStatus = 0;
    bool primordial = false;
    bool noMedia = false;    ///< no extent behind the drive
    bool noPackage = false;  ///< no physical package, hence no slot and no enclosure either
    std::string spareFor;    ///< a former hot spare: the drive in whose place it is
    std::string before;      ///< in a lost enclosure: the state to which it returns
    bool operator==(const DriveDescription&) const = default;
};

/// Capacities in blocks of 512 bytes.
struct VolumeDescription : Described {
    std::string name;
    std::optional<std::string> raidLevel;
    std::vector<std::string> pools;
    std::string uniqueName;
    std::uint64_t blocks = 0;
    std::uint64_t consumableBlocks = 0;
    std::uint16_t nameFormat = 0;
    std::uint16_t nameNameSpace = 0;
    std::uint16_t dataRedundancy = 0;
    std::uint16_t packageRedundancy = 0;
    std::uint16_t operationalStatus = 0;
    std::uint16_t extentStatus = 0;
    std::uint8_t deltaReservation = 0;
    bool basedOnUnderlyingRedundancy = false;
    bool primordial = false;
    bool operator==(const VolumeDescription&) const = default;
};

struct PortDescription : Described {
    std::string name;
    std::uint16_t portType = 0;
    std::uint16_t usageRestriction = 0;
    std::uint16_t operationalStatus = 0;
    bool operator==(const PortDescription&) const = default;
};

struct BatteryDescription : Described {
    std::uint16_t batteryStatus = 0;
    std::uint16_t operationalStatus = 0;
    bool operator==(const BatteryDescription&) const = default;
};

/// A device of the controller that is none of the known kinds, such as a fan.
struct OtherDescription : Described {
    std::string name;
    std::uint16_t operationalStatus = 0;
    bool operator==(const OtherDescription&) const = default;
};

struct ControllerDescription : Described {
    std::string model;
    std::uint16_t healthState = 0;
    std::uint16_t operationalStatus = 0;
    bool noSystem = false;   ///< no computer system stands behind the port controller
    bool noPackage = false;  ///< no physical package: neither model nor health
    std::vector<SoftwareDescription> software;
    std::vector<PoolDescription> pools;
    std::vector<EnclosureDescription> enclosures;
    std::vector<DriveDescription> drives;
    std::vector<VolumeDescription> volumes;
    std::vector<PortDescription> ports;
    std::vector<BatteryDescription> batteries;
    std::vector<OtherDescription> others;
};

struct VendorDescription {
    std::string nameSpace = "root/sample";
    std::string classPrefix = "Sample";
};

struct LatencyRange {
    std::chrono::milliseconds minimum{0};
    std::chrono::milliseconds maximum{0};
};

/// How long what follows from a change takes, in seconds of the scenario's time.
struct Consequences {
    bool enabled = true;
    std::uint32_t rebuild = 60;   ///< until a drive has been rebuilt
    std::uint32_t copyBack = 60;  ///< until a replaced drive has its data back from the spare
    std::uint32_t learn = 60;     ///< until a learning battery begins to charge
    std::uint32_t charge = 60;    ///< each of the steps low, charging
};

/// A command at its time.
struct TimedCommand {
    double at = 0;  ///< seconds of the scenario's time
    std::string command;
};

struct Scenario {
    std::string description;
    HostDescription host;
    VendorDescription vendor;
    std::vector<ProfileDescription> profiles;
    std::vector<ControllerDescription> controllers;
    std::vector<FaultRule> faults;
    LatencyRange latency;
    std::optional<std::uint32_t> shuffle;  ///< seed of the order of association results
    BrokerOptions manager;
    Consequences consequences;
    std::vector<TimedCommand> timeline;

    /// NULL when there is no such controller.
    const ControllerDescription* findController(const std::string& id) const;
};

/// The element with that id, NULL without one.
template <typename Description>
const Description* findById(const std::vector<Description>& list, const std::string& id) {
    for (const Description& item : list) {
        if (item.id == id) return &item;
    }
    return nullptr;
}

}  // namespace testbed
