// Elements of an array, as the provider tells of them.
#pragma once

#include <cstdint>
#include <string>

#include "cim_object.h"

inline constexpr const char* kController = "Tovexa_PlexorController";
inline constexpr const char* kVolume = "Tovexa_PlexorStorageVolume";
inline constexpr const char* kDrive = "Tovexa_PlexorStorageExtent";
inline constexpr const char* kPort = "Tovexa_PlexorSASSATAPort";
inline constexpr const char* kBattery = "Tovexa_PlexorBattery";

/// What a check judges: a name, OperationalStatus and HealthState.
inline testbed::Instance element(const std::string& name, std::uint16_t status,
                                 std::uint16_t health) {
    testbed::Instance instance;
    instance.set("ElementName", testbed::CimValue::string(name));
    instance.set("OperationalStatus", testbed::CimValue::uint16Array({status}));
    instance.set("HealthState", testbed::CimValue::uint16(health));
    return instance;
}
