// SAS/SATA ports and batteries: plain records, built by the same steps.
#include <stdlib.h>

#include "PlexorProviderCfg.h"
#include "PlexorProviderLock.h"

namespace {

constexpr const char kBatteryUpdater[] = "CheckAndUpdateBatteryInfo";

/// What differs between the two builders. The message texts take the function's name first, but for
/// `nullDeviceId`, which takes the path.
template <typename Record>
struct Builder {
    const char* caller;
    CMPIObjectPath* Record::*op;
    List_t* RaidController_t::*list;
    time_t RaidController_t::*updateTime;
    void (*read)(Record* record, const CMPIInstance* inst);
    void (*dump)(const Record* record);
    ReleaseFunc_t release;
    const char* noMemory;
    const char* nullDeviceId;
    const char* added;
    const char* notAdded;
};

void ReadPort(SASSATAPort_t* port, const CMPIInstance* inst) {
    port->PortName = StringClone(ReadString(inst, "ElementName"));
    port->PortType = ReadUint16(inst, "PortType");
    port->UsageRestriction = ReadUint16(inst, "UsageRestriction");
    port->OperationalStatus = GetOperationalStatus(inst);
}

void DumpPort(const SASSATAPort_t* port) {
    syslog(LOG_INFO,
           "\nPortOp: %s\n\tDeviceID          - %s\n\tPortName:         - %s\n"
           "\tPortType          - %d\n\tOperationalStatus - %d\n",
           PathText(LOG_INFO, port->PortOp), port->DeviceID, port->PortName, port->PortType,
           port->OperationalStatus);
}

void ReadBattery(Battery_t* battery, const CMPIInstance* inst) {
    battery->BatteryStatus = ReadUint16(inst, "BatteryStatus");
    battery->OperationalStatus = GetOperationalStatus(inst);
}

void DumpBattery(const Battery_t* battery) {
    syslog(LOG_INFO,
           "\nBatteryOp: %s\n\tDeviceID          - %s\n\tBatteryStatus     - %d\n"
           "\tOperationalStatus - %d\n",
           PathText(LOG_INFO, battery->BatteryOp), battery->DeviceID, battery->BatteryStatus,
           battery->OperationalStatus);
}

constexpr Builder<SASSATAPort_t> kPortBuilder = {
    "BuildPortInfo",
    &SASSATAPort_t::PortOp,
    &RaidController_t::PortList,
    &RaidController_t::PortUpdateTime,
    ReadPort,
    DumpPort,
    FreePort,
    "%s, failed to allocate memory for SASSATAPort_t\n",
    "NULL DeviceID for port %s\n",
    "%s: port %p added to the list\n",
    "%s: failed to add port to list, rc %d.\n"};

constexpr Builder<Battery_t> kBatteryBuilder = {"BuildBatteryInfo",
                                                &Battery_t::BatteryOp,
                                                &RaidController_t::BatteryList,
                                                &RaidController_t::BatteryUpdateTime,
                                                ReadBattery,
                                                DumpBattery,
                                                FreeBattery,
                                                "%s, failed to allocate memory for Battery_t\n",
                                                "NULL DeviceID for battery %s\n",
                                                "%s: battery %p added to the list\n",
                                                "%s: failed to add battery to list, rc %d.\n"};

// The formats are the constants of the tables above.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"

template <typename Record>
int Insert(const Builder<Record>& builder, RaidController_t* ctrl, Record* record) {
    MutexGuard lock(ctrl->CtrlMutex);
    const int rc = AppendRecord(ctrl->*builder.list, record, ctrl->*builder.updateTime);
    lock.Unlock();
    if (rc == RESULT_OK) {
        syslog(LOG_DEBUG, builder.added, builder.caller, static_cast<void*>(record));
        return rc;
    }
    syslog(LOG_ERR, builder.notAdded, builder.caller, rc);
    builder.release(record);
    return rc;
}

template <typename Record>
int Build(const Builder<Record>& builder, RaidController_t* ctrl, const CMPIInstance* devInst,
          const CMPIObjectPath* devOp) {
    auto* record = NewRecord<Record>();
    if (record == nullptr) {
        syslog(LOG_ERR, builder.noMemory, builder.caller);
        return RESULT_NO_MEMORY;
    }
    record->*builder.op = ClonePath(devOp);
    record->DeviceID = StringClone(ReadString(devInst, "DeviceID"));
    if (record->DeviceID == nullptr) {
        syslog(LOG_ERR, builder.nullDeviceId, PathText(LOG_ERR, record->*builder.op));
        builder.release(record);
        return RESULT_BAD_ARGUMENT;
    }
    builder.read(record, devInst);
    record->LastUpdateTime = time(nullptr);
    builder.dump(record);
    return Insert(builder, ctrl, record);
}

#pragma GCC diagnostic pop

template <typename Record>
int TracedBuild(const Builder<Record>& builder, RaidController_t* ctrl, const CMPIInstance* devInst,
                const CMPIObjectPath* devOp) {
    syslog(LOG_DEBUG, "%s, ENTER...\n", builder.caller);
    const int rc = Build(builder, ctrl, devInst, devOp);
    syslog(LOG_DEBUG, "%s, EXIT(%d).\n", builder.caller, rc);
    return rc;
}

void UpdateBattery(RaidController_t* ctrl, Battery_t* battery, const CMPIContext* ctx,
                   const CMPIInstance* devInst) {
    const CMPIInstance* inst = devInst;
    if (inst == nullptr) inst = QueryInstance(kBatteryUpdater, ctx, battery->BatteryOp);
    if (inst == nullptr) return;
    const CMPIUint16 operational = GetOperationalStatus(inst);
    const CMPIUint16 status = ReadUint16(inst, "BatteryStatus");
    if (operational == battery->OperationalStatus && status == battery->BatteryStatus) return;

    MutexGuard lock(ctrl->CtrlMutex);
    syslog(LOG_ERR,
           "%s: battery %s status changed. Old OperationalStatus %d BatteryStatust %d, "
           "new OperationalStatus %d BatteryStatust %d\n",
           kBatteryUpdater, battery->DeviceID, battery->OperationalStatus, battery->BatteryStatus,
           operational, status);
    battery->OperationalStatus = operational;
    battery->BatteryStatus = status;
}

}  // namespace

int BuildPortInfo(const CMPIInstanceMI*, const CMPIContext*, RaidController_t* ctrl,
                  const CMPIInstance* devInst, const CMPIObjectPath* devOp) {
    return TracedBuild(kPortBuilder, ctrl, devInst, devOp);
}

int BuildBatteryInfo(const CMPIInstanceMI*, const CMPIContext*, RaidController_t* ctrl,
                     const CMPIInstance* devInst, const CMPIObjectPath* devOp) {
    return TracedBuild(kBatteryBuilder, ctrl, devInst, devOp);
}

int CheckAndUpdatePortInfo(const CMPIInstanceMI*, const CMPIContext*, RaidController_t* ctrl,
                           void* device, CMPIInstance*) {
    const auto* port = static_cast<SASSATAPort_t*>(device);
    syslog(LOG_DEBUG, "%s: ENTER. port - %s\n", __func__, port->PortName);
    if (NeedUpdate(port->LastUpdateTime, port->UpdateEnabled)) {
        StampTime(ctrl->CtrlMutex, ctrl->PortUpdateTime);
    }
    syslog(LOG_DEBUG, "%s, exit.\n", __func__);
    return RESULT_OK;
}

int CheckAndUpdateBatteryInfo(const CMPIInstanceMI*, const CMPIContext* ctx, RaidController_t* ctrl,
                              void* device, CMPIInstance* devInst) {
    auto* battery = static_cast<Battery_t*>(device);
    syslog(LOG_DEBUG, "%s: ENTER. battery - %s\n", __func__, battery->DeviceID);
    if (NeedUpdate(battery->LastUpdateTime, battery->UpdateEnabled)) {
        UpdateBattery(ctrl, battery, ctx, devInst);
        StampTime(ctrl->CtrlMutex, ctrl->BatteryUpdateTime);
    }
    syslog(LOG_DEBUG, "%s, exit.\n", __func__);
    return RESULT_OK;
}
