// Composing the gauges: elements by class, states of elements, and the outcome of the asking.
#include "metrics_view.h"

#include <cstdio>
#include <set>

#include "printable.h"

namespace testbed {
namespace {

std::string escaped(const std::string& text) {
    std::string result;
    for (const char c : printable(text)) {
        if (c == '"' || c == '\\') result += '\\';
        result += c;
    }
    return result;
}

std::string label(const char* name, const std::string& value) {
    return std::string(name) + "=\"" + escaped(value) + "\"";
}

std::string gauge(const char* name, const char* help, const char* unit = "") {
    std::string text = std::string("# TYPE ") + name + " gauge\n";
    if (*unit != '\0') text += std::string("# UNIT ") + name + " " + unit + "\n";
    return text + "# HELP " + name + " " + help + "\n";
}

std::string secondsText(double seconds) {
    char text[40];
    std::snprintf(text, sizeof text, "%.6f", seconds);
    return text;
}

/// NULL for a class that is not counted, or was not answered.
const ServedClass* kindOf(const ClassAnswer& answer) {
    const ServedClass* served = findServedClass(answer.className);
    return served && served->isCounted && answer.response.rc == CMPI_RC_OK ? served : nullptr;
}

std::string countsOf(const Inventory& inventory) {
    std::string text = gauge("plexor_elements", "Elements by kind.");
    for (const ClassAnswer& answer : inventory) {
        if (const ServedClass* kind = kindOf(answer)) {
            text += "plexor_elements{" + label("kind", kind->singular) + "} " +
                    std::to_string(answer.response.instances.size()) + "\n";
        }
    }
    return text;
}

std::string stateLine(const ServedClass& kind, const Instance& instance, const Verdict& verdict) {
    const std::string id = identityOf(kind, instance).value_or(instance.path.text());
    return "plexor_element_level{" + label("kind", kind.singular) + "," + label("id", id) + "," +
           label("name", shortName(instance)) + "," + label("state", foldName(verdict.word)) + "," +
           label("ignored", verdict.ignored ? "yes" : "no") + "} " +
           std::to_string(static_cast<int>(verdict.level)) + "\n";
}

std::string statesOf(const Inventory& inventory, const CheckPolicy& policy) {
    std::string text = gauge("plexor_element_level", "State: 0 ok, 1 warning, 2 critical.");
    std::set<std::string> met;
    for (const ClassAnswer& answer : inventory) {
        const ServedClass* kind = kindOf(answer);
        if (!kind) continue;
        for (const Instance& instance : answer.response.instances) {
            const auto verdict = policy.judge(answer.className, instance);
            if (!verdict) continue;
            std::string line = stateLine(*kind, instance, *verdict);
            // Texts that differ only in what is not shown would make one series twice.
            if (met.insert(line.substr(0, line.rfind('}'))).second) text += line;
        }
    }
    return text;
}

}  // namespace

std::string metricsView(const Inventory& inventory, const CheckPolicy& policy,
                        const AskOutcome& outcome) {
    return gauge("plexor_up", "Whether the server answered everything that it was asked.") +
           "plexor_up " + (outcome.up ? "1" : "0") + "\n" +
           gauge("plexor_inventory_complete", "Whether no element seems to be still arriving.") +
           "plexor_inventory_complete " + (outcome.complete ? "1" : "0") + "\n" +
           gauge("plexor_ask_duration_seconds", "Time that the asking took.", "seconds") +
           "plexor_ask_duration_seconds " + secondsText(outcome.seconds) + "\n" +
           countsOf(inventory) + statesOf(inventory, policy) + "# EOF\n";
}

}  // namespace testbed
