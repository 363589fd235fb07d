// The document's text, and the difference between two versions of it.
#include "page_document.h"

#include <map>

#include "json_view.h"

namespace testbed {
namespace {

using Json = PageDocument::Json;

const std::string& keyIn(const Json& element) {
    return element.at("view").at("key").get_ref<const std::string&>();
}

/// None for lists that are equal.
Json listChange(const Json& before, const Json& after) {
    std::map<std::string, const Json*> old;
    for (const Json& element : before) old.emplace(keyIn(element), &element);
    Json change = {{"put", Json::array()}, {"gone", Json::array()}};
    for (const Json& element : after) {
        const auto known = old.find(keyIn(element));
        if (known == old.end() || *known->second != element) change["put"].push_back(element);
        if (known != old.end()) old.erase(known);
    }
    for (const auto& [key, element] : old) change["gone"].push_back(key);
    return change["put"].empty() && change["gone"].empty() ? Json() : change;
}

}  // namespace

std::string documentText(const PageDocument& document, const Json& about) {
    Json whole = document.rest;
    whole.update(*document.elements);
    whole["page"] = about;
    return jsonLine(whole);
}

Json documentChange(const PageDocument& before, const PageDocument& after) {
    Json change = {{"set", Json::object()}, {"elements", Json::object()}};
    for (const auto& [name, value] : after.rest.items()) {
        if (!before.rest.contains(name) || before.rest[name] != value) change["set"][name] = value;
    }
    if (before.elements == after.elements) return change;
    for (const auto& [name, list] : after.elements->items()) {
        const auto old = before.elements->find(name);
        Json differs = listChange(old != before.elements->end() ? *old : Json::array(), list);
        if (!differs.is_null()) change["elements"][name] = std::move(differs);
    }
    return change;
}

}  // namespace testbed
