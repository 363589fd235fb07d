// Places of a group, their drives, and which of them are lost.
#include "group_places.h"

#include <gtest/gtest.h>

namespace testbed {
namespace {

using Ids = std::vector<std::string>;

class GroupPlacesTest : public ::testing::Test {
protected:
    GroupPlacesTest() {
        for (const char* id : {"a", "b", "c", "d"}) {
            drives_.emplace_back().id = id;
            drives_.back().operationalStatus = 2;
        }
    }
    void lose(std::size_t drive) { drives_.at(drive).operationalStatus = 6; }

    std::vector<DriveDescription> drives_;
    const DriveIndex index_{drives_};
};

TEST_F(GroupPlacesTest, ADriveHasItsFirstPlace) {
    GroupPlaces places({"a", "b", "a"}, index_);
    EXPECT_EQ(places.placeOf("a"), 0u);
    EXPECT_EQ(places.placeOf("b"), 1u);
    EXPECT_EQ(places.placeOf("c"), std::nullopt);
    places.put(0, "c");
    EXPECT_EQ(places.placeOf("a"), 2u);
    EXPECT_EQ(places.ids(), (Ids{"c", "b", "a"}));
}

TEST_F(GroupPlacesTest, WhereNoneIsLostThereIsNoPlaceForAnother) {
    GroupPlaces places({"a", "b"}, index_);
    EXPECT_EQ(places.placeFor("b"), 1u);
    EXPECT_EQ(places.placeFor("c"), std::nullopt);
    places.append("c");
    EXPECT_EQ(places.placeFor("c"), 2u);
}

TEST_F(GroupPlacesTest, AnotherGetsTheFirstLostPlaceThatIsLeft) {
    lose(1);
    GroupPlaces places({"a", "b", "gone"}, index_);
    EXPECT_EQ(places.placeFor("b"), 1u) << "its own";
    EXPECT_EQ(places.placeFor("c"), 1u);
    places.put(1, "c");
    EXPECT_EQ(places.placeFor("d"), 2u) << "of a drive that is not there";
    places.put(2, "d");
    EXPECT_EQ(places.placeFor("e"), std::nullopt);
    places.put(0, "b");
    EXPECT_EQ(places.placeFor("e"), 0u);
    EXPECT_EQ(places.placeOf("a"), std::nullopt);
}

}  // namespace
}  // namespace testbed
