// Looking for the signs: missing members, controllers without devices, what has come and gone.
#include "inventory_gaps.h"

#include <algorithm>
#include <map>
#include <set>

#include "volume_members.h"

namespace testbed {
namespace {

const ServedClass& kControllers = servedClasses()[0];
const ServedClass& kVolumes = servedClasses()[2];
const ServedClass& kDrives = servedClasses()[3];

/// NULL for a class that was not answered.
const std::vector<Instance>* answered(const Inventory& inventory, const std::string& className) {
    for (const ClassAnswer& answer : inventory) {
        if (sameName(answer.className, className)) {
            return answer.response.rc == CMPI_RC_OK ? &answer.response.instances : nullptr;
        }
    }
    return nullptr;
}

std::set<std::string> identities(const std::vector<Instance>& instances) {
    std::set<std::string> all;
    for (const Instance& instance : instances) all.insert(instance.path.identity());
    return all;
}

std::size_t countMissing(const std::set<std::string>& from, const std::set<std::string>& in) {
    return static_cast<std::size_t>(std::count_if(
        from.begin(), from.end(), [&](const std::string& each) { return !in.contains(each); }));
}

void appendChange(std::string& text, std::size_t count, const ServedClass& served,
                  const char* change) {
    if (count == 0) return;
    text += (text.empty() ? "" : ", ") + std::to_string(count) + " " +
            (count == 1 ? served.singular : served.plural) + (count == 1 ? " has " : " have ") +
            change;
}

/// The devices of one controller, by their ids.
std::set<std::string> devicesOf(const std::string& controllerId, const ServedClass& served,
                                const std::vector<Instance>& instances) {
    std::set<std::string> ids;
    for (const Instance& instance : instances) {
        const auto identity = identityOf(served, instance);
        if (identity && belongsTo(served, *identity, controllerId)) {
            ids.insert(identity->substr(controllerId.size() + 1));
        }
    }
    return ids;
}

/// What a volume names that is not there; "" when all is. Ids with a comma in them are let pass.
std::string missingMember(const Instance& volume, const std::set<std::string>& drives) {
    const CimValue* name = volume.find("ElementName");
    const auto members = membersIn(name ? name->asString() : "");
    const std::set<std::string> distinct(members.begin(), members.end());
    const bool commas = std::any_of(drives.begin(), drives.end(), [](const std::string& id) {
        return id.find(',') != std::string::npos;
    });
    if (commas) return "";
    if (distinct.size() > drives.size()) {
        return std::to_string(distinct.size()) + " drives, of which " +
               std::to_string(drives.size()) + " are there";
    }
    for (const std::string& member : members) {
        if (!member.empty() && !isPlace(member) && !drives.contains(member)) {
            return "drive " + member + ", which is not there";
        }
    }
    return "";
}

using DriveIds = std::map<std::string, std::set<std::string>>;  // by controller

/// The drives of every controller that the volume may belong to.
std::set<std::string> drivesBeside(const Instance& volume, const DriveIds& drives) {
    const auto identity = identityOf(kVolumes, volume);
    std::set<std::string> ids;
    if (!identity) return ids;
    for (const auto& [controllerId, own] : drives) {
        if (belongsTo(kVolumes, *identity, controllerId)) ids.insert(own.begin(), own.end());
    }
    return ids;
}

/// True when the volume belongs to a controller that is there.
bool hasController(const Instance& volume, const DriveIds& drives) {
    const auto identity = identityOf(kVolumes, volume);
    return identity && std::any_of(drives.begin(), drives.end(), [&](const auto& entry) {
               return belongsTo(kVolumes, *identity, entry.first);
           });
}

void findMissingMembers(const Inventory& inventory, const DriveIds& drives,
                        std::vector<std::string>& gaps) {
    const auto* volumes = answered(inventory, kVolumes.name);
    if (!volumes || !answered(inventory, kDrives.name)) return;
    for (const Instance& volume : *volumes) {
        if (!hasController(volume, drives)) continue;
        const std::string missing = missingMember(volume, drivesBeside(volume, drives));
        if (!missing.empty()) gaps.push_back(shortName(volume) + " names " + missing);
    }
}

/// True when there may be a device of that controller, or when not all of them are known.
bool mayHaveDevices(const Inventory& inventory, const std::string& controllerId) {
    for (const ServedClass& served : servedClasses()) {
        if (!served.isDevice) continue;
        const auto* devices = answered(inventory, served.name);
        if (!devices || !devicesOf(controllerId, served, *devices).empty()) return true;
    }
    return false;
}

}  // namespace

std::string differenceOf(const Inventory& before, const Inventory& after) {
    std::string text;
    for (const ServedClass& served : servedClasses()) {
        const auto* old = answered(before, served.name);
        const auto* now = answered(after, served.name);
        if (!old || !now) continue;
        const auto oldOnes = identities(*old), newOnes = identities(*now);
        appendChange(text, countMissing(newOnes, oldOnes), served, "come");
        appendChange(text, countMissing(oldOnes, newOnes), served, "gone");
    }
    return text;
}

std::vector<std::string> gapsIn(const Inventory& inventory, const CheckPolicy& policy) {
    std::vector<std::string> gaps;
    const auto* controllers = answered(inventory, kControllers.name);
    if (!controllers) return gaps;
    const auto* allDrives = answered(inventory, kDrives.name);
    DriveIds drives;
    for (const Instance& controller : *controllers) {
        const auto id = identityOf(kControllers, controller);
        if (!id) continue;
        drives[*id] = allDrives ? devicesOf(*id, kDrives, *allDrives) : std::set<std::string>();
        if (!policy.ignores(kControllers, controller) && !mayHaveDevices(inventory, *id)) {
            gaps.push_back(shortName(controller) + " has no devices");
        }
    }
    findMissingMembers(inventory, drives, gaps);
    return gaps;
}

}  // namespace testbed
