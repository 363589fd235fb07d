#include "json_view.h"

#include <nlohmann/json.hpp>

namespace testbed {
namespace {

using nlohmann::ordered_json;

struct ToJson {
    ordered_json operator()(std::monostate) const { return nullptr; }
    ordered_json operator()(bool value) const { return value; }
    ordered_json operator()(std::uint64_t value) const { return value; }
    ordered_json operator()(std::int64_t value) const { return value; }
    ordered_json operator()(double value) const { return value; }
    ordered_json operator()(const std::string& value) const { return value; }
    ordered_json operator()(const std::shared_ptr<const ObjectPath>& value) const {
        return value ? ordered_json(value->text()) : ordered_json(nullptr);
    }
    ordered_json operator()(const std::vector<CimValue>& elements) const {
        ordered_json list = ordered_json::array();
        for (const CimValue& element : elements)
            list.push_back(element.isNull ? ordered_json(nullptr)
                                          : std::visit(ToJson(), element.data));
        return list;
    }
};

ordered_json valuesAsJson(const std::vector<NamedValue>& values) {
    ordered_json object = ordered_json::object();
    for (const auto& [name, value] : values)
        object[name] = value.isNull ? ordered_json(nullptr) : std::visit(ToJson(), value.data);
    return object;
}

}  // namespace

std::string jsonView(const Inventory& inventory) {
    ordered_json document = ordered_json::object();
    for (const ClassAnswer& answer : inventory) {
        ordered_json& list = document[answer.className] = ordered_json::array();
        for (const Instance& instance : answer.response.instances)
            list.push_back({{"path", instance.path.text()},
                            {"keys", valuesAsJson(instance.path.keys)},
                            {"properties", valuesAsJson(instance.properties)}});
    }
    // A vendor's text need not be valid UTF-8.
    return document.dump(2, ' ', false, ordered_json::error_handler_t::replace) + "\n";
}

}  // namespace testbed
