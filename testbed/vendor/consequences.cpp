// Following enclosures, drives, batteries and volumes through a change: spares, rebuilds, states.
#include "consequences.h"

#include <algorithm>
#include <map>
#include <optional>
#include <string_view>
#include <unordered_map>

#include "array_commands.h"
#include "group_places.h"
#include "json_reader.h"
#include "scenario_parser.h"

namespace testbed {
namespace {

using nlohmann::json;
using enum DriveCondition;

constexpr std::uint16_t kOffline = 6;  // of a volume

bool holds(const std::vector<std::string>& list, const std::string& text) {
    return std::find(list.begin(), list.end(), text) != list.end();
}

std::string subjectOf(const char* kind, const std::string& controller, const std::string& id) {
    return std::string(kind) + " " + quotedWord(controller) + " " + quotedWord(id);
}

/// One controller before and after a change, and its part of the document.
class ControllerChange {
public:
    ControllerChange(json& controller, const ControllerDescription& before,
                     const ControllerDescription& after, const Consequences& times,
                     Aftermath& aftermath)
        : json_(controller), before_(before), after_(after), times_(times), aftermath_(aftermath) {
        for (const DriveDescription& drive : after_.drives) {
            if (!drive.spareFor.empty()) standIns_[drive.spareFor].push_back(&drive);
        }
    }

    void followEnclosures() {
        for (const EnclosureDescription& enclosure : after_.enclosures) {
            const EnclosureDescription* old = findById(before_.enclosures, enclosure.id);
            const bool isLost = isLostStatus(enclosure.operationalStatus);
            if (!old || isLostStatus(old->operationalStatus) == isLost) continue;
            for (const DriveDescription& drive : after_.drives) {
                if (drive.enclosure == enclosure.id) isLost ? hide(drive) : bringBack(drive);
            }
        }
    }

    void followDrives() {
        for (const PoolDescription& pool : after_.pools) {
            const PoolDescription* old = findById(before_.pools, pool.id);
            if (!old || pool.primordial) continue;
            GroupPlaces places(groupPlaces(before_, *old), drivesAfter_);
            if (!hasChanged(pool, places.ids())) continue;
            for (const DriveDescription& drive : after_.drives) {
                if (holds(drive.pools, pool.id)) followDrive(pool, drive, places);
            }
            callSpares(pool, places);
            element("pools", pool.id)["members"] = places.ids();
        }
        for (const DriveDescription& drive : after_.drives) {
            if (conditionOf(drive) != Filling) {
                aftermath_.cancelled.push_back(subjectOf("drive", after_.id, drive.id));
            }
        }
    }

    void followVolumes() {
        for (const VolumeDescription& volume : after_.volumes) {
            for (const std::string& id : volume.pools) followVolume(volume, id);
        }
    }

    void followBatteries() {
        for (const BatteryDescription& battery : after_.batteries) {
            const BatteryDescription* old = findById(before_.batteries, battery.id);
            if (old && old->batteryStatus == battery.batteryStatus) continue;
            const std::string subject = subjectOf("battery", after_.id, battery.id);
            aftermath_.cancelled.push_back(subject);
            for (const BatteryStep& step : batterySteps()) {
                if (step.batteryStatus == battery.batteryStatus) {
                    schedule(subject, step.next, step.seconds);
                }
            }
        }
    }

    /// Whether the document may be another one now.
    bool hasChangedDocument() const { return changed_; }

private:
    struct BatteryStep {
        std::uint16_t batteryStatus;
        const char* next;
        std::uint32_t seconds;
    };

    std::vector<BatteryStep> batterySteps() const {
        return {{12, "charging and low", times_.learn},
                {9, "charging and low", times_.charge},
                {8, "charging", times_.charge},
                {6, "optimal", times_.charge}};
    }

    /// To be changed.
    json& driveElement(const std::string& id) {
        changed_ = true;
        if (drives_.empty()) {
            for (json& element : json_["drives"]) drives_.try_emplace(idOf(element), &element);
        }
        return *drives_.at(id);
    }
    json& element(const char* list, const std::string& id) {
        changed_ = true;
        return *findElement(json_, list, id);
    }

    std::optional<DriveCondition> conditionBefore(const std::string& id) const {
        const DriveDescription* old = drivesBefore_.find(id);
        return old ? std::optional(conditionOf(*old)) : std::nullopt;
    }

    void schedule(const std::string& subject, const std::string& state, std::uint32_t seconds) {
        aftermath_.commands.push_back({double(seconds),
                                       "set " + subject + " state=" + json(state).dump(), subject,
                                       double(seconds)});
    }

    void hide(const DriveDescription& hidden) {
        if (conditionOf(hidden) == Lost) return;
        json& entry = driveElement(hidden.id);
        const std::string state = entry.value("state", "online");
        setState(entry, "offline");
        entry["before"] = state;
    }

    void bringBack(const DriveDescription& hidden) {
        if (hidden.before.empty()) return;
        json& entry = driveElement(hidden.id);
        entry.erase("before");
        setState(entry, hidden.before);
    }

    /// Whether a drive of the group has come, gone or changed.
    bool hasChanged(const PoolDescription& pool, const std::vector<std::string>& places) const {
        for (const DriveDescription& drive : after_.drives) {
            const DriveDescription* old = drivesBefore_.find(drive.id);
            const bool isIn = holds(drive.pools, pool.id);
            const bool wasIn = old && holds(old->pools, pool.id);
            if (isIn != wasIn || (isIn && conditionOf(*old) != conditionOf(drive))) return true;
        }
        return std::any_of(places.begin(), places.end(), [&](const std::string& id) {
            return drivesBefore_.find(id) && !drivesAfter_.find(id);
        });
    }

    const DriveDescription* standInFor(const std::string& id, const GroupPlaces& places) const {
        const auto found = standIns_.find(id);
        if (found == standIns_.end()) return nullptr;
        for (const DriveDescription* drive : found->second) {
            if (places.placeOf(drive->id)) return drive;
        }
        return nullptr;
    }

    void followDrive(const PoolDescription& pool, const DriveDescription& drive,
                     GroupPlaces& places) {
        const DriveCondition now = conditionOf(drive);
        const auto then = conditionBefore(drive.id);
        if (now == then || (now != Sound && now != Filling)) return;
        const DriveDescription* standIn = standInFor(drive.id, places);
        const bool isFilled = now == Sound && then == Filling;
        if (now == Filling || (!isFilled && (standIn || (!then && places.placeFor(drive.id))))) {
            fill(drive, standIn, places);
        } else if (standIn) {
            places.put(*places.placeOf(standIn->id), drive.id);
            release(*standIn);
        } else if (isFilled && !drive.spareFor.empty()) {
            retire(pool, drive.spareFor);
        } else if (!places.placeOf(drive.id)) {
            places.append(drive.id);
        }
    }

    /// A drive gets its data: in the place of a lost one, or back from the spare in its place.
    void fill(const DriveDescription& filled, const DriveDescription* standIn,
              GroupPlaces& places) {
        json& entry = driveElement(filled.id);
        if (conditionOf(filled) != Filling) setState(entry, standIn ? "copy back" : "rebuild");
        if (const auto place = places.placeFor(filled.id); !standIn && place) {
            const std::string lost = places.ids()[*place];
            if (lost != filled.id && drivesAfter_.find(lost)) entry["spareFor"] = lost;
            places.put(*place, filled.id);
        } else if (!standIn) {
            places.append(filled.id);
        }
        schedule(subjectOf("drive", after_.id, filled.id), "online",
                 standIn ? times_.copyBack : times_.rebuild);
    }

    void moveToPrimordial(json& entry) {
        const auto primordial = std::find_if(after_.pools.begin(), after_.pools.end(),
                                             [](const auto& pool) { return pool.primordial; });
        if (primordial != after_.pools.end()) movePool(entry, primordial->id);
    }

    /// A spare that has done its work.
    void release(const DriveDescription& spare) {
        json& entry = driveElement(spare.id);
        entry.erase("spareFor");
        moveToPrimordial(entry);
        setState(entry, "hot spare");
    }

    /// A lost drive whose place another one has taken leaves the group.
    void retire(const PoolDescription& pool, const std::string& id) {
        const DriveDescription* lost = drivesAfter_.find(id);
        if (!lost || conditionOf(*lost) != Lost || !holds(lost->pools, pool.id)) return;
        json& entry = driveElement(id);
        entry.erase("spareFor");
        moveToPrimordial(entry);
        entry["primordial"] = true;
    }

    const DriveDescription* smallestSpare(std::uint64_t blocks) const {
        const DriveDescription* found = nullptr;
        for (const DriveDescription& drive : after_.drives) {
            const bool isFree = conditionOf(drive) == Spare && !taken_.contains(drive.id);
            if (!isFree || drive.blocks < blocks) continue;
            if (!found || drive.blocks < found->blocks) found = &drive;
        }
        return found;
    }

    bool canRebuild(const PoolDescription& pool, const std::vector<std::string>& places) const {
        const auto conditions = placeConditions(drivesAfter_, pool.id, places);
        return std::any_of(after_.volumes.begin(), after_.volumes.end(), [&](const auto& volume) {
            return holds(volume.pools, pool.id) && volume.operationalStatus != kOffline &&
                   volumeStateOver(volume, conditions) != std::string("offline");
        });
    }

    void callSpares(const PoolDescription& pool, GroupPlaces& places) {
        if (!canRebuild(pool, places.ids())) return;
        const auto conditions = placeConditions(drivesAfter_, pool.id, places.ids());
        for (std::size_t i = 0; i < conditions.size(); ++i) {
            const std::string old = places.ids()[i];
            // What followDrive has put there is being filled.
            const DriveDescription* lost = drivesAfter_.find(old);
            if (conditions[i] != Lost || (lost && conditionOf(*lost) != Lost)) continue;
            const DriveDescription* size = lost ? lost : drivesBefore_.find(old);
            const DriveDescription* spare = smallestSpare(size ? size->blocks : 0);
            if (!spare) continue;
            const bool wasStandIn = size && !size->spareFor.empty();
            if (wasStandIn) retire(pool, old);
            join(pool, *spare, wasStandIn ? size->spareFor : old);
            places.put(i, spare->id);
        }
    }

    void join(const PoolDescription& pool, const DriveDescription& spare, const std::string& lost) {
        taken_.emplace(spare.id, true);
        json& entry = driveElement(spare.id);
        movePool(entry, pool.id);
        setState(entry, "rebuild");
        entry["spareFor"] = lost;
        schedule(subjectOf("drive", after_.id, spare.id), "online", times_.rebuild);
    }

    /// Whether a drive has come back as it was, with its data.
    bool hasReturned(const std::vector<std::string>& places) const {
        return std::any_of(places.begin(), places.end(), [&](const std::string& id) {
            const DriveDescription* drive = drivesAfter_.find(id);
            return drive && conditionOf(*drive) == Sound && conditionBefore(id) == Lost;
        });
    }

    void followVolume(const VolumeDescription& volume, const std::string& id) {
        const PoolDescription* pool = findById(after_.pools, id);
        if (!pool || pool->primordial) return;
        const std::vector<std::string> places = groupPlaces(after_, *pool);
        if (!hasChanged(*pool, places) && sameMembers(*pool)) return;
        const std::string state =
            volumeStateOver(volume, placeConditions(drivesAfter_, id, places));
        if (volume.operationalStatus == kOffline && !hasReturned(places)) return;
        setState(element("volumes", volume.id), state);
        json& poolElement = element("pools", id);
        poolElement.erase("operationalStatus");
        poolElement["status"] = state == "optimal"   ? "ok"
                                : state == "offline" ? "error"
                                                     : "degraded";
    }

    bool sameMembers(const PoolDescription& pool) const {
        const PoolDescription* old = findById(before_.pools, pool.id);
        return old && old->members == pool.members;
    }

    json& json_;
    const ControllerDescription& before_;
    const ControllerDescription& after_;
    const DriveIndex drivesBefore_{before_.drives};
    const DriveIndex drivesAfter_{after_.drives};
    std::unordered_map<std::string_view, std::vector<const DriveDescription*>> standIns_;
    std::unordered_map<std::string, json*> drives_;
    const Consequences& times_;
    Aftermath& aftermath_;
    std::map<std::string, bool> taken_;
    bool changed_ = false;
};

using Steps = std::initializer_list<void (ControllerChange::*)()>;

/// Some steps for every controller that was there before.
void forControllers(json& document, const Scenario& before, Scenario& after,
                    const std::string& name, Aftermath& aftermath, Steps steps) {
    bool changed = false;
    for (const ControllerDescription& controller : after.controllers) {
        const ControllerDescription* old = before.findController(controller.id);
        if (!old) continue;
        ControllerChange change(*findElement(document, "controllers", controller.id), *old,
                                controller, after.consequences, aftermath);
        for (const auto step : steps) (change.*step)();
        if (change.hasChangedDocument()) changed = true;
    }
    if (changed) after = scenarioOf(document, name);
}

}  // namespace

Aftermath followChange(json& document, const Scenario& before, Scenario& after,
                       const std::string& name) {
    // Each step goes on from what the one before has made of the document.
    Aftermath aftermath;
    const auto follow = [&](Steps steps) {
        forControllers(document, before, after, name, aftermath, steps);
    };
    follow({&ControllerChange::followEnclosures});
    follow({&ControllerChange::followDrives, &ControllerChange::followBatteries});
    follow({&ControllerChange::followVolumes});
    return aftermath;
}

}  // namespace testbed
