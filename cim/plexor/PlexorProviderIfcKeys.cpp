// The keys of the served classes: composing them, and splitting a client's key again.
#include <stdio.h>
#include <stdlib.h>

#include "PlexorProviderIfc.h"

namespace {

constexpr size_t kKeySize = 256;

/// CMPI_chars values are passed as the address of the characters.
void AddKey(CMPIObjectPath* cop, const char* name, const char* value) {
    cop->ft->addKey(cop, name, reinterpret_cast<const CMPIValue*>(value), CMPI_chars);
}

/// Copy of `length` characters; null (logged) without memory.
char* CopyChars(const char* text, size_t length) {
    auto* copy = static_cast<char*>(malloc(length + 1));
    if (copy == nullptr) {
        syslog(LOG_ERR, "malloc failure\n");
        return nullptr;
    }
    memcpy(copy, text, length);
    copy[length] = '\0';
    return copy;
}

/// A key as the client gave it.
struct ClientKey {
    const char* text;
    const char* rest;  ///< what follows the prefix; null for a key that is refused
};

/// What follows the prefix in a key; null (silently) for another prefix, and null (logged) when
/// nothing follows.
const char* AfterPrefix(const char* key, const char* prefix) {
    const size_t length = strlen(prefix);
    if (key == nullptr || strncmp(key, prefix, length) != 0) return nullptr;
    if (key[length] != '\0') return key + length;
    syslog(LOG_ERR, "No valid info in key key %s\n", key);
    return nullptr;
}

/// Reads a key of the path; an absent one is logged and refused.
ClientKey ReadClientKey(const CMPIObjectPath* cop, const char* keyProperty, const char* prefix) {
    CMPIStatus status = {CMPI_RC_OK, nullptr};
    const CMPIData data = cop->ft->getKey(cop, keyProperty, &status);
    if (status.rc != CMPI_RC_OK) {
        syslog(LOG_ERR, "%s key not found in object path %s\n", keyProperty,
               PathText(LOG_ERR, cop));
        return {nullptr, nullptr};
    }
    const char* text = ValueText(data);
    return {text, AfterPrefix(text, prefix)};
}

/// The underscore between the controller's and the device's identifier; null (logged) when the text
/// after the prefix is malformed.
const char* FindSeparator(const char* key, const char* rest) {
    const char* separator = strchr(rest, '_');
    if (separator == nullptr) {
        syslog(LOG_ERR, "Device ID not found in key %s\n", key);
        return nullptr;
    }
    // A one-character controller is refused, an empty one is not; both are part of the format.
    if (separator == rest + 1) {
        syslog(LOG_ERR, "Controller ID not found in key %s\n", key);
        return nullptr;
    }
    if (separator[1] == '\0') {
        syslog(LOG_ERR, "Device ID empty in key %s\n", key);
        return nullptr;
    }
    return separator;
}

}  // namespace

char* MakeDeviceID(const char* ID, const char* prefix) {
    char key[kKeySize];
    snprintf(key, sizeof key, "%s%s", prefix, ID);
    return StringClone(key);
}

char* MakeLogicalDeviceID(const char* ctrlID, const char* devID, const char* prefix) {
    char key[kKeySize];
    snprintf(key, sizeof key, "%s%s%s%s", prefix, ctrlID, "_", devID);
    return StringClone(key);
}

void FillControllerObjectPath(CMPIObjectPath* cop, RaidController_t* ctrl) {
    syslog(LOG_DEBUG, "%s: DeviceID - %s\n", __func__, ctrl->DeviceID);
    AddKey(cop, "CreationClassName", kControllerClass);
    char* name = MakeDeviceID(ctrl->DeviceID, kControllerPrefix);
    AddKey(cop, kControllerKey, name);
    free(name);
}

void FillSoftwareIdentityObjectPath(CMPIObjectPath* cop, RaidController_t* ctrl) {
    syslog(LOG_DEBUG, "%s: DeviceID - %s\n", __func__, ctrl->DeviceID);
    char* id = MakeDeviceID(ctrl->DeviceID, kSoftwarePrefix);
    AddKey(cop, kSoftwareKey, id);
    free(id);
}

void FillLogicalDeviceObjectPath(CMPIObjectPath* cop, const char* deviceID,
                                 const char* creationClassName) {
    syslog(LOG_DEBUG, "%s: ClassName - %s, DeviceID - %s\n", __func__, creationClassName,
           OrNull(deviceID));
    AddKey(cop, "SystemCreationClassName", GetSystemClassName());
    AddKey(cop, "SystemName", GetSystemName());
    AddKey(cop, "CreationClassName", creationClassName);
    AddKey(cop, kDeviceKey, deviceID);
}

int RetrieveDeviceID(const CMPIObjectPath* cop, const char* keyProperty, const char* prefix,
                     char** deviceID) {
    const ClientKey key = ReadClientKey(cop, keyProperty, prefix);
    if (key.rest == nullptr) return RESULT_NOT_FOUND;
    char* copy = CopyChars(key.rest, strlen(key.rest));
    if (copy == nullptr) return RESULT_NO_MEMORY;
    syslog(LOG_DEBUG, "%s: s1 - %s\n", __func__, copy);
    *deviceID = copy;
    return RESULT_OK;
}

int RetrieveControllerAndDeviceIDs(const CMPIObjectPath* cop, const char* prefix, char** ctrlID,
                                   char** deviceID) {
    const ClientKey key = ReadClientKey(cop, kDeviceKey, prefix);
    const char* separator = key.rest != nullptr ? FindSeparator(key.text, key.rest) : nullptr;
    if (separator == nullptr) return RESULT_NOT_FOUND;

    char* controller = CopyChars(key.rest, static_cast<size_t>(separator - key.rest));
    if (controller == nullptr) return RESULT_NO_MEMORY;
    char* device = CopyChars(separator + 1, strlen(separator + 1));
    if (device == nullptr) {
        free(controller);
        return RESULT_NO_MEMORY;
    }
    syslog(LOG_DEBUG, "%s: s1 - %s, s2 - %s\n", __func__, controller, device);
    *ctrlID = controller;
    *deviceID = device;
    return RESULT_OK;
}
