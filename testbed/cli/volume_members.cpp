// Splitting the list of drives in a volume's name.
#include "volume_members.h"

#include <algorithm>

namespace testbed {

std::vector<std::string> membersIn(const std::string& name) {
    static const std::string kBegin = ", Drives(";
    const std::size_t begin = name.rfind(kBegin);
    if (begin == std::string::npos) return {};
    const std::size_t end = name.rfind(')');
    const bool cut = end == std::string::npos || end < begin;
    std::string list = name.substr(begin + kBegin.size());
    list.resize(cut ? list.size() : end - begin - kBegin.size());
    std::vector<std::string> members;
    for (std::size_t at = 0; at <= list.size();) {
        const std::size_t comma = std::min(list.find(',', at), list.size());
        members.push_back(list.substr(at, comma - at));
        at = comma + 1;
    }
    if (cut) members.pop_back();
    return members;
}

bool isPlace(const std::string& member) {
    const std::size_t digits = std::min(member.find_first_not_of("0123456789"), member.size());
    return digits > 0 && digits < member.size() && member[digits] == 'e';
}

}  // namespace testbed
