#include "bare_provider.h"

#include <cstring>

namespace bench {
namespace {

/// Tells one instance from another.
constexpr const char* kKey = "DeviceID";

const CMPIValue* asValue(const std::string& text) {
    // CMPI_chars values are passed as the address of the characters.
    return reinterpret_cast<const CMPIValue*>(text.c_str());
}

/// The member of the union that a scalar of that type is in.
CMPIValue scalar(const testbed::CimValue& value) {
    CMPIValue out;
    std::memset(&out, 0, sizeof out);
    const std::uint64_t number = value.asUnsigned();
    switch (value.type & ~CMPI_ARRAY) {
        case CMPI_boolean:
            out.boolean = static_cast<CMPIBoolean>(number);
            break;
        case CMPI_uint8:
            out.uint8 = static_cast<CMPIUint8>(number);
            break;
        case CMPI_uint16:
            out.uint16 = static_cast<CMPIUint16>(number);
            break;
        default:
            out.uint64 = number;
            break;
    }
    return out;
}

}  // namespace

BareProvider::BareProvider(testbed::Broker& broker, const std::vector<testbed::Instance>& constants)
    : broker_(broker), mi_{this, &table_} {
    for (const testbed::Instance& instance : constants) answers_.push_back(answerOf(instance));
    for (const Answer& answer : answers_) {
        for (const Constant& key : answer.keys)
            if (key.name == kKey) byId_.emplace(key.text, &answer);
    }
    table_.enumerateInstanceNames = names;
    table_.enumerateInstances = enumerate;
    table_.getInstance = get;
}

BareProvider::Constant BareProvider::constantOf(const testbed::NamedValue& named) {
    const testbed::CimValue& value = named.second;
    return {named.first, value.asString(), value.type, scalar(value)};
}

BareProvider::Answer BareProvider::answerOf(const testbed::Instance& instance) {
    Answer answer{instance.path.nameSpace, instance.path.className, {}, {}};
    for (const auto& key : instance.path.keys) answer.keys.push_back(constantOf(key));
    for (const auto& property : instance.properties) {
        // The manager copies keys from the path; what is null nobody has set.
        if (instance.path.findKey(property.first) != nullptr || property.second.isNull) continue;
        answer.properties.push_back(constantOf(property));
    }
    return answer;
}

const BareProvider::Answer* BareProvider::find(const CMPIObjectPath* path) const {
    const CMPIString* key = path->ft->getKey(path, kKey, nullptr).value.string;
    const auto found = byId_.find(key->ft->getCharPtr(key, nullptr));
    return found != byId_.end() ? found->second : nullptr;
}

CMPIObjectPath* BareProvider::makePath(const Answer& answer) const {
    const CMPIBroker* broker = broker_.handle();
    CMPIObjectPath* path = broker->eft->newObjectPath(broker, answer.nameSpace.c_str(),
                                                      answer.className.c_str(), nullptr);
    for (const Constant& key : answer.keys)
        path->ft->addKey(path, key.name.c_str(), asValue(key.text), CMPI_chars);
    return path;
}

void BareProvider::setArray(CMPIInstance* instance, const Constant& constant) const {
    const CMPIBroker* broker = broker_.handle();
    const auto element = static_cast<CMPIType>(constant.type & ~CMPI_ARRAY);
    CMPIValue value;
    value.array = broker->eft->newArray(broker, 1, element, nullptr);
    value.array->ft->setElementAt(value.array, 0, &constant.value, element);
    instance->ft->setProperty(instance, constant.name.c_str(), &value, constant.type);
}

void BareProvider::returnInstance(const CMPIResult* result, const Answer& answer) const {
    const CMPIBroker* broker = broker_.handle();
    CMPIInstance* instance = broker->eft->newInstance(broker, makePath(answer), nullptr);
    for (const Constant& constant : answer.properties) {
        const char* name = constant.name.c_str();
        if ((constant.type & CMPI_ARRAY) != 0)
            setArray(instance, constant);
        else if (constant.type == CMPI_string)
            instance->ft->setProperty(instance, name, asValue(constant.text), CMPI_chars);
        else
            instance->ft->setProperty(instance, name, &constant.value, constant.type);
    }
    result->ft->returnInstance(result, instance);
}

CMPIStatus BareProvider::names(CMPIInstanceMI* mi, const CMPIContext*, const CMPIResult* result,
                               const CMPIObjectPath*) {
    for (const Answer& answer : of(mi).answers_)
        result->ft->returnObjectPath(result, of(mi).makePath(answer));
    result->ft->returnDone(result);
    return {CMPI_RC_OK, nullptr};
}

CMPIStatus BareProvider::enumerate(CMPIInstanceMI* mi, const CMPIContext*, const CMPIResult* result,
                                   const CMPIObjectPath*, const char**) {
    for (const Answer& answer : of(mi).answers_) of(mi).returnInstance(result, answer);
    result->ft->returnDone(result);
    return {CMPI_RC_OK, nullptr};
}

CMPIStatus BareProvider::get(CMPIInstanceMI* mi, const CMPIContext*, const CMPIResult* result,
                             const CMPIObjectPath* path, const char**) {
    const Answer* answer = of(mi).find(path);
    if (answer == nullptr) return {CMPI_RC_ERR_NOT_FOUND, nullptr};
    of(mi).returnInstance(result, *answer);
    result->ft->returnDone(result);
    return {CMPI_RC_OK, nullptr};
}

}  // namespace bench
