// The identity of the host that contains everything the provider serves.
#include <stdlib.h>

#include "PlexorProviderLock.h"
#include "PlexorProviderUtil.h"
#include "PlexorProviderUtilLife.h"

char* __SystemName = nullptr;
char* __HostName = nullptr;
char* __SystemClassName = nullptr;

namespace {

/// First instance of the host class, the broker's; null when there is none, which is logged.
CMPIInstance* FindHostInstance(const CMPIContext* ctx, const CMPIObjectPath* path) {
    CMPIStatus status = {CMPI_RC_OK, nullptr};
    const CMPIBroker* broker = CurrentBroker();
    CMPIEnumeration* hosts = nullptr;
    if (path != nullptr) {
        hosts = broker->bft->enumerateInstances(broker, ctx, path, nullptr, &status);
    }
    CMPIInstance* host = nullptr;
    if (status.rc == CMPI_RC_OK) host = NextInstance(hosts);
    if (host != nullptr) return host;

    const char* message = StringText(status.msg);
    if (message != nullptr) {
        syslog(LOG_ERR, "%s: no instance found. rc %d, msg %s\n", "InitSystemInfo", status.rc,
               message);
    } else {
        syslog(LOG_ERR, "%s: no instance found. rc %d\n", "InitSystemInfo", status.rc);
    }
    return nullptr;
}

// A request that a cleanup could not wait for may still read the names, hence LoadShared and
// StoreShared.

/// The names as the manager has them, for whoever stores or frees them.
struct HostNames {
    char* system;
    char* host;
    char* className;
};

char* CloneName(const CMPIInstance* host, const char* property) {
    const char* text = ReadString(host, property);
    return text != nullptr ? StringClone(text) : nullptr;
}

HostNames ReadNames(const CMPIInstance* host) {
    char* system = CloneName(host, "Name");
    char* hostName = CloneName(host, "ElementName");
    return {system, hostName, CloneName(host, "CreationClassName")};
}

void ReleaseName(char*& field) {
    free(field);
    StoreShared(field, nullptr);
}

/// False after a stop: the names are not this thread's any more.
bool StoreIfLifeStands(const HostNames& names) {
    const LifeGuard life;
    if (!life.Stands()) return false;
    // A name that an earlier, incomplete reading left is replaced, not leaked.
    ReleaseSystemInfo();
    StoreShared(__SystemName, names.system);
    StoreShared(__HostName, names.host);
    StoreShared(__SystemClassName, names.className);
    return true;
}

/// False after a stop. Nobody who ends the life waits for the manager's answers.
bool StoreNames(const CMPIInstance* host) {
    const HostNames names = ReadNames(host);
    if (StoreIfLifeStands(names)) return true;
    free(names.system);
    free(names.host);
    free(names.className);
    return false;
}

}  // namespace

int InitSystemInfo(const CMPIInstanceMI*, const CMPIContext* ctx) {
    syslog(LOG_DEBUG, "%s: entering...\n", __func__);
    if (__SystemName != nullptr) return RESULT_OK;

    CMPIStatus status = {CMPI_RC_OK, nullptr};
    const CMPIBroker* broker = CurrentBroker();
    CMPIObjectPath* path =
        broker->eft->newObjectPath(broker, "root/cimv2", "OMC_UnitaryComputerSystem", &status);
    if (status.rc != CMPI_RC_OK) {
        syslog(LOG_ERR, "%s: rc %d, msg %s\n", __func__, status.rc, StatusText(status));
        return RESULT_NO_MEMORY;
    }
    syslog(LOG_DEBUG, "%s, CIM Query - EnumInstances: %s", __func__, PathText(LOG_DEBUG, path));
    const CMPIInstance* host = FindHostInstance(ctx, path);
    if (host == nullptr || !StoreNames(host)) return RESULT_NOTHING;
    syslog(LOG_DEBUG, "SYSTEM INFO: HostName %s, SystemName %s, SystemClassName %s\n",
           OrNull(GetHostName()), OrNull(GetSystemName()), OrNull(GetSystemClassName()));
    return RESULT_OK;
}

void ReleaseSystemInfo() {
    ReleaseName(__SystemClassName);
    ReleaseName(__HostName);
    ReleaseName(__SystemName);
}

void GiveUpSystemInfo() {
    StoreShared(__SystemClassName, nullptr);
    StoreShared(__HostName, nullptr);
    StoreShared(__SystemName, nullptr);
}

const char* GetHostName() {
    return LoadShared(__HostName);
}
const char* GetSystemName() {
    return LoadShared(__SystemName);
}
const char* GetSystemClassName() {
    return LoadShared(__SystemClassName);
}
