// Reading the broker's objects without trusting them.
#include "PlexorProviderLock.h"
#include "PlexorProviderUtil.h"

const CMPIBroker* CurrentBroker() {
    return LoadShared(Broker);
}

bool LogEnabled(int priority) {
    return (setlogmask(0) & LOG_MASK(priority)) != 0;
}

const char* StringText(const CMPIString* string) {
    return string != nullptr ? string->ft->getCharPtr(string, nullptr) : nullptr;
}

const char* StatusText(const CMPIStatus& status) {
    const char* text = StringText(status.msg);
    return text != nullptr ? text : "NULL";
}

const char* PathText(int priority, const CMPIObjectPath* path) {
    if (path == nullptr) return "NULL";
    if (!LogEnabled(priority)) return "";
    const char* text = StringText(path->ft->toString(path, nullptr));
    return text != nullptr ? text : "NULL";
}

const char* ValueText(const CMPIData& data) {
    if ((data.state & (CMPI_nullValue | CMPI_badValue | CMPI_notFound)) != 0) return nullptr;
    if (data.type == CMPI_string) return StringText(data.value.string);
    if (data.type == CMPI_chars) return data.value.chars;
    return nullptr;
}

namespace {

CMPIData NullData() {
    CMPIData data;
    memset(&data, 0, sizeof data);
    data.type = CMPI_null;
    data.state = CMPI_nullValue;
    return data;
}

/// Widens a scalar by its declared type; 0 for everything that is not a number or truth value.
CMPIUint64 ScalarNumber(const CMPIData& data) {
    if ((data.state & (CMPI_nullValue | CMPI_badValue | CMPI_notFound)) != 0) return 0;
    switch (data.type) {
        case CMPI_boolean:
            return data.value.boolean;
        case CMPI_uint8:
            return data.value.uint8;
        case CMPI_uint16:
            return data.value.uint16;
        case CMPI_uint32:
            return data.value.uint32;
        case CMPI_uint64:
            return data.value.uint64;
        case CMPI_sint8:
            return static_cast<CMPIUint64>(data.value.sint8);
        case CMPI_sint16:
            return static_cast<CMPIUint64>(data.value.sint16);
        case CMPI_sint32:
            return static_cast<CMPIUint64>(data.value.sint32);
        case CMPI_sint64:
            return static_cast<CMPIUint64>(data.value.sint64);
        default:
            return 0;
    }
}

// Elements of another type than the wanted one that are passed over in a row: an enumeration may
// give such elements for ever.
constexpr int kMostOddElements = 1000;

/// Takes the next element. False at the end, and when the enumeration cannot give it: asking such a
/// one again might never end.
bool NextElement(const CMPIEnumeration* enumeration, CMPIData& data, bool* failed = nullptr) {
    if (enumeration == nullptr) return false;
    CMPIStatus status = {CMPI_RC_OK, nullptr};
    const bool more = enumeration->ft->hasNext(enumeration, &status) != 0;
    if (more) data = enumeration->ft->getNext(enumeration, &status);
    if (failed != nullptr) *failed = status.rc != CMPI_RC_OK;
    return more && status.rc == CMPI_RC_OK;
}

/// Element 0 of an array property; a null value when there is no array.
CMPIData FirstElement(const CMPIInstance* inst, const char* name) {
    if (inst == nullptr) return NullData();
    // Neither status nor state is asked: what claims to be an array and is there gets read.
    const CMPIData data = inst->ft->getProperty(inst, name, nullptr);
    if ((data.type & CMPI_ARRAY) == 0 || data.value.array == nullptr) return NullData();
    return data.value.array->ft->getElementAt(data.value.array, 0, nullptr);
}

}  // namespace

CMPIData ReadProperty(const CMPIInstance* inst, const char* name) {
    if (inst == nullptr) return NullData();
    CMPIStatus status = {CMPI_RC_OK, nullptr};
    const CMPIData data = inst->ft->getProperty(inst, name, &status);
    return status.rc == CMPI_RC_OK ? data : NullData();
}

const char* ReadString(const CMPIInstance* inst, const char* name) {
    return ValueText(ReadProperty(inst, name));
}

CMPIUint64 ReadUint64(const CMPIInstance* inst, const char* name) {
    return ScalarNumber(ReadProperty(inst, name));
}

CMPIUint16 ReadUint16(const CMPIInstance* inst, const char* name) {
    return static_cast<CMPIUint16>(ReadUint64(inst, name));
}

CMPIUint8 ReadUint8(const CMPIInstance* inst, const char* name) {
    return static_cast<CMPIUint8>(ReadUint64(inst, name));
}

CMPIBoolean ReadBoolean(const CMPIInstance* inst, const char* name) {
    return ReadUint64(inst, name) != 0 ? 1 : 0;
}

CMPIUint16 ReadArrayUint16(const CMPIInstance* inst, const char* name) {
    return static_cast<CMPIUint16>(ScalarNumber(FirstElement(inst, name)));
}

CMPIValue GetArrayProperty(const CMPIInstance* inst, const char* property) {
    return FirstElement(inst, property).value;
}

CMPIUint16 GetOperationalStatus(const CMPIInstance* inst) {
    return ReadArrayUint16(inst, "OperationalStatus");
}

const char* ReadKey(const CMPIObjectPath* path, const char* name) {
    if (path == nullptr) return nullptr;
    CMPIStatus status = {CMPI_RC_OK, nullptr};
    const CMPIData data = path->ft->getKey(path, name, &status);
    return status.rc == CMPI_RC_OK ? ValueText(data) : nullptr;
}

const char* ClassNameText(const CMPIObjectPath* path) {
    return path != nullptr ? StringText(path->ft->getClassName(path, nullptr)) : nullptr;
}

CMPIObjectPath* InstancePath(const CMPIInstance* inst) {
    return inst != nullptr ? inst->ft->getObjectPath(inst, nullptr) : nullptr;
}

CMPIObjectPath* ClonePath(const CMPIObjectPath* path) {
    return path != nullptr ? path->ft->clone(path, nullptr) : nullptr;
}

CMPIInstance* CloneInstance(const CMPIInstance* inst) {
    return inst != nullptr ? inst->ft->clone(inst, nullptr) : nullptr;
}

void ReleasePath(CMPIObjectPath*& path) {
    if (path != nullptr) path->ft->release(path);
    path = nullptr;
}

void ReleaseInstance(CMPIInstance*& inst) {
    if (inst != nullptr) inst->ft->release(inst);
    inst = nullptr;
}

bool HasNext(const CMPIEnumeration* enumeration) {
    return enumeration != nullptr && enumeration->ft->hasNext(enumeration, nullptr) != 0;
}

CMPIInstance* NextInstance(const CMPIEnumeration* enumeration, bool* failed) {
    CMPIData data = NullData();
    for (int i = 0; i < kMostOddElements; i++) {
        if (!NextElement(enumeration, data, failed)) return nullptr;
        if (data.type == CMPI_instance && data.value.inst != nullptr) return data.value.inst;
    }
    if (failed != nullptr) *failed = true;
    return nullptr;
}

CMPIObjectPath* NextPath(const CMPIEnumeration* enumeration) {
    CMPIData data = NullData();
    for (int i = 0; i < kMostOddElements; i++) {
        if (!NextElement(enumeration, data)) return nullptr;
        if (data.type == CMPI_ref && data.value.ref != nullptr) return data.value.ref;
    }
    return nullptr;
}
