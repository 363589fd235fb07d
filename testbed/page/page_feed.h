// Keeps a page's document up to date for everybody who looks, with one asking for all of them.
#pragma once

#include <chrono>
#include <condition_variable>
#include <deque>
#include <functional>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <vector>

#include "ask_server.h"
#include "check_policy.h"
#include "http_message.h"
#include "page_changes.h"
#include "page_document.h"
#include "simulated_array.h"

namespace testbed {

/// Where a page's document comes from.
struct PageSource {
    /// Asks for everything; may take long and throw. Called on the feed's own thread, and only
    /// while somebody looks.
    std::function<Answers()> ask;
    std::chrono::milliseconds pause{500};  ///< between two askings
    CheckPolicy policy = {};
    ExpectedCounts expected = {};
    nlohmann::ordered_json about = {};  ///< what does not change
};

/// Thread-safe.
class PageFeed {
public:
    explicit PageFeed(PageSource source);
    /// Waits for an asking under way. No stream may be left.
    ~PageFeed();
    PageFeed(const PageFeed&) = delete;
    PageFeed& operator=(const PageFeed&) = delete;

    /// Asks no more, and wakes no stream. Waits for an asking under way.
    void stop();

    /// Whether somebody follows, or has asked for the document lately.
    bool isWatched() const;
    /// The document now. With the serial of the one that is there: only "serial" and "age".
    std::string document(std::optional<std::uint64_t> known = {});
    /// Server-sent events: "document", then "change" from each version to the next, and "alive"
    /// with serial and age once a second. A slow client gets the document again.
    std::shared_ptr<HttpStream> follow();

    /// The simulator's side has become this.
    void simulate(SimulatedArray array);
    /// Puts a line into the list of changes, and asks soon.
    void note(const std::string& line);

private:
    class Stream;
    using Clock = std::chrono::steady_clock;

    void run();
    Answers askSafely() const;
    void take(Answers answers);
    std::string arrivingNow(const Inventory& inventory);
    void show(Inventory answered);
    void build(const std::lock_guard<std::mutex>& building);
    void publish(PageDocument document);
    bool isWatchedLocked() const;
    std::string headLocked() const;
    std::string wholeLocked();

    const PageSource source_;

    std::mutex building_;  // before mutex_; guards what follows
    Inventory shown_;      // the last answer for each class
    Inventory asked_;      // the last answer, however partial
    std::string failure_;
    std::string arriving_;
    std::string lastArrival_;
    std::optional<Clock::time_point> arrived_;  // when something came or went last
    std::deque<PageChange> changes_;            // the newest first
    SimulatedArray simulated_;
    std::shared_ptr<const PageDocument::Json> elements_;

    mutable std::mutex mutex_;  // guards what follows
    std::condition_variable changed_;
    PageDocument document_;
    std::uint64_t serial_;
    std::string body_;         // the document behind its head; "" until somebody wants it
    HttpStream::Text change_;  // from the version before
    std::vector<Stream*> streams_;
    std::optional<Clock::time_point> lookedAt_;  // by one who asks for the document
    std::optional<Clock::time_point> answered_;  // when everything was
    Clock::time_point due_{};
    bool stops_ = false;

    std::thread thread_;
};

}  // namespace testbed
