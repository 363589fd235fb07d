// The polling interval from options of the test's own: what is asked of an option, in which order,
// and options that throw.
#include <functional>
#include <stdexcept>

#include "KerncfgAdvancedOption.h"
#include "NodecfgAdvancedIntegerOption.h"
#include "provider_fixture.h"

namespace {

using Kerncfg::Adv::AdvancedOption;
using Found = std::unique_ptr<AdvancedOption>;

/// What the provider's look-up finds instead of the store's option.
std::function<Found()> standIn;

}  // namespace

// The linker puts the first in front of the second for the provider's objects and these tests.
Found findStandIn(const std::string& path) __asm__(
    "__wrap__ZN7Kerncfg3Adv18AdvancedOptionImpl10FindOptionERKNSt7__cxx1112basic_"
    "stringIcSt11char_traitsIcESaIcEEE");
Found findInStore(const std::string& path) __asm__(
    "__real__ZN7Kerncfg3Adv18AdvancedOptionImpl10FindOptionERKNSt7__cxx1112basic_"
    "stringIcSt11char_traitsIcESaIcEEE");

Found findStandIn(const std::string& path) {
    return standIn ? standIn() : findInStore(path);
}

namespace plexortest {
namespace {

using Questions = std::vector<std::string>;

/// An option that is no number; notes what it is asked.
class AskedTextOption : public AdvancedOption {
public:
    AskedTextOption(Questions& asked, std::function<bool()> isDefault)
        : asked_(asked), isDefault_(std::move(isDefault)) {}
    bool IsDefault() const override {
        asked_.push_back("state");
        return isDefault_();
    }

private:
    Questions& asked_;
    std::function<bool()> isDefault_;
};

/// One whose value is 45.
class AskedNumberOption : public Nodecfg::Adv::AdvancedIntegerOption {
public:
    AskedNumberOption(Questions& asked, std::function<bool()> isDefault)
        : AdvancedIntegerOption(45, false), asked_(asked), isDefault_(std::move(isDefault)) {}
    bool IsDefault() const override {
        asked_.push_back("state");
        return isDefault_();
    }
    int GetValue() const override {
        asked_.push_back("value");
        return AdvancedIntegerOption::GetValue();
    }

private:
    Questions& asked_;
    std::function<bool()> isDefault_;
};

class PollingOption : public ProviderTest {
protected:
    void TearDown() override {
        standIn = nullptr;
        ProviderTest::TearDown();
    }
    template <class Option>
    void provide(std::function<bool()> isDefault) {
        standIn = [this, isDefault] { return std::make_unique<Option>(asked_, isDefault); };
    }

    Questions asked_;
};

TEST_F(PollingOption, IsAskedForItsStateAndThenItsValue) {
    provide<AskedNumberOption>([] { return false; });
    EXPECT_EQ(GetSampelInterval(), 45);
    EXPECT_EQ(asked_, (Questions{"state", "value"}));
}

TEST_F(PollingOption, AtItsDefaultIsNotAskedForItsValue) {
    provide<AskedNumberOption>([] { return true; });
    EXPECT_EQ(GetSampelInterval(), 20);
    EXPECT_EQ(asked_, Questions{"state"});
}

TEST_F(PollingOption, IsAskedForItsStateBeforeItsTypeIsLookedAt) {
    provide<AskedTextOption>([] { return false; });
    EXPECT_EQ(GetSampelInterval(), 20);
    EXPECT_EQ(asked_, Questions{"state"});
}

TEST_F(PollingOption, WhoseStateCannotBeToldCountsAsTwenty) {
    provide<AskedNumberOption>([]() -> bool { throw std::runtime_error("no state"); });
    EXPECT_EQ(GetSampelInterval(), 20);
    provide<AskedTextOption>([]() -> bool { throw 7; });
    EXPECT_EQ(GetSampelInterval(), 20);
    EXPECT_EQ(asked_, (Questions{"state", "state"}));
    EXPECT_TRUE(CapturedSyslog::lines().empty());
}

TEST_F(PollingOption, WhoseLookUpThrowsCountsAsTwenty) {
    standIn = []() -> Found { throw 7; };
    EXPECT_EQ(GetSampelInterval(), 20);
    EXPECT_TRUE(CapturedSyslog::lines().empty());
}

// A manager may cancel a thread of the provider's, or end it, wherever it is.
TEST_F(PollingOption, AThreadThatEndsInTheStoreEnds) {
    int reached = 0;
    standIn = [&reached]() -> Found {
        reached++;
        pthread_exit(&reached);
    };
    pthread_t thread;
    ASSERT_EQ(pthread_create(
                  &thread, nullptr,
                  [](void*) -> void* {
                      GetSampelInterval();
                      return nullptr;
                  },
                  nullptr),
              0);
    void* result = nullptr;
    ASSERT_EQ(pthread_join(thread, &result), 0);
    EXPECT_EQ(result, &reached);
}

}  // namespace
}  // namespace plexortest
