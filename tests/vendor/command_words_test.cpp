#include <gtest/gtest.h>

#include "command_words.h"
#include "scenario.h"

namespace testbed {
namespace {

using nlohmann::json;

std::string commandError(const std::string& command) {
    try {
        commandWords(command);
    } catch (const ScenarioError& error) {
        return error.what();
    }
    return "no error";
}

json valueOf(const std::string& word) {
    const auto words = commandWords(word);
    EXPECT_EQ(words.size(), 1u) << word;
    EXPECT_EQ(words.at(0).name, "a") << word;
    return words.at(0).value;
}

TEST(CommandWords, PlainValuesAreWhatTheyLookLike) {
    EXPECT_EQ(valueOf("a=5"), json(5));
    EXPECT_EQ(valueOf("a=-5"), json(-5));
    EXPECT_EQ(valueOf("a=true"), json(true));
    EXPECT_EQ(valueOf("a=null"), json(nullptr));
    EXPECT_EQ(valueOf("a=failed"), json("failed"));
    EXPECT_EQ(valueOf("a=32_1"), json("32_1"));
    EXPECT_EQ(valueOf("a=b=c"), json("b=c"));
    EXPECT_EQ(valueOf("a="), json(""));
    EXPECT_EQ(valueOf("a=1e999"), json("1e999"));
}

TEST(CommandWords, QuotedValuesAreTexts) {
    EXPECT_EQ(valueOf(R"(a="hot spare")"), json("hot spare"));
    EXPECT_EQ(valueOf(R"(a="5")"), json("5"));
    EXPECT_EQ(valueOf(R"(a="say \"so\"")"), json("say \"so\""));
    EXPECT_EQ(valueOf(R"("a=hot spare")"), json("hot spare"));
}

TEST(CommandWords, JsonKeepsItsStrings) {
    EXPECT_EQ(valueOf(R"(a=["x y", "z]"])"), json({"x y", "z]"}));
    EXPECT_EQ(valueOf(R"(a={"type": "string", "value": "a}b"})"),
              json({{"type", "string"}, {"value", "a}b"}}));
}

TEST(CommandWords, WordsFollowEachOther) {
    const auto words = commandWords("  set drive\tC0 \"my id\" a=[1, 2] b=\"x\" \r");
    ASSERT_EQ(words.size(), 6u);
    EXPECT_EQ(words[3].text, "my id");
    EXPECT_EQ(words[4].value, json({1, 2}));
    EXPECT_EQ(words[5].name, "b");
    EXPECT_TRUE(commandWords("").empty());
}

TEST(CommandWords, WhatIsOpenIsRefused) {
    EXPECT_EQ(commandError("a=\"x"), "command: a quotation mark is missing");
    EXPECT_EQ(commandError("a=[1, 2"), "command: a bracket is missing");
    EXPECT_EQ(commandError("a=\"x\"y"), "command: a blank is missing behind \"x\"");
    EXPECT_EQ(commandError("a=[oops]"), "command: line 1, column 2: not valid JSON");
    EXPECT_EQ(commandError("a=[1e999]"), "command: line 1, column 7: the number is too large");
    EXPECT_NE(commandError("a=" + std::string(200000, '[')).find("a bracket is missing"),
              std::string::npos);
    EXPECT_NE(commandError("a=" + std::string(200000, '[') + std::string(200000, ']'))
                  .find("nested deeper than 64 levels"),
              std::string::npos);
}

TEST(CommandWords, QuotedWordsStandForTheirText) {
    for (const char* text : {"C0", "a b", "a\"b", "a\\b", ""})
        EXPECT_EQ(commandWords(quotedWord(text)).at(0).text, text);
}

}  // namespace
}  // namespace testbed
