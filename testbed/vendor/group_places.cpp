// Finding places by drive, and the first that is lost.
#include "group_places.h"

#include <algorithm>

namespace testbed {

GroupPlaces::GroupPlaces(std::vector<std::string> ids, const DriveIndex& drives)
    : ids_(std::move(ids)), drives_(drives) {
    for (std::size_t i = 0; i < ids_.size(); ++i) places_[ids_[i]].insert(i);
}

std::optional<std::size_t> GroupPlaces::placeOf(const std::string& id) const {
    const auto found = places_.find(id);
    if (found == places_.end()) return std::nullopt;
    return *found->second.begin();
}

std::optional<std::size_t> GroupPlaces::placeFor(const std::string& id) {
    if (const auto own = placeOf(id)) return own;
    while (lookFrom_ < ids_.size() && !isLost(ids_[lookFrom_])) ++lookFrom_;
    return lookFrom_ < ids_.size() ? std::optional(lookFrom_) : std::nullopt;
}

void GroupPlaces::put(std::size_t place, const std::string& id) {
    const auto old = places_.find(ids_[place]);
    old->second.erase(place);
    if (old->second.empty()) places_.erase(old);
    ids_[place] = id;
    places_[id].insert(place);
    if (isLost(id)) lookFrom_ = std::min(lookFrom_, place);
}

void GroupPlaces::append(const std::string& id) {
    places_[id].insert(ids_.size());
    ids_.push_back(id);
}

bool GroupPlaces::isLost(const std::string& id) const {
    const DriveDescription* drive = drives_.find(id);
    return drive == nullptr || conditionOf(*drive) == DriveCondition::Lost;
}

}  // namespace testbed
