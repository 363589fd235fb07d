// What the tests of refresh and workers share beyond the provider's fixture.
#pragma once

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

#include "PlexorProviderCfg.h"
#include "vendor_fixture.h"

namespace plexortest {

/// Whether workers flush through their context, where a fault rule can catch it.
#if defined(PLEXOR_CONTEXT_FLUSH) && PLEXOR_CONTEXT_FLUSH
inline constexpr bool kContextHasFlush = true;
#else
inline constexpr bool kContextHasFlush = false;
#endif

class RefreshTest : public VendorTest {
protected:
    static void clearLog() { CapturedSyslog::clear(); }

    static std::size_t timesLogged(int priority, const std::string& text) {
        const auto lines = CapturedSyslog::linesAt(priority);
        return static_cast<std::size_t>(std::count(lines.begin(), lines.end(), text));
    }
    /// Whether the log has exactly one such line.
    static bool loggedOnce(int priority, const std::string& text) {
        return timesLogged(priority, text) == 1;
    }
    /// Number of the first line with that text; -1 without one.
    static int lineNumber(const std::string& text) {
        const auto lines = CapturedSyslog::lines();
        const auto found = std::find_if(lines.begin(), lines.end(),
                                        [&](const LogLine& line) { return line.text == text; });
        return found == lines.end() ? -1 : static_cast<int>(found - lines.begin());
    }
    /// "assocClass>resultClass" of every query for associators so far, in order.
    std::vector<std::string> associatorQueries() {
        std::vector<std::string> found;
        for (const testbed::CallRecord& call : books().queries()) {
            if (call.entry != testbed::Entry::Associators) continue;
            found.push_back(call.assocClass.value_or("NULL") + ">" +
                            call.resultClass.value_or("NULL"));
            EXPECT_TRUE(asksForAll(call)) << found.back();
        }
        return found;
    }
};

}  // namespace plexortest
