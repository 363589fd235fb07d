// Packing values into CMPIData, type by type, and reading what a provider passed.
#include "conversions.h"

#include <cstring>

#include "cim_object.h"
#include "object_array.h"
#include "object_path.h"
#include "object_string.h"

namespace testbed {

namespace {

double asReal(const CimValue& value) {
    const auto* real = std::get_if<double>(&value.data);
    return real ? *real : static_cast<double>(value.asUnsigned());
}

/// Fills in a value of a type that is not an object.
void packScalar(const CimValue& value, CMPIValue& packed) {
    const std::uint64_t number = value.asUnsigned();
    switch (value.type) {
        case CMPI_boolean:
            packed.boolean = number != 0;
            break;
        case CMPI_uint8:
        case CMPI_sint8:
            packed.uint8 = static_cast<CMPIUint8>(number);
            break;
        case CMPI_uint16:
        case CMPI_sint16:
        case CMPI_char16:
            packed.uint16 = static_cast<CMPIUint16>(number);
            break;
        case CMPI_uint32:
        case CMPI_sint32:
            packed.uint32 = static_cast<CMPIUint32>(number);
            break;
        case CMPI_uint64:
        case CMPI_sint64:
            packed.uint64 = number;
            break;
        case CMPI_real32:
            packed.real32 = static_cast<CMPIReal32>(asReal(value));
            break;
        case CMPI_real64:
            packed.real64 = asReal(value);
            break;
        default:
            break;
    }
}

void packObject(const Object& source, const CimValue& value, CMPIValue& packed) {
    if (const auto* elements = std::get_if<std::vector<CimValue>>(&value.data)) {
        const auto elementType = static_cast<CMPIType>(value.type & ~CMPI_ARRAY);
        packed.array = &makeDerived<ArrayObject>(source, elementType, *elements);
    } else if (const auto* path = std::get_if<std::shared_ptr<const ObjectPath>>(&value.data)) {
        packed.ref = &makeDerived<PathObject>(source, **path);
    } else if (value.type == CMPI_string) {
        packed.string = &makeDerived<StringObject>(source, value.asString());
    } else {
        packScalar(value, packed);
    }
}

/// Reads a variable that need not be aligned like the union.
template <class Type>
Type load(const CMPIValue* value) {
    Type variable;
    std::memcpy(&variable, static_cast<const void*>(value), sizeof variable);
    return variable;
}

CimValue readScalar(const CMPIValue* value, CMPIType type) {
    switch (type) {
        case CMPI_boolean:
            return CimValue::boolean(load<CMPIBoolean>(value) != 0);
        case CMPI_char16:
        case CMPI_uint16:
            return CimValue::unsignedInteger(type, load<CMPIUint16>(value));
        case CMPI_uint8:
            return CimValue::unsignedInteger(type, load<CMPIUint8>(value));
        case CMPI_uint32:
            return CimValue::unsignedInteger(type, load<CMPIUint32>(value));
        case CMPI_uint64:
            return CimValue::unsignedInteger(type, load<CMPIUint64>(value));
        case CMPI_sint8:
            return CimValue::signedInteger(type, load<CMPISint8>(value));
        case CMPI_sint16:
            return CimValue::signedInteger(type, load<CMPISint16>(value));
        case CMPI_sint32:
            return CimValue::signedInteger(type, load<CMPISint32>(value));
        case CMPI_sint64:
            return CimValue::signedInteger(type, load<CMPISint64>(value));
        case CMPI_real32:
            return CimValue{type, false, double{load<CMPIReal32>(value)}};
        case CMPI_real64:
            return CimValue::real64(load<CMPIReal64>(value));
        default:
            return CimValue::null(CMPI_null);
    }
}

CimValue fromObject(const StringObject& string) {
    return string.text() ? CimValue::string(string.text()) : CimValue::null(CMPI_string);
}

CimValue fromObject(const PathObject& path) {
    return CimValue::reference(path.content());
}

CimValue fromObject(const ArrayObject& array) {
    return CimValue::array(array.elementType(), array.values());
}

/// Reads a variable that holds an object's handle; a NULL one stands for a null value.
template <class Handle>
CMPIrc readObject(const CMPIValue* value, CMPIType type, CimValue& result) {
    const auto* handle = load<const Handle*>(value);
    result = CimValue::null(type);
    if (handle == nullptr) return CMPI_RC_OK;
    const auto* object = usable(handle, Entry::OtherObjectCall);
    if (object == nullptr) return CMPI_RC_ERR_INVALID_HANDLE;
    result = fromObject(*object);
    return CMPI_RC_OK;
}

}  // namespace

CMPIData toData(const Object& source, const CimValue& value) {
    CMPIData data = dataWithout(value.isNull ? CMPI_nullValue : CMPI_goodValue);
    data.type = value.type;
    if (!value.isNull) {
        packObject(source, value, data.value);
    } else if (value.type == CMPI_string) {
        // A null text is a string object without characters.
        data.value.string = &makeDerived<StringObject>(source, std::nullopt);
    }
    return data;
}

CMPIrc readValue(const CMPIValue* value, CMPIType type, CimValue& result) {
    result = CimValue::null(type);
    if (value == nullptr) return CMPI_RC_OK;
    if ((type & CMPI_ARRAY) != 0) return readObject<CMPIArray>(value, type, result);
    switch (type) {
        case CMPI_chars:
            result = CimValue::string(static_cast<const char*>(static_cast<const void*>(value)));
            return CMPI_RC_OK;
        case CMPI_string:
            return readObject<CMPIString>(value, type, result);
        case CMPI_ref:
            return readObject<CMPIObjectPath>(value, type, result);
        case CMPI_null:
            return CMPI_RC_OK;
        default:
            result = readScalar(value, type);
            return result.type == type ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_DATA_TYPE;
    }
}

bool isNumeric(CMPIType type) {
    return (type & (CMPI_ARRAY | CMPI_ENC)) == 0 && (type & (CMPI_INTEGER | CMPI_REAL)) != 0;
}

std::optional<std::vector<std::string>> readNames(const char** names) {
    if (names == nullptr) return std::nullopt;
    std::vector<std::string> list;
    for (; *names != nullptr; ++names) list.emplace_back(*names);
    return list;
}

}  // namespace testbed
