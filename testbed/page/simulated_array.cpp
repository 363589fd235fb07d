// Racks of slots from the scenario, progress from the schedule, and the timeline's next commands.
#include "simulated_array.h"

#include <algorithm>
#include <cmath>

#include "cim_words.h"
#include "command_words.h"
#include "printable.h"
#include "raid_group.h"

namespace testbed {
namespace {

using nlohmann::ordered_json;

constexpr std::size_t kShownAhead = 5;

struct Slot {
    std::optional<std::uint16_t> number;
    ordered_json content;  // what stands beside the number
};

std::string targetOf(const std::string& controller, const std::string& id) {
    return quotedWord(controller) + " " + quotedWord(id);
}

std::string keyFor(const std::string& kind, const std::string& controller, const std::string& id) {
    return kind + ":" + controller + "_" + id;
}

/// In their order, with the numbers between them, unless they lie far apart.
ordered_json slotsAsJson(std::vector<Slot> slots) {
    std::stable_sort(slots.begin(), slots.end(), [](const Slot& left, const Slot& right) {
        return left.number.value_or(0xffff) < right.number.value_or(0xffff);
    });
    constexpr int kWidest = 24;
    std::optional<int> last;
    ordered_json list = ordered_json::array();
    for (const Slot& slot : slots) {
        for (int next = last.value_or(0) + 1; last && slot.number && next < *slot.number; next++) {
            if (*slot.number - *last > kWidest) break;
            list.push_back({{"slot", next}});
        }
        ordered_json entry =
            slot.number ? ordered_json{{"slot", *slot.number}} : ordered_json{{"slot", nullptr}};
        entry.update(slot.content);
        list.push_back(std::move(entry));
        if (slot.number) last = *slot.number;
    }
    return list;
}

class Racks {
public:
    explicit Racks(const LiveArray& array) : array_(array), pulled_(array.pulled()) {}

    ordered_json take() {
        for (const ControllerDescription& controller : array_.scenario().controllers) {
            for (const EnclosureDescription& enclosure : controller.enclosures) {
                addEnclosure(controller, enclosure);
            }
            auto loose = slotsOf(controller, "");
            if (!loose.empty()) {
                racks_.push_back({{"controller", controller.id},
                                  {"name", "Drives without an enclosure"},
                                  {"row", true},
                                  {"slots", slotsAsJson(std::move(loose))}});
            }
        }
        return std::move(racks_);
    }

private:
    void addEnclosure(const ControllerDescription& controller,
                      const EnclosureDescription& enclosure) {
        const auto word = wordOf(operationalStatusWords(), enclosure.operationalStatus);
        racks_.push_back({{"controller", controller.id},
                          {"name", "Enclosure " + printable(enclosure.id)},
                          {"row", false},
                          {"target", targetOf(controller.id, enclosure.id)},
                          {"state", word.empty() ? std::to_string(enclosure.operationalStatus)
                                                 : std::string(word)},
                          {"lost", isLostStatus(enclosure.operationalStatus)},
                          {"slots", slotsAsJson(slotsOf(controller, enclosure.id))}});
    }

    /// Drives in the enclosure and places of those that were pulled out of it.
    std::vector<Slot> slotsOf(const ControllerDescription& controller,
                              const std::string& enclosure) const {
        std::vector<Slot> slots;
        for (const DriveDescription& drive : controller.drives) {
            if (enclosureOf(controller, drive) == enclosure) {
                slots.push_back({drive.slot,
                                 {{"drive", keyFor("drive", controller.id, drive.id)},
                                  {"id", printable(drive.id)}}});
            }
        }
        const ControllerDescription* original = array_.original().findController(controller.id);
        for (const PulledDrive& pulled : pulled_) {
            const DriveDescription* drive = original && pulled.controller == controller.id
                                                ? findById(original->drives, pulled.id)
                                                : nullptr;
            if (drive && enclosureOf(controller, *drive) == enclosure) {
                slots.push_back(
                    {drive->slot, {{"id", printable(drive->id)}, {"insert", pulled.insert}}});
            }
        }
        return slots;
    }

    /// "" for an enclosure that there is not.
    static std::string enclosureOf(const ControllerDescription& controller,
                                   const DriveDescription& drive) {
        return findById(controller.enclosures, drive.enclosure) ? drive.enclosure : "";
    }

    const LiveArray& array_;
    std::vector<PulledDrive> pulled_;
    ordered_json racks_ = ordered_json::array();
};

template <typename Descriptions>
void addTargets(CommandTargets& targets, const char* kind, const std::string& controller,
                const Descriptions& list) {
    for (const auto& item : list) {
        targets.emplace(keyFor(kind, controller, item.id), targetOf(controller, item.id));
    }
}

/// What is under way: "drive C0 32_7" of the schedule.
ordered_json progressAsJson(const LiveArray& array, double now) {
    ordered_json all = ordered_json::object();
    for (const ScheduledCommand& command : array.upcoming()) {
        if (command.lasts <= 0) continue;
        const auto words = commandWords(command.subject);
        if (words.size() != 3) continue;
        const double left = std::clamp(command.at - now, 0.0, command.lasts);
        const int percent = static_cast<int>(100 * (1 - left / command.lasts));
        all[keyFor(words[0].text, words[1].text, words[2].text)] = {
            {"percent", percent},
            {"text", std::to_string(percent) + " %, " + durationText(left) + " left"}};
    }
    return all;
}

ordered_json timelineAsJson(const LiveArray& array, const ArrayClock& clock) {
    ordered_json next = ordered_json::array();
    for (const ScheduledCommand& command : array.upcoming()) {
        if (next.size() == kShownAhead) break;
        next.push_back({{"in", durationText(std::max(0.0, command.at - clock.now()))},
                        {"command", command.command}});
    }
    const std::size_t more = array.upcoming().size() - next.size();
    return {{"speed", clock.speed()}, {"paused", clock.isPaused()}, {"next", next}, {"more", more}};
}

}  // namespace

std::string durationText(double seconds) {
    const long whole = std::lround(std::ceil(seconds));
    const auto two = [](long large, const char* unit, long small, const char* below) {
        return std::to_string(large) + " " + unit +
               (small > 0 ? " " + std::to_string(small) + " " + below : "");
    };
    if (whole < 60) return std::to_string(whole) + " s";
    if (whole < 3600) return two(whole / 60, "min", whole % 60, "s");
    return two(whole / 3600, "h", whole % 3600 / 60, "min");
}

SimulatedArray simulatedArray(const LiveArray& array, const ArrayClock& clock) {
    SimulatedArray simulated;
    simulated.racks = Racks(array).take();
    simulated.progress = progressAsJson(array, clock.now());
    simulated.timeline = timelineAsJson(array, clock);
    for (const ControllerDescription& controller : array.scenario().controllers) {
        addTargets(simulated.targets, "drive", controller.id, controller.drives);
        addTargets(simulated.targets, "volume", controller.id, controller.volumes);
        addTargets(simulated.targets, "port", controller.id, controller.ports);
        addTargets(simulated.targets, "battery", controller.id, controller.batteries);
        for (const DriveDescription& drive : controller.drives) {
            if (drive.slot && !drive.enclosure.empty()) {
                simulated.places.emplace(
                    controller.id + " " + std::to_string(*drive.slot) + "e" + drive.enclosure,
                    keyFor("drive", controller.id, drive.id));
            }
        }
    }
    return simulated;
}

}  // namespace testbed
