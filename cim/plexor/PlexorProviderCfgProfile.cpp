// Finding the vendor's registrations of the RAID profile.
#include "PlexorProviderCfg.h"

namespace {

constexpr const char kProfileName[] = "Host Hardware RAID Controller";
constexpr unsigned int kMaxProfiles = sizeof(Array_t::Array) / sizeof(void*);

/// Stores the instance when it registers our profile.
void ExamineProfile(CMPIInstance* inst, Array_t* profiles) {
    const char* name = ReadString(inst, "RegisteredName");
    const CMPIUint16 organization = ReadUint16(inst, "RegisteredOrganization");
    const char* version = ReadString(inst, "RegisteredVersion");
    syslog(LOG_DEBUG,
           "CIM_RegisteredProfile: RegisteredName %s, RegisteredVersion: %s, "
           "RegisteredOrganization: %d\n",
           OrNull(name), OrNull(version), organization);
    if (name == nullptr || strcmp(name, kProfileName) != 0) return;
    syslog(LOG_INFO, "Found a HHRC profile: %s\n",
           LogEnabled(LOG_INFO) ? PathText(LOG_INFO, InstancePath(inst)) : "");
    profiles->Array[profiles->Count++] = inst;
}

int CollectProfiles(const CMPIContext* ctx, Array_t* profiles) {
    CMPIStatus status = {CMPI_RC_OK, nullptr};
    const CMPIBroker* broker = CurrentBroker();
    CMPIObjectPath* path =
        broker->eft->newObjectPath(broker, "root/interop", "CIM_RegisteredProfile", &status);
    if (status.rc != CMPI_RC_OK) {
        syslog(LOG_ERR, "status: rc %d, msg %s\n", status.rc, StatusText(status));
        return RESULT_NO_MEMORY;
    }

    profiles->Count = 0;
    CMPIEnumeration* found = QueryInstances("GetHHRCProfiles", ctx, path);
    while (HasNext(found)) {
        // Before the element is looked at: with all slots taken any further one is too many.
        if (profiles->Count >= kMaxProfiles) {
            syslog(LOG_ERR, "%s: profile array out of range\n", "GetHHRCProfiles");
            return RESULT_ARRAY_FULL;
        }
        CMPIInstance* inst = NextInstance(found);
        if (inst == nullptr || StopRequested()) break;
        ExamineProfile(inst, profiles);
    }
    return static_cast<int>(profiles->Count);
}

}  // namespace

int GetHHRCProfiles(const CMPIInstanceMI*, const CMPIContext* ctx, Array_t* profileArray) {
    syslog(LOG_DEBUG, "GetHHRCProfiles: entering...\n");
    int rc = RESULT_BAD_ARGUMENT;
    if (profileArray != nullptr && ctx != nullptr) rc = CollectProfiles(ctx, profileArray);
    syslog(LOG_DEBUG, "GetHHRCProfiles: exiting, RC %d.\n", rc);
    return rc;
}
