#include "http_message.h"

#include <algorithm>

#include "cim_object.h"

namespace testbed {
namespace {

struct Reason {
    int status;
    const char* phrase;
};

constexpr Reason kReasons[] = {
    {100, "Continue"},
    {200, "OK"},
    {400, "Bad Request"},
    {401, "Unauthorized"},
    {405, "Method Not Allowed"},
    {411, "Length Required"},
    {413, "Payload Too Large"},
    {415, "Unsupported Media Type"},
    {417, "Expectation Failed"},
    {431, "Request Header Fields Too Large"},
    {500, "Internal Server Error"},
    {501, "Not Implemented"},
    {505, "HTTP Version Not Supported"},
};

const char* phraseOf(int status) {
    const auto* found = std::find_if(std::begin(kReasons), std::end(kReasons),
                                     [&](const Reason& reason) { return reason.status == status; });
    return found == std::end(kReasons) ? "Unknown" : found->phrase;
}

}  // namespace

const std::string* HttpRequest::header(std::string_view name) const {
    for (const auto& [known, value] : headers)
        if (sameName(known, name)) return &value;
    return nullptr;
}

bool HttpRequest::keepsConnection() const {
    const std::string* wish = header("Connection");
    const std::string options = wish ? foldName(*wish) : "";
    if (options.find("close") != std::string::npos) return false;
    return minorVersion >= 1 || options.find("keep-alive") != std::string::npos;
}

std::string httpText(const HttpResponse& response, bool keepConnection) {
    std::string text =
        "HTTP/1.1 " + std::to_string(response.status) + " " + phraseOf(response.status) + "\r\n";
    for (const auto& [name, value] : response.headers) text += name + ": " + value + "\r\n";
    if (response.status >= 200) {
        text += "Content-Length: " + std::to_string(response.body.size()) + "\r\n";
        text += keepConnection ? "Connection: keep-alive\r\n" : "Connection: close\r\n";
    }
    return text + "\r\n" + response.body;
}

}  // namespace testbed
