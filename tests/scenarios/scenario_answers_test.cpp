// Every scenario, through the real library: what a client gets must be what was worked out by hand
// in expected/NAME.txt.
#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <regex>

#include "provider_session.h"
#include "scenario_parser.h"

namespace {

using testbed::Instance;

std::string shown(const Instance& instance, const char* property) {
    const testbed::CimValue* value = instance.find(property);
    if (value == nullptr || value->isNull) return "";
    return value->isArray() ? std::to_string(value->asUnsigned()) : value->text();
}

/// "Class|ElementName|HealthState or VersionString|OperationalStatus"
std::vector<std::string> answerLines(testbed::ProviderSession& session) {
    constexpr std::size_t kPrefix = sizeof "Tovexa_Plexor" - 1;
    std::vector<std::string> names, lines;
    for (const auto& served : testbed::servedClasses()) names.emplace_back(served.name);
    auto client = session.client();
    for (const auto& answer : testbed::collectInventory(client, names, "root/cimv2")) {
        EXPECT_EQ(answer.response.rc, CMPI_RC_OK) << answer.className;
        for (const Instance& instance : answer.response.instances)
            lines.push_back(answer.className.substr(kPrefix) + "|" +
                            shown(instance, "ElementName") + "|" + shown(instance, "HealthState") +
                            shown(instance, "VersionString") + "|" +
                            shown(instance, "OperationalStatus"));
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

/// The lines of `left` that are not in `right`; both sorted.
std::vector<std::string> without(const std::vector<std::string>& left,
                                 const std::vector<std::string>& right) {
    std::vector<std::string> rest;
    std::set_difference(left.begin(), left.end(), right.begin(), right.end(),
                        std::back_inserter(rest));
    return rest;
}

class ScenarioAnswers : public ::testing::TestWithParam<const char*> {
protected:
    std::vector<std::string> answers() {
        const auto scenario =
            testbed::readScenario(std::string(SCENARIO_DIR) + "/" + GetParam() + ".json");
        testbed::ProviderSession session(scenario, PROVIDER_LIBRARY, "PlexorProvider");
        EXPECT_TRUE(session.waitForInventory(std::chrono::seconds(120), "root/cimv2"));
        auto lines = answerLines(session);
        EXPECT_EQ(session.broker().books().misuses(), std::vector<std::string>());
        return lines;
    }
};

TEST_P(ScenarioAnswers, AreThoseWorkedOutByHand) {
    const Expected expected = readExpected(GetParam());
    ASSERT_FALSE(expected.lines.empty());
    EXPECT_EQ(answers(), expected.lines);
}

INSTANTIATE_TEST_SUITE_P(Ordered, ScenarioAnswers,
                         ::testing::Values("healthy-array", "degraded-array", "two-controllers",
                                           "no-pools", "many-drives", "predictive-failure",
                                           "raid6-double-fault", "foreign-drives", "enclosure-lost",
                                           "battery-learning", "spare-rebuild", "four-enclosures"));

class HostileVendor : public ScenarioAnswers {};

TEST_P(HostileVendor, CostsAtMostTheRecords) {
    Expected expected = readExpected(GetParam());
    ASSERT_FALSE(expected.lines.empty());
    std::vector<std::string> lines = answers();
    for (const std::string& pattern : expected.patterns) {
        const auto match = std::find_if(lines.begin(), lines.end(), [&](const std::string& line) {
            return std::regex_match(line, std::regex(pattern));
        });
        ASSERT_NE(match, lines.end()) << "nothing matches " << pattern;
        lines.erase(match);
    }
    std::sort(lines.begin(), lines.end());
    std::sort(expected.lines.begin(), expected.lines.end());
    EXPECT_EQ(without(lines, expected.lines), std::vector<std::string>()) << "unexpected";
    EXPECT_EQ(without(expected.lines, lines), std::vector<std::string>()) << "missing";
}

INSTANTIATE_TEST_SUITE_P(Shuffled, HostileVendor, ::testing::Values("hostile-vendor"));

}  // namespace
