// A fixture's work under several log masks: a masked line makes no path's text, and what is not
// masked says the same whatever else is.
#pragma once

#include <functional>
#include <ostream>
#include <string>
#include <vector>

#include "log_text.h"
#include "provider_fixture.h"

namespace plexortest {

/// A line as it was logged, masked or not, and how many texts of paths were made for it.
struct CostedLine {
    int priority;
    std::string text;  ///< without addresses
    std::size_t pathTexts;

    bool operator==(const CostedLine&) const = default;
};

inline void PrintTo(const CostedLine& line, std::ostream* out) {
    *out << line.text << " (" << line.pathTexts << " texts of paths)";
}

/// Any fixture over a broker, with its log looked at under masks.
template <class Fixture>
class MaskedLog : public Fixture {
protected:
    /// How often the work below runs.
    static constexpr std::size_t kRuns = 4;

    /// Runs the work with the log open, up to info, up to error, and at info alone. It must log the
    /// same each time and name a path in at least one line.
    void expectSameUnderMasks(const std::function<void()>& work) {
        this->books().recordObjectCalls(true);
        const std::vector<CostedLine> open = linesUnder(LOG_UPTO(LOG_DEBUG), work);
        std::size_t pathTexts = 0;
        for (const CostedLine& line : open) pathTexts += line.pathTexts;
        EXPECT_GT(pathTexts, 0u) << "no line names a path";
        for (const int mask : {LOG_UPTO(LOG_INFO), LOG_UPTO(LOG_ERR), LOG_MASK(LOG_INFO)}) {
            const std::vector<CostedLine> lines = linesUnder(mask, work);
            EXPECT_EQ(seenUnder(mask, lines), seenUnder(mask, open)) << "mask " << mask;
            for (const CostedLine& line : lines) {
                EXPECT_TRUE(isSeen(mask, line) || line.pathTexts == 0) << "masked: " << line.text;
            }
        }
    }

private:
    std::vector<CostedLine> linesUnder(int mask, const std::function<void()>& work) {
        std::vector<CostedLine> lines;
        std::size_t before = 0;
        this->books().clearCalls();
        CapturedSyslog::onLine([&](const LogLine& line) {
            const std::size_t made = this->books().count(testbed::Entry::PathToString);
            lines.push_back({line.priority, logText(line), made - before});
            before = made;
        });
        setlogmask(mask);
        work();
        setlogmask(LOG_UPTO(LOG_DEBUG));
        CapturedSyslog::onLine(nullptr);
        EXPECT_EQ(this->books().count(testbed::Entry::PathToString), before) << "for no line";
        return lines;
    }
    static bool isSeen(int mask, const CostedLine& line) {
        return (mask & LOG_MASK(line.priority)) != 0;
    }
    static std::vector<CostedLine> seenUnder(int mask, std::vector<CostedLine> lines) {
        std::erase_if(lines, [mask](const CostedLine& line) { return !isSeen(mask, line); });
        return lines;
    }
};

}  // namespace plexortest
