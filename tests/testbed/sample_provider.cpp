// A provider that answers with what it was asked, for the tests of loading and requesting.
#include <cmpidt.h>
#include <cmpift.h>

#include <atomic>

namespace {

const CMPIBroker* broker = nullptr;
std::atomic<int> factoryCalls = 0;

CMPIStatus ok() {
    return {CMPI_RC_OK, nullptr};
}

CMPIStatus cleanup(CMPIInstanceMI*, const CMPIContext*, CMPIBoolean terminating) {
    broker->eft->newString(broker, "cleanup", nullptr);
    return {terminating ? CMPI_RC_OK : CMPI_RC_DO_NOT_UNLOAD, nullptr};
}

CMPIStatus enumerateInstanceNames(CMPIInstanceMI*, const CMPIContext*, const CMPIResult* result,
                                  const CMPIObjectPath* classPath) {
    result->ft->returnObjectPath(result, classPath);
    result->ft->returnDone(result);
    return ok();
}

CMPIStatus enumerateInstances(CMPIInstanceMI*, const CMPIContext*, const CMPIResult* result,
                              const CMPIObjectPath* classPath, const char** properties) {
    CMPIInstance* instance = broker->eft->newInstance(broker, classPath, nullptr);
    CMPIUint32 count = 0;
    while (properties != nullptr && properties[count] != nullptr) ++count;
    if (properties != nullptr) {
        instance->ft->setProperty(instance, "Wanted", reinterpret_cast<CMPIValue*>(&count),
                                  CMPI_uint32);
    }
    result->ft->returnInstance(result, instance);
    result->ft->returnDone(result);
    return ok();
}

CMPIStatus getInstance(CMPIInstanceMI*, const CMPIContext*, const CMPIResult*,
                       const CMPIObjectPath* path, const char**) {
    return {CMPI_RC_ERR_NOT_FOUND, path->ft->toString(path, nullptr)};
}

CMPIStatus createInstance(CMPIInstanceMI*, const CMPIContext*, const CMPIResult*,
                          const CMPIObjectPath*, const CMPIInstance*) {
    return {CMPI_RC_ERR_NOT_SUPPORTED, nullptr};
}

CMPIStatus modifyInstance(CMPIInstanceMI*, const CMPIContext*, const CMPIResult*,
                          const CMPIObjectPath*, const CMPIInstance*, const char**) {
    return {CMPI_RC_ERR_NOT_SUPPORTED, nullptr};
}

CMPIStatus deleteInstance(CMPIInstanceMI*, const CMPIContext*, const CMPIResult*,
                          const CMPIObjectPath*) {
    return {CMPI_RC_ERR_NOT_SUPPORTED, nullptr};
}

CMPIStatus execQuery(CMPIInstanceMI*, const CMPIContext*, const CMPIResult*, const CMPIObjectPath*,
                     const char*, const char*) {
    return {CMPI_RC_ERR_NOT_SUPPORTED, nullptr};
}

CMPIInstanceMIFT table = {
    CMPI_VERSION,       1,           "sample",       cleanup,        enumerateInstanceNames,
    enumerateInstances, getInstance, createInstance, modifyInstance, deleteInstance,
    execQuery,
};
CMPIInstanceMI mi = {&factoryCalls, &table};

}  // namespace

CMPI_EXTERN_C CMPIInstanceMI* Sample_Create_InstanceMI(const CMPIBroker* givenBroker,
                                                       const CMPIContext*, CMPIStatus* status) {
    broker = givenBroker;
    ++factoryCalls;
    *status = ok();
    return &mi;
}

CMPI_EXTERN_C CMPIInstanceMI* Unwilling_Create_InstanceMI(const CMPIBroker*, const CMPIContext*,
                                                          CMPIStatus* status) {
    *status = {CMPI_RC_ERR_FAILED, nullptr};
    return nullptr;
}
