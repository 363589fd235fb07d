// Words, signs and commands of the page.
#include <gtest/gtest.h>

#include <nlohmann/json.hpp>

#include "array_commands.h"
#include "element_views.h"
#include "page_commands.h"
#include "page_files.h"
#include "simulated_array.h"

namespace testbed {
namespace {

TEST(PageWords, Sizes) {
    EXPECT_EQ(sizeText(0), "0 bytes");
    EXPECT_EQ(sizeText(512), "512 bytes");
    EXPECT_EQ(sizeText(1'800'000'000'000), "1.8 TB");
    EXPECT_EQ(sizeText(12'000'000'000'000), "12 TB");
    EXPECT_EQ(sizeText(999'999'999'999), "1 TB");
    EXPECT_EQ(sizeText(~0ull), "18 EB");
}

TEST(PageWords, Durations) {
    EXPECT_EQ(durationText(0), "0 s");
    EXPECT_EQ(durationText(34.2), "35 s");
    EXPECT_EQ(durationText(120), "2 min");
    EXPECT_EQ(durationText(3725), "1 h 2 min");
}

TEST(PageWords, EveryLookButNoneHasASignOfItsOwn) {
    std::set<std::string> signs;
    const auto looks = looksAsJson();
    for (const auto& look : looks) signs.insert(look["sign"].get<std::string>());
    EXPECT_EQ(signs.size(), looks.size());
}

/// Every state that the check's table has looks like its level, or like one thing of that level.
TEST(PageWords, StatesHaveTheLevelOfTheTable) {
    for (const StateRule& rule : stateRules()) {
        Instance instance;
        instance.path = {"root/cimv2", rule.className, {}};
        instance.set("ElementName", CimValue::string(std::string("x - ") + rule.word));
        instance.set("OperationalStatus", CimValue::uint16(rule.operationalStatus.value_or(99)));
        instance.set("HealthState", CimValue::uint16(rule.healthState));
        const ElementState state = stateOf(rule.className, instance, {});
        EXPECT_EQ(state.level, levelName(rule.level)) << rule.className << " " << rule.word;
        EXPECT_FALSE(state.word.empty()) << rule.className << " " << rule.word;
        EXPECT_FALSE(state.sign.empty()) << rule.className << " " << rule.word;
        EXPECT_EQ(state.look == "critical", rule.level == CheckLevel::Critical) << rule.word;
    }
}

TEST(PageWords, ButtonsSendCommandsThatThereAre) {
    const auto commands = commandsAsJson();
    std::size_t count = 0;
    for (const auto& [kind, lists] : commands.items())
        for (const auto& list : lists)
            for (const auto& entry : list) {
                std::string command = entry["command"];
                if (const auto at = command.find("{}"); at != std::string::npos)
                    command.replace(at, 2, "C0 1");
                EXPECT_TRUE(isForPages(command)) << command;
                EXPECT_FALSE(entry["help"].get<std::string>().empty()) << command;
                count++;
            }
    EXPECT_GT(count, 50u);
}

TEST(PageWords, SomeCommandsAreNotForPages) {
    for (const char* command : {"quit", "save /etc/passwd", "show", "help", "wait 5", " quit",
                                "\"save\" x", "dance", "", "\tsave x"})
        EXPECT_FALSE(isForPages(command)) << command;
    for (const char* command :
         {"set drive C0 1 slot=4", "server http=503", "clear server", "pause"})
        EXPECT_TRUE(isForPages(command)) << command;
}

TEST(PageWords, FilesAreSmall) {
    std::size_t size = 0;
    for (const PageFile& file : pageFiles()) {
        size += file.content.size();
        EXPECT_GT(file.content.size(), 100u) << file.target;
        EXPECT_EQ(file.content.find("://"), file.content.find("://www.w3.org/2000/svg"))
            << file.target << " loads something from elsewhere";
    }
    EXPECT_LT(size, 100u * 1024);
}

}  // namespace
}  // namespace testbed
