#include "http_reader.h"

#include <algorithm>
#include <charconv>
#include <optional>
#include <utility>

#include "cim_object.h"

namespace testbed {
namespace {

bool isToken(std::string_view text) {
    constexpr std::string_view kMarks = "!#$%&'*+-.^_`|~";
    return !text.empty() && std::all_of(text.begin(), text.end(), [&](char c) {
        return (c >= '0' && c <= '9') || (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') ||
               kMarks.find(c) != std::string_view::npos;
    });
}

std::string_view trimmed(std::string_view text) {
    while (!text.empty() && (text.front() == ' ' || text.front() == '\t')) text.remove_prefix(1);
    while (!text.empty() && (text.back() == ' ' || text.back() == '\t')) text.remove_suffix(1);
    return text;
}

std::optional<std::size_t> parseSize(std::string_view text, int base) {
    std::size_t size = 0;
    const char* end = text.data() + text.size();
    const auto [stop, error] = std::from_chars(text.data(), end, size, base);
    if (error == std::errc::result_out_of_range) return static_cast<std::size_t>(-1);
    if (text.empty() || error != std::errc() || stop != end) return std::nullopt;
    return size;
}

}  // namespace

HttpReader::Progress HttpReader::add(std::string_view bytes) {
    if (state_ != State::Refused) input_ += bytes;
    while (state_ != State::Complete && state_ != State::Refused && step()) {
    }
    if (state_ == State::Refused) return Progress::Refused;
    if (state_ == State::Complete) return Progress::Complete;
    return std::exchange(wantsContinue_, false) ? Progress::WantsContinue : Progress::NeedsMore;
}

HttpRequest HttpReader::take() {
    state_ = State::RequestLine;
    searched_ = headSize_ = remaining_ = 0;
    wantsContinue_ = false;
    return std::exchange(request_, {});
}

bool HttpReader::refuse(int status) {
    state_ = State::Refused;
    refusal_ = status;
    input_.clear();
    return false;
}

/// The next line without its end; false when it has not arrived whole, or the lines are too long.
bool HttpReader::takeLine(std::string& line) {
    const std::size_t end = input_.find('\n', searched_);
    const std::size_t size = end == std::string::npos ? input_.size() : end + 1;
    if (headSize_ + size > limits_.head) return refuse(431);
    if (end == std::string::npos) {
        searched_ = input_.size();
        return false;
    }
    line = input_.substr(0, end);
    if (line.ends_with('\r')) line.pop_back();
    input_.erase(0, size);
    searched_ = 0;
    headSize_ += size;
    return true;
}

/// Reads one piece. False when more must arrive first, or the request is refused.
bool HttpReader::step() {
    std::string line;
    switch (state_) {
        case State::RequestLine:
            return takeLine(line) && readRequestLine(std::move(line));
        case State::Headers:
            return takeLine(line) && (line.empty() ? endHeaders() : readHeader(line));
        case State::Body:
            return readBody(State::Complete);
        case State::ChunkSize:
            return takeLine(line) && readChunkSize(line);
        case State::ChunkData:
            return readBody(State::ChunkEnd);
        case State::ChunkEnd:
            if (!takeLine(line)) return false;
            if (!line.empty()) return refuse(400);
            state_ = State::ChunkSize;
            headSize_ = 0;
            return true;
        case State::Trailers:
            if (!takeLine(line)) return false;
            if (line.empty()) state_ = State::Complete;
            return true;
        default:
            return false;
    }
}

bool HttpReader::readRequestLine(std::string line) {
    if (line.empty()) return true;  // line ends may stand before a request
    const std::size_t first = line.find(' ');
    const std::size_t last = line.rfind(' ');
    if (first == std::string::npos || first == last) return refuse(400);
    request_.method = line.substr(0, first);
    request_.target = line.substr(first + 1, last - first - 1);
    const std::string version = line.substr(last + 1);
    if (!isToken(request_.method) || request_.target.find(' ') != std::string::npos ||
        !version.starts_with("HTTP/"))
        return refuse(400);
    if (version != "HTTP/1.1" && version != "HTTP/1.0") return refuse(505);
    request_.minorVersion = version.back() - '0';
    state_ = State::Headers;
    return true;
}

bool HttpReader::readHeader(const std::string& line) {
    const std::size_t colon = line.find(':');
    if (colon == std::string::npos || !isToken(line.substr(0, colon))) return refuse(400);
    const std::string_view value = trimmed(std::string_view(line).substr(colon + 1));
    request_.headers.emplace_back(line.substr(0, colon), value);
    return true;
}

bool HttpReader::endHeaders() {
    headSize_ = 0;
    const std::string* coding = request_.header("Transfer-Encoding");
    const std::string* length = request_.header("Content-Length");
    const std::string* expectation = request_.header("Expect");
    if (coding && length) return refuse(400);
    if (coding && !sameName(*coding, "chunked")) return refuse(501);
    if (expectation && !sameName(*expectation, "100-continue")) return refuse(417);
    if (!coding && !length && request_.method.ends_with("POST")) return refuse(411);
    if (length && !readLength(*length)) return false;
    state_ = coding ? State::ChunkSize : remaining_ > 0 ? State::Body : State::Complete;
    wantsContinue_ = expectation && state_ != State::Complete && input_.empty();
    return true;
}

bool HttpReader::readLength(const std::string& text) {
    for (const auto& [name, value] : request_.headers)
        if (sameName(name, "Content-Length") && value != text) return refuse(400);
    const auto size = parseSize(text, 10);
    if (!size) return refuse(400);
    if (*size > limits_.body) return refuse(413);
    remaining_ = *size;
    return true;
}

bool HttpReader::readChunkSize(const std::string& line) {
    headSize_ = 0;
    const auto size = parseSize(trimmed(line.substr(0, line.find(';'))), 16);
    if (!size) return refuse(400);
    if (*size > limits_.body - request_.body.size()) return refuse(413);
    remaining_ = *size;
    state_ = *size == 0 ? State::Trailers : State::ChunkData;
    return true;
}

/// Moves what has arrived of the body or the chunk.
bool HttpReader::readBody(State next) {
    const std::size_t size = std::min(remaining_, input_.size());
    request_.body.append(input_, 0, size);
    input_.erase(0, size);
    remaining_ -= size;
    if (remaining_ == 0) state_ = next;
    return remaining_ == 0;
}

}  // namespace testbed
