#include "json_reader.h"

namespace testbed {
namespace {

using nlohmann::json;

constexpr std::uint64_t kMostRepetitions = 100000;

void replaceNumber(std::string& text, const std::string& number) {
    static const std::string mark = "{n}";
    for (std::size_t at = text.find(mark); at != std::string::npos; at = text.find(mark, at))
        text.replace(at, mark.size(), number);
}

void replaceNumber(json& value, const std::string& number) {
    if (value.is_string()) {
        replaceNumber(value.get_ref<std::string&>(), number);
    } else if (value.is_structured()) {
        for (json& child : value) replaceNumber(child, number);
    }
}

void appendRepetitions(json& list, json element, const JsonPlace& place) {
    const std::uint64_t count = readNumber(place.member("count"), kMostRepetitions);
    const std::uint64_t first =
        element.contains("first") ? readNumber(place.member("first"), UINT32_MAX) : 0;
    element.erase("count");
    element.erase("first");
    for (std::uint64_t n = first; n < first + count; ++n) {
        json copy = element;
        replaceNumber(copy, std::to_string(n));
        list.push_back(std::move(copy));
    }
}

json expandedList(const json& list, const JsonPlace& place) {
    json expanded = json::array();
    for (std::size_t i = 0; i < list.size(); ++i) {
        if (list[i].is_object() && list[i].contains("count"))
            appendRepetitions(expanded, list[i], place.element(i));
        else
            expanded.push_back(list[i]);
    }
    return expanded;
}

}  // namespace

void expandRepetitions(json& document, const JsonPlace& place) {
    if (!document.is_structured()) return;
    const auto placeOf = [&](auto& item) {
        return document.is_array() ? place.element(std::stoul(item.key()))
                                   : place.member(item.key());
    };
    // Inner lists first: an outer repetition then numbers what they have become.
    for (auto& item : document.items()) expandRepetitions(item.value(), placeOf(item));
    if (document.is_array()) document = expandedList(document, place);
}

}  // namespace testbed
