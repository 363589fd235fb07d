// Taking texts, numbers, flags, codes and lists from an object, and refusing what is left over.
#include "json_reader.h"

#include <algorithm>
#include <charconv>
#include <climits>

namespace testbed {

using nlohmann::json;

namespace {

/// Digits, as repetitions and commands produce them where a number is meant.
bool isNumber(const std::string& text) {
    return !text.empty() && text.find_first_not_of("0123456789") == std::string::npos;
}

std::optional<std::string> textOf(const json& value) {
    if (value.is_string()) return value.get<std::string>();
    if (value.is_number_unsigned()) return value.dump();
    return std::nullopt;
}

std::optional<std::uint64_t> numberOf(const json& value, std::uint64_t maximum) {
    std::uint64_t number = 0;
    bool whole = false;
    if (value.is_number_unsigned()) {
        number = value.get<std::uint64_t>();
        whole = true;
    } else if (value.is_string()) {
        const std::string& text = value.get_ref<const std::string&>();
        const char* end = text.data() + text.size();
        const auto [rest, error] = std::from_chars(text.data(), end, number);
        whole = !text.empty() && error == std::errc() && rest == end;
    }
    return whole && number <= maximum ? std::optional(number) : std::nullopt;
}

}  // namespace

std::string textIn(const json& object, const char* name) {
    const auto member = object.find(name);
    if (member == object.end()) return "";
    return member->is_string() ? member->get<std::string>() : member->dump();
}

std::string idOf(const json& element) {
    if (!element.is_object()) return "";
    for (const char* name : {"id", "number", "tag"}) {
        if (element.contains(name)) return textIn(element, name);
    }
    return "";
}

void JsonPlace::fail(const std::string& what, const std::string& about) const {
    const std::string inner = place.empty() || about.empty() ? about : "." + about;
    throw PlacedError(file + ": " + (place.empty() ? what : place + ": " + what), place + inner);
}

JsonPlace JsonPlace::member(const std::string& name) const {
    return {&value->at(name), file, place.empty() ? name : place + "." + name, names, kept};
}

JsonPlace JsonPlace::element(std::size_t index) const {
    const json& child = value->at(index);
    const std::string id = names == ElementNames::Ids ? idOf(child) : "";
    return {&child, file, place + "[" + (id.empty() ? std::to_string(index) : id) + "]", names,
            kept};
}

// Most values are what they should be, and their places, which take longer to make than the values
// to read, are never told.

std::string readText(const JsonPlace& place) {
    if (auto text = textOf(*place.value)) return *std::move(text);
    place.fail("a text is needed here");
}

std::uint64_t readNumber(const JsonPlace& place, std::uint64_t maximum) {
    if (const auto number = numberOf(*place.value, maximum)) return *number;
    place.fail("a whole number from 0 to " + std::to_string(maximum) + " is needed here");
}

JsonReader::JsonReader(JsonPlace place) : place_(std::move(place)) {
    if (!place_.value->is_object()) place_.fail("an object is needed here");
}

bool JsonReader::has(const std::string& name) const {
    return place_.value->contains(name);
}

const json* JsonReader::find(const std::string& name) {
    const auto member = place_.value->find(name);
    if (member == place_.value->end()) return nullptr;
    known_.push_back(&*member);
    return known_.back();
}

std::optional<JsonPlace> JsonReader::take(const std::string& name) {
    if (find(name) == nullptr) return std::nullopt;
    return place_.member(name);
}

std::string JsonReader::text(const std::string& name) {
    auto text = optionalText(name);
    if (!text) fail("\"" + name + "\" is missing");
    return *std::move(text);
}

std::optional<std::string> JsonReader::optionalText(const std::string& name) {
    const json* member = find(name);
    if (member == nullptr) return std::nullopt;
    if (auto text = textOf(*member)) return text;
    return readText(place_.member(name));
}

std::string JsonReader::text(const std::string& name, const std::string& absent) {
    return optionalText(name).value_or(absent);
}

bool JsonReader::flag(const std::string& name, bool absent) {
    const json* member = find(name);
    if (member == nullptr) return absent;
    if (!member->is_boolean()) place_.member(name).fail("true or false is needed here");
    return member->get<bool>();
}

std::optional<std::uint64_t> JsonReader::number(const std::string& name, std::uint64_t maximum) {
    const json* member = find(name);
    if (member == nullptr) return std::nullopt;
    if (const auto number = numberOf(*member, maximum)) return number;
    return readNumber(place_.member(name), maximum);
}

std::uint16_t JsonReader::number16(const std::string& name, std::uint16_t absent) {
    return static_cast<std::uint16_t>(number(name, UINT16_MAX).value_or(absent));
}

int JsonReader::integer(const std::string& name, int absent) {
    const auto member = take(name);
    if (!member) return absent;
    const json& value = *member->value;
    const bool fits = value.is_number_unsigned()
                          ? value.get<std::uint64_t>() <= INT_MAX
                          : value.is_number_integer() && value.get<std::int64_t>() >= INT_MIN;
    if (!fits) {
        member->fail("a whole number from " + std::to_string(INT_MIN) + " to " +
                     std::to_string(INT_MAX) + " is needed here");
    }
    return value.get<int>();
}

std::vector<std::string> JsonReader::texts(const std::string& name) {
    const auto member = take(name);
    if (!member) return {};
    if (!member->value->is_array()) return {readText(*member)};
    std::vector<std::string> result;
    for (std::size_t i = 0; i < member->value->size(); ++i) {
        result.push_back(readText(member->element(i)));
    }
    return result;
}

std::uint16_t JsonReader::code(const std::string& name, CodeWords words, std::uint16_t absent) {
    const auto member = take(name);
    if (!member) return absent;
    const bool isWord = member->value->is_string();
    const std::string word = isWord ? member->value->get<std::string>() : "";
    if (!isWord || isNumber(word)) {
        return static_cast<std::uint16_t>(readNumber(*member, UINT16_MAX));
    }
    const auto code = codeOf(words, word);
    if (!code) member->fail("unknown word \"" + word + "\" (known: " + listOf(words) + ")");
    return *code;
}

const StateWord* JsonReader::state(const std::string& name, StateWords states) {
    const auto member = take(name);
    if (!member) return nullptr;
    const std::string word = readText(*member);
    const StateWord* state = findState(states, word);
    if (!state) {
        place_.fail("unknown " + name + " \"" + word + "\" (known: " + listOf(states) + ")", name);
    }
    return state;
}

std::vector<JsonPlace> JsonReader::list(const std::string& name) {
    const auto member = take(name);
    if (!member) return {};
    if (!member->value->is_array()) member->fail("a list is needed here");
    std::vector<JsonPlace> elements;
    for (std::size_t i = 0; i < member->value->size(); ++i) {
        for (JsonPlace& element : repetitionsOf(member->element(i))) {
            elements.push_back(std::move(element));
        }
    }
    return elements;
}

void JsonReader::finish() const {
    for (const auto& [name, value] : place_.value->items()) {
        if (std::find(known_.begin(), known_.end(), &value) == known_.end())
            place_.fail("unknown member \"" + name + "\"", name);
    }
}

}  // namespace testbed
