// CIM values, instances, errors and the check's result as JSON.
#include "json_view.h"

#include <nlohmann/json.hpp>

namespace testbed {
namespace {

using nlohmann::ordered_json;

/// Of the document; changes only when a reader of the last one could not read the next one.
constexpr int kFormat = 1;

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
        for (const CimValue& element : elements) {
            list.push_back(element.isNull ? ordered_json(nullptr)
                                          : std::visit(ToJson(), element.data));
        }
        return list;
    }
};

ordered_json valuesAsJson(const std::vector<NamedValue>& values) {
    ordered_json object = ordered_json::object();
    for (const auto& [name, value] : values) {
        object[name] = value.isNull ? ordered_json(nullptr) : std::visit(ToJson(), value.data);
    }
    return object;
}

/// What a check says of the instance; null for one that is not judged.
ordered_json verdictAsJson(const std::optional<Verdict>& verdict) {
    if (!verdict) return nullptr;
    return {{"level", levelName(verdict->level)},
            {"word", verdict->word},
            {"reason", verdict->finding},
            {"ignored", verdict->ignored}};
}

ordered_json errorsAsJson(const Inventory& inventory) {
    ordered_json list = ordered_json::array();
    for (const ClassAnswer& answer : inventory) {
        if (answer.response.rc != CMPI_RC_OK) {
            list.push_back({{"class", answer.className},
                            {"status", static_cast<int>(answer.response.rc)},
                            {"message", answer.response.message.value_or("")}});
        }
    }
    return list;
}

ordered_json checkAsJson(const CheckSummary& check) {
    return {{"status", check.status},
            {"level", statusName(check.status)},
            {"text", check.text},
            {"performance", check.numbers}};
}

}  // namespace

ordered_json jsonDocument(const Inventory& inventory, const CheckPolicy& policy,
                          const CheckSummary* check) {
    ordered_json document = {{"format", kFormat}};
    if (check) document["check"] = checkAsJson(*check);
    document["errors"] = errorsAsJson(inventory);
    for (const ClassAnswer& answer : inventory) {
        ordered_json& list = document[answer.className] = ordered_json::array();
        for (const Instance& instance : answer.response.instances) {
            list.push_back({{"path", instance.path.text()},
                            {"keys", valuesAsJson(instance.path.keys)},
                            {"properties", valuesAsJson(instance.properties)},
                            {"verdict", verdictAsJson(policy.judge(answer.className, instance))}});
        }
    }
    return document;
}

// A vendor's text need not be valid UTF-8.
std::string jsonLine(const ordered_json& document) {
    return document.dump(-1, ' ', true, ordered_json::error_handler_t::replace);
}

std::string jsonView(const Inventory& inventory, const CheckPolicy& policy,
                     const CheckSummary* check) {
    const ordered_json document = jsonDocument(inventory, policy, check);
    return document.dump(2, ' ', true, ordered_json::error_handler_t::replace) + "\n";
}

}  // namespace testbed
