// Composing keys: prefix, identifiers, the cut at 255 characters, the copy on the heap.
#include <stdlib.h>

#include <memory>
#include <string>

#include "PlexorProviderIfc.h"
#include "provider_fixture.h"

namespace {

using plexortest::Allocator;
using plexortest::CapturedSyslog;
using plexortest::FailAllocation;
using plexortest::LogLine;

using OwnedText = std::unique_ptr<char, decltype(&free)>;

OwnedText deviceId(const std::string& id, const std::string& prefix) {
    return {MakeDeviceID(id.c_str(), prefix.c_str()), free};
}

OwnedText logicalDeviceId(const std::string& ctrl, const std::string& device,
                          const std::string& prefix) {
    return {MakeLogicalDeviceID(ctrl.c_str(), device.c_str(), prefix.c_str()), free};
}

class KeysComposeTest : public plexortest::ProviderTest {};

TEST_F(KeysComposeTest, DeviceIdIsPrefixThenIdentifier) {
    EXPECT_STREQ(deviceId("C0", "tvxController").get(), "tvxControllerC0");
    EXPECT_STREQ(deviceId("C0", "tovexa:ControllerSoftware").get(), "tovexa:ControllerSoftwareC0");
    EXPECT_STREQ(deviceId("", "tvxController").get(), "tvxController");
    EXPECT_STREQ(deviceId("%s%n", "tvxController").get(), "tvxController%s%n");
}

TEST_F(KeysComposeTest, LogicalDeviceIdJoinsControllerAndDeviceWithAnUnderscore) {
    EXPECT_STREQ(logicalDeviceId("12", "5", "tvxStorageVolume").get(), "tvxStorageVolume12_5");
    EXPECT_STREQ(logicalDeviceId("12", "5", "tvxStorageExt").get(), "tvxStorageExt12_5");
    EXPECT_STREQ(logicalDeviceId("AB", "C_D", "tvxPort").get(), "tvxPortAB_C_D");
    EXPECT_STREQ(logicalDeviceId("", "", "tvxControllerBattery").get(), "tvxControllerBattery_");
}

TEST_F(KeysComposeTest, DeviceIdIsCutAt255Characters) {
    const std::string prefix = "tvxController";  // 13 characters
    EXPECT_EQ(deviceId(std::string(241, 'a'), prefix).get(), prefix + std::string(241, 'a'));
    EXPECT_EQ(deviceId(std::string(242, 'a'), prefix).get(), prefix + std::string(242, 'a'));
    EXPECT_EQ(deviceId(std::string(243, 'a'), prefix).get(), prefix + std::string(242, 'a'));
    EXPECT_EQ(deviceId(std::string(9000, 'a'), prefix).get(), prefix + std::string(242, 'a'));
}

TEST_F(KeysComposeTest, LogicalDeviceIdIsCutAt255Characters) {
    const std::string prefix = "tvxPort";  // 7 characters, then 100 and the underscore: 108
    const std::string ctrl(100, 'c');
    const std::string full = prefix + ctrl + "_" + std::string(147, 'd');
    EXPECT_EQ(logicalDeviceId(ctrl, std::string(147, 'd'), prefix).get(), full);
    EXPECT_EQ(logicalDeviceId(ctrl, std::string(148, 'd'), prefix).get(), full);
    // The cut may take the device and the underscore altogether.
    EXPECT_EQ(logicalDeviceId(std::string(400, 'c'), "d", prefix).get(),
              prefix + std::string(248, 'c'));
}

TEST_F(KeysComposeTest, EachResultIsAHeapBlockOfItsOwn) {
    const OwnedText first = deviceId("C0", "tvxController");
    const OwnedText second = deviceId("C0", "tvxController");
    EXPECT_NE(first.get(), second.get());
    EXPECT_STREQ(first.get(), second.get());
}

TEST_F(KeysComposeTest, ComposingLogsNothing) {
    deviceId("C0", "tvxController");
    logicalDeviceId("12", "5", "tvxPort");
    EXPECT_EQ(CapturedSyslog::lines(), std::vector<LogLine>{});
}

TEST_F(KeysComposeTest, FailedCopyOfADeviceIdIsLoggedAndGivesNull) {
    const auto fault = FailAllocation::nth(1, Allocator::Strdup);
    EXPECT_EQ(deviceId("C0", "tvxController").get(), nullptr);
    EXPECT_EQ(CapturedSyslog::lines(),
              (std::vector<LogLine>{
                  {LOG_WARNING, "strdup() failed to duplicate string tvxControllerC0\n"}}));
}

TEST_F(KeysComposeTest, FailedCopyOfALogicalDeviceIdIsLoggedAndGivesNull) {
    const auto fault = FailAllocation::nth(1, Allocator::Strdup);
    EXPECT_EQ(logicalDeviceId("AB", "C_D", "tvxPort").get(), nullptr);
    EXPECT_EQ(CapturedSyslog::lines(),
              (std::vector<LogLine>{
                  {LOG_WARNING, "strdup() failed to duplicate string tvxPortAB_C_D\n"}}));
}

TEST_F(KeysComposeTest, FailedCopyOfACutKeyLogsTheCutKey) {
    const auto fault = FailAllocation::nth(1, Allocator::Strdup);
    EXPECT_EQ(deviceId(std::string(300, 'a'), "tvxController").get(), nullptr);
    EXPECT_TRUE(plexortest::logged(
        LOG_WARNING,
        "strdup() failed to duplicate string tvxController" + std::string(242, 'a') + "\n"));
}

TEST_F(KeysComposeTest, StringCloneCopiesToTheHeap) {
    const char original[] = "a text";
    const OwnedText copy(StringClone(original), free);
    EXPECT_NE(copy.get(), original);
    EXPECT_STREQ(copy.get(), "a text");
    const OwnedText empty(StringClone(""), free);
    EXPECT_STREQ(empty.get(), "");
    EXPECT_EQ(CapturedSyslog::lines(), std::vector<LogLine>{});
}

TEST_F(KeysComposeTest, StringCloneOfNullIsNullAndCallsNothing) {
    const auto fault = FailAllocation::none();
    EXPECT_EQ(StringClone(nullptr), nullptr);
    EXPECT_EQ(fault.calls(), 0u);
    EXPECT_EQ(CapturedSyslog::lines(), std::vector<LogLine>{});
}

TEST_F(KeysComposeTest, StringCloneThatFailsIsLoggedAndGivesNull) {
    const auto fault = FailAllocation::nth(1, Allocator::Strdup);
    EXPECT_EQ(StringClone("a text"), nullptr);
    EXPECT_EQ(
        CapturedSyslog::lines(),
        (std::vector<LogLine>{{LOG_WARNING, "strdup() failed to duplicate string a text\n"}}));
}

}  // namespace
