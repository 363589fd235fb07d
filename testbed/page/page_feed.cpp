// The thread that asks while somebody looks, and the event streams that carry the news.
#include "page_feed.h"

#include <algorithm>
#include <cstdio>
#include <set>

#include "inventory_gaps.h"
#include "json_view.h"
#include "printable.h"

namespace testbed {
namespace {

using Json = PageDocument::Json;

constexpr std::size_t kMostChanges = 60;
constexpr std::chrono::seconds kLooking{10};  // after an asking for the document
constexpr std::chrono::seconds kArriving{3};  // as long as a check waits
constexpr std::chrono::seconds kHeartbeat{1};

/// So that a page does not take the document of an earlier server for one of this one.
std::uint64_t firstSerial() {
    const auto now = std::chrono::system_clock::now().time_since_epoch();
    return static_cast<std::uint64_t>(
        std::chrono::duration_cast<std::chrono::milliseconds>(now).count());
}

HttpStream::Text eventText(const char* name, const std::string& data) {
    return std::make_shared<const std::string>(std::string("event: ") + name + "\ndata: " + data +
                                               "\n\n");
}

ClassAnswer* answerFor(Inventory& inventory, const std::string& className) {
    for (ClassAnswer& answer : inventory) {
        if (sameName(answer.className, className)) return &answer;
    }
    return nullptr;
}

/// Drives that stand in no rack, in rows of their controllers.
void addRows(Json& racks, const Json& drives) {
    std::set<std::string> placed;
    for (const Json& rack : racks) {
        for (const Json& slot : rack["slots"]) {
            if (slot.contains("drive")) placed.insert(slot["drive"].get<std::string>());
        }
    }
    for (const Json& drive : drives) {
        const Json& view = drive["view"];
        if (placed.contains(view["key"].get<std::string>())) continue;
        const auto row = std::find_if(racks.begin(), racks.end(), [&](const Json& rack) {
            return rack["row"].get<bool>() && rack["controller"] == view["controller"];
        });
        Json slot = {{"slot", nullptr}, {"drive", view["key"]}, {"id", view["id"]}};
        if (row != racks.end()) {
            (*row)["slots"].push_back(std::move(slot));
            continue;
        }
        racks.push_back({{"controller", view["controller"]},
                         {"name", "Drives"},
                         {"row", true},
                         {"slots", Json::array({std::move(slot)})}});
    }
}

}  // namespace

/// A client that follows. It knows which version it has been sent last.
class PageFeed::Stream : public HttpStream {
public:
    explicit Stream(PageFeed& feed) : feed_(feed) {
        const std::lock_guard lock(feed_.mutex_);
        feed_.streams_.push_back(this);
        feed_.changed_.notify_all();
    }
    ~Stream() override {
        const std::lock_guard lock(feed_.mutex_);
        std::erase(feed_.streams_, this);
    }

    Text next() override {
        const std::lock_guard lock(feed_.mutex_);
        const auto now = Clock::now();
        if (sent_ == feed_.serial_ && now - at_ < kHeartbeat) return nullptr;
        const bool isNext = sent_ != 0 && sent_ + 1 == feed_.serial_;
        const bool isSame = sent_ == feed_.serial_;
        sent_ = feed_.serial_;
        at_ = now;
        if (isSame) return eventText("alive", "{" + feed_.headLocked() + "}");
        return isNext ? feed_.change_ : eventText("document", feed_.wholeLocked());
    }

    void onNews(std::function<void()> wake) override {
        const std::lock_guard lock(feed_.mutex_);
        wake_ = std::move(wake);
    }

    /// With the feed's mutex.
    void wake() const {
        if (wake_) wake_();
    }

private:
    PageFeed& feed_;
    std::uint64_t sent_ = 0;
    Clock::time_point at_{};
    std::function<void()> wake_;
};

PageFeed::PageFeed(PageSource source)
    : source_(std::move(source)),
      elements_(std::make_shared<const Json>(Json::object())),
      serial_(firstSerial()) {
    {
        const std::lock_guard building(building_);
        failure_ = "no answer yet";
        build(building);
    }
    thread_ = std::thread([this] { run(); });
}

PageFeed::~PageFeed() {
    stop();
}

void PageFeed::stop() {
    {
        const std::lock_guard lock(mutex_);
        stops_ = true;
        changed_.notify_all();
    }
    if (thread_.joinable()) thread_.join();
}

bool PageFeed::isWatchedLocked() const {
    return !streams_.empty() || (lookedAt_ && Clock::now() - *lookedAt_ < kLooking);
}

bool PageFeed::isWatched() const {
    const std::lock_guard lock(mutex_);
    return isWatchedLocked();
}

void PageFeed::run() {
    std::unique_lock lock(mutex_);
    while (!stops_) {
        if (!isWatchedLocked()) {
            changed_.wait(lock);
        } else if (Clock::now() < due_) {
            changed_.wait_until(lock, due_);
        } else {
            lock.unlock();
            Answers answers = askSafely();
            take(std::move(answers));
            lock.lock();
            due_ = Clock::now() + source_.pause;
        }
    }
}

Answers PageFeed::askSafely() const {
    try {
        return source_.ask();
    } catch (const std::exception& error) {
        Answers answers;
        answers.failure = error.what();
        return answers;
    }
}

void PageFeed::take(Answers answers) {
    const std::lock_guard building(building_);
    failure_ = answers.failure;
    arriving_ = failure_.empty() ? arrivingNow(answers.inventory) : "";
    const bool isWhole =
        failure_.empty() &&
        std::all_of(answers.inventory.begin(), answers.inventory.end(),
                    [](const ClassAnswer& answer) { return answer.response.rc == CMPI_RC_OK; });
    const bool isSame = isWhole && sameAnswers(answers.inventory, shown_);
    asked_ = answers.inventory;
    if (!isSame) {
        show(std::move(answers.inventory));
        elements_ = nullptr;
    }
    if (isWhole) {
        const std::lock_guard lock(mutex_);
        answered_ = Clock::now();
    }
    build(building);
}

/// Like a check, which asks twice: what came or went lately may go on doing so.
std::string PageFeed::arrivingNow(const Inventory& inventory) {
    const auto now = Clock::now();
    const bool isFirst = shown_.empty();
    std::string difference = isFirst ? "asked for the first time" : differenceOf(shown_, inventory);
    if (!difference.empty()) {
        arrived_ = now;
        lastArrival_ = std::move(difference);
    }
    return arrived_ && now - *arrived_ < kArriving ? lastArrival_ : "";
}

/// Classes that were not answered stay as they were last.
void PageFeed::show(Inventory answered) {
    const bool isFirst = shown_.empty();
    if (!isFirst) {
        for (PageChange& change : changesBetween(shown_, answered, source_.policy)) {
            changes_.push_front(std::move(change));
        }
    }
    changes_.resize(std::min(changes_.size(), kMostChanges));
    for (ClassAnswer& answer : answered) {
        ClassAnswer* old = answerFor(shown_, answer.className);
        if (!old) {
            shown_.push_back(std::move(answer));
        } else if (answer.response.rc == CMPI_RC_OK) {
            *old = std::move(answer);
        }
    }
}

void PageFeed::build(const std::lock_guard<std::mutex>&) {
    const CheckSummary check = shown_.empty() && asked_.empty()
                                   ? unknownSummary(failure_)
                                   : summarize(asked_, {.failure = failure_,
                                                        .expected = source_.expected,
                                                        .policy = source_.policy,
                                                        .arriving = arriving_});
    Json rest = jsonDocument(asked_, source_.policy, &check);
    for (const ServedClass& served : servedClasses()) rest.erase(served.name);
    if (!elements_) {
        const ElementViews views(shown_, source_.policy, simulated_.targets, simulated_.places);
        Json all = jsonDocument(shown_, source_.policy);
        Json elements = Json::object();
        for (const ClassAnswer& answer : shown_) {
            Json& list = elements[answer.className] = std::move(all[answer.className]);
            for (std::size_t i = 0; i < list.size(); i++) {
                list[i]["view"] =
                    views.of(*findServedClass(answer.className), answer.response.instances[i]);
            }
        }
        elements_ = std::make_shared<const Json>(std::move(elements));
    }
    rest["changes"] = changesAsJson({changes_.begin(), changes_.end()});
    rest["racks"] = simulated_.racks.is_null() ? Json::array() : simulated_.racks;
    rest["progress"] = simulated_.progress.is_null() ? Json::object() : simulated_.progress;
    rest["timeline"] = simulated_.timeline;
    addRows(rest["racks"], elements_->value("Tovexa_PlexorStorageExtent", Json::array()));
    publish({elements_, std::move(rest)});
}

void PageFeed::publish(PageDocument document) {
    Json change;
    {
        const std::lock_guard lock(mutex_);
        if (document_.elements && document_ == document) return;
    }
    // Only who builds changes the document, and there is but one at a time.
    if (document_.elements) change = documentChange(document_, document);
    const std::lock_guard lock(mutex_);
    document_ = std::move(document);
    change["base"] = serial_++;
    // Its members stand behind the head, which has the serial.
    change_ = eventText("change", "{" + headLocked() + "," + jsonLine(change).substr(1));
    body_.clear();
    if (stops_) return;
    for (const Stream* stream : streams_) stream->wake();
}

std::string PageFeed::headLocked() const {
    char age[40] = "null";
    if (answered_) {
        std::snprintf(age, sizeof age, "%.1f",
                      std::chrono::duration<double>(Clock::now() - *answered_).count());
    }
    return "\"serial\":" + std::to_string(serial_) + ",\"age\":" + age;
}

std::string PageFeed::wholeLocked() {
    if (body_.empty()) body_ = documentText(document_, source_.about).substr(1);
    return "{" + headLocked() + "," + body_;
}

std::string PageFeed::document(std::optional<std::uint64_t> known) {
    const std::lock_guard lock(mutex_);
    lookedAt_ = Clock::now();
    changed_.notify_all();
    if (known == serial_) return "{" + headLocked() + "}";
    return wholeLocked();
}

std::shared_ptr<HttpStream> PageFeed::follow() {
    return std::make_shared<Stream>(*this);
}

void PageFeed::simulate(SimulatedArray array) {
    const std::lock_guard building(building_);
    if (simulated_ == array) return;
    const bool otherNames =
        simulated_.targets != array.targets || simulated_.places != array.places;
    simulated_ = std::move(array);
    if (otherNames) elements_ = nullptr;
    build(building);
}

void PageFeed::note(const std::string& line) {
    const std::lock_guard building(building_);
    changes_.push_front({timeStamp(), "", "", printable(line)});
    changes_.resize(std::min(changes_.size(), kMostChanges));
    build(building);
    const std::lock_guard lock(mutex_);
    due_ = {};
    changed_.notify_all();
}

}  // namespace testbed
