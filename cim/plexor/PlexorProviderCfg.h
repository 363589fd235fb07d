// What the inventory's files share: broker queries, the workers' gate and their quiet stop.
#pragma once

#include <stdlib.h>

#include "PlexorProviderDeadline.h"
#include "PlexorProviderUtil.h"
#include "PlexorProviderUtilLife.h"

/// A query of the broker: everything that its call and its log lines name.
struct Query_t {
    const char* Caller;            ///< name of the function that asks
    const CMPIContext* Context;    ///< context of the calling thread
    const CMPIObjectPath* Source;  ///< path it is made on
    const char* AssocClass;        ///< null: any
    const char* ResultClass;       ///< null: any
};

// Each of these logs the query. The queries below them do so themselves; a caller that must log
// something between the two uses LogAssociators and RunAssociators.
void LogAssociators(const Query_t& query);
void LogAssociatorNames(const Query_t& query);

// Each logs the query, makes it, and logs its failure. The result is the broker's; null when the
// query failed or there is nothing. Made without CtrlMutex. While the workers are being stopped,
// nothing is asked and the answer is null.
CMPIEnumeration* QueryInstances(const char* caller, const CMPIContext* ctx,
                                const CMPIObjectPath* path);
CMPIEnumeration* QueryAssociators(const Query_t& query);
CMPIEnumeration* QueryAssociatorNames(const Query_t& query);
/// The instance counts even if it came with a failure; `failed`, when given, tells.
CMPIInstance* QueryInstance(const char* caller, const CMPIContext* ctx, const CMPIObjectPath* path,
                            bool* failed = nullptr);

// The same without the line before the query.
CMPIEnumeration* RunAssociators(const Query_t& query);
CMPIEnumeration* RunAssociatorNames(const Query_t& query);

/// A zero-filled record or work item; null without memory. Released with free().
template <typename Record>
Record* NewRecord() {
    return static_cast<Record*>(calloc(1, sizeof(Record)));
}

/// Queues a work item of the calling thread's life. RESULT_NOTHING when that life has ended: such
/// an item would become the next one's. Else the queue's code. The caller keeps what is not queued.
int QueueItem(Thread_Args_t* item);

/// Frees a work item of ProcessBuildLogicalDeviceInfo with the clones in it.
void ReleaseDeviceItem(Thread_Args_t* item);

/// Runs one queued item on the calling worker when it is the only one: where the other could not be
/// started, nobody else would. False when there are two, or nothing is queued. Takes
/// PlexorThreadMutex; the item runs without it, and without a flush, which would end what the
/// caller itself has obtained.
bool RunQueuedItemAlone(const CMPIContext* ctx) PLEXOR_WITHOUT(PlexorThreadMutex);

// Beginning a life of the provider and stopping its work before the inventory is released.

/// Begins a life: what earlier ones left behind in the workers' words (TerminateThread,
/// ThreadActivityDone, ActiveThreads) does not count for it. Takes no lock but the life's.
void BeginWork();

/// Whether one worker of the present life is active at most, by ActiveThreads.
bool OneWorkerActiveAtMost() PLEXOR_HOLDS(PlexorThreadMutex);

/// Whether the initial inventory of the present life is done. Takes PlexorThreadMutex.
bool InventoryDone() PLEXOR_WITHOUT(PlexorThreadMutex);

/// Closes the gate for the life that is about to begin. The caller holds the life's mutex.
void CloseInventoryGate();

/// Asks the present life to end and waits until no work function is running. False when one still
/// is after the limit: then nothing that it may use can be released. `limit` is asked again after
/// WakeQuiesce, with PlexorThreadMutex held.
bool QuiesceWorkers(Deadline (*limit)()) PLEXOR_WITHOUT(PlexorThreadMutex);

/// Has QuiesceWorkers look at its limit again. Takes PlexorThreadMutex.
void WakeQuiesce() PLEXOR_WITHOUT(PlexorThreadMutex);
