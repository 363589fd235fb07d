#include "check_rules.h"

#include <gtest/gtest.h>

#include <fstream>
#include <set>
#include <sstream>

#include "elements.h"

namespace testbed {
namespace {

constexpr CheckLevel kOk = CheckLevel::Ok;
constexpr CheckLevel kWarning = CheckLevel::Warning;
constexpr CheckLevel kCritical = CheckLevel::Critical;

struct Case {
    const char* className;
    const char* name;
    int status;
    int health;
    CheckLevel level;
    const char* finding;
};

void expectVerdicts(std::initializer_list<Case> cases) {
    for (const Case& each : cases) {
        const auto verdict = judge(each.className, element(each.name, each.status, each.health));
        ASSERT_TRUE(verdict) << each.name;
        EXPECT_EQ(verdict->level, each.level) << each.name << " " << each.status;
        EXPECT_EQ(verdict->finding, each.finding) << each.name << " " << each.status;
    }
}

TEST(CheckRules, Volumes) {
    expectVerdicts({{kVolume, "RAID5 Logical Volume 0 - OPTIMAL", 2, 5, kOk, ""},
                    {kVolume, "RAID5 Logical Volume 0 - DEGRADED", 3, 10, kWarning, "degraded"},
                    {kVolume, "RAID5 Logical Volume 0 - OFFLINE", 6, 30, kCritical, "offline"},
                    {kVolume, "v - UNDEFINED", 0, 0, kWarning, "unknown"},
                    {kVolume, "v - UNDEFINED", 5, 0, kWarning, "predictive failure"},
                    {kVolume, "v - UNDEFINED", 99, 0, kWarning, "undefined"}});
}

TEST(CheckRules, Drives) {
    expectVerdicts({{kDrive, "d - ONLINE", 2, 5, kOk, ""},
                    {kDrive, "d - HOT SPARE", 2, 5, kOk, ""},
                    {kDrive, "d - UNCONFIGURED GOOD", 2, 5, kOk, ""},
                    {kDrive, "d - UNCONFIGURED GOOD", 15, 5, kOk, ""},
                    {kDrive, "d - REBUILD", 2, 5, kWarning, "rebuilding"},
                    {kDrive, "d - UNCONFIGURED BAD", 6, 10, kWarning, "unconfigured bad"},
                    {kDrive, "d - FAILED", 6, 30, kCritical, "failed"},
                    {kDrive, "d - OFFLINE", 12, 20, kCritical, "offline"},
                    {kDrive, "d - UNDEFINED", 5, 10, kWarning, "predictive failure"},
                    {kDrive, "d - UNDEFINED", 65535, 10, kWarning, "undefined"}});
}

TEST(CheckRules, PortsAndBatteries) {
    expectVerdicts({{kPort, "p", 2, 5, kOk, ""},
                    {kPort, "p", 15, 5, kOk, ""},
                    {kPort, "p", 12, 20, kOk, ""},
                    {kPort, "p", 6, 30, kCritical, "error"},
                    {kPort, "p", 0, 0, kWarning, "unknown"},
                    {kBattery, "b", 2, 5, kOk, ""},
                    {kBattery, "b", 15, 5, kOk, ""},
                    {kBattery, "b", 12, 20, kCritical, "no contact"},
                    {kBattery, "b", 6, 30, kCritical, "error"},
                    {kBattery, "b", 3, 0, kWarning, "degraded"}});
}

TEST(CheckRules, ChargeOfABattery) {
    const struct {
        int charge;
        CheckLevel level;
        const char* finding;
    } cases[] = {{0, kOk, ""},         {1, kOk, ""},
                 {2, kOk, ""},         {3, kOk, ""},
                 {4, kWarning, "low"}, {5, kCritical, "critical"},
                 {6, kOk, ""},         {7, kOk, ""},
                 {8, kOk, ""},         {9, kCritical, "charging and critical"},
                 {10, kOk, ""},        {11, kOk, ""},
                 {12, kOk, ""},        {13, kWarning, "overcharged"},
                 {99, kOk, ""}};
    for (const auto& each : cases) {
        Instance battery = element("b", 2, 5);
        battery.set("BatteryStatus", CimValue::uint16(static_cast<std::uint16_t>(each.charge)));
        const auto verdict = judge(kBattery, battery);
        EXPECT_EQ(verdict->level, each.level) << each.charge;
        EXPECT_EQ(verdict->finding, each.finding) << each.charge;
    }
}

TEST(CheckRules, WorseOfStatusAndChargeCounts) {
    Instance battery = element("b", 6, 30);
    battery.set("BatteryStatus", CimValue::uint16(4));
    EXPECT_EQ(judge(kBattery, battery)->finding, "error");
    battery.set("OperationalStatus", CimValue::uint16Array({3}));
    battery.set("HealthState", CimValue::uint16(0));
    EXPECT_EQ(judge(kBattery, battery)->finding, "low");
    battery.set("BatteryStatus", CimValue::uint16(5));
    EXPECT_EQ(judge(kBattery, battery)->level, kCritical);
    EXPECT_EQ(judge(kBattery, battery)->finding, "critical");
}

TEST(CheckRules, NamesThatAreCutDoNotHideAState) {
    expectVerdicts(
        {{kVolume, "RAID6 v Logical Volume 0, Drives(1,2,3", 3, 10, kWarning, "degraded"},
         {kVolume, "", 6, 30, kCritical, "offline"},
         {kDrive, "Drive with a long na", 6, 30, kCritical, "failed"},
         {kDrive, "Drive with a long na", 6, 10, kWarning, "unconfigured bad"},
         {kDrive, "Drive - REBUI", 2, 5, kOk, ""}});
}

TEST(CheckRules, WordsDoNotHideNumbers) {
    expectVerdicts({{kVolume, "v - OPTIMAL", 6, 30, kCritical, "offline"},
                    {kDrive, "d - ONLINE", 2, 30, kCritical, "failed"},
                    {kDrive, "d - ONLINE", 2, 20, kCritical, "major failure"},
                    {kDrive, "d - ONLINE", 2, 25, kCritical, "critical failure"},
                    {kDrive, "d - ONLINE", 2, 10, kWarning, "degraded"},
                    {kDrive, "d - ONLINE", 2, 15, kWarning, "minor failure"},
                    {kDrive, "d - ONLINE", 2, 0, kWarning, "unknown"},
                    {kDrive, "d - ONLINE", 2, 77, kCritical, "undefined"},
                    {kVolume, "v - OFFLINE", 6, 5, kCritical, "error"},
                    {kPort, "p", 12, 30, kCritical, "failed"}});
}

TEST(CheckRules, AbsentAndNullValuesAreNoGoodSign) {
    Instance bare;
    for (const char* className : {kVolume, kDrive, kPort, kBattery})
        EXPECT_EQ(judge(className, bare)->level, kWarning) << className;
    bare.set("OperationalStatus", CimValue::null(CMPI_uint16A));
    bare.set("HealthState", CimValue::string("fine"));
    EXPECT_EQ(judge(kDrive, bare)->level, kWarning);
}

TEST(CheckRules, SeveralStatesAreNoGoodSign) {
    Instance drive = element("d - ONLINE", 2, 5);
    drive.set("OperationalStatus", CimValue::uint16Array({2, 6}));
    EXPECT_EQ(judge(kDrive, drive)->level, kWarning);
    EXPECT_EQ(judge(kBattery, drive)->level, kWarning);
}

TEST(CheckRules, ControllersAreNotJudged) {
    EXPECT_FALSE(judge("Tovexa_PlexorController", element("c", 6, 30)));
    EXPECT_FALSE(judge("Tovexa_PlexorSoftwareIdentity", element("s", 6, 30)));
    EXPECT_TRUE(judge("tovexa_plexorbattery", element("b", 2, 5)));
}

TEST(CheckRules, ShortNames) {
    EXPECT_EQ(shortName(element(
                  "RAID5 data Logical Volume 0 on controller C0, Drives(1,2) - OPTIMAL", 2, 5)),
              "RAID5 data Logical Volume 0 on controller C0");
    EXPECT_EQ(shortName(element("RAID0 Logical Volume 0 on controller C0 - OFFLINE", 6, 30)),
              "RAID0 Logical Volume 0 on controller C0");
    EXPECT_EQ(shortName(element("Drive 32_3 on controller C0 Fw: GS0F - FAILED", 6, 30)),
              "Drive 32_3 on controller C0");
    EXPECT_EQ(shortName(element("left - right", 2, 5)), "left - right");
    EXPECT_EQ(shortName(element("twice - OFFLINE - OFFLINE", 2, 5)), "twice - OFFLINE");
    Instance nameless;
    nameless.path = {"root/cimv2", kBattery, {}};
    EXPECT_EQ(shortName(nameless), "root/cimv2:Tovexa_PlexorBattery");
}

/// The cells of a line of a table, trimmed.
std::vector<std::string> cellsOf(const std::string& line) {
    std::vector<std::string> cells;
    std::istringstream stream(line);
    for (std::string cell; std::getline(stream, cell, '|');) {
        const std::size_t first = cell.find_first_not_of(' ');
        if (first != std::string::npos)
            cells.push_back(cell.substr(first, cell.find_last_not_of(' ') - first + 1));
    }
    return cells;
}

struct DocumentedRow {
    std::string className, word, status, health, verdict;
    auto operator<=>(const DocumentedRow&) const = default;
};

/// The table of state words, a row for each class.
std::vector<DocumentedRow> documentedRows() {
    const std::map<std::string, std::vector<const char*>> classes = {
        {"volume", {kVolume}},
        {"drive", {kDrive}},
        {"port, battery", {kPort, kBattery}},
        {"port", {kPort}},
        {"battery", {kBattery}}};
    std::vector<DocumentedRow> rows;
    std::ifstream file(OPERATING_MANUAL);
    for (std::string line; std::getline(file, line);) {
        const auto cells = cellsOf(line);
        if (cells.size() != 5 || !classes.contains(cells[0])) continue;
        for (const char* className : classes.at(cells[0]))
            rows.push_back({className, cells[1] == "-" ? "" : cells[1], cells[2], cells[3],
                            cells[4].substr(0, cells[4].find(':'))});
    }
    return rows;
}

/// True when a status is among the numbers of the cell.
bool tellsStatus(const std::string& cell, const std::optional<std::uint16_t>& status) {
    const bool other = cell.starts_with("any other");
    if (!status || other) return !status && other;
    std::istringstream words(cell.substr(0, cell.find("ExtentStatus")));
    for (std::string word; words >> word;)
        if (std::isdigit(static_cast<unsigned char>(word[0])) && std::stoi(word) == *status)
            return true;
    return false;
}

TEST(CheckRules, ManualHasTheSameTable) {
    static constexpr const char* kVerdicts[] = {"ok", "warning", "critical"};
    const auto rows = documentedRows();
    ASSERT_GE(rows.size(), 20u);
    std::set<DocumentedRow> met;
    for (const StateRule& rule : stateRules()) {
        const std::string verdict = kVerdicts[static_cast<int>(rule.level)];
        int matches = 0;
        for (const DocumentedRow& row : rows) {
            if (row.className != rule.className || row.word != rule.word ||
                row.health != std::to_string(rule.healthState) || row.verdict != verdict ||
                !tellsStatus(row.status, rule.operationalStatus))
                continue;
            met.insert(row);
            matches++;
        }
        EXPECT_EQ(matches, 1) << rule.className << " " << rule.word << " " << verdict;
    }
    EXPECT_EQ(met.size(), rows.size()) << "the manual has rows that no rule has";
}

}  // namespace
}  // namespace testbed
