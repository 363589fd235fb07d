// Routing requests to files, document, events, token and command, and the headers of every answer.
#include "page_server.h"

#include <algorithm>
#include <charconv>

#include "json_view.h"
#include "page_commands.h"
#include "page_files.h"

namespace testbed {
namespace {

using nlohmann::ordered_json;

constexpr std::string_view kDocument = "/page.json";
constexpr std::string_view kEvents = "/page/events";
constexpr std::string_view kToken = "/page/token";
constexpr std::string_view kCommand = "/page/command";
constexpr std::string_view kSince = "?since=";

/// Nothing from elsewhere, nothing inline, no text taken for markup, nobody's frame.
constexpr const char* kPolicy =
    "default-src 'none'; script-src 'self'; style-src 'self'; img-src 'self'; connect-src 'self'; "
    "base-uri 'none'; form-action 'none'; frame-ancestors 'none'; "
    "require-trusted-types-for 'script'; trusted-types 'none'";

HttpHeaders pageHeaders(std::string type) {
    return {{"Content-Type", std::move(type)},
            {"Cache-Control", "no-store"},
            {"Content-Security-Policy", kPolicy},
            {"X-Content-Type-Options", "nosniff"},
            {"Referrer-Policy", "no-referrer"},
            {"Cross-Origin-Resource-Policy", "same-origin"},
            {"Cross-Origin-Opener-Policy", "same-origin"}};
}

HttpResponse refusal(int status) {
    HttpResponse response{status, pageHeaders("text/plain"), {}};
    if (status == 401) {
        response.headers.emplace_back("WWW-Authenticate", "Basic realm=\"plexor-testbed\"");
    }
    return response;
}

HttpResponse jsonResponse(std::string text) {
    return {200, pageHeaders("application/json"), std::move(text)};
}

const PageFile* fileFor(std::string_view target) {
    for (const PageFile& file : pageFiles()) {
        if (file.target == target) return &file;
    }
    return nullptr;
}

/// The serial behind "?since="; none for anything else.
std::optional<std::uint64_t> knownSerial(std::string_view target) {
    target.remove_prefix(kDocument.size());
    if (!target.starts_with(kSince)) return std::nullopt;
    target.remove_prefix(kSince.size());
    std::uint64_t serial = 0;
    const char* end = target.data() + target.size();
    const auto [stop, error] = std::from_chars(target.data(), end, serial);
    return error == std::errc() && stop == end ? std::optional(serial) : std::nullopt;
}

bool isDocument(std::string_view target) {
    return target.substr(0, target.find('?')) == kDocument;
}

/// The command in {"command": "…"}; "" for anything else.
std::string commandIn(const std::string& body) {
    const auto document = ordered_json::parse(body, nullptr, false);
    if (!document.is_object()) return "";
    const auto command = document.find("command");
    return command != document.end() && command->is_string() ? command->get<std::string>() : "";
}

bool isOneLine(const std::string& text) {
    return std::none_of(text.begin(), text.end(),
                        [](char c) { return static_cast<unsigned char>(c) < 0x20; });
}

HttpResponse resultResponse(const CommandResult& result) {
    return jsonResponse(jsonLine({{"refused", result.refused}, {"text", result.text}}));
}

}  // namespace

std::optional<HttpOutcome> PageServer::answer(const HttpRequest& request) const {
    const std::string_view target = request.target;
    const bool isGet = request.method == "GET";
    const bool isCommand = request.method == "POST" && target == kCommand;
    const bool isKnown =
        isCommand ||
        (isGet && (fileFor(target) || isDocument(target) || target == kEvents || target == kToken));
    if (!isKnown) return std::nullopt;
    if (const int status = access_.refusalOf(request)) return refusal(status);
    return isCommand ? answerCommand(request) : answerGet(request);
}

HttpOutcome PageServer::answerGet(const HttpRequest& request) const {
    if (const PageFile* file = fileFor(request.target)) {
        return HttpResponse{200, pageHeaders(std::string(file->type)), std::string(file->content)};
    }
    if (isDocument(request.target)) {
        return jsonResponse(feed_.document(knownSerial(request.target)));
    }
    if (request.target == kToken) {
        return jsonResponse(
            jsonLine({{"token", maySteer(request) ? ordered_json(access_.token()) : nullptr}}));
    }
    return HttpResponse{200, pageHeaders("text/event-stream"), {}, {}, feed_.follow()};
}

HttpOutcome PageServer::answerCommand(const HttpRequest& request) const {
    if (!carryOut_ || !access_.isOwnCommand(request)) return refusal(403);
    const std::string* type = request.header("Content-Type");
    if (!type || !type->starts_with("application/json")) return refusal(415);
    const std::string command = commandIn(request.body);
    if (command.empty() || !isOneLine(command)) return refusal(400);
    if (!isForPages(command)) {
        return resultResponse({true, false, "not for pages; plexor-testbed tell takes it"});
    }
    return SlowWork([this, command] { return resultResponse(carryOut_(command)); });
}

}  // namespace testbed
