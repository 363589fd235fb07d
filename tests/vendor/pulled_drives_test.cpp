#include "pulled_drives.h"

#include <gtest/gtest.h>

#include "command_words.h"

namespace testbed {
namespace {

using nlohmann::json;

const json kThreeDrives = json::parse(R"({"controllers": [{"id": "C 0", "drives": [
    {"id": "5", "slot": 5, "enclosure": "32", "name": "a \"b\"", "pool": "DG0", "state": "failed"},
    {"id": "s", "state": "hot spare", "status": 2}, {"id": "k"}]}]})");

TEST(PulledDrives, NothingIsMissing) {
    EXPECT_TRUE(pulledDrives(kThreeDrives, kThreeDrives).empty());
}

TEST(PulledDrives, AreAddedByTheCommandThatTheyCarry) {
    json now = kThreeDrives;
    now["controllers"][0]["drives"] = json::array({json{{"id", "k"}}});
    const auto pulled = pulledDrives(kThreeDrives, now);
    ASSERT_EQ(pulled.size(), 2u);
    EXPECT_EQ(pulled[0].controller, "C 0");
    EXPECT_EQ(pulled[0].id, "5");
    // The new drive has none of the old one's state; a spare is one again.
    EXPECT_EQ(pulled[0].insert,
              "add drive \"C 0\" id=\"5\" enclosure=\"32\" name=\"a \\\"b\\\"\" pool=DG0 slot=5");
    EXPECT_EQ(pulled[1].insert, "add drive \"C 0\" id=s state=\"hot spare\"");
    const auto words = commandWords(pulled[0].insert);
    EXPECT_EQ(words.at(3).value, json("5"));
    EXPECT_EQ(words.at(5).value, json("a \"b\""));
}

TEST(PulledDrives, ControllersThatAreGoneHaveNoSlots) {
    EXPECT_TRUE(pulledDrives(kThreeDrives, json::parse(R"({"controllers": []})")).empty());
}

}  // namespace
}  // namespace testbed
