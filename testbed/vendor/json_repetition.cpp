// Writing out elements that stand for many, with their numbers put in, within bounds.
#include <algorithm>
#include <string_view>

#include "json_reader.h"

namespace testbed {
namespace {

using nlohmann::json;

constexpr std::uint64_t kMostRepetitions = 100000;
constexpr std::uint64_t kMostElements = 1000000;

bool isRepeated(const json& element) {
    return element.is_object() && element.contains("count");
}

void replaceNumber(std::string& text, const std::string& number) {
    static const std::string mark = "{n}";
    for (std::size_t at = text.find(mark); at != std::string::npos; at = text.find(mark, at)) {
        text.replace(at, mark.size(), number);
    }
}

void replaceNumber(json& value, const std::string& number) {
    if (value.is_string()) {
        replaceNumber(value.get_ref<std::string&>(), number);
    } else if (value.is_structured()) {
        for (json& child : value) {
            if (!value.is_array() || !isRepeated(child)) replaceNumber(child, number);
        }
    }
}

/// A value on the way down a document. Its place is made only for the error that tells it.
struct Step {
    const json& value;
    const JsonPlace& document;
    const Step* above = nullptr;
    std::string_view name = {};  ///< in an object
    std::size_t index = 0;       ///< in a list

    JsonPlace place() const {
        if (above == nullptr) return document;
        return above->value.is_object() ? above->place().member(std::string(name))
                                        : above->place().element(index);
    }
    /// How many elements it stands for.
    std::uint64_t times() const {
        return isRepeated(value) ? readNumber(place().member("count"), kMostRepetitions) : 1;
    }
};

/// The elements of all lists within, at most one more than allowed.
std::uint64_t countElements(const Step& step) {
    const json& value = step.value;
    std::uint64_t sum = 0;
    if (value.is_object()) {
        for (const auto& [name, child] : value.items()) {
            if (child.is_structured()) sum += countElements({child, step.document, &step, name});
        }
    }
    if (value.is_array()) {
        for (std::size_t i = 0; i < value.size(); ++i) {
            const Step element{value[i], step.document, &step, {}, i};
            const std::uint64_t times = element.times();
            sum += times * (1 + countElements(element));
        }
    }
    return std::min(sum, kMostElements + 1);
}

}  // namespace

std::vector<JsonPlace> repetitionsOf(const JsonPlace& element) {
    if (!isRepeated(*element.value)) return {element};
    const std::uint64_t count = readNumber(element.member("count"), kMostRepetitions);
    const std::uint64_t first =
        element.value->contains("first") ? readNumber(element.member("first"), UINT32_MAX) : 0;
    json pattern = *element.value;
    pattern.erase("count");
    pattern.erase("first");
    std::vector<JsonPlace> places;
    for (std::uint64_t n = first; n < first + count; ++n) {
        json copy = pattern;
        replaceNumber(copy, std::to_string(n));
        JsonPlace place = element;
        place.kept = std::make_shared<const json>(std::move(copy));
        place.value = place.kept.get();
        places.push_back(std::move(place));
    }
    return places;
}

void limitRepetitions(const JsonPlace& document) {
    if (countElements({*document.value, document}) > kMostElements) {
        document.fail("more than " + std::to_string(kMostElements) + " elements with all counts");
    }
}

void expandRepetitions(json& document) {
    if (!document.is_structured()) return;
    if (document.is_array() && std::any_of(document.begin(), document.end(), isRepeated)) {
        json expanded = json::array();
        for (json& element : document) {
            for (JsonPlace& place : repetitionsOf({&element, "", ""})) {
                expanded.push_back(*place.value);
            }
        }
        document = std::move(expanded);
    }
    for (json& child : document) expandRepetitions(child);
}

}  // namespace testbed
