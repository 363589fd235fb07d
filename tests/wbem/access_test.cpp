// Whom a server agrees to serve.
#include "access.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>

namespace testbed {
namespace {

class Access : public ::testing::Test {
protected:
    Access() { std::ofstream(file_) << "open-sesame\nmore\n"; }
    ~Access() override { std::filesystem::remove(file_); }

    /// "USER PASSWORD", "everybody", or why the server refuses to start.
    static std::string outcome(const AccessOptions& options) {
        try {
            const auto access = accessOf(options);
            return access ? access->user + " " + access->password : "everybody";
        } catch (const std::runtime_error& error) {
            return error.what();
        }
    }

    static AccessOptions at(const char* address, bool insecurePublic = false) {
        AccessOptions options;
        options.address = address;
        options.insecurePublic = insecurePublic;
        return options;
    }

    const std::string file_ = "/tmp/access-test." + std::to_string(getpid());
};

TEST_F(Access, EverybodyOnThisHostOnly) {
    EXPECT_EQ(outcome(AccessOptions()), "everybody");
    for (const char* address : {"127.0.0.1", "127.1.2.3", "::1", "::ffff:127.0.0.1"})
        EXPECT_EQ(outcome(at(address)), "everybody") << address;
    for (const char* address : {"0.0.0.0", "::", "192.0.2.1", "2001:db8::1", "::ffff:192.0.2.1"})
        EXPECT_EQ(outcome(at(address)), "everybody who reaches " + std::string(address) +
                                            " could ask; name a --user, or say --insecure-public");
    EXPECT_EQ(outcome(at("0.0.0.0", true)), "everybody");
    // What is no address is for the listening socket to refuse.
    EXPECT_EQ(outcome(at("nowhere")), "everybody");
}

TEST_F(Access, UserHasANameAndAPassword) {
    AccessOptions options = at("0.0.0.0");
    options.isUserGiven = true;
    options.passwordFile = file_;
    EXPECT_EQ(outcome(options), "--user has no name");
    options.user = "a:b";
    EXPECT_EQ(outcome(options), "--user: a name with a colon cannot be sent");
    options.user = "Aladdin";
    EXPECT_EQ(outcome(options), "Aladdin open-sesame");
    options.passwordFile = "/nonexistent";
    EXPECT_EQ(outcome(options), "no password in /nonexistent: No such file or directory");
}

}  // namespace
}  // namespace testbed
