// Collecting what is found, counted, missing or surplus, and composing the line of it.
#include "check_summary.h"

#include <algorithm>
#include <cstdio>

#include "inventory_gaps.h"
#include "printable.h"

namespace testbed {
namespace {

/// Names of a finding that are shown; the rest is counted.
constexpr std::size_t kMostNames = 5;
constexpr std::size_t kLongestName = 120;

/// Elements of one class in one state.
struct Finding {
    const ServedClass* kind;
    Verdict verdict;
    std::vector<std::string> names;
};

/// What was found of one class.
struct Count {
    const ServedClass* kind;
    std::size_t number;
    bool known;
};

/// NULL for software, which nobody counts.
const ServedClass* kindOf(const std::string& className) {
    const ServedClass* served = findServedClass(className);
    return served && served->isCounted ? served : nullptr;
}

std::string counted(std::size_t count, const ServedClass& kind) {
    return std::to_string(count) + " " + (count == 1 ? kind.singular : kind.plural);
}

/// A text of a vendor or a server as part of a line.
std::string inLine(const std::string& text) {
    std::string result = printable(text);
    std::replace(result.begin(), result.end(), '|', '/');
    return result;
}

std::string clipped(std::string name) {
    if (name.size() <= kLongestName) return name;
    std::size_t end = kLongestName;
    while (end > 0 && (static_cast<unsigned char>(name[end]) & 0xc0) == 0x80) end--;
    return name.substr(0, end) + "...";
}

/// "answered with status 5 (…)"
std::string statusOf(const Response& response) {
    std::string text = "answered with status " + std::to_string(response.rc);
    if (response.message && !response.message->empty()) {
        text += " (" + inLine(clipped(*response.message)) + ")";
    }
    return text;
}

/// The first of the names and the number of the others.
std::string someOf(const std::vector<std::string>& names, std::size_t most,
                   const char* separator = ", ") {
    std::string text;
    const std::size_t shown = std::min(names.size(), most);
    for (std::size_t i = 0; i < shown; i++) text += (i ? separator : "") + clipped(names[i]);
    if (shown < names.size()) text += " and " + std::to_string(names.size() - shown) + " more";
    return text;
}

std::string textOf(const Finding& finding) {
    return counted(finding.names.size(), *finding.kind) + " " + finding.verdict.finding + ": " +
           someOf(finding.names, kMostNames);
}

/// "critical: Drive 32_3 on controller C0 (failed)"
std::string detailOf(const Verdict& verdict, const std::string& name) {
    const std::string& state = verdict.finding.empty() ? verdict.word : verdict.finding;
    return inLine(std::string(verdict.ignored ? "ignored " : "") + levelName(verdict.level) + ": " +
                  clipped(name) + (state.empty() ? "" : " (" + foldName(state) + ")"));
}

/// Everything that a line tells.
class Summary {
public:
    Summary(const Inventory& inventory, const CheckTerms& terms) : terms_(terms) {
        for (const ClassAnswer& answer : inventory) take(answer);
        for (const auto& [status, classNames] : statuses_) {
            errors_.push_back(someOf(classNames, 1) + " " + status);
        }
        if (!terms.failure.empty()) errors_.push_back(terms.failure);
        noteArriving(inventory);
        if (nothing().empty() && !arriving_) noteCounts();
        std::stable_sort(findings_.begin(), findings_.end(),
                         [](const Finding& left, const Finding& right) {
                             return left.verdict.level > right.verdict.level;
                         });
    }

    CheckSummary result() {
        return {status(), inLine(text()), numbers(), std::move(details_), std::move(problems_)};
    }

private:
    void take(const ClassAnswer& answer) {
        const ServedClass* kind = kindOf(answer.className);
        const bool known = answer.response.rc == CMPI_RC_OK;
        if (!known) noteStatus(answer);
        if (!kind) return;
        for (const Instance& instance : answer.response.instances) take(*kind, instance);
        counts_.push_back({kind, answer.response.instances.size(), known});
    }

    /// Classes with the same answer are told of once.
    void noteStatus(const ClassAnswer& answer) {
        const std::string status = statusOf(answer.response);
        const auto same = std::find_if(statuses_.begin(), statuses_.end(),
                                       [&](const auto& entry) { return entry.first == status; });
        auto& classNames = same != statuses_.end()
                               ? same->second
                               : statuses_.emplace_back(status, std::vector<std::string>()).second;
        classNames.push_back(answer.className);
    }

    void take(const ServedClass& kind, const Instance& instance) {
        const auto verdict = terms_.policy.judge(kind.name, instance);
        if (!verdict) return;
        details_.push_back(detailOf(*verdict, shortName(instance)));
        if (verdict->level == CheckLevel::Ok) return;
        problems_.push_back(details_.back());
        if (verdict->ignored) {
            ignored_++;
            return;
        }
        const auto same =
            std::find_if(findings_.begin(), findings_.end(), [&](const Finding& finding) {
                return finding.kind == &kind && finding.verdict.level == verdict->level &&
                       finding.verdict.finding == verdict->finding;
            });
        Finding& finding =
            same != findings_.end() ? *same : findings_.emplace_back(Finding{&kind, *verdict, {}});
        finding.names.push_back(shortName(instance));
    }

    /// Where there is nothing at all, that is said instead.
    void noteArriving(const Inventory& inventory) {
        std::vector<std::string> signs;
        if (!terms_.arriving.empty()) signs.push_back(terms_.arriving);
        if (nothing().empty()) {
            for (std::string& gap : gapsIn(inventory, terms_.policy)) {
                signs.push_back(std::move(gap));
            }
        }
        arriving_ = !signs.empty();
        if (arriving_) errors_.push_back("inventory still arriving: " + someOf(signs, 2, "; "));
    }

    /// Only of classes that were answered; what is not known is no alarm.
    void noteCounts() {
        for (const Count& count : counts_) {
            const auto expected = terms_.expected.find(count.kind->plural);
            if (!count.known || expected == terms_.expected.end()) continue;
            const std::size_t wanted = expected->second.count;
            if (count.number < wanted) {
                missing_.push_back("only " + std::to_string(count.number) + " of " +
                                   counted(wanted, *count.kind));
            }
            if (count.number > wanted && expected->second.exact) {
                surplus_.push_back(counted(count.number, *count.kind) + " instead of " +
                                   std::to_string(wanted));
            }
        }
    }

    /// What was asked for, but is not there; "" when there is something to judge.
    std::string nothing() const {
        if (counts_.empty()) return "nothing to judge";
        const Count& first = counts_.front();
        const bool ofControllers = first.kind == &servedClasses().front();
        if (first.number == 0 && (ofControllers || counts_.size() == 1)) {
            return std::string("no ") + first.kind->plural;
        }
        const bool devices = std::any_of(counts_.begin() + 1, counts_.end(),
                                         [](const Count& count) { return count.number > 0; });
        // The provider shows a controller before its devices.
        if (counts_.size() > 1 && !devices) {
            return counted(first.number, *first.kind) + ", but no devices";
        }
        return "";
    }

    int status() const {
        const CheckLevel worst =
            findings_.empty() ? CheckLevel::Ok : findings_.front().verdict.level;
        if (worst == CheckLevel::Critical || !missing_.empty()) return kCheckCritical;
        if (!errors_.empty() || !nothing().empty()) return kCheckUnknown;
        return worst == CheckLevel::Warning || !surplus_.empty() ? kCheckWarning : kCheckOk;
    }

    std::string text() const {
        std::vector<std::string> parts = missing_;
        for (const Finding& finding : findings_) parts.push_back(textOf(finding));
        parts.insert(parts.end(), surplus_.begin(), surplus_.end());
        parts.insert(parts.end(), errors_.begin(), errors_.end());
        if (errors_.empty() && !nothing().empty()) parts.push_back(nothing());
        if (parts.empty()) {
            for (const Count& count : counts_) parts.push_back(counted(count.number, *count.kind));
        }
        if (ignored_ > 0) parts.push_back(std::to_string(ignored_) + " ignored");
        std::string text;
        for (const std::string& part : parts) {
            text += (text.empty() ? "" : status() == kCheckOk ? ", " : "; ") + part;
        }
        return text;
    }

    /// "drives=9;9:9;9:", or "drives=U" for a number that is not known.
    std::string numberOf(const Count& count) const {
        const auto expected = terms_.expected.find(count.kind->plural);
        const std::string text = std::string(count.kind->plural) + "=" +
                                 (count.known ? std::to_string(count.number) : "U");
        if (expected == terms_.expected.end()) return text;
        const std::string wanted = std::to_string(expected->second.count);
        return text + ";" + (expected->second.exact ? wanted + ":" + wanted : "") + ";" + wanted +
               ":";
    }

    std::string numbers() const {
        if (counts_.empty()) return "";
        std::size_t warnings = 0, criticals = 0;
        for (const Finding& finding : findings_) {
            (finding.verdict.level == CheckLevel::Critical ? criticals : warnings) +=
                finding.names.size();
        }
        std::string text;
        for (const Count& count : counts_) text += numberOf(count) + " ";
        text += "warning=" + std::to_string(warnings) + " critical=" + std::to_string(criticals);
        if (ignored_ > 0) text += " ignored=" + std::to_string(ignored_);
        return text + time();
    }

    std::string time() const {
        if (!terms_.time) return "";
        char text[80];
        std::snprintf(text, sizeof text, " time=%.3fs;;;0;%u", terms_.time->seconds,
                      terms_.time->limitSeconds);
        return text;
    }

    const CheckTerms& terms_;
    std::vector<std::string> missing_;
    std::vector<std::string> surplus_;
    std::vector<Finding> findings_;  // the worst first
    std::vector<std::string> errors_;
    std::vector<std::pair<std::string, std::vector<std::string>>> statuses_;  // with their classes
    std::vector<Count> counts_;
    std::vector<std::string> details_, problems_;
    std::size_t ignored_ = 0;
    bool arriving_ = false;
};

}  // namespace

const char* statusName(int status) {
    static constexpr const char* kNames[] = {"ok", "warning", "critical", "unknown"};
    return kNames[status];
}

std::string CheckSummary::line() const {
    static constexpr const char* kWords[] = {"OK", "WARNING", "CRITICAL", "UNKNOWN"};
    return std::string("PLEXOR ") + kWords[status] + " - " + text +
           (numbers.empty() ? "" : " | " + numbers);
}

std::string statusLine(const ClassAnswer& answer) {
    return answer.className + " " + statusOf(answer.response);
}

CheckSummary summarize(const Inventory& inventory, const CheckTerms& terms) {
    return Summary(inventory, terms).result();
}

CheckSummary unknownSummary(const std::string& reason) {
    return {kCheckUnknown, inLine(reason), ""};
}

}  // namespace testbed
