#include "http_post.h"

#include <algorithm>
#include <array>
#include <charconv>

#include "cim_object.h"

namespace testbed {
namespace {

constexpr std::size_t kLongestLine = 8192;
constexpr std::size_t kMostHeaders = 200;
constexpr std::size_t kToTheEnd = static_cast<std::size_t>(-1);

std::string_view trimmed(std::string_view text) {
    const std::size_t first = text.find_first_not_of(" \t");
    if (first == std::string_view::npos) return {};
    return text.substr(first, text.find_last_not_of(" \t") - first + 1);
}

std::size_t numberIn(std::string_view text, int base, const char* what) {
    std::size_t number = 0;
    const char* end = text.data() + text.size();
    const auto [stop, error] = std::from_chars(text.data(), end, number, base);
    if (error != std::errc() || stop != end || number == kToTheEnd)
        throw WbemError(std::string("no HTTP: a bad ") + what);
    return number;
}

/// An answer as it arrives.
class AnswerReader {
public:
    AnswerReader(ByteStream& stream, std::size_t largestBody)
        : stream_(stream), largestBody_(largestBody) {}

    PostAnswer read() {
        PostAnswer answer;
        do {
            answer = PostAnswer();
            readStatus(answer);
            readHeaders(answer.headers);
        } while (answer.status / 100 == 1);  // the real one follows
        readBody(answer);
        return answer;
    }

private:
    bool fill() {
        if (next_ < size_) return true;
        next_ = 0;
        size_ = stream_.read(buffer_.data(), buffer_.size());
        return size_ > 0;
    }

    std::string readLine() {
        std::string line;
        for (;;) {
            if (!fill())
                throw WbemError(started_ ? "the answer ends early" : "the server sent no answer");
            started_ = true;
            const char c = buffer_[next_++];
            if (c == '\n') break;
            line += c;
            if (line.size() > kLongestLine) throw WbemError("no HTTP: a line without an end");
        }
        if (line.ends_with('\r')) line.pop_back();
        return line;
    }

    void readStatus(PostAnswer& answer) {
        const std::string line = readLine();
        const std::string_view text = line;
        if (!text.starts_with("HTTP/1.") || text.size() < 12 || text[8] != ' ')
            throw WbemError("the answer is no HTTP");
        answer.status = static_cast<int>(numberIn(text.substr(9, 3), 10, "status"));
        answer.reason = trimmed(text.substr(12));
    }

    void readHeaders(HttpHeaders& headers) {
        for (std::string line = readLine(); !line.empty(); line = readLine()) {
            const std::size_t colon = std::min(line.find(':'), line.size());
            const std::string_view text = line;
            headers.emplace_back(trimmed(text.substr(0, colon)),
                                 trimmed(text.substr(std::min(colon + 1, text.size()))));
            if (headers.size() > kMostHeaders) throw WbemError("no HTTP: too many headers");
        }
    }

    void readBody(PostAnswer& answer) {
        const std::string& coding = answer.header("Content-Encoding");
        if (!coding.empty() && !sameName(coding, "identity"))
            throw WbemError("the answer is compressed, which was not asked for");
        const std::string& transfer = answer.header("Transfer-Encoding");
        const std::string& length = answer.header("Content-Length");
        if (answer.status == 204 || answer.status == 304) return;
        if (!transfer.empty() && !sameName(transfer, "identity"))
            readChunks(answer.body);
        else if (!length.empty())
            append(answer.body, numberIn(length, 10, "length"));
        else
            append(answer.body, kToTheEnd);
    }

    void readChunks(std::string& body) {
        for (;;) {
            const std::string line = readLine();
            const std::size_t end = std::min(line.find(';'), line.size());
            const std::string_view digits = trimmed(std::string_view(line).substr(0, end));
            const std::size_t size = numberIn(digits, 16, "chunk");
            if (size == 0) return;  // trailers say nothing of use
            append(body, size);
            if (!readLine().empty()) throw WbemError("no HTTP: a chunk of another size");
        }
    }

    /// `size` bytes, or all that come.
    void append(std::string& body, std::size_t size) {
        if (size != kToTheEnd && size > largestBody_ - body.size()) refuseSize();
        while (size > 0) {
            if (!fill()) {
                if (size == kToTheEnd) return;
                throw WbemError("the answer ends early");
            }
            const std::size_t count = std::min(size_ - next_, size);
            if (count > largestBody_ - body.size()) refuseSize();
            body.append(buffer_.data() + next_, count);
            next_ += count;
            if (size != kToTheEnd) size -= count;
        }
    }

    [[noreturn]] void refuseSize() const {
        throw WbemError("the answer has more than " + std::to_string(largestBody_) + " bytes");
    }

    ByteStream& stream_;
    std::size_t largestBody_;
    std::array<char, 16384> buffer_;
    std::size_t next_ = 0;
    std::size_t size_ = 0;
    bool started_ = false;
};

}  // namespace

const std::string& PostAnswer::header(std::string_view name) const {
    static const std::string none;
    for (const auto& [known, value] : headers)
        if (sameName(known, name)) return value;
    return none;
}

PostAnswer httpPost(ByteStream& stream, const PostRequest& request, std::size_t largestBody) {
    std::string text =
        "POST " + request.path + " HTTP/1.1\r\nHost: " + request.host +
        "\r\nConnection: close\r\nContent-Length: " + std::to_string(request.body.size()) + "\r\n";
    for (const auto& [name, value] : request.headers) text += name + ": " + value + "\r\n";
    text += "\r\n" + request.body;
    stream.write(text);
    return AnswerReader(stream, largestBody).read();
}

}  // namespace testbed
