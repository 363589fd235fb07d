// SAS/SATA ports and batteries: plain records, built by the same steps.
#include "PlexorProviderCfgBuild.h"
#include "PlexorProviderLock.h"

namespace {

constexpr const char kBatteryUpdater[] = "CheckAndUpdateBatteryInfo";

/// What differs between the two builders.
template <typename Record>
struct Builder {
    const char* caller;
    const DeviceKind& kind;
    CMPIObjectPath* Record::*op;
    void (*read)(Record* record, const CMPIInstance* inst);
    void (*dump)(const Record* record);
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
           PathText(LOG_INFO, port->PortOp), port->DeviceID, OrNull(port->PortName), port->PortType,
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

constexpr Builder<SASSATAPort_t> kPortBuilder = {"BuildPortInfo", kPorts, &SASSATAPort_t::PortOp,
                                                 ReadPort, DumpPort};
constexpr Builder<Battery_t> kBatteryBuilder = {"BuildBatteryInfo", kBatteries,
                                                &Battery_t::BatteryOp, ReadBattery, DumpBattery};

template <typename Record>
bool ReadParts(const Builder<Record>& builder, Record* record, const CMPIInstance* devInst,
               const CMPIObjectPath* devOp) {
    record->*builder.op = ClonePath(devOp);
    record->DeviceID = CloneDeviceID(builder.kind, devInst, record->*builder.op);
    if (record->DeviceID == nullptr) return false;
    builder.read(record, devInst);
    record->LastUpdateTime = time(nullptr);
    return true;
}

template <typename Record>
int Build(const Builder<Record>& builder, RaidController_t* ctrl, const CMPIInstance* devInst,
          const CMPIObjectPath* devOp) {
    return BuildRecord<Record>(builder.caller, builder.kind, [&](Record* record) -> int {
        if (!ReadParts(builder, record, devInst, devOp)) return RESULT_BAD_ARGUMENT;
        builder.dump(record);
        return PublishRecord(builder.caller, ctrl, builder.kind, record);
    });
}

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
        StampTime(ctrl, kPorts);
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
        StampTime(ctrl, kBatteries);
    }
    syslog(LOG_DEBUG, "%s, exit.\n", __func__);
    return RESULT_OK;
}
