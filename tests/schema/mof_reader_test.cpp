// Files and their includes.
#include "mof_reader.h"

#include <sys/stat.h>

#include "mof_error.h"
#include "scratch_directory.h"

namespace testbed {
namespace {

class MofFiles : public ::testing::Test {
protected:
    MofDocument read(const std::string& name) { return readMof(scratch_.path() / name); }
    std::string complaint(const std::string& name) {
        try {
            read(name);
        } catch (const MofError& error) {
            return error.what();
        }
        return "";
    }
    std::string inScratch(const std::string& name) { return (scratch_.path() / name).string(); }

    ScratchDirectory scratch_;
};

TEST_F(MofFiles, IncludesAreReadWhereTheyStand) {
    scratch_.write("top.mof",
                   "class A {}; #pragma include (\"sub/b.mof\")\n#pragma locale (\"en_US\")\n"
                   "class D {};");
    scratch_.write("sub/b.mof", "class B {}; #pragma include (\"../c.mof\")");
    scratch_.write("c.mof", "class C {};");
    std::string names;
    for (const ClassDefinition& definition : read("top.mof").classes) names += definition.name;
    EXPECT_EQ(names, "ABCD");
}

TEST_F(MofFiles, AFileMayBeIncludedTwiceButNotInItself) {
    scratch_.write("twice.mof", "#pragma include (\"none.mof\")\n#pragma include (\"none.mof\")");
    scratch_.write("none.mof", "");
    EXPECT_EQ(complaint("twice.mof"), "");
    scratch_.write("self.mof", "\n#pragma include (\"back.mof\")");
    scratch_.write("back.mof", "#pragma include (\"./self.mof\")");
    EXPECT_EQ(complaint("self.mof"),
              inScratch("back.mof") + ":1: " + inScratch("self.mof") + " includes itself");
}

TEST_F(MofFiles, WhatIsMissingIsNamedWithTheLine) {
    scratch_.write("top.mof", "\n\n#pragma include (\"gone.mof\")");
    EXPECT_EQ(complaint("top.mof"),
              inScratch("top.mof") + ":3: cannot read " + inScratch("gone.mof"));
    EXPECT_EQ(complaint("gone.mof"),
              inScratch("gone.mof") + ":1: cannot read " + inScratch("gone.mof"));
}

TEST_F(MofFiles, OnlyFilesOfBearableSizeAreRead) {
    std::filesystem::create_directory(scratch_.path() / "folder.mof");
    EXPECT_NE(complaint("folder.mof"), "");
    ASSERT_EQ(mkfifo(inScratch("pipe.mof").c_str(), 0600), 0);
    EXPECT_NE(complaint("pipe.mof"), "");
    scratch_.write("huge.mof", "");
    std::filesystem::resize_file(scratch_.path() / "huge.mof", 17 * 1024 * 1024);
    EXPECT_NE(complaint("huge.mof").find("cannot read"), std::string::npos);
}

TEST_F(MofFiles, AChainOfIncludesIsBounded) {
    for (int i = 0; i < 40; ++i)
        scratch_.write(std::to_string(i) + ".mof",
                       "#pragma include (\"" + std::to_string(i + 1) + ".mof\")");
    scratch_.write("40.mof", "");
    EXPECT_NE(complaint("0.mof").find("too many included files"), std::string::npos);
    EXPECT_EQ(complaint("20.mof"), "");
}

TEST_F(MofFiles, AnErrorInAnIncludeNamesThatFile) {
    scratch_.write("top.mof", "#pragma include (\"bad.mof\")");
    scratch_.write("bad.mof", "\nclass");
    EXPECT_EQ(complaint("top.mof").find(inScratch("bad.mof") + ":2: "), 0u);
}

}  // namespace
}  // namespace testbed
