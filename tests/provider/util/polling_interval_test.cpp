// The polling interval, as the host's option store has it.
#include <limits.h>
#include <stdlib.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <string>

#include "provider_fixture.h"

namespace plexortest {
namespace {

constexpr char kOption[] = "/UserVars/CIMtvx_plexorProviderPollingInterval";

class PollingInterval : public ProviderTest {
protected:
    void SetUp() override {
        ProviderTest::SetUp();
        file_ = std::filesystem::temp_directory_path() /
                ("polling-interval-" + std::to_string(getpid()));
        useFile(file_);
    }
    void TearDown() override {
        std::filesystem::remove(file_);
        ProviderTest::TearDown();
    }

    static void useFile(const std::string& file) {
        setenv("PLEXOR_HOSTCONFIG_FILE", file.c_str(), 1);
    }
    /// Fills the store with these lines.
    void store(const std::string& lines) { std::ofstream(file_) << lines; }
    void storeValue(const std::string& value) {
        store(std::string(kOption) + " = " + value + "\n");
    }
    const std::string& file() const { return file_; }

    const std::vector<LogLine> kNotFound = {
        {LOG_ERR, "GetSampelInterval: /UserVars/CIMtvx_plexorProviderPollingInterval not found"}};
    const std::vector<LogLine> kNothing = {};

private:
    std::string file_;
};

TEST_F(PollingInterval, IsTheOptionsValue) {
    storeValue("45");
    EXPECT_EQ(GetSampelInterval(), 45);
    EXPECT_EQ(CapturedSyslog::lines(), kNothing);
}

TEST_F(PollingInterval, HasNoBounds) {
    for (const int seconds : {0, 1, -1, -300, INT_MAX, INT_MIN}) {
        storeValue(std::to_string(seconds));
        EXPECT_EQ(GetSampelInterval(), seconds);
    }
    EXPECT_EQ(CapturedSyslog::lines(), kNothing);
}

TEST_F(PollingInterval, IsReadAnewEachTime) {
    storeValue("30");
    EXPECT_EQ(GetSampelInterval(), 30);
    storeValue("31");
    EXPECT_EQ(GetSampelInterval(), 31);
}

TEST_F(PollingInterval, IsTwentyWithoutTheOption) {
    store("/UserVars/Other = 7\n");
    EXPECT_EQ(GetSampelInterval(), 20);
    EXPECT_EQ(CapturedSyslog::lines(), kNotFound);
}

TEST_F(PollingInterval, IsTwentyWithoutAStore) {
    EXPECT_EQ(GetSampelInterval(), 20);
    EXPECT_EQ(CapturedSyslog::lines(), kNotFound);
}

TEST_F(PollingInterval, IsTwentyForAnOptionAtItsDefault) {
    storeValue("default");
    EXPECT_EQ(GetSampelInterval(), 20);
    EXPECT_EQ(CapturedSyslog::lines(), kNothing);
}

TEST_F(PollingInterval, IsTwentyForAnOptionThatIsNoNumber) {
    storeValue("often");
    EXPECT_EQ(GetSampelInterval(), 20);
    EXPECT_EQ(CapturedSyslog::lines(), kNothing);
}

TEST_F(PollingInterval, IsTwentyForANumberThatIsTooLarge) {
    storeValue("99999999999999999999");
    EXPECT_EQ(GetSampelInterval(), 20);
    EXPECT_EQ(CapturedSyslog::lines(), kNothing);
}

TEST_F(PollingInterval, IsTwentyWhenTheStoreCannotBeRead) {
    storeValue("45");
    useFile(file() + "/below-a-file");
    EXPECT_EQ(GetSampelInterval(), 20);
    EXPECT_EQ(CapturedSyslog::lines(), kNothing);
}

TEST_F(PollingInterval, IsTwentyWhenTheStoreIsADirectory) {
    useFile(std::filesystem::temp_directory_path());
    EXPECT_EQ(GetSampelInterval(), 20);
    EXPECT_EQ(CapturedSyslog::lines(), kNothing);
}

}  // namespace
}  // namespace plexortest
