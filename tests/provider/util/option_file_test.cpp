// The file that stands in for the host's option store.
#include <NodecfgAdvancedIntegerOption.h>
#include <OptionFile.h>

#include <gtest/gtest.h>
#include <stdlib.h>
#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <stdexcept>
#include <string>

namespace plexortest {
namespace {

using hostconfig::FindInFile;
using hostconfig::TextOption;
using Kerncfg::Adv::AdvancedOption;
using Kerncfg::Adv::AdvancedOptionImpl;
using Nodecfg::Adv::AdvancedIntegerOption;

class OptionFile : public ::testing::Test {
protected:
    void SetUp() override {
        file = std::filesystem::temp_directory_path() / ("option-file-" + std::to_string(getpid()));
    }
    void TearDown() override {
        std::filesystem::remove(file);
        unsetenv("PLEXOR_HOSTCONFIG_FILE");
    }

    void write(const std::string& lines) { std::ofstream(file, std::ios::binary) << lines; }
    std::unique_ptr<AdvancedOption> find(const std::string& path) { return FindInFile(file, path); }

    /// Expects the option to be a number in use.
    void expectNumber(const std::string& path, int value) {
        const auto option = find(path);
        const auto* integer = dynamic_cast<AdvancedIntegerOption*>(option.get());
        ASSERT_NE(integer, nullptr) << path;
        EXPECT_FALSE(integer->IsDefault());
        EXPECT_EQ(integer->GetValue(), value);
    }
    void expectText(const std::string& path, const std::string& value) {
        const auto option = find(path);
        const auto* text = dynamic_cast<TextOption*>(option.get());
        ASSERT_NE(text, nullptr) << path;
        EXPECT_FALSE(text->IsDefault());
        EXPECT_EQ(text->GetValue(), value);
        EXPECT_EQ(dynamic_cast<AdvancedIntegerOption*>(option.get()), nullptr);
    }

    std::string file;
};

TEST_F(OptionFile, HoldsNumbers) {
    write("/A=5\n/B = -12\n/C\t=\t+7\n/D=007\n/E=0\n");
    expectNumber("/A", 5);
    expectNumber("/B", -12);
    expectNumber("/C", 7);
    expectNumber("/D", 7);
    expectNumber("/E", 0);
}

TEST_F(OptionFile, HoldsNumbersAtTheirDefault) {
    write("/A = default\n");
    const auto option = find("/A");
    ASSERT_NE(dynamic_cast<AdvancedIntegerOption*>(option.get()), nullptr);
    EXPECT_TRUE(option->IsDefault());
}

TEST_F(OptionFile, HoldsTexts) {
    write("/A = on\n/B = 5 s\n/C = -\n/D = a=b\n/E =\n/F = 0x10\n/G = Default\n/H = 5-\n");
    expectText("/A", "on");
    expectText("/B", "5 s");
    expectText("/C", "-");
    expectText("/D", "a=b");
    expectText("/E", "");
    expectText("/F", "0x10");
    expectText("/G", "Default");
    expectText("/H", "5-");
}

TEST_F(OptionFile, LastLineForAPathCounts) {
    write("/A = 1\n/B = 2\n/A = 3\n");
    expectNumber("/A", 3);
    write("/A = 1\n/A = text\n");
    expectText("/A", "text");
}

TEST_F(OptionFile, CommentsAndOtherLinesAreSkipped) {
    write("\n# /A = 1\n   # /A = 2\nno equals sign\n   \n  /A = 4  \n");
    expectNumber("/A", 4);
}

TEST_F(OptionFile, LastLineNeedsNoLineEnd) {
    write("/A = 4");
    expectNumber("/A", 4);
}

TEST_F(OptionFile, CarriageReturnsAreBlanks) {
    write("/A = 4\r\n/B = default\r\n");
    expectNumber("/A", 4);
    EXPECT_TRUE(find("/B")->IsDefault());
}

TEST_F(OptionFile, PathsAreComparedExactly) {
    write("/UserVars/Option = 4\n");
    EXPECT_EQ(find("/UserVars/option"), nullptr);
    EXPECT_EQ(find("/UserVars/Option2"), nullptr);
    EXPECT_EQ(find("/UserVars"), nullptr);
    EXPECT_EQ(find(""), nullptr);
    EXPECT_NE(find("/UserVars/Option"), nullptr);
}

TEST_F(OptionFile, EmptyAndMissingFilesHaveNoOptions) {
    EXPECT_EQ(find("/A"), nullptr);
    write("");
    EXPECT_EQ(find("/A"), nullptr);
}

TEST_F(OptionFile, NumberBeyondAnIntIsAnError) {
    write("/A = 2147483648\n/B = -2147483649\n/C = 2147483647\n/D = -2147483648\n");
    EXPECT_THROW(find("/A"), std::out_of_range);
    EXPECT_THROW(find("/B"), std::out_of_range);
    expectNumber("/C", 2147483647);
    expectNumber("/D", -2147483647 - 1);
}

TEST_F(OptionFile, FileThatCannotBeReadIsAnError) {
    EXPECT_THROW(FindInFile("/", "/A"), std::runtime_error);
    write("/A = 4\n");
    EXPECT_THROW(FindInFile(file + "/below-a-file", "/A"), std::runtime_error);
}

TEST_F(OptionFile, EnvironmentNamesTheFile) {
    write("/A = 4\n");
    setenv("PLEXOR_HOSTCONFIG_FILE", file.c_str(), 1);
    const auto option = AdvancedOptionImpl::FindOption("/A");
    const auto* integer = dynamic_cast<AdvancedIntegerOption*>(option.get());
    ASSERT_NE(integer, nullptr);
    EXPECT_EQ(integer->GetValue(), 4);
    EXPECT_EQ(AdvancedOptionImpl::FindOption("/B"), nullptr);
}

TEST_F(OptionFile, WithoutTheEnvironmentTheDefaultFileCounts) {
    EXPECT_STREQ(hostconfig::kDefaultFile, "/etc/plexor/hostconfig");
    write("/OnlyInTheTestsFile = 4\n");
    setenv("PLEXOR_HOSTCONFIG_FILE", file.c_str(), 1);
    ASSERT_NE(AdvancedOptionImpl::FindOption("/OnlyInTheTestsFile"), nullptr);
    unsetenv("PLEXOR_HOSTCONFIG_FILE");
    EXPECT_EQ(AdvancedOptionImpl::FindOption("/OnlyInTheTestsFile"), nullptr);
}

// None of these may hold up the manager that is loading the provider.

TEST_F(OptionFile, ANamedPipeIsNotWaitedFor) {
    ASSERT_EQ(mkfifo(file.c_str(), 0600), 0);
    EXPECT_THROW(find("/A"), std::runtime_error);
}

TEST_F(OptionFile, ADirectoryIsNoFile) {
    EXPECT_THROW(FindInFile("/", "/A"), std::runtime_error);
}

TEST_F(OptionFile, WhatHasNoEndIsNotRead) {
    EXPECT_THROW(FindInFile("/dev/zero", "/A"), std::runtime_error);
}

TEST_F(OptionFile, HoldsUpTo64Kibibytes) {
    const std::string line = "/A=5\n";
    write(line + std::string(65536 - line.size(), '\n'));
    expectNumber("/A", 5);
    write(line + std::string(65537 - line.size(), '\n'));
    EXPECT_THROW(find("/A"), std::runtime_error);
}

}  // namespace
}  // namespace plexortest
