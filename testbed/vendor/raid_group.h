// A pool's drives as RAID sees them: places, what stands in each, and what that leaves of a volume.
#pragma once

#include <string>
#include <vector>

#include "id_index.h"
#include "scenario.h"

namespace testbed {

/// How a drive stands to its group.
enum class DriveCondition { Sound, Filling, Lost, Spare, Elsewhere };

/// Whether an OperationalStatus is that of a thing that cannot be used.
bool isLostStatus(std::uint16_t operationalStatus);

/// From the numbers that the vendor publishes for it.
DriveCondition conditionOf(const DriveDescription& drive);

/// The places of a pool with their drives' ids, which may be of drives that are gone. When the pool
/// does not say them, they are the drives that name it; a drive being rebuilt then stands in the
/// place of a lost one.
std::vector<std::string> groupPlaces(const ControllerDescription& controller,
                                     const PoolDescription& pool);

using DriveIndex = IdIndex<DriveDescription>;

/// What each place holds: Sound, Filling or Lost.
std::vector<DriveCondition> placeConditions(const DriveIndex& drives, const std::string& pool,
                                            const std::vector<std::string>& places);

/// The state word of a volume over these places: optimal, rebuilding, degraded or offline. RAID10
/// mirrors a place with the next one; RAID50 and RAID60 have two halves.
const char* volumeStateOver(const VolumeDescription& volume,
                            const std::vector<DriveCondition>& places);

}  // namespace testbed
