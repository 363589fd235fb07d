#include "colour.h"

#include <gtest/gtest.h>
#include <pty.h>
#include <stdlib.h>
#include <unistd.h>

#include "elements.h"
#include "tree_view.h"

namespace testbed {
namespace {

Instance device(const char* className, const std::string& name, std::uint16_t status,
                std::uint16_t health) {
    Instance instance = element(name, status, health);
    instance.path = {"root/cimv2", className, {}};
    instance.path.key("DeviceID", CimValue::string("x"));
    return instance;
}

TEST(Colour, TreeShowsWhatACheckWouldSay) {
    ClassAnswer drives{kDrive, {}};
    const auto add = [&](const char* name, std::uint16_t status, std::uint16_t health) {
        drives.response.instances.push_back(device(kDrive, name, status, health));
    };
    add("a - ONLINE", 2, 5);
    add("b - REBUILD", 2, 5);
    add("c\x1b[0m - FAILED", 6, 30);
    EXPECT_EQ(treeView({drives}, {.colours = true}),
              "Drives (3)\n"
              "├─ a - ONLINE\x1b[32m  [health ok, status ok]\x1b[0m\n"
              "├─ \x1b[33mb - REBUILD  [health ok, status ok]\x1b[0m\n"
              "└─ \x1b[31mc?[0m - FAILED  [health failed, status error]\x1b[0m\n");
    EXPECT_EQ(treeView({drives}).find("\x1b"), std::string::npos);
}

TEST(Colour, ControllersHaveNone) {
    ClassAnswer controllers{kController, {}};
    controllers.response.instances.push_back(device(kController, "Controller", 6, 30));
    EXPECT_EQ(treeView({controllers}, {.colours = true}),
              "Controller  [health failed, status error]\n");
}

/// Standard output is a terminal as long as it lives.
class Terminal {
public:
    Terminal() {
        int inner = -1;
        if (openpty(&outer_, &inner, nullptr, nullptr, nullptr) != 0) return;
        saved_ = dup(STDOUT_FILENO);
        dup2(inner, STDOUT_FILENO);
        close(inner);
    }
    ~Terminal() {
        if (!exists()) return;
        dup2(saved_, STDOUT_FILENO);
        close(saved_);
        close(outer_);
    }
    /// False on a system that has no pseudo terminal to give.
    bool exists() const { return outer_ >= 0; }

private:
    int outer_ = -1;
    int saved_ = -1;
};

TEST(Colour, IsForTerminalsUnlessAskedOtherwise) {
    unsetenv("NO_COLOR");
    setenv("TERM", "xterm", 1);
    const auto chosen = [](const char* when) { return ColourChoice{when}.onStandardOutput(); };
    {
        const Terminal terminal;
        if (!terminal.exists()) GTEST_SKIP() << "there are no pseudo terminals here";
        EXPECT_TRUE(chosen("auto"));
        EXPECT_TRUE(chosen("always"));
        EXPECT_FALSE(chosen("never"));
        setenv("NO_COLOR", "", 1);
        EXPECT_TRUE(chosen("auto")) << "empty counts as not set";
        setenv("NO_COLOR", "1", 1);
        EXPECT_FALSE(chosen("auto"));
        EXPECT_TRUE(chosen("always"));
        unsetenv("NO_COLOR");
        setenv("TERM", "dumb", 1);
        EXPECT_FALSE(chosen("auto"));
    }
    setenv("TERM", "xterm", 1);
    int file[2];
    ASSERT_EQ(pipe(file), 0);
    const int saved = dup(STDOUT_FILENO);
    dup2(file[1], STDOUT_FILENO);
    const bool automatic = chosen("auto");
    const bool always = chosen("always");
    dup2(saved, STDOUT_FILENO);
    for (const int descriptor : {file[0], file[1], saved}) close(descriptor);
    EXPECT_FALSE(automatic);
    EXPECT_TRUE(always);
}

}  // namespace
}  // namespace testbed
