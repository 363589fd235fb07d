// What the matching leaves in the log, line by line.
#include <regex>

#include "match_fixture.h"

namespace plexortest {
namespace {

class MatchLog : public MatchTest {
protected:
    static std::string pointer(const void* address) { return formatted("%p", address); }

    /// Index of the only debug line that begins with `start`; -1 unless there is exactly one.
    static int onlyLine(const std::string& start) {
        const auto lines = CapturedSyslog::linesAt(LOG_DEBUG);
        int found = -1;
        for (std::size_t i = 0; i < lines.size(); i++) {
            if (lines[i].rfind(start, 0) != 0) continue;
            if (found >= 0) return -1;
            found = static_cast<int>(i);
        }
        return found;
    }
};

TEST_F(MatchLog, EveryStepInOrder) {
    void* const first = cache("P0");
    void* const second = cache("P1");
    void* const third = cache("P2");
    CMPIEnumeration* const fresh = resultsOf({"P1", "P3"});
    const CMPIArray* const array = fresh->ft->toArray(fresh, nullptr);

    ASSERT_EQ(match(fresh), 0);

    const auto lines = CapturedSyslog::linesAt(LOG_DEBUG);
    ASSERT_EQ(lines.size(), 18u);
    EXPECT_EQ(CapturedSyslog::lines().size(), 18u);
    EXPECT_EQ(lines[0], "CrossoutDuplicatedEntries: ENTER...\n");
    EXPECT_EQ(lines[1], "arrPtr " + pointer(array) + "\n");
    EXPECT_EQ(lines[2], "Enum array size 2\n");
    EXPECT_TRUE(std::regex_match(lines[3], std::regex("OP 0x[0-9a-f]+ added to opArr\\[0\\]\n")));
    EXPECT_EQ(lines[4], "OP " + pointer(ops_[1].Op) + " added to opArr[1]\n");
    EXPECT_EQ(lines[5], "List " + pointer(&list_) + ", size 3\n");
    EXPECT_EQ(lines[6], "data " + pointer(first) + " added to dataArr[0]\n");
    EXPECT_EQ(lines[7], "data " + pointer(second) + " added to dataArr[1]\n");
    EXPECT_EQ(lines[8], "data " + pointer(third) + " added to dataArr[2]\n");
    EXPECT_EQ(lines[9], "dataArr[0]: class name SAMPLE_Port, key P0\n");
    EXPECT_EQ(lines[10], "opArr[0]: class name SAMPLE_Port, key P1\n");
    EXPECT_EQ(lines[11], "opArr[1]: class name SAMPLE_Port, key P3\n");
    EXPECT_EQ(lines[12], "dataArr[1]: class name SAMPLE_Port, key P1\n");
    EXPECT_EQ(lines[13], "opArr[0]: class name SAMPLE_Port, key P1\n");
    // One fresh and two cached entries are left.
    EXPECT_EQ(lines[14], "SAMPLE_Port,P1 duplicated, candidate for update. ci 1, cj 2\n");
    EXPECT_EQ(lines[15], "dataArr[2]: class name SAMPLE_Port, key P2\n");
    EXPECT_EQ(lines[16], "opArr[1]: class name SAMPLE_Port, key P3\n");
    EXPECT_EQ(lines[17], "CrossoutDuplicatedEntries EXITED, rc 0, remove 2, add 1\n");
}

TEST_F(MatchLog, TheCountsGoDownWithEveryMatch) {
    for (const char* key : {"P0", "P1", "P2", "P3"}) cache(key);
    ASSERT_EQ(match(resultsOf({"P0", "P1", "P2"})), 0);

    EXPECT_NE(onlyLine("SAMPLE_Port,P0 duplicated, candidate for update. ci 2, cj 3\n"), -1);
    EXPECT_NE(onlyLine("SAMPLE_Port,P1 duplicated, candidate for update. ci 1, cj 2\n"), -1);
    EXPECT_NE(onlyLine("SAMPLE_Port,P2 duplicated, candidate for update. ci 0, cj 1\n"), -1);
    EXPECT_NE(onlyLine("CrossoutDuplicatedEntries EXITED, rc 0, remove 1, add 0\n"), -1);
}

TEST_F(MatchLog, AMatchEndsTheScanForThatRecord) {
    cache("P0");
    ASSERT_EQ(match(resultsOf({"P0", "P1"})), 0);
    EXPECT_NE(onlyLine("opArr[0]: class name SAMPLE_Port, key P0\n"), -1);
    EXPECT_EQ(onlyLine("opArr[1]: class name"), -1);
}

TEST_F(MatchLog, EmptyCacheIsShownWithItsSize) {
    ASSERT_EQ(match(resultsOf({"P0"})), 0);
    EXPECT_NE(onlyLine("List " + pointer(&list_) + ", size 0\n"), -1);
    EXPECT_NE(onlyLine("CrossoutDuplicatedEntries EXITED, rc 0, remove 0, add 1\n"), -1);
}

TEST_F(MatchLog, NoListIsShownAsNullAndEmpty) {
    ASSERT_EQ(match(nullptr, resultsOf({})), 0);
    EXPECT_NE(onlyLine("List (nil), size 0\n"), -1);
    EXPECT_NE(onlyLine("Enum array size 0\n"), -1);
    EXPECT_NE(onlyLine("CrossoutDuplicatedEntries EXITED, rc 0, remove 0, add 0\n"), -1);
}

TEST_F(MatchLog, AbsentTextsHaveTheirLinesToo) {
    cachePath(nullptr);
    const testbed::Instance noKey{{"root/sample", kClass, {}}, {}};
    ASSERT_EQ(match(results({noKey})), 0);
    EXPECT_NE(onlyLine("dataArr[0]: class name "), -1);
    EXPECT_NE(onlyLine("opArr[0]: class name SAMPLE_Port, key "), -1);
}

}  // namespace
}  // namespace plexortest
