// The places of a group of drives while their drives change.
#pragma once

#include <optional>
#include <set>
#include <string>
#include <unordered_map>
#include <vector>

#include "raid_group.h"

namespace testbed {

/// Places with the ids of what stands in them, each found without a walk. For one thread.
class GroupPlaces {
public:
    /// `drives` are those that there are, and must outlive it; a place of another one is lost.
    GroupPlaces(std::vector<std::string> ids, const DriveIndex& drives);

    /// By place.
    const std::vector<std::string>& ids() const { return ids_; }
    /// The first place of that drive.
    std::optional<std::size_t> placeOf(const std::string& id) const;
    /// The drive's own place, or the first one whose drive is lost.
    std::optional<std::size_t> placeFor(const std::string& id);
    /// Another drive in a place.
    void put(std::size_t place, const std::string& id);
    /// A place more.
    void append(const std::string& id);

private:
    bool isLost(const std::string& id) const;

    std::vector<std::string> ids_;
    std::unordered_map<std::string, std::set<std::size_t>> places_;
    const DriveIndex& drives_;
    std::size_t lookFrom_ = 0;  // no place before is lost
};

}  // namespace testbed
