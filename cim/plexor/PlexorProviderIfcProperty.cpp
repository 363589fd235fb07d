#include "PlexorProviderIfcProperty.h"

namespace {

template <typename Number>
void SetNumber(CMPIInstance* inst, const char* name, Number value, CMPIType type) {
    inst->ft->setProperty(inst, name, reinterpret_cast<const CMPIValue*>(&value), type);
}

/// Sets an array of one element. The element's type may differ from the array's: an array made for
/// strings takes characters.
void SetArray(CMPIInstance* inst, const char* name, CMPIType madeFor, const void* element,
              CMPIType elementType, CMPIType arrayType) {
    const CMPIBroker* broker = CurrentBroker();
    CMPIArray* array = broker->eft->newArray(broker, 1, madeFor, nullptr);
    if (array == nullptr) return;
    array->ft->setElementAt(array, 0, static_cast<const CMPIValue*>(element), elementType);
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
    SetArray(inst, name, CMPI_uint16, &value, CMPI_uint16, CMPI_uint16A);
}

void SetCharsArray(CMPIInstance* inst, const char* name, const char* value) {
    SetArray(inst, name, CMPI_string, value, CMPI_chars, CMPI_charsA);
}

void SetNameAndCaption(CMPIInstance* inst, const char* text) {
    SetChars(inst, "ElementName", text);
    SetChars(inst, "Caption", text);
}
