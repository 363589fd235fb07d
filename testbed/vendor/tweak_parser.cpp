// Reading what a scenario overrules of an object: its class, keys and properties, with their types.
#include <limits>

#include "class_catalogue.h"
#include "scenario_reading.h"

namespace testbed {
namespace {

using nlohmann::json;

CMPIType elementType(CMPIType type) {
    return static_cast<CMPIType>(type & ~CMPI_ARRAY);
}

/// The type of a value that nothing declares.
CMPIType guessType(const json& value) {
    if (value.is_boolean()) return CMPI_boolean;
    if (value.is_number_unsigned()) return CMPI_uint64;
    if (value.is_number_integer()) return CMPI_sint64;
    if (value.is_number()) return CMPI_real64;
    if (value.is_array() && !value.empty()) {
        return static_cast<CMPIType>(guessType(value.front()) | CMPI_ARRAY);
    }
    return value.is_array() ? CMPI_stringA : CMPI_string;
}

int bitsOf(CMPIType type) {
    switch (type) {
        case CMPI_uint8:
        case CMPI_sint8:
            return 8;
        case CMPI_uint16:
        case CMPI_sint16:
            return 16;
        case CMPI_uint32:
        case CMPI_sint32:
            return 32;
        default:
            return 64;
    }
}

CimValue signedValue(const JsonPlace& place, CMPIType type) {
    const std::int64_t limit = std::numeric_limits<std::int64_t>::max() >> (64 - bitsOf(type));
    if (!place.value->is_number_integer()) place.fail("a whole number is needed here");
    // The largest ones that JSON has would be negative here.
    const bool isTooLarge =
        place.value->is_number_unsigned() && place.value->get<std::uint64_t>() > INT64_MAX;
    const std::int64_t number = place.value->get<std::int64_t>();
    if (isTooLarge || number > limit || number < -limit - 1) {
        place.fail("the number does not fit its type");
    }
    return CimValue::signedInteger(type, number);
}

CimValue scalarValue(const JsonPlace& place, CMPIType type) {
    if (place.value->is_null()) return CimValue::null(type);
    switch (type) {
        case CMPI_string:
            return CimValue::string(readText(place));
        case CMPI_boolean:
            if (!place.value->is_boolean()) place.fail("true or false is needed here");
            return CimValue::boolean(place.value->get<bool>());
        case CMPI_real64:
            if (!place.value->is_number()) place.fail("a number is needed here");
            return CimValue::real64(place.value->get<double>());
        case CMPI_sint8:
        case CMPI_sint16:
        case CMPI_sint32:
        case CMPI_sint64:
            return signedValue(place, type);
        default:
            return CimValue::unsignedInteger(type,
                                             readNumber(place, UINT64_MAX >> (64 - bitsOf(type))));
    }
}

CimValue typedValue(const JsonPlace& place, CMPIType type) {
    if (place.value->is_null()) return CimValue::null(type);
    if ((type & CMPI_ARRAY) == 0) return scalarValue(place, type);
    if (!place.value->is_array()) place.fail("a list is needed here, or an explicit type");
    std::vector<CimValue> elements;
    for (std::size_t i = 0; i < place.value->size(); ++i) {
        elements.push_back(scalarValue(place.element(i), elementType(type)));
    }
    return CimValue::array(elementType(type), std::move(elements));
}

/// {"type": "uint16", "value": 3}, {"type": "string", "null": true}.
CimValue explicitValue(const JsonPlace& place) {
    JsonReader reader(place);
    const std::string name = reader.text("type");
    const auto type = typeByName(name);
    if (!type) reader.fail("unknown type \"" + name + "\"");
    const bool null = reader.flag("null");
    const auto value = reader.take("value");
    reader.finish();
    if (null) return CimValue::null(*type);
    if (!value) reader.fail("\"value\" is missing");
    return typedValue(*value, *type);
}

CimValue readValue(const JsonPlace& place, const char* cimClass, const std::string& property) {
    if (place.value->is_object()) return explicitValue(place);
    return typedValue(place, declaredType(cimClass, property).value_or(guessType(*place.value)));
}

std::vector<NamedValue> readValues(JsonReader& reader, const char* member, const char* cimClass) {
    const auto place = reader.take(member);
    if (!place) return {};
    const JsonReader checked(*place);
    std::vector<NamedValue> values;
    for (const auto& [name, value] : place->value->items()) {
        values.emplace_back(name, readValue(place->member(name), cimClass, name));
    }
    return values;
}

Tweaks readOneTweaks(JsonReader& reader, const char* cimClass) {
    Tweaks tweaks;
    tweaks.className = reader.text("class", "");
    tweaks.properties = readValues(reader, "properties", cimClass);
    tweaks.keys = readValues(reader, "keys", cimClass);
    tweaks.omit = reader.texts("omit");
    tweaks.omitKeys = reader.texts("omitKeys");
    return tweaks;
}

}  // namespace

void readTweaks(JsonReader& reader, Described& described, const char* cimClass,
                std::initializer_list<PartName> parts) {
    described.tweaks = readOneTweaks(reader, cimClass);
    for (const PartName& part : parts) {
        const auto place = reader.take(part.name);
        if (!place) continue;
        JsonReader partReader(*place);
        described.parts[part.name] = readOneTweaks(partReader, part.cimClass);
        partReader.finish();
    }
}

}  // namespace testbed
