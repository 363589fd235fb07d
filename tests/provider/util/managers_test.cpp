// What the provider does because managers differ, and what it leaves where they do not.
#include <unistd.h>

#include <memory>

#include "PlexorProviderCfg.h"
#include "PlexorProviderUtilLife.h"
#include "PlexorProviderUtilManager.h"
#include "beside.h"
#include "entry_fixture.h"
#include "fake_instance.h"
#include "keys_fake_path.h"
#include "refresh_fixture.h"

namespace {

using plexortest::CapturedSyslog;
using plexortest::kContextHasFlush;
using plexortest::VirtualClock;
using testbed::BrokerOptions;
using testbed::Entry;
using testbed::FaultRule;

constexpr const char* kDriveKeys[] = {"SystemCreationClassName", "SystemName", "CreationClassName",
                                      "DeviceID"};

/// A manager of the large kind, as far as instances go.
BrokerOptions withoutKeysAndChars() {
    BrokerOptions options;
    options.instancesWithoutKeys = true;
    options.refusesCharsInArrays = true;
    options.flush = testbed::FlushOffer::None;
    return options;
}

class ManagersTest : public plexortest::EntryTest {
protected:
    explicit ManagersTest(BrokerOptions options = {}) : EntryTest(std::move(options)) {}

    void SetUp() override {
        EntryTest::SetUp();
        defineKeys("Tovexa_PlexorController", {"CreationClassName", "Name"});
        defineKeys("Tovexa_PlexorSoftwareIdentity", {"InstanceID"});
        defineKeys("Tovexa_PlexorStorageExtent", {std::begin(kDriveKeys), std::end(kDriveKeys)});
        presentVendor();
        callFactory();
        ASSERT_TRUE(inventoryTaken());
        settleWorkers();
    }
    void defineKeys(const char* className, const std::vector<std::string>& keys) {
        testbed::ClassDefinition definition{className, "", {}};
        for (const std::string& key : keys) {
            definition.properties.push_back({key, CMPI_string, true, className, {}});
        }
        repository.defineClass("root/cimv2", definition);
    }
    testbed::Instance first(const char* className) {
        const auto answer = testbed::InstanceClient(broker, &mi).enumerateInstances(className);
        EXPECT_EQ(answer.instances.size(), 1u);
        return answer.instances.at(0);
    }
    static std::string textOf(const testbed::Instance& instance, const char* name) {
        const testbed::CimValue* value = instance.find(name);
        return value != nullptr && !value->isNull ? value->text() : "null";
    }
};

class LargeManagerTest : public ManagersTest {
protected:
    LargeManagerTest() : ManagersTest(withoutKeysAndChars()) {}
};

TEST_F(LargeManagerTest, KeysAreSetFromThePath) {
    const testbed::Instance drive = first("Tovexa_PlexorStorageExtent");
    const char* expected[] = {"OMC_UnitaryComputerSystem", "host-uuid",
                              "Tovexa_PlexorStorageExtent", "tvxStorageExtC0_d1"};
    for (int i = 0; i < 4; i++) EXPECT_EQ(textOf(drive, kDriveKeys[i]), expected[i]);
    EXPECT_EQ(textOf(first("Tovexa_PlexorController"), "Name"), "tvxControllerC0");
    EXPECT_EQ(textOf(first("Tovexa_PlexorSoftwareIdentity"), "InstanceID"),
              "tovexa:ControllerSoftwareC0");
}

TEST_F(LargeManagerTest, ARefusedStringIsSetAsAnObject) {
    const testbed::Instance controller = first("Tovexa_PlexorController");
    EXPECT_EQ(textOf(controller, "OtherIdentifyingInfo"), "[C0]");
    EXPECT_EQ(textOf(controller, "IdentifyingDescriptions"), "[Serial Number]");
}

TEST_F(LargeManagerTest, ARefusedStringIsSetAsAnObjectWhateverTheReason) {
    const CMPIrc reasons[] = {CMPI_RC_ERR_FAILED, CMPI_RC_ERR_TYPE_MISMATCH,
                              CMPI_RC_ERR_NOT_SUPPORTED};
    for (const CMPIrc reason : reasons) {
        FaultRule refused = refusal(Entry::ArraySetElementAt, reason);
        refused.times = 1;
        faults().add(refused);
        EXPECT_EQ(textOf(first("Tovexa_PlexorController"), "OtherIdentifyingInfo"), "[C0]")
            << reason;
    }
}

/// As large ones are, but for the strings.
class CharsTakingTest : public ManagersTest {
protected:
    CharsTakingTest() : ManagersTest(withoutKeys()) {}

private:
    static BrokerOptions withoutKeys() {
        BrokerOptions options = withoutKeysAndChars();
        options.refusesCharsInArrays = false;
        return options;
    }
};

TEST_F(CharsTakingTest, AStringThatWasTakenIsNotSetTwice) {
    books().recordObjectCalls(true);
    books().clearCalls();
    EXPECT_EQ(textOf(first("Tovexa_PlexorController"), "OtherIdentifyingInfo"), "[C0]");
    EXPECT_EQ(books().count(Entry::NewString), 0u);
}

/// Its calls write a status only when they fail.
class SilentSuccessTest : public ManagersTest {
protected:
    explicit SilentSuccessTest(BrokerOptions options = {})
        : ManagersTest(silent(std::move(options))) {}

private:
    static BrokerOptions silent(BrokerOptions options) {
        options.silentSuccess = true;
        return options;
    }
};

TEST_F(SilentSuccessTest, NothingIsTakenForAFailure) {
    const testbed::Instance drive = first("Tovexa_PlexorStorageExtent");
    EXPECT_EQ(textOf(drive, "DeviceID"), "tvxStorageExtC0_d1");
    EXPECT_EQ(testbed::InstanceClient(broker, &mi).getInstance(drive.path).instances,
              std::vector<testbed::Instance>{drive});
    EXPECT_EQ(textOf(first("Tovexa_PlexorController"), "OtherIdentifyingInfo"), "[C0]");
    VirtualClock::advance(100);
    first("Tovexa_PlexorStorageExtent");
    EXPECT_TRUE(plexortest::WorkersMeet::untilIdle());
    EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR),
              (std::vector<std::string>{
                  "GetSampelInterval: /UserVars/CIMtvx_plexorProviderPollingInterval not found",
                  "InitPlexorThreads: Sample interval was set to 20 secs\n"}));
    EXPECT_EQ(CapturedSyslog::linesAt(LOG_WARNING), std::vector<std::string>{});
}

class SilentLargeManagerTest : public SilentSuccessTest {
protected:
    SilentLargeManagerTest() : SilentSuccessTest(withoutKeysAndChars()) {}
};

TEST_F(SilentLargeManagerTest, KeysAndStringsAreSetAllTheSame) {
    EXPECT_EQ(textOf(first("Tovexa_PlexorStorageExtent"), "DeviceID"), "tvxStorageExtC0_d1");
    const testbed::Instance controller = first("Tovexa_PlexorController");
    EXPECT_EQ(textOf(controller, "Name"), "tvxControllerC0");
    EXPECT_EQ(textOf(controller, "OtherIdentifyingInfo"), "[C0]");
}

/// A path with one key, of which anything can be answered.
struct OneKey {
    CMPIData data = plexortest::dataOf(CMPI_chars, 0);
    CMPIrc rc = CMPI_RC_OK;
    plexortest::FakeString name{"Name"};
    CMPIObjectPathFT table = {};
    CMPIObjectPath path = {};
    int asked = 0;  ///< how often for the key

    OneKey() {
        data.value.chars = const_cast<char*>("a value");
        path.hdl = this;
        path.ft = &table;
        table.getKeyCount = [](const CMPIObjectPath*, CMPIStatus*) -> CMPICount { return 1; };
        table.getKeyAt = [](const CMPIObjectPath* self, CMPICount, CMPIString** keyName,
                            CMPIStatus* status) {
            auto* key = static_cast<OneKey*>(const_cast<void*>(self->hdl));
            key->asked++;
            *keyName = &key->name;
            *status = {key->rc, nullptr};
            return key->data;
        };
    }
    OneKey(const OneKey&) = delete;

    /// What is set in an instance that answers so when it is asked for that property.
    std::string setIn(CMPIData answered) const {
        KeyCopying copying;
        return setIn(answered, copying);
    }
    std::string setIn(CMPIData answered, KeyCopying& copying) const {
        static std::string set;
        set = "nothing";
        plexortest::FakeInstance fake(answered);
        fake.table.setProperty = [](const CMPIInstance*, const char* property,
                                    const CMPIValue* value, CMPIType) {
            set = std::string(property) + " " + reinterpret_cast<const char*>(value);
            return CMPIStatus{CMPI_RC_OK, nullptr};
        };
        CompleteKeys(&fake.instance, &path, copying);
        return set;
    }
};

const CMPIData kNullText = plexortest::dataOf(CMPI_string, 0, CMPI_nullValue);

/// How often the first key of all is asked for, in the first life and before anybody has been seen
/// to lack anything.
const int askedAtFirst = [] {
    const OneKey key;
    key.setIn(kNullText);
    return key.asked;
}();

TEST(ManagersAtFirst, AreTakenForWhatTheBuildIsFor) {
    EXPECT_EQ(askedAtFirst, kContextHasFlush ? 0 : 1);
}

TEST_F(LargeManagerTest, AKeyIsSetOnlyWhereItsNameAndValueCanBeRead) {
    OneKey key;
    EXPECT_EQ(key.setIn(kNullText), "Name a value");
    key.rc = CMPI_RC_ERR_FAILED;
    EXPECT_EQ(key.setIn(kNullText), "nothing") << "the path does not answer";
    key.rc = CMPI_RC_OK;
    key.name.hdl = nullptr;
    key.name.text = nullptr;
    EXPECT_EQ(key.setIn(kNullText), "nothing") << "without a name";
    OneKey number;
    number.data = plexortest::dataOf(CMPI_uint32, 7);
    EXPECT_EQ(number.setIn(kNullText), "nothing") << "no text";
}

TEST_F(LargeManagerTest, AKeyThatHasNoTextInThePathEitherIsNotAskedForAgain) {
    OneKey number;
    number.data = plexortest::dataOf(CMPI_uint32, 7);
    KeyCopying ofNumbers;
    for (int i = 0; i < 3; i++) EXPECT_EQ(number.setIn(kNullText, ofNumbers), "nothing");
    EXPECT_EQ(number.asked, 1);
    const OneKey text;
    KeyCopying ofTexts;
    for (int i = 0; i < 3; i++) EXPECT_EQ(text.setIn(kNullText, ofTexts), "Name a value");
    EXPECT_EQ(text.asked, 3) << "this manager has left it out each time";
}

TEST_F(LargeManagerTest, AKeyThatWasCopiedIsNotAskedForAgain) {
    const OneKey key;
    KeyCopying copied;
    for (int i = 0; i < 3; i++) {
        EXPECT_EQ(key.setIn(plexortest::dataOf(CMPI_string, 1), copied), "nothing");
    }
    EXPECT_EQ(key.asked, 1);
}

TEST_F(LargeManagerTest, RequestsLearnAtTheSameTimeThatKeysAreCopied) {
    KeyCopying copying;
    const auto complete = [&copying] {
        OneKey key;
        plexortest::FakeInstance fake(plexortest::dataOf(CMPI_string, 1));
        CompleteKeys(&fake.instance, &key.path, copying);
    };
    const plexortest::Beside others(complete);
    for (int i = 0; i < 10; i++) {
        complete();
        others.awaitRound();
    }
    EXPECT_EQ(copying.copiedInLife, PresentLife());
}

TEST_F(LargeManagerTest, APropertyThatTheInstanceDoesNotHaveIsNotMissed) {
    const auto notThere = static_cast<CMPIValueState>(CMPI_nullValue | CMPI_notFound);
    EXPECT_EQ(OneKey().setIn(plexortest::dataOf(CMPI_string, 0, notThere)), "nothing");
    EXPECT_EQ(OneKey().setIn(plexortest::dataOf(CMPI_string, 1)), "nothing") << "it is there";
}

TEST_F(LargeManagerTest, WithoutAContextOfItsOwnAnItemUsesTheWorkers) {
    FaultRule none;
    none.entry = Entry::PrepareAttachThread;
    none.nullResult = true;
    faults().add(none);
    books().clearCalls();
    ItemSpan span(ctx());
    EXPECT_EQ(span.Context(), ctx());
    span.End();
    EXPECT_EQ(books().count(Entry::AttachThread), 0u);
    EXPECT_EQ(books().count(Entry::DetachThread), 0u);
}

TEST_F(LargeManagerTest, WithoutAStringObjectTheElementStaysAsItIs) {
    FaultRule none;
    none.entry = Entry::NewString;
    none.nullResult = true;
    faults().add(none);
    const testbed::Instance controller = first("Tovexa_PlexorController");
    EXPECT_EQ(textOf(controller, "OtherIdentifyingInfo"), "[]");
    EXPECT_EQ(textOf(controller, "ElementName"), "Controller C0 (Model C0)");
}

std::size_t timesToldOfAnotherManager() {
    std::size_t told = 0;
    for (const std::string& line : CapturedSyslog::linesAt(LOG_ERR)) {
        told += line ==
                "PlexorProvider: the manager's context table has no flush: this build of the "
                "provider is for another manager\n";
    }
    return told;
}

TEST_F(LargeManagerTest, TheBuildForAnotherManagerSaysSoOnce) {
    if (!kContextHasFlush) GTEST_SKIP() << "this is the build for such managers";
    EXPECT_LE(timesToldOfAnotherManager(), 1u) << "once for the process";
    // Whether an earlier test was told does not matter to a process that runs this one only.
    const std::string style = GTEST_FLAG_GET(death_test_style);
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_EXIT(_exit(timesToldOfAnotherManager() == 1 ? 0 : 1), ::testing::ExitedWithCode(0), "");
    GTEST_FLAG_SET(death_test_style, style);
}

TEST_F(LargeManagerTest, WhatARefreshObtainsGoesWithIt) {
    if (!kContextHasFlush) GTEST_SKIP() << "this program exports a flush function";
    testbed::InstanceClient client(broker, &mi);
    auto refresh = [&] {
        VirtualClock::advance(100);
        client.enumerateInstances("Tovexa_PlexorStorageVolume");
        EXPECT_TRUE(plexortest::WorkersMeet::untilIdle());
    };
    refresh();
    auto kept = [&] {
        std::size_t objects = 0;
        for (const auto& part : broker.kept()) {
            if (part.thread != std::this_thread::get_id()) objects += part.objects;
        }
        return objects;
    };
    const std::size_t objects = kept();
    for (int i = 0; i < 5; i++) refresh();
    EXPECT_EQ(kept(), objects);
}

TEST_F(ManagersTest, TheHostsOwnIsAskedOnceForAString) {
    if (!kContextHasFlush) GTEST_SKIP() << "this build takes every manager for a standard one";
    faults().add(refusal(Entry::ArraySetElementAt));
    books().recordObjectCalls(true);
    books().clearCalls();
    first("Tovexa_PlexorController");
    EXPECT_EQ(books().count(Entry::NewString), 0u);
}

TEST_F(ManagersTest, OneThatCopiesKeysIsAskedNothingMore) {
    first("Tovexa_PlexorController");
    books().clearCalls();
    FaultRule asked;
    asked.entry = Entry::InstanceGetProperty;
    int reads = 0;
    asked.keepResult = true;
    asked.hook = [&reads] { reads++; };
    FaultRule made = asked;
    made.entry = Entry::NewString;
    int strings = 0;
    made.hook = [&strings] { strings++; };
    faults().add(asked);
    faults().add(made);
    EXPECT_EQ(textOf(first("Tovexa_PlexorController"), "Name"), "tvxControllerC0");
    EXPECT_EQ(reads, 0);
    EXPECT_EQ(strings, 0);
}

}  // namespace
