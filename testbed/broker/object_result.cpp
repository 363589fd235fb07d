// The function table of results, and what a strict broker refuses to take from a provider.
#include "object_result.h"

#include <algorithm>

#include "object_instance.h"
#include "object_path.h"

namespace testbed {

namespace {

/// False when the broker is strict and the path lacks a key of its class, or has it with another
/// type.
bool hasKeys(const BrokerCore& core, const ObjectPath& path) {
    if (!core.options.strictProperties) return true;
    const auto keys = core.repository.keys(path.nameSpace, path.className);
    return std::all_of(keys.begin(), keys.end(), [&](const KeyDefinition& known) {
        const CimValue* key = path.findKey(known.name);
        return key != nullptr && (key->isNull || key->type == CimValue::null(known.type).type);
    });
}

CMPIStatus returnData(const CMPIResult* result, const CMPIValue*, CMPIType) {
    return statusOn(result, Entry::OtherObjectCall, nullptr,
                    [](ResultObject&) { return CMPI_RC_ERR_NOT_SUPPORTED; });
}

CMPIStatus returnInstance(const CMPIResult* result, const CMPIInstance* instance) {
    return statusOn(result, Entry::ResultReturnInstance, nullptr, [&](ResultObject& object) {
        const InstanceObject* returned = usable(instance, Entry::ResultReturnInstance);
        if (returned == nullptr) return CMPI_RC_ERR_INVALID_PARAMETER;
        if (!hasKeys(object.core(), returned->content().path)) return CMPI_RC_ERR_INVALID_PARAMETER;
        object.collected().instances.push_back(returned->returned());
        return CMPI_RC_OK;
    });
}

CMPIStatus returnObjectPath(const CMPIResult* result, const CMPIObjectPath* path) {
    return statusOn(result, Entry::ResultReturnObjectPath, nullptr, [&](ResultObject& object) {
        const PathObject* returned = usable(path, Entry::ResultReturnObjectPath);
        if (returned == nullptr) return CMPI_RC_ERR_INVALID_PARAMETER;
        if (!hasKeys(object.core(), returned->content())) return CMPI_RC_ERR_INVALID_PARAMETER;
        object.collected().paths.push_back(returned->content());
        return CMPI_RC_OK;
    });
}

CMPIStatus returnDone(const CMPIResult* result) {
    return statusOn(result, Entry::ResultReturnDone, nullptr, [](ResultObject& object) {
        ++object.collected().doneCalls;
        return CMPI_RC_OK;
    });
}

const CMPIResultFT resultTable = {
    .ftVersion = CMPI_VERSION,
    .release = releaseEntry<CMPIResult>,
    .clone = cloneEntry<CMPIResult>,
    .returnData = returnData,
    .returnInstance = returnInstance,
    .returnObjectPath = returnObjectPath,
    .returnDone = returnDone,
};

}  // namespace

ResultObject::ResultObject(BrokerCore& brokerCore, Broker::Collected& collected)
    : Object(brokerCore, ObjectKind::Result),
      CMPIResult{nullptr, &resultTable},
      collected_(&collected) {
    hdl = this;
}

std::shared_ptr<ResultObject> ResultObject::copy() const {
    return std::make_shared<ResultObject>(core(), *collected_);
}

}  // namespace testbed
