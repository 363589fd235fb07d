// Asks the vendor through the broker, and logs what it asks and what failed. Who else asks the
// broker: the search for the host's identity (UtilSystem), whose lines are its own, and the walk
// that asks for the class of a path (CfgDevices), which is not logged.
#include "PlexorProviderCfg.h"

namespace {

/// Whether a query may be made at all: there is a path to make it on, and nobody waits for us.
bool MayAsk(const CMPIObjectPath* path) {
    return path != nullptr && !StopRequested();
}

}  // namespace

void LogAssociators(const Query_t& query) {
    syslog(LOG_DEBUG, "%s, CIM Query - Associators: %s (assocClass: %s, resultClass: %s)",
           query.Caller, PathText(LOG_DEBUG, query.Source), OrNull(query.AssocClass),
           OrNull(query.ResultClass));
}

void LogAssociatorNames(const Query_t& query) {
    syslog(LOG_DEBUG, "%s, CIM Query - AssociatorNames: %s (assocClass: %s, resultClass: %s)",
           query.Caller, PathText(LOG_DEBUG, query.Source), OrNull(query.AssocClass),
           OrNull(query.ResultClass));
}

CMPIEnumeration* RunAssociators(const Query_t& query) {
    if (!MayAsk(query.Source)) return nullptr;
    CMPIStatus status = {CMPI_RC_OK, nullptr};
    const CMPIBroker* broker = CurrentBroker();
    CMPIEnumeration* found =
        broker->bft->associators(broker, query.Context, query.Source, query.AssocClass,
                                 query.ResultClass, nullptr, nullptr, nullptr, &status);
    if (status.rc == CMPI_RC_OK) return found;
    syslog(LOG_ERR,
           "Associators %s (assocClass: %s, resultClass: %s) failed, status: rc %d, msg %s",
           PathText(LOG_ERR, query.Source), OrNull(query.AssocClass), OrNull(query.ResultClass),
           status.rc, StatusText(status));
    return nullptr;
}

CMPIEnumeration* RunAssociatorNames(const Query_t& query) {
    if (!MayAsk(query.Source)) return nullptr;
    CMPIStatus status = {CMPI_RC_OK, nullptr};
    const CMPIBroker* broker = CurrentBroker();
    CMPIEnumeration* found =
        broker->bft->associatorNames(broker, query.Context, query.Source, query.AssocClass,
                                     query.ResultClass, nullptr, nullptr, &status);
    if (status.rc == CMPI_RC_OK) return found;
    syslog(LOG_ERR,
           "AssociatorNames %s (assocClass: %s, resultClass: %s) failed, status: rc %d, msg %s",
           PathText(LOG_ERR, query.Source), OrNull(query.AssocClass), OrNull(query.ResultClass),
           status.rc, StatusText(status));
    return nullptr;
}

CMPIEnumeration* QueryAssociators(const Query_t& query) {
    LogAssociators(query);
    return RunAssociators(query);
}

CMPIEnumeration* QueryAssociatorNames(const Query_t& query) {
    LogAssociatorNames(query);
    return RunAssociatorNames(query);
}

CMPIEnumeration* QueryInstances(const char* caller, const CMPIContext* ctx,
                                const CMPIObjectPath* path) {
    syslog(LOG_DEBUG, "%s, CIM Query - EnumInstances %s", caller, PathText(LOG_DEBUG, path));
    if (!MayAsk(path)) return nullptr;
    CMPIStatus status = {CMPI_RC_OK, nullptr};
    const CMPIBroker* broker = CurrentBroker();
    CMPIEnumeration* found = broker->bft->enumerateInstances(broker, ctx, path, nullptr, &status);
    if (status.rc == CMPI_RC_OK) return found;
    syslog(LOG_ERR, "EnumInstances %s failed, status: rc %d, msg %s", PathText(LOG_ERR, path),
           status.rc, StatusText(status));
    return nullptr;
}

CMPIInstance* QueryInstance(const char* caller, const CMPIContext* ctx, const CMPIObjectPath* path,
                            bool* failed) {
    syslog(LOG_DEBUG, "%s, CIM Query - GetInstance: %s", caller, PathText(LOG_DEBUG, path));
    if (!MayAsk(path)) return nullptr;
    CMPIStatus status = {CMPI_RC_OK, nullptr};
    const CMPIBroker* broker = CurrentBroker();
    CMPIInstance* found = broker->bft->getInstance(broker, ctx, path, nullptr, &status);
    if (failed != nullptr) *failed = status.rc != CMPI_RC_OK;
    if (status.rc == CMPI_RC_OK) return found;
    syslog(LOG_ERR, "GetInstance %s failed, status: rc %d, msg %s", PathText(LOG_ERR, path),
           status.rc, StatusText(status));
    return found;
}
