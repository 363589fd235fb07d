// Packing work items and unpacking them.
#include "PlexorProviderCfgItems.h"

#include <type_traits>

namespace {

template <typename Value>
uintptr_t ToArg(Value value) {
    if constexpr (std::is_pointer_v<Value>) {
        return reinterpret_cast<uintptr_t>(value);
    } else {
        return static_cast<uintptr_t>(value);
    }
}

template <typename Value>
void FromArg(uintptr_t arg, Value& value) {
    if constexpr (std::is_pointer_v<Value>) {
        value = reinterpret_cast<Value>(arg);  // NOLINT(performance-no-int-to-ptr): Args are words
    } else {
        value = static_cast<Value>(arg);
    }
}

}  // namespace

void Pack(Thread_Args_t* item, const WorkerStart& work) {
    item->Arg0 = ToArg(work.index);
    item->Arg1 = ToArg(work.context);
}

void Unpack(const Thread_Args_t* item, WorkerStart& work) {
    FromArg(item->Arg0, work.index);
    FromArg(item->Arg1, work.context);
}

void Pack(Thread_Args_t* item, const InventoryWork& work) {
    item->Func = DoBuildDeviceInfoAsync;
    item->Arg0 = ToArg(work.mi);
}

void Unpack(const Thread_Args_t* item, InventoryWork& work) {
    FromArg(item->Arg0, work.mi);
}

void Pack(Thread_Args_t* item, const DeviceWork& work) {
    item->Func = ProcessBuildLogicalDeviceInfo;
    item->Arg0 = ToArg(work.ctrl);
    item->Arg1 = ToArg(work.mi);
    item->Arg3 = ToArg(work.op);
    item->Arg4 = ToArg(work.inst);
    item->Arg5 = ToArg(work.deviceCode);
}

void Unpack(const Thread_Args_t* item, DeviceWork& work) {
    FromArg(item->Arg0, work.ctrl);
    FromArg(item->Arg1, work.mi);
    FromArg(item->Arg3, work.op);
    FromArg(item->Arg4, work.inst);
    FromArg(item->Arg5, work.deviceCode);
}

void Pack(Thread_Args_t* item, const RefreshWork& work) {
    item->Func = DoDeviceConfigChange;
    item->Arg0 = ToArg(work.mi);
    item->Arg2 = ToArg(work.ctrl);
    item->Arg3 = ToArg(work.action);
}

void Unpack(const Thread_Args_t* item, RefreshWork& work) {
    FromArg(item->Arg0, work.mi);
    FromArg(item->Arg2, work.ctrl);
    FromArg(item->Arg3, work.action);
}
