// Reading a fault rule from a scenario: which calls it is for, and what becomes of them.
#include "scenario_reading.h"

namespace testbed {
namespace {

Entry readEntry(JsonReader& reader) {
    const std::string call = reader.text("call");
    for (int i = 0; i <= static_cast<int>(Entry::Release); ++i) {
        const Entry entry = static_cast<Entry>(i);
        if (sameName(entryName(entry), call)) return entry;
    }
    reader.fail("unknown call \"" + call + "\"");
}

}  // namespace

FaultRule readFault(const JsonPlace& place) {
    JsonReader reader(place);
    FaultRule rule;
    rule.entry = readEntry(reader);
    rule.className = reader.optionalText("className");
    rule.assocClass = reader.optionalText("assocClass");
    rule.resultClass = reader.optionalText("resultClass");
    rule.name = reader.optionalText("name");
    rule.pathContains = reader.optionalText("pathContains");
    rule.skip = static_cast<int>(reader.number("skip", INT32_MAX).value_or(0));
    rule.times = reader.integer("times", -1);
    rule.rc = static_cast<CMPIrc>(reader.number("rc", INT32_MAX).value_or(CMPI_RC_OK));
    rule.message = reader.optionalText("message");
    rule.nullResult = reader.flag("nullResult");
    rule.keepResult = reader.flag("keepResult");
    rule.wrongType = reader.flag("wrongType");
    rule.delay = std::chrono::milliseconds(reader.number("delayMs", INT32_MAX).value_or(0));
    reader.finish();
    return rule;
}

}  // namespace testbed
