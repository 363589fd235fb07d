// Comparing a broker's string with a text of our own.
#include <strings.h>

#include "provider_fixture.h"

namespace plexortest {
namespace {

using StringCompare = ProviderTest;

TEST_F(StringCompare, LetterCaseDoesNotCount) {
    EXPECT_EQ(CMStringCmp(broker.makeString("Tovexa_PlexorBattery"), "Tovexa_PlexorBattery"), 0);
    EXPECT_EQ(CMStringCmp(broker.makeString("tovexa_plexorbattery"), "Tovexa_PlexorBattery"), 0);
    EXPECT_EQ(CMStringCmp(broker.makeString("TOVEXA_PLEXORBATTERY"), "Tovexa_PlexorBattery"), 0);
    EXPECT_EQ(CMStringCmp(broker.makeString(""), ""), 0);
}

TEST_F(StringCompare, PrefixesAreNotEqual) {
    EXPECT_GT(CMStringCmp(broker.makeString("Tovexa_PlexorBattery2"), "Tovexa_PlexorBattery"), 0);
    EXPECT_LT(CMStringCmp(broker.makeString("Tovexa_PlexorBatter"), "Tovexa_PlexorBattery"), 0);
}

TEST_F(StringCompare, ResultIsThatOfTheLibraryFunction) {
    EXPECT_EQ(CMStringCmp(broker.makeString("alpha"), "Beta"), strcasecmp("alpha", "Beta"));
    EXPECT_EQ(CMStringCmp(broker.makeString("Gamma"), "beta"), strcasecmp("Gamma", "beta"));
    EXPECT_LT(CMStringCmp(broker.makeString("alpha"), "Beta"), 0);
    EXPECT_GT(CMStringCmp(broker.makeString("Gamma"), "beta"), 0);
}

TEST_F(StringCompare, StringWithoutTextIsNoName) {
    EXPECT_NE(CMStringCmp(broker.makeNullString(), "Tovexa_PlexorBattery"), 0);
    EXPECT_EQ(CMStringCmp(broker.makeNullString(), ""), 0);
}

TEST_F(StringCompare, MissingStringIsNoName) {
    EXPECT_NE(CMStringCmp(nullptr, "Tovexa_PlexorBattery"), 0);
}

TEST_F(StringCompare, AsksTheStringOnce) {
    const CMPIString* text = broker.makeString("a");
    books().recordObjectCalls(true);
    CMStringCmp(text, "b");
    EXPECT_EQ(books().count(testbed::Entry::StringGetCharPtr), 1u);
}

TEST_F(StringCompare, StringThatRefusesItsTextIsNoName) {
    const CMPIString* text = broker.makeString("a");
    faults().add(refusal(testbed::Entry::StringGetCharPtr));
    EXPECT_NE(CMStringCmp(text, "a"), 0);
}

}  // namespace
}  // namespace plexortest
