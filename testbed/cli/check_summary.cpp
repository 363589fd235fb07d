#include "check_summary.h"

#include <algorithm>
#include <vector>

#include "check_rules.h"

namespace testbed {
namespace {

/// Names of a finding that are shown; the rest is counted.
constexpr std::size_t kMostNames = 5;
constexpr std::size_t kLongestName = 120;

struct Noun {
    const char* className;
    const char* singular;
    const char* plural;
};

constexpr Noun kNouns[] = {
    {"Tovexa_PlexorController", "controller", "controllers"},
    {"Tovexa_PlexorStorageVolume", "volume", "volumes"},
    {"Tovexa_PlexorStorageExtent", "drive", "drives"},
    {"Tovexa_PlexorSASSATAPort", "port", "ports"},
    {"Tovexa_PlexorBattery", "battery", "batteries"},
};

/// Elements of one class in one state.
struct Finding {
    const Noun* noun;
    Verdict verdict;
    std::vector<std::string> names;
};

/// NULL for software, which nobody counts.
const Noun* nounOf(const std::string& className) {
    const auto* found = std::find_if(std::begin(kNouns), std::end(kNouns), [&](const Noun& noun) {
        return sameName(noun.className, className);
    });
    return found == std::end(kNouns) ? nullptr : found;
}

std::string counted(std::size_t count, const Noun& noun) {
    return std::to_string(count) + " " + (count == 1 ? noun.singular : noun.plural);
}

/// A text of a vendor or a server as part of the line.
std::string printable(std::string text) {
    for (char& c : text) {
        if (static_cast<unsigned char>(c) < 0x20 || c == 0x7f) c = '?';
        if (c == '|') c = '/';
    }
    return text;
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
    if (response.message && !response.message->empty())
        text += " (" + printable(clipped(*response.message)) + ")";
    return text;
}

/// The first of the names and the number of the others.
std::string someOf(const std::vector<std::string>& names, std::size_t most) {
    std::string text;
    const std::size_t shown = std::min(names.size(), most);
    for (std::size_t i = 0; i < shown; i++) text += (i ? ", " : "") + clipped(names[i]);
    if (shown < names.size()) text += " and " + std::to_string(names.size() - shown) + " more";
    return text;
}

std::string textOf(const Finding& finding) {
    return counted(finding.names.size(), *finding.noun) + " " + finding.verdict.finding + ": " +
           someOf(finding.names, kMostNames);
}

/// Everything that a line tells.
class Summary {
public:
    Summary(const Inventory& inventory, const CheckTerms& terms) {
        for (const ClassAnswer& answer : inventory) {
            const Noun* noun = nounOf(answer.className);
            if (answer.response.rc != CMPI_RC_OK) noteStatus(answer);
            for (const Instance& instance : answer.response.instances)
                if (noun) take(*noun, instance);
            if (noun) counts_.emplace_back(noun, answer.response.instances.size());
        }
        for (const auto& [status, classNames] : statuses_)
            errors_.push_back(someOf(classNames, 1) + " " + status);
        if (!terms.failure.empty()) errors_.push_back(terms.failure);
        if (nothing().empty()) noteMissing(inventory, terms);
        std::stable_sort(findings_.begin(), findings_.end(),
                         [](const Finding& left, const Finding& right) {
                             return left.verdict.level > right.verdict.level;
                         });
    }

    CheckSummary result() const {
        static constexpr const char* kWords[] = {"OK", "WARNING", "CRITICAL", "UNKNOWN"};
        const int status = this->status();
        return {status,
                printable(std::string("PLEXOR ") + kWords[status] + " - " + text()) + numbers()};
    }

private:
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

    void take(const Noun& noun, const Instance& instance) {
        const auto verdict = judge(noun.className, instance);
        if (!verdict || verdict->level == CheckLevel::Ok) return;
        const auto same =
            std::find_if(findings_.begin(), findings_.end(), [&](const Finding& finding) {
                return finding.noun == &noun && finding.verdict.level == verdict->level &&
                       finding.verdict.finding == verdict->finding;
            });
        Finding& finding =
            same != findings_.end() ? *same : findings_.emplace_back(Finding{&noun, *verdict, {}});
        finding.names.push_back(shortName(instance));
    }

    /// Only of classes that were answered; what is not known is no alarm.
    void noteMissing(const Inventory& inventory, const CheckTerms& terms) {
        for (const ClassAnswer& answer : inventory) {
            const Noun* noun = nounOf(answer.className);
            if (!noun || answer.response.rc != CMPI_RC_OK) continue;
            const auto expected = terms.expected.find(noun->plural);
            const std::size_t count = answer.response.instances.size();
            if (expected != terms.expected.end() && count < expected->second)
                missing_.push_back("only " + std::to_string(count) + " of " +
                                   counted(expected->second, *noun));
        }
    }

    /// What was asked for, but is not there; "" when there is something to judge.
    std::string nothing() const {
        if (counts_.empty()) return "nothing to judge";
        const auto& [first, firstCount] = counts_.front();
        if (firstCount == 0 && (first == kNouns || counts_.size() == 1))
            return std::string("no ") + first->plural;
        const bool devices = std::any_of(counts_.begin() + 1, counts_.end(),
                                         [](const auto& entry) { return entry.second > 0; });
        // The provider shows a controller before its devices.
        if (counts_.size() > 1 && !devices) return counted(firstCount, *first) + ", but no devices";
        return "";
    }

    int status() const {
        const CheckLevel worst =
            findings_.empty() ? CheckLevel::Ok : findings_.front().verdict.level;
        if (worst == CheckLevel::Critical || !missing_.empty()) return kCheckCritical;
        if (!errors_.empty() || !nothing().empty()) return kCheckUnknown;
        return worst == CheckLevel::Warning ? kCheckWarning : kCheckOk;
    }

    std::string text() const {
        std::vector<std::string> parts = missing_;
        for (const Finding& finding : findings_) parts.push_back(textOf(finding));
        parts.insert(parts.end(), errors_.begin(), errors_.end());
        if (errors_.empty() && !nothing().empty()) parts.push_back(nothing());
        if (parts.empty())
            for (const auto& [noun, count] : counts_) parts.push_back(counted(count, *noun));
        std::string text;
        for (const std::string& part : parts)
            text += (text.empty() ? "" : status() == kCheckOk ? ", " : "; ") + part;
        return text;
    }

    std::string numbers() const {
        if (counts_.empty()) return "";
        std::size_t warnings = 0, criticals = 0;
        for (const Finding& finding : findings_)
            (finding.verdict.level == CheckLevel::Critical ? criticals : warnings) +=
                finding.names.size();
        std::string text = " |";
        for (const auto& [noun, count] : counts_)
            text.append(" ").append(noun->plural).append("=").append(std::to_string(count));
        return text + " warning=" + std::to_string(warnings) +
               " critical=" + std::to_string(criticals);
    }

    std::vector<std::string> missing_;
    std::vector<Finding> findings_;  // the worst first
    std::vector<std::string> errors_;
    std::vector<std::pair<std::string, std::vector<std::string>>> statuses_;  // with their classes
    std::vector<std::pair<const Noun*, std::size_t>> counts_;
};

}  // namespace

std::string statusLine(const ClassAnswer& answer) {
    return answer.className + " " + statusOf(answer.response);
}

bool isCounted(const std::string& plural) {
    return std::any_of(std::begin(kNouns), std::end(kNouns),
                       [&](const Noun& noun) { return plural == noun.plural; });
}

CheckSummary summarize(const Inventory& inventory, const CheckTerms& terms) {
    return Summary(inventory, terms).result();
}

CheckSummary unknownSummary(const std::string& reason) {
    return {kCheckUnknown, printable("PLEXOR UNKNOWN - " + reason)};
}

}  // namespace testbed
