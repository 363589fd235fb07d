// What a controller's cache holds, as plain values that can be compared and printed.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace modeltest {

/// A text that may be absent.
using Text = std::optional<std::string>;

struct PoolState {
    std::string className, instanceId, poolId;
    bool primordial = false;
    std::uint64_t operationalStatus = 0, total = 0, remaining = 0;
    std::vector<std::string> members;
    bool operator==(const PoolState&) const = default;
};

struct DriveState {
    std::string className, id;
    Text name, firmware, chassis, pool;
    std::uint64_t operationalStatus = 0, extentStatus = 0, enabledState = 0, slot = 0;
    std::uint64_t blocks = 0, consumable = 0;
    bool primordial = false;
    bool operator==(const DriveState&) const = default;
};

struct VolumeState {
    std::string className, id;
    Text elementName, name, raidLevel, pool;
    std::uint64_t operationalStatus = 0, extentStatus = 0, blocks = 0, consumable = 0;
    bool operator==(const VolumeState&) const = default;
};

struct PortState {
    std::string className, id;
    Text name;
    std::uint64_t operationalStatus = 0, portType = 0;
    bool operator==(const PortState&) const = default;
};

struct BatteryState {
    std::string className, id;
    std::uint64_t operationalStatus = 0, batteryStatus = 0;
    bool operator==(const BatteryState&) const = default;
};

struct ControllerState {
    std::string id, model;
    std::vector<PoolState> pools;
    std::vector<DriveState> drives;
    std::vector<VolumeState> volumes;
    std::vector<PortState> ports;
    std::vector<BatteryState> batteries;
    bool operator==(const ControllerState&) const = default;
};

/// One line a record; for the message of a failed comparison.
std::string describe(const ControllerState& controller);

/// Reads the provider's cache, controllers in list order.
std::vector<ControllerState> readCache();

}  // namespace modeltest
