#include "books.h"

#include <gtest/gtest.h>

namespace testbed {
namespace {

CallRecord call(Entry entry) {
    CallRecord record;
    record.entry = entry;
    return record;
}

TEST(Entries, HaveNamesInTheirOrder) {
    EXPECT_STREQ(entryName(Entry::PrepareAttachThread), "prepareAttachThread");
    EXPECT_STREQ(entryName(Entry::ContextFlush), "context.flush");
    EXPECT_STREQ(entryName(Entry::InstanceGetProperty), "instance.getProperty");
    EXPECT_STREQ(entryName(Entry::Release), "release");
    EXPECT_STREQ(kindName(ObjectKind::Path), "path");
}

TEST(Entries, QueriesAndObjectEntries) {
    EXPECT_TRUE(isQuery(Entry::EnumerateInstanceNames));
    EXPECT_TRUE(isQuery(Entry::ReferenceNames));
    EXPECT_FALSE(isQuery(Entry::DetachThread));
    EXPECT_FALSE(isQuery(Entry::ClassPathIsA));
    EXPECT_FALSE(isObjectEntry(Entry::ContextFlush));
    EXPECT_TRUE(isObjectEntry(Entry::ResultReturnInstance));
    EXPECT_TRUE(isObjectEntry(Entry::Clone));
}

TEST(BooksTest, CallsKeepTheirOrderAndOutcome) {
    Books books;
    const std::size_t first = books.record(call(Entry::Associators));
    const std::size_t second = books.record(call(Entry::NewString));
    books.setRc(second, CMPI_RC_ERR_FAILED);
    books.setRc(first, CMPI_RC_ERR_NOT_FOUND);
    ASSERT_EQ(books.calls().size(), 2u);
    EXPECT_EQ(books.calls()[0].rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(books.calls()[1].rc, CMPI_RC_ERR_FAILED);
    ASSERT_EQ(books.queries().size(), 1u);
    EXPECT_EQ(books.queries()[0].entry, Entry::Associators);
}

TEST(BooksTest, OutcomeOfAClearedCallHitsNoOther) {
    Books books;
    const std::size_t old = books.record(call(Entry::Associators));
    books.clearCalls();
    EXPECT_EQ(books.count(Entry::Associators), 0u);
    books.record(call(Entry::GetInstance));
    books.setRc(old, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(books.calls().at(0).rc, CMPI_RC_OK);
}

TEST(BooksTest, CountsWithoutKeeping) {
    Books books;
    books.keepCalls(false);
    books.setRc(books.record(call(Entry::Associators)), CMPI_RC_ERR_FAILED);
    EXPECT_TRUE(books.calls().empty());
    EXPECT_EQ(books.count(Entry::Associators), 1u);
}

TEST(BooksTest, ObjectEntriesOnlyOnRequest) {
    Books books;
    books.record(call(Entry::InstanceGetProperty));
    EXPECT_EQ(books.count(Entry::InstanceGetProperty), 0u);
    books.recordObjectCalls(true);
    books.record(call(Entry::InstanceGetProperty));
    EXPECT_EQ(books.count(Entry::InstanceGetProperty), 1u);
}

TEST(BooksTest, ObjectsAreCountedByKindCloneAndThread) {
    Books books;
    int one = 0, two = 0;
    books.objectMade(&one, ObjectKind::String, false);
    std::thread::id other;
    std::thread([&] {
        books.objectMade(&two, ObjectKind::Path, true);
        other = std::this_thread::get_id();
    }).join();
    EXPECT_EQ(books.live(), 2u);
    EXPECT_EQ(books.live(ObjectKind::Path), 1u);
    EXPECT_EQ(books.liveClones(), 1u);
    EXPECT_EQ(books.liveOnThread(other), 1u);
    EXPECT_EQ(books.kindOf(&one), ObjectKind::String);

    books.objectEnded(&one);
    EXPECT_EQ(books.live(), 1u);
    EXPECT_EQ(books.kindOf(&one), std::nullopt);
    EXPECT_TRUE(books.objectUsed(&two, "path.getKey"));
    EXPECT_TRUE(books.misuses().empty());
    EXPECT_FALSE(books.objectUsed(&one, "string.getCharPtr"));
    ASSERT_EQ(books.misuses().size(), 1u);
    EXPECT_NE(books.misuses()[0].find("string.getCharPtr"), std::string::npos);
}

}  // namespace
}  // namespace testbed
