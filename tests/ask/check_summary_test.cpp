#include "check_summary.h"

#include <gtest/gtest.h>

#include <algorithm>

#include "elements.h"

namespace testbed {
namespace {

ClassAnswer answer(const char* kind, std::vector<Instance> instances) {
    ClassAnswer made{std::string("Tovexa_Plexor") + kind, {}};
    made.response.instances = std::move(instances);
    return made;
}

/// One of each, all well.
Inventory healthy() {
    return {answer("Controller", {element("Controller C0 (M)", 3, 5)}),
            answer("SoftwareIdentity", {element("s", 0, 0)}),
            answer("StorageVolume", {element("v0 - OPTIMAL", 2, 5), element("v1 - OPTIMAL", 2, 5)}),
            answer("StorageExtent", {element("d0 Fw: 1 - ONLINE", 2, 5)}),
            answer("SASSATAPort", {element("p0", 12, 20)}),
            answer("Battery", {element("b0", 2, 5)})};
}

std::vector<Instance>& of(Inventory& inventory, int index) {
    return inventory[static_cast<std::size_t>(index)].response.instances;
}

TEST(CheckSummary, AllIsWell) {
    const CheckSummary summary = summarize(healthy());
    EXPECT_EQ(summary.status, 0);
    EXPECT_EQ(summary.line(),
              "PLEXOR OK - 1 controller, 2 volumes, 1 drive, 1 port, 1 battery"
              " | controllers=1 volumes=2 drives=1 ports=1 batteries=1 warning=0 critical=0");
}

TEST(CheckSummary, WorstComesFirst) {
    Inventory inventory = healthy();
    of(inventory, 2).push_back(element("RAID5 x Logical Volume 2, Drives(1) - DEGRADED", 3, 10));
    EXPECT_EQ(summarize(inventory).status, 1);
    of(inventory, 3).push_back(element("d1 Fw: 1 - REBUILD", 2, 5));
    of(inventory, 3).push_back(element("d2 Fw: 1 - FAILED", 6, 30));
    of(inventory, 3).push_back(element("d3 Fw: 1 - FAILED", 6, 30));
    const CheckSummary summary = summarize(inventory);
    EXPECT_EQ(summary.status, 2);
    EXPECT_EQ(summary.line(),
              "PLEXOR CRITICAL - 2 drives failed: d2, d3; 1 volume degraded: "
              "RAID5 x Logical Volume 2; 1 drive rebuilding: d1"
              " | controllers=1 volumes=3 drives=4 ports=1 batteries=1 warning=2 critical=2");
}

TEST(CheckSummary, WarningSaysSo) {
    Inventory inventory = healthy();
    of(inventory, 5)[0] = element("b0", 3, 0);
    const CheckSummary summary = summarize(inventory);
    EXPECT_EQ(summary.status, 1);
    EXPECT_EQ(summary.line().find("PLEXOR WARNING - 1 battery degraded: b0 | "), 0u)
        << summary.line();
}

TEST(CheckSummary, ManyNamesAreCounted) {
    Inventory inventory = healthy();
    for (int i = 0; i < 40; i++)
        of(inventory, 3).push_back(element("e" + std::to_string(i) + " Fw: x - FAILED", 6, 30));
    const std::string line = summarize(inventory).line();
    EXPECT_NE(line.find("40 drives failed: e0, e1, e2, e3, e4 and 35 more |"), std::string::npos)
        << line;
}

TEST(CheckSummary, LongNamesAreCutBetweenCharacters) {
    Inventory inventory = healthy();
    std::string name = "x";
    for (int i = 0; i < 100; i++) name += "\xc3\xa4";
    of(inventory, 5)[0] = element(name, 6, 30);
    const std::string line = summarize(inventory).line();
    EXPECT_NE(line.find("1 battery error: " + name.substr(0, 119) + "... |"), std::string::npos)
        << line;
}

TEST(CheckSummary, TextsOfVendorsStayInTheLine) {
    Inventory inventory = healthy();
    of(inventory, 5)[0] = element("a\nb|c\x1b[31m", 6, 30);
    const std::string line = summarize(inventory).line();
    EXPECT_NE(line.find("1 battery error: a?b/c?[31m |"), std::string::npos) << line;
    EXPECT_EQ(std::count(line.begin(), line.end(), '|'), 1);
}

TEST(CheckSummary, NothingFoundIsUnknown) {
    Inventory inventory;
    EXPECT_EQ(summarize(inventory).line(), "PLEXOR UNKNOWN - nothing to judge");
    inventory = {answer("Controller", {}), answer("StorageVolume", {}), answer("Battery", {})};
    EXPECT_EQ(summarize(inventory).status, 3);
    EXPECT_EQ(summarize(inventory).line(),
              "PLEXOR UNKNOWN - no controllers"
              " | controllers=0 volumes=0 batteries=0 warning=0 critical=0");
    of(inventory, 0).push_back(element("Controller C0 (M)", 2, 5));
    EXPECT_EQ(summarize(inventory).status, 3);
    EXPECT_EQ(summarize(inventory).line().find("PLEXOR UNKNOWN - 1 controller, but no devices |"),
              0u);
    of(inventory, 2).push_back(element("b", 2, 5));
    EXPECT_EQ(summarize(inventory).status, 0);
}

TEST(CheckSummary, OneClassCanBeChecked) {
    EXPECT_EQ(summarize({answer("Controller", {element("c", 2, 5)})}).status, 0);
    EXPECT_EQ(summarize({answer("Battery", {element("b", 2, 5)})}).status, 0);
    EXPECT_EQ(summarize({answer("Battery", {element("b", 6, 30)})}).status, 2);
    const CheckSummary summary = summarize({answer("StorageVolume", {})});
    EXPECT_EQ(summary.status, 3);
    EXPECT_EQ(summary.line(), "PLEXOR UNKNOWN - no volumes | volumes=0 warning=0 critical=0");
}

TEST(CheckSummary, ErrorsAreUnknownUnlessItIsCriticalAlready) {
    Inventory inventory = healthy();
    inventory[5].response.rc = CMPI_RC_ERR_INVALID_CLASS;
    inventory[5].response.message = "no such\nclass";
    inventory[5].response.instances.clear();
    CheckSummary summary = summarize(inventory);
    EXPECT_EQ(summary.status, 3);
    EXPECT_EQ(summary.line().find("PLEXOR UNKNOWN - Tovexa_PlexorBattery answered with status 5 "
                                  "(no such?class) | "),
              0u)
        << summary.line();
    of(inventory, 3)[0] = element("d0 - REBUILD", 2, 5);
    EXPECT_EQ(summarize(inventory).status, 3);
    of(inventory, 3)[0] = element("d0 - FAILED", 6, 30);
    summary = summarize(inventory);
    EXPECT_EQ(summary.status, 2);
    EXPECT_NE(summary.line().find("failed: d0; Tovexa_PlexorBattery answered with status 5"),
              std::string::npos)
        << summary.line();
}

TEST(CheckSummary, AnswersThatBreakOffAreUnknownUnlessItIsCriticalAlready) {
    Inventory inventory = healthy();
    inventory.resize(3);
    EXPECT_EQ(summarize(inventory, {"h:1: no answer in time"}).status, 3);
    EXPECT_EQ(summarize(inventory, {"h:1: no answer in time"}).line(),
              "PLEXOR UNKNOWN - h:1: no answer in time"
              " | controllers=1 volumes=2 warning=0 critical=0");
    of(inventory, 2)[0] = element("v0 - OFFLINE", 6, 30);
    EXPECT_EQ(summarize(inventory, {"h:1: no answer in time"}).status, 2);
}

TEST(CheckSummary, MissingElementsAreCritical) {
    Inventory inventory = healthy();
    EXPECT_EQ(
        summarize(inventory, CheckTerms{"", {{"volumes", 2}, {"drives", 1}, {"batteries", 1}}})
            .status,
        0);
    const CheckSummary summary =
        summarize(inventory, CheckTerms{"", {{"volumes", 4}, {"drives", 9}}});
    EXPECT_EQ(summary.status, 2);
    EXPECT_EQ(summary.line().find("PLEXOR CRITICAL - only 2 of 4 volumes; only 1 of 9 drives | "),
              0u)
        << summary.line();
    of(inventory, 5)[0] = element("b0", 3, 0);
    EXPECT_EQ(summarize(inventory, CheckTerms{"", {{"ports", 2}}})
                  .line()
                  .find("PLEXOR CRITICAL - only 1 of 2 ports; 1 battery degraded: b0 |"),
              0u);
}

TEST(CheckSummary, WhatIsNotKnownIsNotMissing) {
    const CheckTerms terms{"", {{"drives", 9}, {"batteries", 2}}};
    Inventory inventory = healthy();
    of(inventory, 3).resize(9, of(inventory, 3)[0]);
    inventory[5].response.rc = CMPI_RC_ERR_FAILED;
    EXPECT_EQ(summarize(inventory, terms).status, 3) << "a class that was answered with an error";
    inventory.resize(5);
    EXPECT_EQ(summarize(inventory, {"late", terms.expected}).status, 3) << "a class not answered";
    for (int i = 2; i < 5; i++) of(inventory, i).clear();
    EXPECT_EQ(summarize(inventory, terms).status, 3) << "an inventory that has just begun";
}

TEST(CheckSummary, UnknownHasAReason) {
    const CheckSummary summary = unknownSummary("because\n|");
    EXPECT_EQ(summary.status, 3);
    EXPECT_EQ(summary.line(), "PLEXOR UNKNOWN - because?/");
}

}  // namespace
}  // namespace testbed
