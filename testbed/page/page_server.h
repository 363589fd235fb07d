// Answers a browser: the page, its document, changes as they happen, and commands.
#pragma once

#include <functional>
#include <optional>
#include <string>

#include "control_socket.h"
#include "page_access.h"
#include "page_feed.h"

namespace testbed {

class PageServer {
public:
    /// Carries out a command of a page. May take as long as it wants.
    using CarryOut = std::function<CommandResult(const std::string&)>;

    /// `feed` must outlive the server. Without `carryOut` one can only look.
    PageServer(PageFeed& feed, PageAccess access, CarryOut carryOut = nullptr)
        : feed_(feed), access_(std::move(access)), carryOut_(std::move(carryOut)) {}

    /// None for a request that is not for a page. Thread-safe.
    std::optional<HttpOutcome> answer(const HttpRequest& request) const;

private:
    HttpOutcome answerGet(const HttpRequest& request) const;
    HttpOutcome answerCommand(const HttpRequest& request) const;
    bool maySteer(const HttpRequest& request) const {
        return carryOut_ != nullptr && access_.maySteer(request);
    }

    PageFeed& feed_;
    PageAccess access_;
    CarryOut carryOut_;
};

}  // namespace testbed
