// Every scenario, through the real library, on every kind of manager: what a client gets must be
// what was worked out by hand in expected/NAME.txt. In the short form the kinds get some of them.
#include <gtest/gtest.h>
#include <stdlib.h>

#include <algorithm>
#include <fstream>
#include <regex>
#include <set>
#include <sstream>

#include "manager_kinds.h"
#include "provider_session.h"
#include "scenario_parser.h"

namespace {

using testbed::Instance;

std::string shown(const Instance& instance, const char* property) {
    const testbed::CimValue* value = instance.find(property);
    if (value == nullptr || value->isNull) return "";
    return value->isArray() ? std::to_string(value->asUnsigned()) : value->text();
}

/// Keys and texts that a manager may have lost on the way.
void expectComplete(const Instance& instance) {
    for (const auto& [key, value] : instance.path.keys) {
        const testbed::CimValue* property = instance.find(key);
        ASSERT_NE(property, nullptr) << key;
        EXPECT_EQ(property->text(), value.text()) << key;
    }
    for (const auto& [name, value] : instance.properties) {
        if (value.type != CMPI_stringA || value.isNull) continue;
        for (const auto& element : std::get<std::vector<testbed::CimValue>>(value.data))
            EXPECT_NE(element.asString(), "") << name;
    }
}

/// "Class|ElementName|HealthState or VersionString|OperationalStatus"
std::vector<std::string> answerLines(testbed::ProviderSession& session) {
    constexpr std::size_t kPrefix = sizeof "Tovexa_Plexor" - 1;
    std::vector<std::string> names, lines;
    for (const auto& served : testbed::servedClasses()) names.emplace_back(served.name);
    auto client = session.client();
    for (const auto& answer : testbed::collectInventory(client, names, "root/cimv2")) {
        EXPECT_EQ(answer.response.rc, CMPI_RC_OK) << answer.className;
        for (const Instance& instance : answer.response.instances) {
            expectComplete(instance);
            lines.push_back(answer.className.substr(kPrefix) + "|" +
                            shown(instance, "ElementName") + "|" + shown(instance, "HealthState") +
                            shown(instance, "VersionString") + "|" +
                            shown(instance, "OperationalStatus"));
        }
    }
    return lines;
}

struct Expected {
    std::vector<std::string> lines;  ///< in order, or in any order
    std::vector<std::string> patterns;
};

Expected readExpected(const std::string& name) {
    Expected expected;
    std::ifstream file(std::string(EXPECTED_DIR) + "/" + name + ".txt");
    for (std::string line; std::getline(file, line);) {
        if (line.empty() || line[0] == '#') continue;
        if (line[0] == '~')
            expected.patterns.push_back(line.substr(1));
        else
            expected.lines.push_back(line);
    }
    return expected;
}

/// "…Drives(b,a)…" as "…Drives(a,b)…": a volume names its drives in the order of the vendor's
/// answer.
std::string withDrivesInOrder(const std::string& line) {
    std::smatch parts;
    if (!std::regex_match(line, parts, std::regex(R"((.*Drives\()([^)]*)(\).*))"))) return line;
    std::istringstream list(parts[2]);
    std::set<std::string> drives;
    for (std::string drive; std::getline(list, drive, ',');) drives.insert(drive);
    std::string ordered;
    for (const std::string& drive : drives) ordered += (ordered.empty() ? "" : ",") + drive;
    return parts[1].str() + ordered + parts[3].str();
}

/// The lines of `left` that are not in `right`; both sorted.
std::vector<std::string> without(const std::vector<std::string>& left,
                                 const std::vector<std::string>& right) {
    std::vector<std::string> rest;
    std::set_difference(left.begin(), left.end(), right.begin(), right.end(),
                        std::back_inserter(rest));
    return rest;
}

struct Run {
    std::string scenario;
    std::string manager = "host";

    bool isHost() const { return manager == "host"; }
};

void PrintTo(const Run& run, std::ostream* out) {
    *out << run.scenario << " on " << run.manager;
}

class ScenarioAnswers : public ::testing::TestWithParam<Run> {
protected:
    std::vector<std::string> answers() {
        const auto& [name, manager] = GetParam();
        auto scenario = testbed::readScenario(std::string(SCENARIO_DIR) + "/" + name + ".json");
        if (!GetParam().isHost()) testbed::chooseManager(scenario.manager, manager);
        testbed::ProviderSession session(
            scenario, GetParam().isHost() ? PROVIDER_LIBRARY : STANDARD_LIBRARY, "PlexorProvider");
        EXPECT_TRUE(session.waitForInventory(std::chrono::seconds(120), "root/cimv2"));
        auto lines = answerLines(session);
        EXPECT_EQ(session.broker().books().misuses(), std::vector<std::string>());
        return lines;
    }
};

TEST_P(ScenarioAnswers, AreThoseWorkedOutByHand) {
    const Expected expected = readExpected(GetParam().scenario);
    ASSERT_FALSE(expected.lines.empty());
    EXPECT_EQ(answers(), expected.lines);
}

const std::vector<Run> kOrdered = {
    {"healthy-array"},  {"degraded-array"},     {"two-controllers"},    {"no-pools"},
    {"many-drives"},    {"predictive-failure"}, {"raid6-double-fault"}, {"foreign-drives"},
    {"enclosure-lost"}, {"battery-learning"},   {"spare-rebuild"},      {"four-enclosures"}};

INSTANTIATE_TEST_SUITE_P(Ordered, ScenarioAnswers, ::testing::ValuesIn(kOrdered));

/// Where the order is the manager's, and may cost records on a hostile vendor.
class AnswersInAnyOrder : public ScenarioAnswers {};

TEST_P(AnswersInAnyOrder, AreThoseWorkedOutByHand) {
    Expected expected = readExpected(GetParam().scenario);
    ASSERT_FALSE(expected.lines.empty());
    std::vector<std::string> lines = answers();
    for (const std::string& pattern : expected.patterns) {
        const auto match = std::find_if(lines.begin(), lines.end(), [&](const std::string& line) {
            return std::regex_match(line, std::regex(pattern));
        });
        ASSERT_NE(match, lines.end()) << "nothing matches " << pattern;
        lines.erase(match);
    }
    for (auto* list : {&lines, &expected.lines})
        for (std::string& line : *list) line = withDrivesInOrder(line);
    std::sort(lines.begin(), lines.end());
    std::sort(expected.lines.begin(), expected.lines.end());
    EXPECT_EQ(without(lines, expected.lines), std::vector<std::string>()) << "unexpected";
    EXPECT_EQ(without(expected.lines, lines), std::vector<std::string>()) << "missing";
}

INSTANTIATE_TEST_SUITE_P(Shuffled, AnswersInAnyOrder, ::testing::Values(Run{"hostile-vendor"}));

std::vector<Run> runsOnKinds() {
    std::vector<Run> runs;
    for (const auto& kind : testbed::managerKinds()) {
        if (std::string(kind.name) == "host") continue;
        for (const char* scenario : {"healthy-array", "two-controllers", "hostile-vendor"})
            runs.push_back({scenario, kind.name});
        if (getenv("PLEXOR_LONG") == nullptr) continue;
        for (const char* scenario : {"degraded-array", "no-pools", "many-drives"})
            runs.push_back({scenario, kind.name});
    }
    return runs;
}

INSTANTIATE_TEST_SUITE_P(Kinds, AnswersInAnyOrder, ::testing::ValuesIn(runsOnKinds()));

}  // namespace
