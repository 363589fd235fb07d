// The entries that a provider may find but not use: they answer that they are not supported.
#include <cerrno>
#include <tuple>

#include "broker_calls.h"
#include "broker_tables.h"

namespace testbed {

namespace {

/// Any entry of the broker's own table with a status out parameter at its end.
template <class Result, class... Arguments>
Result unsupported(const CMPIBroker* broker, const CMPIContext*, Arguments... arguments) {
    CMPIStatus* status = std::get<sizeof...(Arguments) - 1>(std::tuple(arguments...));
    return answerBroker<Result>(broker, describeCall(Entry::Unsupported), status,
                                [](BrokerCore&, CMPIStatus& outcome) {
                                    outcome.rc = CMPI_RC_ERR_NOT_SUPPORTED;
                                    return refusal<Result>();
                                });
}

/// Any entry whose result is the status.
template <class... Arguments>
CMPIStatus unsupportedStatus(const CMPIBroker* broker, const CMPIContext* ctx, Arguments...) {
    CMPIStatus status = statusOk;
    unsupported<Nothing>(broker, ctx, &status);
    return status;
}

/// Any entry of the system table that answers as a POSIX function does.
template <class... Arguments>
int noSystemCall(Arguments...) {
    return ENOTSUP;
}

/// Any entry of the system table that answers with a pointer or nothing.
template <class Result, class... Arguments>
Result nothingFromSystem(Arguments...) {
    return Result();
}

using Path = const CMPIObjectPath*;
using Text = const char*;

}  // namespace

void fillUnsupportedEntries(CMPIBrokerFT& table) {
    table.deliverIndication = unsupportedStatus<Text, const CMPIInstance*>;
    table.createInstance = unsupported<CMPIObjectPath*, Path, const CMPIInstance*, CMPIStatus*>;
    table.modifyInstance = unsupportedStatus<Path, const CMPIInstance*, const char**>;
    table.deleteInstance = unsupportedStatus<Path>;
    table.execQuery = unsupported<CMPIEnumeration*, Path, Text, Text, CMPIStatus*>;
    table.invokeMethod = unsupported<CMPIData, Path, Text, const CMPIArgs*, CMPIArgs*, CMPIStatus*>;
    table.setProperty = unsupportedStatus<Path, Text, const CMPIValue*, CMPIType>;
    table.getProperty = unsupported<CMPIData, Path, Text, CMPIStatus*>;
}

const CMPIBrokerExtFT systemTable = {
    .ftVersion = CMPI_VERSION,
    .resolveFileName = nothingFromSystem<char*>,
    .newThread = nothingFromSystem<CMPI_THREAD_TYPE>,
    .joinThread = noSystemCall,
    .exitThread = noSystemCall,
    .cancelThread = noSystemCall,
    .threadSleep = noSystemCall,
    .threadOnce = noSystemCall,
    .createThreadKey = noSystemCall,
    .destroyThreadKey = noSystemCall,
    .getThreadSpecific = nothingFromSystem<void*>,
    .setThreadSpecific = noSystemCall,
    .newMutex = nothingFromSystem<CMPI_MUTEX_TYPE>,
    .destroyMutex = nothingFromSystem<void>,
    .lockMutex = nothingFromSystem<void>,
    .unlockMutex = nothingFromSystem<void>,
    .newCondition = nothingFromSystem<CMPI_COND_TYPE>,
    .destroyCondition = nothingFromSystem<void>,
    .condWait = noSystemCall,
    .timedCondWait = noSystemCall,
    .signalCondition = noSystemCall,
};

}  // namespace testbed
