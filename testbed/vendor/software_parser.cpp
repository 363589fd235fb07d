// Reading a controller's software: the named kinds, and the list for everything else.
#include "scenario_reading.h"

namespace testbed {
namespace {

/// One member of {"firmware": "23.9.0", …}.
SoftwareDescription readNamedSoftware(const JsonPlace& place, const std::string& kind) {
    const auto code = codeOf(softwareClassificationWords(), kind);
    if (!code) {
        place.fail("unknown software \"" + kind +
                   "\" (known: " + listOf(softwareClassificationWords()) + ")");
    }
    SoftwareDescription software;
    software.id = kind;
    software.classifications = {*code};
    software.version = readText(place);
    return software;
}

/// One element of [{"id": …, "classifications": [10], "version": …}, …].
SoftwareDescription readListedSoftware(const JsonPlace& place) {
    JsonReader reader(place);
    SoftwareDescription software;
    software.id = reader.text("id");
    software.version = reader.text("version", "");
    if (const auto list = reader.take("classifications")) {
        if (!list->value->is_array()) list->fail("a list is needed here");
        for (std::size_t i = 0; i < list->value->size(); ++i) {
            software.classifications.push_back(
                static_cast<std::uint16_t>(readNumber(list->element(i), UINT16_MAX)));
        }
    }
    readTweaks(reader, software, "CIM_SoftwareIdentity");
    reader.finish();
    return software;
}

}  // namespace

std::vector<SoftwareDescription> readSoftware(JsonReader& reader) {
    const auto member = reader.take("software");
    std::vector<SoftwareDescription> list;
    if (!member) return list;
    if (member->value->is_object()) {
        for (const auto& [kind, version] : member->value->items()) {
            list.push_back(readNamedSoftware(member->member(kind), kind));
        }
        return list;
    }
    for (const JsonPlace& place : reader.list("software")) {
        list.push_back(readListedSoftware(place));
        if (findById(list, list.back().id) != &list.back()) {
            place.fail("second \"" + list.back().id + "\"");
        }
    }
    return list;
}

}  // namespace testbed
