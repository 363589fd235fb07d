// What work items carry. Which Arg holds what is relied on outside; it is written and read in
// PlexorProviderCfgItems.cpp only.
#pragma once

#include <stdlib.h>

#include "PlexorProvider.h"

/// The start-up record of a worker.
struct WorkerStart {
    long index;
    CMPIContext* context;  ///< prepared for it, not attached yet
};

/// The initial inventory.
struct InventoryWork {
    const CMPIInstanceMI* mi;
};

/// One device of the walk over a controller's logical devices. The clones are the item's.
struct DeviceWork {
    RaidController_t* ctrl;
    const CMPIInstanceMI* mi;
    CMPIObjectPath* op;
    CMPIInstance* inst;
    int deviceCode;
};

/// The refresh of one class of one controller.
struct RefreshWork {
    const CMPIInstanceMI* mi;
    RaidController_t* ctrl;
    int action;
};

void Pack(Thread_Args_t* item, const WorkerStart& work);
void Pack(Thread_Args_t* item, const InventoryWork& work);
void Pack(Thread_Args_t* item, const DeviceWork& work);
void Pack(Thread_Args_t* item, const RefreshWork& work);

void Unpack(const Thread_Args_t* item, WorkerStart& work);
void Unpack(const Thread_Args_t* item, InventoryWork& work);
void Unpack(const Thread_Args_t* item, DeviceWork& work);
void Unpack(const Thread_Args_t* item, RefreshWork& work);

/// What an item carries, out of the item, which is freed.
template <typename Work>
Work TakeWork(void* args) {
    auto* item = static_cast<Thread_Args_t*>(args);
    Work work;
    Unpack(item, work);
    free(item);
    return work;
}
