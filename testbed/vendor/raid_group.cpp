// The condition of each place, and how many losses a RAID level bears.
#include "raid_group.h"

#include <algorithm>

namespace testbed {
namespace {

using enum DriveCondition;

constexpr std::uint16_t kOk = 2, kDormant = 15;
constexpr std::uint16_t kRebuild = 11, kSpare = 13;

/// How a level spreads over its places: `spans` equal parts, each of which bears `losses`.
struct Tolerance {
    std::size_t spans = 1;
    std::size_t losses = 0;
};

Tolerance toleranceOf(const VolumeDescription& volume, std::size_t places) {
    const std::string level = volume.raidLevel.value_or("");
    if (level == "RAID1") return {1, std::max<std::size_t>(places, 1) - 1};
    if (level == "RAID10") return {std::max<std::size_t>(places / 2, 1), 1};
    if (level == "RAID50") return {2, 1};
    if (level == "RAID60") return {2, 2};
    return {1, volume.packageRedundancy};
}

bool holds(const std::vector<std::string>& list, const std::string& text) {
    return std::find(list.begin(), list.end(), text) != list.end();
}

}  // namespace

bool isLostStatus(std::uint16_t operationalStatus) {
    constexpr std::uint16_t kLost[] = {6, 7, 12, 13};  // error, broken, no contact, lost
    return std::find(std::begin(kLost), std::end(kLost), operationalStatus) != std::end(kLost);
}

DriveCondition conditionOf(const DriveDescription& drive) {
    if (isLostStatus(drive.operationalStatus)) return Lost;
    if (drive.operationalStatus == kOk && drive.extentStatus == kRebuild) return Filling;
    if (drive.operationalStatus == kOk && drive.extentStatus == kSpare) return Spare;
    return drive.primordial || drive.operationalStatus == kDormant ? Elsewhere : Sound;
}

std::vector<std::string> groupPlaces(const ControllerDescription& controller,
                                     const PoolDescription& pool) {
    if (!pool.members.empty()) return pool.members;
    std::vector<std::string> places;
    std::vector<std::size_t> lost;
    for (const DriveDescription& drive : controller.drives) {
        if (!holds(drive.pools, pool.id) || conditionOf(drive) == Filling) continue;
        if (conditionOf(drive) == Lost) lost.push_back(places.size());
        places.push_back(drive.id);
    }
    auto free = lost.begin();
    for (const DriveDescription& drive : controller.drives) {
        if (!holds(drive.pools, pool.id) || conditionOf(drive) != Filling) continue;
        if (free != lost.end()) {
            places[*free++] = drive.id;
        } else {
            places.push_back(drive.id);
        }
    }
    return places;
}

std::vector<DriveCondition> placeConditions(const DriveIndex& drives, const std::string& pool,
                                            const std::vector<std::string>& places) {
    std::vector<DriveCondition> conditions;
    for (const std::string& id : places) {
        const DriveDescription* drive = drives.find(id);
        const DriveCondition condition =
            drive && holds(drive->pools, pool) ? conditionOf(*drive) : Lost;
        conditions.push_back(condition == Sound || condition == Filling ? condition : Lost);
    }
    return conditions;
}

const char* volumeStateOver(const VolumeDescription& volume,
                            const std::vector<DriveCondition>& places) {
    const Tolerance tolerance = toleranceOf(volume, places.size());
    std::vector<std::size_t> missing(tolerance.spans);
    for (std::size_t i = 0; i < places.size(); ++i) {
        if (places[i] != Sound) ++missing[i * tolerance.spans / places.size()];
    }
    for (const std::size_t count : missing) {
        if (count > tolerance.losses) return "offline";
    }
    if (std::count(places.begin(), places.end(), Lost) > 0) return "degraded";
    return std::count(places.begin(), places.end(), Filling) > 0 ? "rebuilding" : "optimal";
}

}  // namespace testbed
