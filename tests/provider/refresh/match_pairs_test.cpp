// Which cached records and which fresh results are taken for the same device.
#include "match_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testbed::Entry;
using testbed::FaultRule;
using testbed::Instance;
using testbed::ObjectPath;

class MatchPairs : public MatchTest {};

TEST_F(MatchPairs, GoneStayingAndNewDevicesAreToldApart) {
    void* const gone = cache("P0");
    void* const staying = cache("P1");

    ASSERT_EQ(match(resultsOf({"P1", "P2"})), 0);

    ASSERT_EQ(flags(), "01");
    EXPECT_EQ(devices_[0].Device, gone);
    EXPECT_EQ(devices_[0].Instance, nullptr);
    EXPECT_EQ(devices_[1].Device, staying);
    EXPECT_EQ(keyOf(devices_[1].Instance), "P1");
    EXPECT_EQ(left(), "- P2 ");
    EXPECT_EQ(ops_[0].Instance, nullptr);
    EXPECT_EQ(keyOf(ops_[1].Instance), "P2");
}

TEST_F(MatchPairs, NoMoreRecordsAreTakenThanTheListCounts) {
    cache("P0");
    cache("P1");
    list_.Size = 1;
    ASSERT_EQ(match(resultsOf({"P0"})), 0);
    EXPECT_EQ(flags(), "1");
    EXPECT_EQ(CapturedSyslog::countContaining(" added to dataArr["), 1u);
    list_.Size = 2;
}

TEST_F(MatchPairs, ResultsInAnotherOrderFindTheirRecords) {
    cache("P0");
    cache("P1");
    cache("P2");

    ASSERT_EQ(match(resultsOf({"P2", "P0", "P1"})), 0);

    ASSERT_EQ(flags(), "111");
    EXPECT_EQ(keyOf(devices_[0].Instance), "P0");
    EXPECT_EQ(keyOf(devices_[1].Instance), "P1");
    EXPECT_EQ(keyOf(devices_[2].Instance), "P2");
}

TEST_F(MatchPairs, WithoutRecordsNoIdentityIsRead) {
    CMPIEnumeration* const fresh = resultsOf({"P0", "P1"});
    books().recordObjectCalls(true);
    ASSERT_EQ(match(fresh), 0);
    EXPECT_EQ(books().count(Entry::PathGetKey), 0u);
    EXPECT_EQ(books().count(Entry::PathGetClassName), 0u);
    EXPECT_EQ(left(), "P0 P1 ");
}

TEST_F(MatchPairs, WhenEveryResultIsMatchedTheNewArrayIsGone) {
    cache("P0");
    ASSERT_EQ(match(resultsOf({"P0"})), 0);
    EXPECT_EQ(flags(), "1");
    EXPECT_EQ(ops_, nullptr);
    EXPECT_EQ(opCount_, 0);
}

TEST_F(MatchPairs, EmptyResultLeavesEveryRecordUnmatched) {
    cache("P0");
    cache("P1");
    ASSERT_EQ(match(resultsOf({})), 0);
    EXPECT_EQ(flags(), "00");
    EXPECT_EQ(ops_, nullptr);
    EXPECT_EQ(opCount_, 0);
}

TEST_F(MatchPairs, EmptyCacheLeavesEveryResult) {
    ASSERT_EQ(match(resultsOf({"P0", "P1"})), 0);
    EXPECT_EQ(devices_, nullptr);
    EXPECT_EQ(deviceCount_, 0);
    EXPECT_EQ(left(), "P0 P1 ");
}

TEST_F(MatchPairs, NoListIsAnEmptyCache) {
    ASSERT_EQ(match(nullptr, resultsOf({"P0"})), 0);
    EXPECT_EQ(devices_, nullptr);
    EXPECT_EQ(deviceCount_, 0);
    EXPECT_EQ(left(), "P0 ");
}

TEST_F(MatchPairs, NothingOnEitherSide) {
    ASSERT_EQ(match(resultsOf({})), 0);
    EXPECT_EQ(devices_, nullptr);
    EXPECT_EQ(deviceCount_, 0);
    EXPECT_EQ(ops_, nullptr);
    EXPECT_EQ(opCount_, 0);
}

TEST_F(MatchPairs, KeysThatDifferInLetterCaseDoNotMatch) {
    cache("port-a");
    ASSERT_EQ(match(resultsOf({"PORT-A"})), 0);
    EXPECT_EQ(flags(), "0");
    EXPECT_EQ(left(), "PORT-A ");
}

TEST_F(MatchPairs, ClassNamesThatDifferInLetterCaseDoNotMatch) {
    cache(pathOf("P0", "SAMPLE_PORT"));
    ASSERT_EQ(match(results({instanceOf("P0", "SAMPLE_Port")})), 0);
    EXPECT_EQ(flags(), "0");
    EXPECT_EQ(left(), "P0 ");
}

TEST_F(MatchPairs, AnotherClassWithTheSameKeyDoesNotMatch) {
    cache(pathOf("P0", "SAMPLE_Battery"));
    ASSERT_EQ(match(resultsOf({"P0"})), 0);
    EXPECT_EQ(flags(), "0");
    EXPECT_EQ(left(), "P0 ");
}

TEST_F(MatchPairs, KeyThatBeginsWithTheOtherDoesNotMatch) {
    cache("P1");
    ASSERT_EQ(match(resultsOf({"P10"})), 0);
    EXPECT_EQ(flags(), "0");
}

TEST_F(MatchPairs, OtherKeysAndNamespaceTakeNoPart) {
    cache(pathOf("P0").key("SystemName", CimValue::string("left")));
    ObjectPath elsewhere = pathOf("P0").key("SystemName", CimValue::string("right"));
    elsewhere.key("CreationClassName", CimValue::string("other"));
    elsewhere.nameSpace = "root/elsewhere";

    ASSERT_EQ(match(results({Instance{elsewhere, {}}})), 0);

    EXPECT_EQ(flags(), "1");
    EXPECT_EQ(opCount_, 0);
}

TEST_F(MatchPairs, OnlyTheNamedKeyCounts) {
    cache(pathOf("P0").key("Tag", CimValue::string("same")));
    Instance other = instanceOf("P9");
    other.path.key("Tag", CimValue::string("same"));

    ASSERT_EQ(match(results({other}), "Tag"), 0);

    EXPECT_EQ(flags(), "1");
    EXPECT_EQ(keyOf(devices_[0].Instance), "P9");
}

TEST_F(MatchPairs, OfTwoEqualRecordsOnlyTheFirstIsMatched) {
    cache("P0");
    cache("P0");
    ASSERT_EQ(match(resultsOf({"P0"})), 0);
    EXPECT_EQ(flags(), "10");
    EXPECT_NE(devices_[0].Instance, nullptr);
    EXPECT_EQ(devices_[1].Instance, nullptr);
    EXPECT_EQ(opCount_, 0);
}

TEST_F(MatchPairs, OfTwoEqualResultsTheFirstIsTaken) {
    Instance first = instanceOf("P0");
    Instance second = instanceOf("P0");
    first.set("Place", CimValue::string("first"));
    second.set("Place", CimValue::string("second"));
    cache("P0");

    ASSERT_EQ(match(results({first, second})), 0);

    EXPECT_EQ(flags(), "1");
    EXPECT_EQ(testbed::Broker::toInstance(devices_[0].Instance).find("Place")->asString(), "first");
    EXPECT_EQ(left(), "- P0 ");
}

TEST_F(MatchPairs, EqualPairsOnBothSidesMatchInOrder) {
    Instance first = instanceOf("P0");
    Instance second = instanceOf("P0");
    first.set("Place", CimValue::string("first"));
    second.set("Place", CimValue::string("second"));
    cache("P0");
    cache("P0");

    ASSERT_EQ(match(results({first, second})), 0);

    EXPECT_EQ(flags(), "11");
    EXPECT_EQ(testbed::Broker::toInstance(devices_[1].Instance).find("Place")->asString(),
              "second");
    EXPECT_EQ(opCount_, 0);
}

TEST_F(MatchPairs, MissingKeyIsNobodysEqual) {
    cache(ObjectPath{"root/sample", kClass, {}});
    cache("P1");
    ASSERT_EQ(match(results({Instance{{"root/sample", kClass, {}}, {}}, instanceOf("P1")})), 0);
    EXPECT_EQ(flags(), "01");
    EXPECT_EQ(opCount_, 2);
    EXPECT_NE(ops_[0].Op, nullptr);
    EXPECT_EQ(ops_[1].Op, nullptr);
}

TEST_F(MatchPairs, NullKeyIsNobodysEqual) {
    const ObjectPath null = pathOf("").key("DeviceID", CimValue::null(CMPI_string));
    cache(null);
    ASSERT_EQ(match(results({Instance{null, {}}})), 0);
    EXPECT_EQ(flags(), "0");
    EXPECT_EQ(opCount_, 1);
}

TEST_F(MatchPairs, KeyThatIsANumberIsNobodysEqual) {
    const ObjectPath number = pathOf("").key("DeviceID", CimValue::uint32(7));
    cache(number);
    ASSERT_EQ(match(results({Instance{number, {}}})), 0);
    EXPECT_EQ(flags(), "0");
    EXPECT_EQ(opCount_, 1);
}

TEST_F(MatchPairs, EmptyKeysAreEqual) {
    cache("");
    ASSERT_EQ(match(resultsOf({""})), 0);
    EXPECT_EQ(flags(), "1");
}

TEST_F(MatchPairs, PathsWithoutClassNameAreNobodysEqual) {
    cache("P0");
    CMPIEnumeration* const fresh = resultsOf({"P0"});
    FaultRule noName;
    noName.entry = testbed::Entry::PathGetClassName;
    noName.nullResult = true;
    faults().add(noName);

    ASSERT_EQ(match(fresh), 0);

    EXPECT_EQ(flags(), "0");
    EXPECT_EQ(opCount_, 1);
    EXPECT_NE(ops_[0].Op, nullptr);
}

TEST_F(MatchPairs, RecordWithoutPathIsNobodysEqual) {
    cachePath(nullptr);
    ASSERT_EQ(match(resultsOf({"P0"})), 0);
    EXPECT_EQ(flags(), "0");
    EXPECT_EQ(left(), "P0 ");
}

TEST_F(MatchPairs, ResultWithoutPathIsNeitherMatchedNorOffered) {
    cache("P0");
    CMPIEnumeration* const fresh = resultsOf({"P0", "P0"});
    FaultRule noPath;
    noPath.entry = testbed::Entry::InstanceGetObjectPath;
    noPath.nullResult = true;
    noPath.times = 1;
    faults().add(noPath);

    ASSERT_EQ(match(fresh), 0);

    EXPECT_EQ(flags(), "1");
    EXPECT_EQ(left(), "- - ");
}

}  // namespace
}  // namespace plexortest
