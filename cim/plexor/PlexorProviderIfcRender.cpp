// Rendering controllers, software identities, ports and batteries.
#include "PlexorProviderIfc.h"
#include "PlexorProviderIfcProperty.h"

namespace {

using ShortText = BoundedText<128>;

void SetControllerName(CMPIInstance* inst, const RaidController_t* ctrl) {
    ShortText text;
    text.Append("Controller %s (%s)", ctrl->DeviceID, ctrl->Model);
    SetNameAndCaption(inst, text.Text());
}

void SetStatusAndHealth(CMPIInstance* inst, CMPIUint16 opStatus) {
    SetUint16Array(inst, "OperationalStatus", opStatus);
    SetUint16(inst, "HealthState", GetHealthStateByOpStatus(opStatus));
}

}  // namespace

CMPIUint16 GetHealthStateByOpStatus(CMPIUint16 opStatus) {
    switch (opStatus) {
        case OPSTATUS_OK:
        case OPSTATUS_DORMANT:
            return HEALTHSTATE_OK;
        case OPSTATUS_ERROR:
            return HEALTHSTATE_FAILED;
        case OPSTATUS_NO_CONTACT:
            return HEALTHSTATE_MAJOR;
        default:
            return HEALTHSTATE_UNKNOWN;
    }
}

void FillControllerInstance(CMPIInstance* inst, RaidController_t* ctrl) {
    constexpr CMPIUint16 kDedicatedStorage = 3;
    syslog(LOG_DEBUG, "%s(ENTER): ID %s\n", __func__, ctrl->DeviceID);
    SetControllerName(inst, ctrl);
    SetUint16Array(inst, "OperationalStatus", ctrl->OperationalStatus);
    // Not the record's: a controller that answers counts as healthy.
    SetUint16(inst, "HealthState", HEALTHSTATE_OK);
    SetCharsArray(inst, "IdentifyingDescriptions", "Serial Number");
    SetCharsArray(inst, "OtherIdentifyingInfo", ctrl->DeviceID);
    SetUint16Array(inst, "Dedicated", kDedicatedStorage);
    SetChars(inst, "NameFormat", "Other");
    syslog(LOG_DEBUG, "%s(EXIT)\n", __func__);
}

void FillSoftwareIdentityInstance(CMPIInstance* inst, RaidController_t* ctrl) {
    syslog(LOG_DEBUG, "%s(ENTER): ID %s\n", __func__, ctrl->DeviceID);
    ShortText versions;
    versions.Append("%s (Package)", VersionOrNone(ctrl->BundleVersion));
    versions.Append("; %s (Fw)", VersionOrNone(ctrl->FirmwareVersion));
    SetBoolean(inst, "IsEntity", true);
    SetChars(inst, "VersionString", versions.Text());
    SetControllerName(inst, ctrl);
    syslog(LOG_DEBUG, "%s(EXIT)\n", __func__);
}

void FillPortInstance(CMPIInstance* inst, RaidController_t* ctrl, SASSATAPort_t* port) {
    ShortText text;
    text.Append("%s on Controller %s", port->PortName, ctrl->DeviceID);
    SetNameAndCaption(inst, text.Text());
    SetStatusAndHealth(inst, port->OperationalStatus);
    SetUint16(inst, "PortType", port->PortType);
    SetUint16(inst, "UsageRestriction", port->UsageRestriction);
}

void FillBatteryInstance(CMPIInstance* inst, RaidController_t* ctrl, Battery_t* battery) {
    ShortText text;
    text.Append("Battery %s on Controller %s", battery->DeviceID, ctrl->DeviceID);
    SetNameAndCaption(inst, text.Text());
    SetStatusAndHealth(inst, battery->OperationalStatus);
    SetUint16(inst, "BatteryStatus", battery->BatteryStatus);
}
