// An array that runs: its commands, what follows from them, and its time.
#include "live_array.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>

#include "broker.h"
#include "scenario_parser.h"

namespace testbed {
namespace {

constexpr const char* kArray = R"({
  "controllers": [{
    "id": "C0",
    "pools": [{"id": "Primordial", "primordial": true}, {"id": "G"}],
    "enclosures": [{"number": 1}, {"number": 2}],
    "drives": [
      {"count": 3, "id": "d{n}", "enclosure": 1, "pool": "G", "capacityGB": 100},
      {"id": "e0", "enclosure": 2, "pool": "G", "capacityGB": 100},
      {"id": "small", "state": "hot spare", "capacityGB": 50},
      {"id": "large", "state": "hot spare", "capacityGB": 300},
      {"id": "fit", "state": "hot spare", "capacityGB": 100}],
    "volumes": [{"id": "v", "raid": "RAID5", "pool": "G"}],
    "batteries": [{"id": "b"}]
  }],
  "consequences": {"rebuildSeconds": 100, "copyBackSeconds": 50, "learnSeconds": 30,
                   "chargeSeconds": 20}
})";

class LiveArrayTest : public ::testing::Test {
protected:
    void SetUp() override { open(kArray); }
    void TearDown() override { std::filesystem::remove(file_); }

    void open(const std::string& text) {
        file_ = ::testing::TempDir() + "plexor-live-array-" + std::to_string(getpid()) + ".json";
        write(text);
        array_.reset();
        broker_.reset();
        repository_ = std::make_unique<Repository>();
        broker_ = std::make_unique<Broker>(*repository_);
        array_ = std::make_unique<LiveArray>(*broker_, file_);
    }

    void write(const std::string& text) const { std::ofstream(file_) << text; }

    std::string refusal(const std::string& command) {
        try {
            array_->apply(command);
        } catch (const ScenarioError& error) {
            return error.what();
        }
        return "";
    }

    const ControllerDescription& controller() const { return array_->scenario().controllers.at(0); }
    /// "OperationalStatus/ExtentStatus pool".
    std::string drive(const std::string& id) const {
        const DriveDescription* drive = findById(controller().drives, id);
        if (!drive) return "gone";
        std::string text =
            std::to_string(drive->operationalStatus) + "/" + std::to_string(drive->extentStatus);
        for (const std::string& pool : drive->pools) text += " " + pool;
        return text;
    }
    int volume() const { return controller().volumes.at(0).operationalStatus; }
    int battery() const { return controller().batteries.at(0).batteryStatus; }

    bool isRefusedByVendor() {
        CallRecord call;
        call.entry = Entry::Associators;
        call.className = "X";
        return broker_->faults().match(call).has_value();
    }

    std::string file_;
    std::unique_ptr<Repository> repository_;
    std::unique_ptr<Broker> broker_;
    std::unique_ptr<LiveArray> array_;
};

TEST_F(LiveArrayTest, RefusedCommandsChangeNothingAndSayWhy) {
    EXPECT_EQ(refusal("dance"), "command: unknown command \"dance\"; help lists the known ones");
    EXPECT_EQ(refusal("learn drive C0 d0"),
              "command: unknown command \"learn drive\"; help lists the known ones");
    EXPECT_EQ(refusal("set"), "command: the kind is missing");
    EXPECT_EQ(refusal("fail wheel C0 1"),
              "command: unknown kind \"wheel\" (known: drive, volume, pool, enclosure, port, "
              "battery, other)");
    EXPECT_EQ(refusal("fail drive C1 d0"), "command: no controller \"C1\"");
    EXPECT_EQ(refusal("fail drive C0 d9"), "command: no drive \"d9\"");
    EXPECT_EQ(refusal("fail drive C0 d0 now"), "command: unexpected \"now\"");
    EXPECT_EQ(refusal("set drive C0 d0 sloth=1"),
              "command: controllers[C0].drives[d0]: unknown member \"sloth\"");
    EXPECT_EQ(refusal("set drive C0 d0 slot=1e999"),
              "command: controllers[C0].drives[d0].slot: a whole number from 0 to 65535 is needed "
              "here");
    EXPECT_EQ(drive("d0"), "2/2 G");
}

// Each of these ended the program, at once or when the array was saved.
TEST_F(LiveArrayTest, ATextThatIsNotInUtf8IsRefusedWithItsCommand) {
    EXPECT_EQ(refusal("add battery C0 id=\xff= state=learning"), "command: it is not in UTF-8");
    EXPECT_EQ(refusal("set controller C0 model=\xff"), "command: it is not in UTF-8");
    array_->save(file_);
    EXPECT_EQ(refusal("set controller C0 model=\xc3\xa9"), "");
    array_->save(file_);
}

TEST_F(LiveArrayTest, ADriveIsReplacedBesideASpareForANumber) {
    array_->apply("set drive C0 large spareFor=7");
    array_->apply("replace drive C0 d0");
    EXPECT_EQ(refusal("add drive C0 id=1 pool=Primordial"), "");
    EXPECT_EQ(refusal("replace drive C0 1"), "");
}

TEST_F(LiveArrayTest, RepeatedDrivesThatACommandAddsFillTheLostOnesPlace) {
    for (const char* spare : {"small", "large", "fit"}) {
        array_->apply(std::string("remove drive C0 ") + spare);
    }
    array_->apply("fail drive C0 d0");
    array_->apply("add drive C0 id=x{n} count=2 pool=G capacityGB=100");
    const auto& drives = controller().drives;
    ASSERT_EQ(drives.size(), 6u);
    EXPECT_EQ(drives[4].id, "x0");
    EXPECT_EQ(drives[4].spareFor, "d0");
    EXPECT_EQ(drives[5].id, "x1");
    EXPECT_EQ(refusal("add drive C0 id=y{n} count=100001"),
              "command: controllers[C0].drives[y{n}].count: a whole number from 0 to 100000 is "
              "needed here");
}

TEST_F(LiveArrayTest, ThousandsOfDrivesByOneCommandJoinTheirGroupSoon) {
    // As many looks as there are pairs of them would be too many, and triples no end.
    constexpr std::size_t kDrives = 4000;
    for (const char* spare : {"small", "large", "fit"}) {
        array_->apply(std::string("remove drive C0 ") + spare);
    }
    array_->apply("fail drive C0 d1");
    array_->apply("add drive C0 id=x{n} count=4000 pool=G");
    const std::vector<std::string>& places = controller().pools.at(1).members;
    ASSERT_EQ(places.size(), 4 + kDrives - 1) << "the first one is in the lost one's place";
    EXPECT_EQ(places.at(1), "x0");
    EXPECT_EQ(places.back(), "x3999");
}

TEST_F(LiveArrayTest, ANewStateIsNotOverruledByOldNumbers) {
    array_->apply("set drive C0 d0 operationalStatus=99");
    EXPECT_EQ(drive("d0"), "99/2 G");
    array_->apply("set drive C0 d0 state=\"predictive failure\"");
    EXPECT_EQ(drive("d0"), "5/2 G");
}

TEST_F(LiveArrayTest, TheBestSpareIsRebuiltAndTheVolumeIsOptimalAgain) {
    array_->apply("fail drive C0 d1");
    EXPECT_EQ(drive("d1"), "6/3 G");
    EXPECT_EQ(drive("fit"), "2/11 G") << "the smallest that is large enough";
    EXPECT_EQ(drive("large"), "2/13 Primordial");
    EXPECT_EQ(volume(), 3);
    EXPECT_EQ(array_->nextDue(), 100);
    EXPECT_TRUE(array_->advance(99).empty());
    EXPECT_EQ(volume(), 3);
    EXPECT_EQ(array_->advance(100).size(), 1u);
    EXPECT_EQ(drive("fit"), "2/2 G");
    EXPECT_EQ(drive("d1"), "6/3 Primordial") << "failed still, outside of the group";
    EXPECT_EQ(volume(), 2);
}

TEST_F(LiveArrayTest, AReplacedDriveGetsItsDataBackAndTheSpareIsFree) {
    array_->apply("fail drive C0 d1");
    array_->advance(100);
    array_->apply("replace drive C0 d1");
    EXPECT_EQ(drive("d1"), "2/11 G");
    EXPECT_EQ(volume(), 2) << "the spare still stands in";
    array_->advance(150);
    EXPECT_EQ(drive("d1"), "2/2 G");
    EXPECT_EQ(drive("fit"), "2/13 Primordial");
    EXPECT_EQ(volume(), 2);
}

TEST_F(LiveArrayTest, OneTooManyTakesTheVolumeOfflineAndNothingBringsItsDataBack) {
    array_->apply("fail drive C0 d0");
    array_->apply("fail drive C0 d1");
    EXPECT_EQ(volume(), 6);
    EXPECT_EQ(drive("large"), "2/13 Primordial") << "nothing to rebuild from";
    array_->advance(1000);
    EXPECT_EQ(volume(), 6);
    array_->apply("restore drive C0 d1");
    EXPECT_NE(volume(), 6) << "the drive has come back with its data";
}

TEST_F(LiveArrayTest, ASpareThatFailsIsFollowedByTheNext) {
    array_->apply("fail drive C0 d1");
    array_->apply("fail drive C0 fit");
    EXPECT_EQ(drive("large"), "2/11 G");
    EXPECT_EQ(volume(), 3);
    array_->advance(100);
    EXPECT_EQ(volume(), 2);
    EXPECT_EQ(drive("fit").substr(0, 3), "6/3") << "not online: its rebuild has ended";
}

TEST_F(LiveArrayTest, ARemovedDriveIsMissed) {
    array_->apply("remove drive C0 fit");
    array_->apply("remove drive C0 large");
    array_->apply("remove drive C0 d2");
    EXPECT_EQ(volume(), 3);
    array_->apply("add drive C0 id=d2 pool=G capacityGB=100");
    EXPECT_EQ(drive("d2"), "2/11 G") << "a new one holds no data";
    array_->advance(100);
    EXPECT_EQ(drive("d2"), "2/2 G");
    EXPECT_EQ(volume(), 2);
}

TEST_F(LiveArrayTest, AnEnclosureTakesItsDrivesAlong) {
    array_->apply("remove drive C0 fit");
    array_->apply("remove drive C0 large");
    array_->apply("fail enclosure C0 2");
    EXPECT_EQ(drive("e0"), "12/2 G");
    EXPECT_EQ(volume(), 3);
    array_->apply("fail enclosure C0 1");
    EXPECT_EQ(volume(), 6);
    array_->apply("restore enclosure C0 1");
    array_->apply("restore enclosure C0 2");
    EXPECT_EQ(drive("e0"), "2/2 G");
    EXPECT_EQ(volume(), 2);
}

TEST_F(LiveArrayTest, ABatteryLearnsAndCharges) {
    array_->apply("learn battery C0 b");
    std::vector<int> states{battery()};
    for (const double time : {30, 50, 70}) {
        array_->advance(time);
        states.push_back(battery());
    }
    EXPECT_EQ(states, (std::vector<int>{12, 8, 6, 3}));
    EXPECT_EQ(array_->nextDue(), -1);
}

TEST_F(LiveArrayTest, ConsequencesCanBeSwitchedOff) {
    std::string text = kArray;
    text.replace(text.find("{\"rebuildSeconds"), std::string::npos, "false}");
    open(text);
    array_->apply("fail drive C0 d1");
    EXPECT_EQ(volume(), 2);
    EXPECT_EQ(drive("fit"), "2/13 Primordial");
    EXPECT_EQ(array_->nextDue(), -1);
}

struct Level {
    const char* raid;
    std::vector<const char*> lost;
    int status;
};

TEST_F(LiveArrayTest, LevelsBearWhatTheyBear) {
    for (const Level& level : std::vector<Level>{{"RAID0", {"d0"}, 6},
                                                 {"RAID1", {"d0", "d1", "d2"}, 3},
                                                 {"RAID5", {"d0"}, 3},
                                                 {"raid 6", {"d0", "d1"}, 3},
                                                 {"RAID6", {"d0", "d1", "d2"}, 6},
                                                 {"RAID10", {"d0", "d2"}, 3},
                                                 {"RAID10", {"d0", "d1"}, 6},
                                                 {"RAID50", {"d0", "d2"}, 3},
                                                 {"RAID50", {"d0", "d1"}, 6},
                                                 {"RAID60", {"d0", "d1", "d2", "e0"}, 3}}) {
        open(kArray);
        for (const char* spare : {"small", "large", "fit"})
            array_->apply(std::string("remove drive C0 ") + spare);
        array_->apply("set volume C0 v raid=\"" + std::string(level.raid) + "\"");
        for (const char* id : level.lost) array_->apply(std::string("fail drive C0 ") + id);
        EXPECT_EQ(volume(), level.status) << level.raid << " without " << level.lost.size();
    }
}

TEST_F(LiveArrayTest, FaultsAreArmedOnce) {
    array_->apply("fault call=associators className=X rc=1 times=1");
    EXPECT_TRUE(isRefusedByVendor());
    array_->apply("fail drive C0 d0");
    array_->apply("latency 0 1");
    EXPECT_FALSE(isRefusedByVendor()) << "it has fired";
    array_->apply("fault call=associators className=X rc=1 times=2");
    EXPECT_TRUE(isRefusedByVendor());
    array_->apply("clear faults");
    EXPECT_FALSE(isRefusedByVendor());
}

TEST_F(LiveArrayTest, ResetGoesBackToTheFileAndArmsItsFaults) {
    std::string text = kArray;
    text.insert(text.rfind('}'),
                R"(, "faults": [{"call": "associators", "className": "X", "rc": 1, "times": 1}])");
    open(text);
    EXPECT_TRUE(isRefusedByVendor());
    array_->apply("fail drive C0 d1");
    EXPECT_FALSE(isRefusedByVendor());
    array_->reset();
    EXPECT_TRUE(isRefusedByVendor());
    EXPECT_EQ(drive("d1"), "2/2 G");
    EXPECT_EQ(drive("fit"), "2/13 Primordial");
    EXPECT_EQ(array_->nextDue(), -1);
}

TEST_F(LiveArrayTest, ABrokenFileLeavesEverythingAsItWas) {
    array_->apply("fail drive C0 d1");
    for (const char* text : {"", "{}", "{\"shuffle\": 1e999}", "{\"controllers\": [1e999]}"}) {
        write(text);
        EXPECT_THROW(array_->reload(), ScenarioError) << text;
        EXPECT_EQ(drive("fit"), "2/11 G");
        EXPECT_EQ(array_->nextDue(), 100);
    }
}

TEST_F(LiveArrayTest, WhatIsSavedGoesOnWhereItWas) {
    array_->apply("fail drive C0 d1");
    array_->advance(40);
    array_->save(file_ + ".saved");
    std::ifstream stream(file_ + ".saved");
    const std::string text((std::istreambuf_iterator<char>(stream)), {});
    std::filesystem::remove(file_ + ".saved");
    open(text);
    EXPECT_EQ(drive("fit"), "2/11 G");
    EXPECT_EQ(volume(), 3);
    EXPECT_EQ(array_->nextDue(), 60);
    array_->advance(60);
    EXPECT_EQ(volume(), 2);
    array_->apply("replace drive C0 d1");
    array_->advance(110);
    EXPECT_EQ(drive("fit"), "2/13 Primordial");
    EXPECT_THROW(array_->save("/nowhere/at-all.json"), ScenarioError);
}

TEST_F(LiveArrayTest, TheTimelineSpeaksAtItsTimes) {
    std::string text = kArray;
    text.insert(text.rfind('}'), R"(, "timeline": [{"at": 20, "command": "fail drive C0 d9"},
        {"at": 10.5, "command": "fail drive C0 d0"}])");
    open(text);
    EXPECT_EQ(array_->nextDue(), 10.5);
    auto done = array_->advance(10.5);
    ASSERT_EQ(done.size(), 1u);
    EXPECT_EQ(done[0].command, "fail drive C0 d0");
    EXPECT_EQ(done[0].refusal, "");
    done = array_->advance(500);
    ASSERT_EQ(done.size(), 2u) << "the refused one and the end of the rebuild";
    EXPECT_EQ(done[0].refusal, "command: no drive \"d9\"");
    EXPECT_EQ(done[1].at, 110.5);
    EXPECT_EQ(volume(), 2);
}

}  // namespace
}  // namespace testbed
