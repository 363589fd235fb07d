// Finding the elements of a long list by their id.
#pragma once

#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

namespace testbed {

/// Looks up a list's elements by id; of several with the same id the first one. The list must
/// outlive it and stay as it is. Made at the first look. For one thread.
template <typename Description>
class IdIndex {
public:
    explicit IdIndex(const std::vector<Description>& list) : list_(list) {}

    /// NULL without such an element.
    const Description* find(const std::string& id) const {
        if (known_.empty()) {
            for (const Description& item : list_) known_.try_emplace(item.id, &item);
        }
        const auto found = known_.find(id);
        return found != known_.end() ? found->second : nullptr;
    }

private:
    const std::vector<Description>& list_;
    mutable std::unordered_map<std::string_view, const Description*> known_;
};

}  // namespace testbed
