// One setter for each type of property, and the arrays of one element.
#include "PlexorProviderIfcProperty.h"

#include "PlexorProviderUtilManager.h"

namespace {

template <typename Number>
void SetNumber(CMPIInstance* inst, const char* name, Number value, CMPIType type) {
    inst->ft->setProperty(inst, name, reinterpret_cast<const CMPIValue*>(&value), type);
}

/// A new array of one element; null when the broker gives none.
CMPIArray* NewArray(CMPIType madeFor) {
    const CMPIBroker* broker = CurrentBroker();
    return broker->eft->newArray(broker, 1, madeFor, nullptr);
}

void SetArray(CMPIInstance* inst, const char* name, CMPIArray* array, CMPIType arrayType) {
    CMPIValue value;
    memset(&value, 0, sizeof value);
    value.array = array;
    inst->ft->setProperty(inst, name, &value, arrayType);
}

}  // namespace

void SetChars(CMPIInstance* inst, const char* name, const char* value) {
    // CMPI_chars values are passed as the address of the characters.
    inst->ft->setProperty(inst, name, reinterpret_cast<const CMPIValue*>(value), CMPI_chars);
}

void SetUint8(CMPIInstance* inst, const char* name, CMPIUint8 value) {
    SetNumber(inst, name, value, CMPI_uint8);
}

void SetUint16(CMPIInstance* inst, const char* name, CMPIUint16 value) {
    SetNumber(inst, name, value, CMPI_uint16);
}

void SetUint64(CMPIInstance* inst, const char* name, CMPIUint64 value) {
    SetNumber(inst, name, value, CMPI_uint64);
}

void SetBoolean(CMPIInstance* inst, const char* name, bool value) {
    SetNumber(inst, name, static_cast<CMPIBoolean>(value ? 1 : 0), CMPI_boolean);
}

void SetUint16Array(CMPIInstance* inst, const char* name, CMPIUint16 value) {
    CMPIArray* array = NewArray(CMPI_uint16);
    if (array == nullptr) return;
    array->ft->setElementAt(array, 0, reinterpret_cast<const CMPIValue*>(&value), CMPI_uint16);
    SetArray(inst, name, array, CMPI_uint16A);
}

void SetCharsArray(CMPIInstance* inst, const char* name, const char* value) {
    CMPIArray* array = NewArray(CMPI_string);
    if (array == nullptr) return;
    SetFirstString(array, value);
    SetArray(inst, name, array, CMPI_charsA);
}

void SetNameAndCaption(CMPIInstance* inst, const char* text) {
    SetChars(inst, "ElementName", text);
    SetChars(inst, "Caption", text);
}
