// Matching with bad arguments, without memory, and with enumerations that contradict themselves.
#include "match_fixture.h"

namespace plexortest {
namespace {

using testbed::Entry;
using testbed::FaultRule;

class MatchFailures : public MatchTest {
protected:
    void expectNothingHandedBack() {
        EXPECT_EQ(devices_, nullptr);
        EXPECT_EQ(deviceCount_, 0);
        EXPECT_EQ(ops_, nullptr);
        EXPECT_EQ(opCount_, 0);
    }
    void expectLast(const std::string& line) {
        const auto lines = CapturedSyslog::lines();
        ASSERT_FALSE(lines.empty());
        EXPECT_EQ(lines.back().text, line);
        EXPECT_EQ(lines.back().priority, LOG_DEBUG);
    }
    void expectNoMemoryForResults() {
        expectNothingHandedBack();
        EXPECT_EQ(
            timesLogged(LOG_ERR, "CrossoutDuplicatedEntries, failed to allocate memory for enum\n"),
            1u);
    }
    void addRule(Entry entry, int skip = 0) {
        FaultRule rule;
        rule.entry = entry;
        rule.nullResult = true;
        rule.skip = skip;
        faults().add(rule);
    }

    /// Makes toArray of one enumeration answer with another one's array.
    void giveArrayOf(CMPIEnumeration* enumeration, CMPIEnumeration* other) {
        static CMPIArray* array;
        static CMPIEnumerationFT table;
        array = other->ft->toArray(other, nullptr);
        table = *enumeration->ft;
        table.toArray = [](const CMPIEnumeration*, CMPIStatus*) { return array; };
        enumeration->ft = &table;
    }
};

TEST_F(MatchFailures, EachMissingArgumentIsRejected) {
    cache("P0");
    CMPIEnumeration* const fresh = resultsOf({"P0"});
    for (int missing = 0; missing < 5; missing++) {
        SCOPED_TRACE(missing);
        clearLog();
        const int rc = CrossoutDuplicatedEntries(
            &list_, fresh, getOp, missing == 0 ? nullptr : "DeviceID",
            missing == 1 ? nullptr : &devices_, missing == 2 ? nullptr : &ops_,
            missing == 3 ? nullptr : &deviceCount_, missing == 4 ? nullptr : &opCount_);

        EXPECT_EQ(rc, -100);
        const auto lines = CapturedSyslog::lines();
        ASSERT_EQ(lines.size(), 3u);
        EXPECT_EQ(lines[0].text, "CrossoutDuplicatedEntries: ENTER...\n");
        EXPECT_EQ(lines[0].priority, LOG_DEBUG);
        EXPECT_EQ(lines[1].text, "CrossoutDuplicatedEntries: invalid parameter\n");
        EXPECT_EQ(lines[1].priority, LOG_ERR);
        expectLast("CrossoutDuplicatedEntries EXITED, rc -100, remove 0, add 0\n");
        EXPECT_EQ(devices_, nullptr);
        EXPECT_EQ(ops_, nullptr);
    }
}

TEST_F(MatchFailures, NoArrayFromTheEnumeration) {
    cache("P0");
    CMPIEnumeration* const fresh = resultsOf({"P0"});
    addRule(Entry::EnumerationToArray);

    EXPECT_EQ(match(fresh), -100);

    expectNothingHandedBack();
    EXPECT_EQ(timesLogged(LOG_DEBUG, "arrPtr (nil)\n"), 1u);
    EXPECT_EQ(timesLogged(LOG_ERR, "CrossoutDuplicatedEntries, failed to get array from enum\n"),
              1u);
    expectLast("CrossoutDuplicatedEntries EXITED, rc -100, remove 0, add 0\n");
}

TEST_F(MatchFailures, NoEnumerationHasNoArray) {
    cache("P0");
    EXPECT_EQ(match(nullptr), -100);
    expectNothingHandedBack();
    expectLast("CrossoutDuplicatedEntries EXITED, rc -100, remove 0, add 0\n");
}

TEST_F(MatchFailures, NoMemoryForTheResults) {
    cache("P0");
    CMPIEnumeration* const fresh = resultsOf({"P0"});
    {
        const auto fault = FailAllocation::nth(1);
        EXPECT_EQ(match(fresh), -2);
        EXPECT_EQ(fault.failures(), 1u);
    }
    expectNoMemoryForResults();
    expectLast("CrossoutDuplicatedEntries EXITED, rc -2, remove 0, add 0\n");
}

TEST_F(MatchFailures, NoMemoryForTheRecordsGivesTheResultsUp) {
    cache("P0");
    cache("P1");
    CMPIEnumeration* const fresh = resultsOf({"P0", "P1", "P2"});
    {
        const auto fault = FailAllocation::nth(2);
        EXPECT_EQ(match(fresh), -2);
        EXPECT_EQ(fault.failures(), 1u);
    }
    expectNothingHandedBack();
    EXPECT_EQ(
        timesLogged(LOG_ERR, "CrossoutDuplicatedEntries, failed to allocate memory for list\n"),
        1u);
    // The results had been counted before.
    expectLast("CrossoutDuplicatedEntries EXITED, rc -2, remove 0, add 3\n");
}

TEST_F(MatchFailures, NoMemoryForWhatIsLookedUpGivesEverythingUp) {
    cache("P0");
    for (const std::size_t n : {3, 4}) {
        CMPIEnumeration* const fresh = resultsOf({"P0", "P1"});
        {
            const auto fault = FailAllocation::nth(n);
            EXPECT_EQ(match(fresh), -2);
            EXPECT_EQ(fault.failures(), 1u);
        }
        expectNoMemoryForResults();
        expectLast("CrossoutDuplicatedEntries EXITED, rc -2, remove 0, add 0\n");
    }
}

TEST_F(MatchFailures, EveryAllocationMayFail) {
    cache("P0");
    for (int n = 1;; n++) {
        CMPIEnumeration* const fresh = resultsOf({"P0", "P1"});
        const auto fault = FailAllocation::nth(n);
        const int rc = match(fresh);
        if (fault.failures() == 0) {
            EXPECT_EQ(rc, 0);
            EXPECT_EQ(n, 5) << "both arrays, and what they are matched with";
            break;
        }
        EXPECT_EQ(rc, -2);
        expectNothingHandedBack();
    }
}

TEST_F(MatchFailures, MoreResultsThanTheArrayHad) {
    cache("P4");
    std::vector<std::string> keys;
    for (int i = 0; i < 40; i++) keys.push_back("P" + std::to_string(i));
    CMPIEnumeration* const fresh = resultsOf(keys);
    giveArrayOf(fresh, resultsOf({"P0"}));

    ASSERT_EQ(match(fresh), 0);

    EXPECT_EQ(timesLogged(LOG_DEBUG, "Enum array size 1\n"), 1u);
    EXPECT_EQ(flags(), "1");
    ASSERT_EQ(opCount_, 40);
    EXPECT_EQ(ops_[4].Op, nullptr);
    EXPECT_EQ(keyOf(ops_[39].Instance), "P39");
    expectLast("CrossoutDuplicatedEntries EXITED, rc 0, remove 0, add 39\n");
}

TEST_F(MatchFailures, ResultsAlthoughTheArrayIsEmpty) {
    CMPIEnumeration* const fresh = resultsOf({"P0", "P1", "P2"});
    giveArrayOf(fresh, resultsOf({}));

    ASSERT_EQ(match(fresh), 0);

    EXPECT_EQ(timesLogged(LOG_DEBUG, "Enum array size 0\n"), 1u);
    EXPECT_EQ(left(), "P0 P1 P2 ");
}

TEST_F(MatchFailures, NoMemoryForMoreResultsThanTheArrayHad) {
    cache("P2");
    CMPIEnumeration* const fresh = resultsOf({"P0", "P1", "P2"});
    giveArrayOf(fresh, resultsOf({"P0"}));
    {
        const auto fault = FailAllocation::nth(2);
        // To go on without them would be to take P2 for gone.
        EXPECT_EQ(match(fresh), -2);
        EXPECT_EQ(fault.failures(), 1u);
    }
    expectNoMemoryForResults();
}

TEST_F(MatchFailures, FewerResultsThanTheArrayHad) {
    cache("P0");
    CMPIEnumeration* const fresh = resultsOf({"P0", "P1"});
    giveArrayOf(fresh, resultsOf({"P0", "P1", "P2", "P3"}));

    ASSERT_EQ(match(fresh), 0);

    EXPECT_EQ(timesLogged(LOG_DEBUG, "Enum array size 4\n"), 1u);
    EXPECT_EQ(flags(), "1");
    EXPECT_EQ(left(), "- P1 ");
    expectLast("CrossoutDuplicatedEntries EXITED, rc 0, remove 0, add 1\n");
}

TEST_F(MatchFailures, ResultsThatCannotBeReadToTheirEndAreNotMatched) {
    cache("A");
    cache("B");
    for (const Entry entry : {Entry::EnumerationHasNext, Entry::EnumerationGetNext}) {
        for (int position = 0; position < 2; position++) {
            SCOPED_TRACE(std::string(testbed::entryName(entry)) + " " + std::to_string(position));
            FaultRule rule = refusal(entry);
            rule.skip = position;
            faults().add(rule);
            EXPECT_EQ(match(resultsOf({"A", "B"})), -100);
            expectNothingHandedBack();
            expectLast("CrossoutDuplicatedEntries EXITED, rc -100, remove 0, add 0\n");
            faults().clear();
        }
    }
}

TEST_F(MatchFailures, AnElementThatIsNoInstanceIsPassedOver) {
    CMPIEnumeration* const fresh = resultsOf({"P0", "P1", "P2"});
    FaultRule number;
    number.entry = Entry::EnumerationGetNext;
    number.wrongType = true;
    number.skip = 1;
    number.times = 1;
    faults().add(number);

    ASSERT_EQ(match(fresh), 0);

    EXPECT_EQ(left(), "P0 P2 ");
}

TEST_F(MatchFailures, NothingIsReleased) {
    cache("P0");
    CMPIEnumeration* const fresh = resultsOf({"P0", "P1"});
    books().recordObjectCalls(true);

    ASSERT_EQ(match(fresh), 0);

    EXPECT_EQ(books().count(Entry::Release), 0u);
    EXPECT_EQ(books().count(Entry::Clone), 0u);
}

}  // namespace
}  // namespace plexortest
