// One asking for everybody, and what turns one version into the next.
#include "page_feed.h"

#include <gtest/gtest.h>

#include <atomic>

#include "page_about.h"

namespace testbed {
namespace {

using nlohmann::json;
using std::chrono::milliseconds;

constexpr const char* kController = "Tovexa_PlexorController";
constexpr const char* kDrive = "Tovexa_PlexorStorageExtent";

Instance instance(const char* className, const char* key, const std::string& id,
                  const std::string& name) {
    Instance made;
    made.path = {"root/cimv2", className, {}};
    made.path.key(key, CimValue::string(id));
    made.set("ElementName", CimValue::string(name));
    return made;
}

Instance drive(const std::string& id, bool failed = false) {
    Instance made =
        instance(kDrive, "DeviceID", "tvxStorageExtC0_" + id,
                 "Drive " + id + " on controller C0 - " + (failed ? "FAILED" : "ONLINE"));
    made.set("OperationalStatus", CimValue::uint16(failed ? 6 : 2));
    made.set("HealthState", CimValue::uint16(failed ? 30 : 5));
    return made;
}

ClassAnswer answer(const char* className, std::vector<Instance> instances) {
    ClassAnswer made{className, {}};
    made.response.instances = std::move(instances);
    return made;
}

class PageFeeds : public ::testing::Test {
protected:
    /// Answers with the drives, and counts.
    Answers ask() {
        asked_++;
        const std::lock_guard lock(mutex_);
        if (!failure_.empty()) throw std::runtime_error(failure_);
        Answers answers;
        answers.inventory = {answer(kController, {instance(kController, "Name", "tvxControllerC0",
                                                           "Controller C0")}),
                             answer(kDrive, drives_)};
        return answers;
    }

    void set(std::vector<Instance> drives, std::string failure = "") {
        const std::lock_guard lock(mutex_);
        drives_ = std::move(drives);
        failure_ = std::move(failure);
    }

    /// The next event but "alive", as {name, data}; "nothing" when none comes.
    static std::pair<std::string, json> next(HttpStream& stream) {
        for (int i = 0; i < 3000; i++) {
            if (const HttpStream::Text text = stream.next()) {
                const std::size_t line = text->find('\n');
                const std::string name = text->substr(7, line - 7);
                if (name != "alive") return {name, json::parse(text->substr(line + 7))};
            }
            std::this_thread::sleep_for(milliseconds(10));
        }
        return {"nothing", {}};
    }

    /// The first change that has the class's elements; null when none comes.
    static json changeOf(HttpStream& stream, const char* className) {
        for (;;) {
            const auto [name, data] = next(stream);
            if (name == "nothing") return {};
            if (name == "change" && data["elements"].contains(className)) return data;
        }
    }

    /// A follower who has been sent the document from before the first answer.
    std::shared_ptr<HttpStream> followEarly() {
        const std::lock_guard gate(mutex_);  // nothing is answered meanwhile
        const auto stream = feed_.follow();
        EXPECT_EQ(next(*stream).first, "document");
        return stream;
    }

    std::mutex mutex_;
    std::vector<Instance> drives_{drive("1"), drive("2")};
    std::string failure_;
    std::atomic<int> asked_ = 0;
    PageFeed feed_{{.ask = [this] { return ask(); },
                    .pause = milliseconds(50),
                    .about = pageAbout("here", true)}};
};

TEST_F(PageFeeds, NobodyIsAskedUntilSomebodyLooks) {
    std::this_thread::sleep_for(milliseconds(200));
    EXPECT_EQ(asked_, 0);
    EXPECT_FALSE(feed_.isWatched());
    const auto stream = followEarly();
    EXPECT_TRUE(feed_.isWatched());
    EXPECT_FALSE(changeOf(*stream, kDrive).is_null());
    EXPECT_GT(asked_, 0);
}

TEST_F(PageFeeds, FiftyFollowersCostAsMuchAsOne) {
    std::vector<std::shared_ptr<HttpStream>> streams{feed_.follow()};
    next(*streams[0]);
    std::this_thread::sleep_for(milliseconds(300));
    asked_ = 0;
    std::this_thread::sleep_for(milliseconds(500));
    const int one = asked_;
    for (int i = 0; i < 49; i++) streams.push_back(feed_.follow());
    asked_ = 0;
    std::this_thread::sleep_for(milliseconds(500));
    EXPECT_GT(one, 0);
    EXPECT_LE(asked_, 10);  // 500 / 50, however quick the machine is
}

TEST_F(PageFeeds, ChangesAreTold) {
    const auto stream = followEarly();
    EXPECT_EQ(json::parse(feed_.document())["check"]["level"], "unknown");
    const json first = changeOf(*stream, kDrive);
    ASSERT_EQ(first["elements"][kDrive]["put"].size(), 2u);
    EXPECT_EQ(first["elements"][kDrive]["put"][0]["view"]["state"], "online");

    set({drive("2", true), drive("3")});
    const json change = changeOf(*stream, kDrive);
    EXPECT_EQ(change["serial"], change["base"].get<std::uint64_t>() + 1);
    EXPECT_EQ(change["elements"][kDrive]["gone"], json({"drive:C0_1"}));
    ASSERT_EQ(change["elements"][kDrive]["put"].size(), 2u);
    EXPECT_EQ(change["elements"][kDrive]["put"][0]["view"]["look"], "critical");
    std::vector<std::string> texts;
    for (const json& entry : change["set"]["changes"]) texts.push_back(entry["text"]);
    EXPECT_EQ(texts, (std::vector<std::string>{"Drive 1 on controller C0 has gone",
                                               "Drive 3 on controller C0 has come, online",
                                               "Drive 2 on controller C0: online → failed"}));
}

TEST_F(PageFeeds, WhoIsSlowGetsTheDocumentAgain) {
    const auto slow = followEarly();
    const auto quick = feed_.follow();
    EXPECT_EQ(next(*quick).first, "document");
    for (int i = 0; i < 3; i++) {
        set({drive(std::to_string(i))});
        EXPECT_FALSE(changeOf(*quick, kDrive).is_null());
    }
    const auto [name, document] = next(*slow);
    EXPECT_EQ(name, "document");
    EXPECT_EQ(document[kDrive][0]["view"]["id"], "2");
}

TEST_F(PageFeeds, WhatFailsLeavesWhatWasThere) {
    const auto stream = followEarly();
    EXPECT_FALSE(changeOf(*stream, kDrive).is_null());
    set({}, "the server has gone");
    json check;
    for (int i = 0; i < 50 && check["text"] != "the server has gone"; i++) {
        const json change = next(*stream).second;
        if (change["set"].contains("check")) check = change["set"]["check"];
        EXPECT_TRUE(change["elements"].empty()) << change;
    }
    EXPECT_EQ(check["level"], "unknown");
    EXPECT_EQ(json::parse(feed_.document())[kDrive].size(), 2u);
}

TEST_F(PageFeeds, AskersAreToldWhenThereIsNothingNew) {
    const json document = json::parse(feed_.document());
    feed_.stop();
    const json now = json::parse(feed_.document());
    EXPECT_TRUE(now.contains("check"));
    const json same = json::parse(feed_.document(now["serial"].get<std::uint64_t>()));
    EXPECT_EQ(same["serial"], now["serial"]);
    EXPECT_FALSE(same.contains("check"));
}

TEST_F(PageFeeds, DrivesWithoutARackStandInARow) {
    SimulatedArray simulated;
    simulated.racks = json::parse(R"([{"controller": "C0", "name": "Enclosure 1", "row": false,
        "slots": [{"slot": 0, "drive": "drive:C0_1"}]}])");
    feed_.simulate(simulated);
    const auto stream = followEarly();
    EXPECT_FALSE(changeOf(*stream, kDrive).is_null());
    const json racks = json::parse(feed_.document())["racks"];
    ASSERT_EQ(racks.size(), 2u);
    EXPECT_EQ(racks[1], json::parse(R"({"controller": "C0", "name": "Drives", "row": true,
        "slots": [{"slot": null, "drive": "drive:C0_2", "id": "2"}]})"));
}

}  // namespace
}  // namespace testbed
