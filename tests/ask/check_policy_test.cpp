#include "check_policy.h"

#include <gtest/gtest.h>

#include <fstream>

#include "canned_answers.h"
#include "elements.h"
#include "printable.h"
#include "scripted_server.h"
#include "tool_process.h"

namespace testbed {
namespace {

Instance drive(const std::string& id, const std::string& state, std::uint16_t status,
               std::uint16_t health) {
    Instance instance = element("Drive " + id + " - " + state, status, health);
    instance.set("DeviceID", CimValue::string("tvxStorageExtC0_" + id));
    return instance;
}

TEST(CheckPolicy, LevelsOfWordsChange) {
    CheckPolicy policy;
    EXPECT_TRUE(policy.takeLevel("unconfigured-bad=critical"));
    EXPECT_TRUE(policy.takeLevel("drive:OFFLINE=warning"));
    EXPECT_TRUE(policy.takeLevel("HOT_SPARE=warning"));
    EXPECT_TRUE(policy.takeLevel("rebuild=OK"));
    const auto bad = policy.judge(kDrive, drive("0", "UNCONFIGURED BAD", 6, 10));
    EXPECT_EQ(bad->level, CheckLevel::Critical);
    EXPECT_EQ(bad->finding, "unconfigured bad");
    EXPECT_EQ(policy.judge(kDrive, drive("0", "OFFLINE", 12, 20))->level, CheckLevel::Warning);
    EXPECT_EQ(policy.judge(kVolume, drive("0", "OFFLINE", 6, 30))->level, CheckLevel::Critical);
    EXPECT_EQ(policy.judge(kDrive, drive("0", "HOT SPARE", 2, 5))->finding, "hot spare");
    EXPECT_EQ(policy.judge(kDrive, drive("0", "REBUILD", 2, 5))->finding, "");
    EXPECT_EQ(policy.judge(kDrive, drive("0", "ONLINE", 2, 30))->level, CheckLevel::Critical)
        << "numbers that contradict the word";
    EXPECT_FALSE(policy.judge("Tovexa_PlexorController", drive("0", "OFFLINE", 6, 30)));
}

TEST(CheckPolicy, OneElementIsIgnored) {
    for (const char* text : {"drive:C0_1", "Drive:tvxStorageExtC0_1"}) {
        CheckPolicy policy;
        ASSERT_TRUE(policy.takeIgnored(text));
        EXPECT_TRUE(policy.judge(kDrive, drive("1", "FAILED", 6, 30))->ignored);
        EXPECT_EQ(policy.judge(kDrive, drive("1", "FAILED", 6, 30))->level, CheckLevel::Critical);
        EXPECT_FALSE(policy.judge(kDrive, drive("1", "ONLINE", 2, 5))->ignored);
        EXPECT_FALSE(policy.judge(kDrive, drive("11", "FAILED", 6, 30))->ignored);
        EXPECT_FALSE(policy.judge(kVolume, drive("1", "OFFLINE", 6, 30))->ignored);
    }
}

TEST(CheckPolicy, RefusesWhatItDoesNotKnow) {
    CheckPolicy policy;
    for (const char* text : {"", "DEGRADED", "DEGRADED=", "DEGRADED=bad", "NOPE=ok", "=ok",
                             "drive:DEGRADED=ok", "port:OFFLINE=ok", "disk:OFFLINE=ok"})
        EXPECT_FALSE(policy.takeLevel(text)) << text;
    for (const char* text : {"", "drive", "drive:", "disk:C0_1", "drive:tvxStorageExt", ":C0_1"})
        EXPECT_FALSE(policy.takeIgnored(text)) << text;
}

/// The tool and an array with a failed drive.
class Policy : public ::testing::Test {
protected:
    Policy() {
        array_.driveState = "FAILED";
        array_.driveStatus = 6;
        array_.driveHealth = 30;
    }
    Outcome ask(const std::string& more) { return runTool("ask " + server.url() + " " + more); }

    ScriptedServer server{[this](const std::string& request) { return array_.answerTo(request); }};

private:
    SmallArray array_;
};

TEST_F(Policy, IgnoredElementsAreCounted) {
    const Outcome outcome = ask("--check --no-refresh --ignore drive:C0_d0");
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.output.find("PLEXOR OK - 1 controller, 1 volume, 1 drive, 0 ports, 0 "
                                  "batteries, 1 ignored | controllers=1 volumes=1 drives=1 ports=0 "
                                  "batteries=0 warning=0 critical=0 ignored=1 time="),
              0u)
        << outcome.output;
    EXPECT_EQ(ask("--check --no-refresh --ignore drive:d0").status, 2);
    EXPECT_EQ(ask("--check --ignore nothing").status, 3);
}

TEST_F(Policy, LevelsOfTheSite) {
    EXPECT_EQ(ask("--check --no-refresh --level FAILED=warning").status, 1);
    EXPECT_EQ(ask("--check --no-refresh --level failed=ok,DEGRADED=critical").status, 0);
    EXPECT_EQ(ask("--check --level FAILED=fine").status, 3);
}

TEST_F(Policy, VerboseChecksNameElements) {
    const auto behindFirst = [&](const std::string& more) {
        const std::string output = ask("--check --no-refresh " + more).output;
        return output.substr(output.find('\n') + 1);
    };
    EXPECT_EQ(behindFirst(""), "");
    EXPECT_EQ(behindFirst("-v"), "critical: Drive d0 on controller C0 (failed)\n");
    EXPECT_EQ(behindFirst("-v --ignore drive:C0_d0"),
              "ignored critical: Drive d0 on controller C0 (failed)\n");
    EXPECT_EQ(behindFirst("-vv"),
              "ok: RAID1 v Logical Volume 0 on controller C0 (optimal)\n"
              "critical: Drive d0 on controller C0 (failed)\n");
}

TEST_F(Policy, ProblemsAloneCanBeShown) {
    EXPECT_EQ(ask("--problems").output,
              "Controller C0 (M)  [health ok, status ok]\n"
              "└─ Drives (1)\n"
              "   └─ Drive d0 on controller C0 Fw: 1 - FAILED  [health failed, status error]\n");
    EXPECT_EQ(ask("--problems --level FAILED=ok").output, "no problems among 3 elements\n");
    EXPECT_EQ(ask("--problems --check").status, 3);
}

TEST_F(Policy, MetricsAreWhatAnotherParserReads) {
    const std::string file = ::testing::TempDir() + "plexor-ask-metrics";
    std::ofstream(file) << ask("--metrics --refresh 0 --ignore drive:C0_d0").output;
    const std::string parse =
        "/usr/bin/python3 -c '"
        "from prometheus_client.openmetrics.parser import text_string_to_metric_families as read\n"
        "for family in read(open(\"" +
        file +
        "\").read()):\n"
        "    for s in family.samples:\n"
        "        value = float(s.value) if s.name != \"plexor_ask_duration_seconds\" else s.value "
        "< 30\n"
        "        print(family.type, s.name, *s.labels.values(), value, sep=\"/\")\n"
        "' >" +
        file + ".out";
    ASSERT_EQ(std::system(parse.c_str()), 0);
    std::ifstream stream(file + ".out");
    const std::string said{std::istreambuf_iterator<char>(stream), {}};
    EXPECT_EQ(said,
              "gauge/plexor_up/1.0\n"
              "gauge/plexor_inventory_complete/1.0\n"
              "gauge/plexor_ask_duration_seconds/True\n"
              "gauge/plexor_elements/controller/1.0\n"
              "gauge/plexor_elements/volume/1.0\n"
              "gauge/plexor_elements/drive/1.0\n"
              "gauge/plexor_elements/port/0.0\n"
              "gauge/plexor_elements/battery/0.0\n"
              "gauge/plexor_element_level/volume/C0_0/RAID1 v Logical Volume 0 on controller "
              "C0/optimal/no/0.0\n"
              "gauge/plexor_element_level/drive/C0_d0/Drive d0 on controller C0/failed/yes/2.0\n");
}

TEST(Metrics, SayWhenNobodyAnswers) {
    const Outcome outcome = runTool("ask --metrics http://127.0.0.1:1");
    EXPECT_EQ(outcome.status, 0);
    EXPECT_NE(outcome.output.find("\nplexor_up 0\n"), std::string::npos) << outcome.output;
    EXPECT_EQ(outcome.output.find("plexor_elements{"), std::string::npos);
    EXPECT_EQ(outcome.errors, "plexor-testbed: 127.0.0.1:1: no connection: Connection refused\n");
}

TEST(Printable, LeavesNothingThatMisleads) {
    EXPECT_EQ(printable("a\xc3\xa4\xe6\xbc\xa2 b"), "a\xc3\xa4\xe6\xbc\xa2 b");
    EXPECT_EQ(printable("\xe2\x80\xae\xe2\x80\x8b\xc2\x9b\x7f\t"), "?????");
    EXPECT_EQ(printable("\xff\xc3(\xe2\x80"),
              "??"
              "(??");
    EXPECT_EQ(printable("\xed\xa0\x80\xc0\xaf\xf4\x90\x80\x80"), "?????????");
    EXPECT_EQ(printableAscii("a\xc3\xa4\xff"), "a??");
}

TEST(Printable, FoldsAtBlanks) {
    const auto folded = [](const std::string& text, std::size_t first, std::size_t rest) {
        std::string all;
        for (const auto& part : foldedLines(text, first, rest))
            all += text.substr(part.begin, part.end - part.begin) + "/";
        return all;
    };
    EXPECT_EQ(folded("one two three", 20, 20), "one two three/");
    EXPECT_EQ(folded("one two  three", 8, 5), "one two/three/");
    EXPECT_EQ(folded("abcdefgh", 3, 4), "abc/defg/h/");
    EXPECT_EQ(folded("", 3, 4), "/");
    EXPECT_EQ(folded("\xe6\xbc\xa2\xe6\xbc\xa2", 3, 3), "\xe6\xbc\xa2/\xe6\xbc\xa2/");
}

}  // namespace
}  // namespace testbed
