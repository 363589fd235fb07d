// What a page shows, as JSON: the document of --json with what people want to see beside it.
#pragma once

#include <memory>
#include <nlohmann/json.hpp>
#include <string>

namespace testbed {

/// A version of a page's document. The elements, which are most of it, are shared by versions that
/// have the same.
struct PageDocument {
    using Json = nlohmann::ordered_json;

    std::shared_ptr<const Json> elements;  ///< by class, lists of elements with their views
    Json rest;                             ///< by member, everything else that can change

    bool operator==(const PageDocument& other) const {
        return elements == other.elements && rest == other.rest;
    }
};

/// Members of the one document, on one line.
std::string documentText(const PageDocument& document, const nlohmann::ordered_json& about);

/// What turns `before` into `after`: "set", members of the rest that differ; and "elements", for
/// each class that differs "put", elements that are new or differ, and "gone", keys of those that
/// are no more.
nlohmann::ordered_json documentChange(const PageDocument& before, const PageDocument& after);

}  // namespace testbed
