#include "cim_words.h"

#include <gtest/gtest.h>

namespace testbed {
namespace {

TEST(CimWords, WordsAndCodesGoBothWays) {
    EXPECT_EQ(codeOf(operationalStatusWords(), "degraded"), 3);
    EXPECT_EQ(codeOf(operationalStatusWords(), "Predictive Failure"), 5);
    EXPECT_EQ(codeOf(operationalStatusWords(), "well"), std::nullopt);
    EXPECT_EQ(wordOf(healthStateWords(), 30), "failed");
    EXPECT_EQ(wordOf(healthStateWords(), 31), "");
    EXPECT_EQ(codeOf(softwareClassificationWords(), "package"), 13);
}

TEST(CimWords, DriveStatesAreWhatTheVendorPublishes) {
    struct Row {
        const char* word;
        int status, extent;
        bool unassigned;
    };
    constexpr Row rows[] = {{"online", 2, 2, false},           {"hot spare", 2, 13, true},
                            {"failed", 6, 3, false},           {"rebuild", 2, 11, false},
                            {"unconfigured good", 2, 2, true}, {"unconfigured bad", 6, 2, true},
                            {"offline", 12, 2, false}};
    for (const Row& row : rows) {
        const StateWord* state = findState(driveStates(), row.word);
        ASSERT_NE(state, nullptr) << row.word;
        EXPECT_EQ(state->operationalStatus, row.status) << row.word;
        EXPECT_EQ(state->detail, row.extent) << row.word;
        EXPECT_EQ(state->primordial, row.unassigned) << row.word;
    }
    EXPECT_EQ(findState(driveStates(), "broken"), nullptr);
}

TEST(CimWords, RaidLevelsBringTheirRedundancy) {
    ASSERT_NE(findRaidLevel("raid6"), nullptr);
    EXPECT_EQ(findRaidLevel("raid6")->packageRedundancy, 2);
    EXPECT_EQ(findRaidLevel("RAID1")->dataRedundancy, 2);
    EXPECT_EQ(findRaidLevel("RAID7"), nullptr);
}

}  // namespace
}  // namespace testbed
