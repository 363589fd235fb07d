// A stop that is asked for in the middle of work, by the thread that does the work.
#pragma once

#include <gtest/gtest.h>

#include <string>

#include "PlexorProviderCfg.h"
#include "captured_syslog.h"
#include "worker_harness.h"

namespace plexortest {

/// Asks for the stop when the n-th line with that beginning is logged.
class StopAtLine {
public:
    explicit StopAtLine(const std::string& beginning, int number = 1) {
        CapturedSyslog::onLine([this, beginning, number](const LogLine& line) {
            if (line.text.starts_with(beginning) && ++seen_ == number) {
                EXPECT_TRUE(quiesceWorkers());
            }
        });
    }
    ~StopAtLine() {
        CapturedSyslog::onLine(nullptr);
        EXPECT_TRUE(StopRequested()) << "the line never came";
    }
    StopAtLine(const StopAtLine&) = delete;
    StopAtLine& operator=(const StopAtLine&) = delete;

private:
    int seen_ = 0;
};

}  // namespace plexortest
