// One request on the provider's table: a call scope, the arguments, and what the result collects.
#include "instance_client.h"

#include <charconv>

#include "object_string.h"

namespace testbed {

namespace {

/// A property list in the form that a provider receives.
class PropertyNames {
public:
    explicit PropertyNames(const PropertyList& properties) : isGiven_(properties.has_value()) {
        if (!properties) return;
        for (const std::string& name : *properties) names_.push_back(name.c_str());
        names_.push_back(nullptr);
    }
    /// NULL when the client wants all properties.
    const char** get() { return isGiven_ ? names_.data() : nullptr; }

private:
    bool isGiven_;
    std::vector<const char*> names_;
};

std::optional<std::string> messageOf(const CMPIStatus& status) {
    const StringObject* message = usable(status.msg, Entry::StringGetCharPtr);
    if (message == nullptr) return std::nullopt;
    return message->text() ? message->text() : "";
}

/// The path with a number for each text that reads as one.
ObjectPath withNumericKeys(ObjectPath path) {
    for (auto& [name, value] : path.keys) {
        const std::string& text = value.asString();
        std::uint64_t number = 0;
        const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
        if (text.empty() || error != std::errc() || end != text.data() + text.size()) continue;
        value = CimValue::uint64(number);
    }
    return path;
}

/// Runs call(context, result, path) as a request of its own.
template <class Call>
Response request(Broker& broker, const ObjectPath& path, Call call) {
    Broker::Collected collected;
    const Broker::CallScope scope(broker);
    const CMPIStatus status =
        call(scope.context(), broker.makeResult(collected), broker.makePath(path));
    Response response;
    response.rc = status.rc;
    response.message = messageOf(status);
    response.doneCalls = collected.doneCalls;
    response.paths = std::move(collected.paths);
    response.instances = std::move(collected.instances);
    return response;
}

}  // namespace

Response InstanceClient::enumerateInstanceNames(const std::string& className,
                                                const std::string& nameSpace) {
    return request(broker_, {nameSpace, className, {}},
                   [&](CMPIContext* context, CMPIResult* result, CMPIObjectPath* path) {
                       return mi_->ft->enumerateInstanceNames(mi_, context, result, path);
                   });
}

Response InstanceClient::enumerateInstances(const std::string& className,
                                            const PropertyList& properties,
                                            const std::string& nameSpace) {
    PropertyNames names(properties);
    return request(broker_, {nameSpace, className, {}},
                   [&](CMPIContext* context, CMPIResult* result, CMPIObjectPath* path) {
                       return mi_->ft->enumerateInstances(mi_, context, result, path, names.get());
                   });
}

Response InstanceClient::getInstance(const ObjectPath& instancePath,
                                     const PropertyList& properties) {
    PropertyNames names(properties);
    const bool asNumbers = broker_.options().numericKeys;
    return request(broker_, asNumbers ? withNumericKeys(instancePath) : instancePath,
                   [&](CMPIContext* context, CMPIResult* result, CMPIObjectPath* path) {
                       return mi_->ft->getInstance(mi_, context, result, path, names.get());
                   });
}

CMPIrc InstanceClient::cleanup(bool terminating) {
    const Broker::CallScope scope(broker_);
    return mi_->ft->cleanup(mi_, scope.context(), static_cast<CMPIBoolean>(terminating)).rc;
}

}  // namespace testbed
