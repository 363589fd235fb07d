// Words, numbers, strings with their escapes, and comments of MOF.
#include "mof_lexer.h"

#include "cim_object.h"
#include "mof_error.h"

namespace testbed {
namespace {

constexpr std::string_view kByteOrderMark = "\xef\xbb\xbf";
constexpr std::string_view kSymbols = "#[]{}():;,=";
constexpr std::size_t kShownLength = 40;

bool isDigit(char c) {
    return c >= '0' && c <= '9';
}

bool isHexDigit(char c) {
    return isDigit(c) || (c >= 'a' && c <= 'f') || (c >= 'A' && c <= 'F');
}

bool startsWord(char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_';
}

bool belongsToWord(char c) {
    return startsWord(c) || isDigit(c);
}

bool isControl(char c) {
    const auto byte = static_cast<unsigned char>(c);
    return (byte < 0x20 && c != '\t') || byte == 0x7f;
}

unsigned hexValue(char c) {
    if (isDigit(c)) return static_cast<unsigned>(c - '0');
    return static_cast<unsigned>((c | 0x20) - 'a' + 10);
}

/// Appends a code of the basic plane as UTF-8.
void appendUtf8(std::string& text, unsigned code) {
    if (code < 0x80) {
        text += static_cast<char>(code);
    } else if (code < 0x800) {
        text += static_cast<char>(0xc0 | (code >> 6));
        text += static_cast<char>(0x80 | (code & 0x3f));
    } else {
        text += static_cast<char>(0xe0 | (code >> 12));
        text += static_cast<char>(0x80 | ((code >> 6) & 0x3f));
        text += static_cast<char>(0x80 | (code & 0x3f));
    }
}

}  // namespace

bool MofToken::isWord(std::string_view keyword) const {
    return kind == MofTokenKind::Word && sameName(text, keyword);
}

std::string MofToken::shown() const {
    if (kind == MofTokenKind::End) return "the end of the file";
    const std::string start = text.substr(0, kShownLength);
    return kind == MofTokenKind::String ? "the string \"" + start + "\"" : "\"" + start + "\"";
}

MofLexer::MofLexer(std::string_view text, std::string file) : text_(text), file_(std::move(file)) {
    if (text_.starts_with(kByteOrderMark)) place_ = kByteOrderMark.size();
}

void MofLexer::fail(int line, const std::string& what) const {
    throw MofError(file_, line, what);
}

char MofLexer::peek(std::size_t ahead) const {
    return place_ + ahead < text_.size() ? text_[place_ + ahead] : '\0';
}

void MofLexer::skipBlockComment() {
    const int start = line_;
    for (place_ += 2; !atEnd(); ++place_) {
        if (peek() == '*' && peek(1) == '/') {
            place_ += 2;
            return;
        }
        if (peek() == '\n') ++line_;
    }
    fail(start, "a comment without an end");
}

void MofLexer::skipSpace() {
    while (!atEnd()) {
        const char c = peek();
        if (c == '/' && peek(1) == '/') {
            while (!atEnd() && peek() != '\n') ++place_;
        } else if (c == '/' && peek(1) == '*') {
            skipBlockComment();
        } else if (c == ' ' || c == '\t' || c == '\r' || c == '\f' || c == '\n') {
            if (c == '\n') ++line_;
            ++place_;
        } else {
            return;
        }
    }
}

MofToken MofLexer::read(MofTokenKind kind, bool (*belongs)(char)) {
    const std::size_t start = place_;
    while (!atEnd() && belongs(peek())) ++place_;
    return {kind, std::string(text_.substr(start, place_ - start)), line_};
}

MofToken MofLexer::readNumber() {
    MofToken token{MofTokenKind::Number, "", line_};
    do {
        token.text += text_[place_++];
        // The sign of an exponent; a hexadecimal number may end in "e".
        const bool isHex = token.text.find_first_of("xX") != std::string::npos;
        const bool afterExponent = !isHex && (token.text.back() | 0x20) == 'e';
        if (afterExponent && (peek() == '+' || peek() == '-')) token.text += text_[place_++];
    } while (!atEnd() && (belongsToWord(peek()) || peek() == '.'));
    return token;
}

unsigned MofLexer::readEscape() {
    static constexpr std::string_view names = "btnfr\"'\\";
    static constexpr std::string_view values = "\b\t\n\f\r\"'\\";
    const char name = peek();
    const std::size_t known = name == '\0' ? names.npos : names.find(name);
    if (known != names.npos) {
        ++place_;
        return static_cast<unsigned char>(values[known]);
    }
    if ((name | 0x20) != 'x' || !isHexDigit(peek(1))) fail(line_, "an unknown escape in a literal");
    ++place_;
    unsigned code = 0;
    for (int digits = 0; digits < 4 && isHexDigit(peek()); ++digits) {
        code = code * 16 + hexValue(text_[place_++]);
    }
    return code;
}

MofToken MofLexer::readString() {
    MofToken token{MofTokenKind::String, "", line_};
    ++place_;
    while (true) {
        if (atEnd() || peek() == '\n') fail(line_, "a string without an end");
        const char c = text_[place_++];
        if (c == '"') return token;
        if (isControl(c)) fail(line_, "a control character in a string");
        if (c == '\\') {
            appendUtf8(token.text, readEscape());
        } else {
            token.text += c;
        }
    }
}

MofToken MofLexer::readCharacter() {
    ++place_;
    if (atEnd() || isControl(peek()) || peek() == '\'') fail(line_, "an empty character literal");
    unsigned code = static_cast<unsigned char>(text_[place_++]);
    if (code >= 0x80) fail(line_, "a character literal beyond ASCII; write it as \\x");
    if (code == '\\') code = readEscape();
    if (peek() != '\'') fail(line_, "a character literal without an end");
    ++place_;
    return {MofTokenKind::Character, std::to_string(code), line_};
}

MofToken MofLexer::next() {
    skipSpace();
    if (atEnd()) return {MofTokenKind::End, "", line_};
    const char c = peek();
    if (startsWord(c)) return read(MofTokenKind::Word, belongsToWord);
    const bool isSigned = (c == '+' || c == '-') && (isDigit(peek(1)) || peek(1) == '.');
    if (isDigit(c) || isSigned || (c == '.' && isDigit(peek(1)))) return readNumber();
    if (c == '"') return readString();
    if (c == '\'') return readCharacter();
    if (c == '$' && startsWord(peek(1))) {
        ++place_;
        return read(MofTokenKind::Alias, belongsToWord);
    }
    if (c == '\0' || kSymbols.find(c) == kSymbols.npos) {
        fail(line_, "a character that does not belong here");
    }
    ++place_;
    return {MofTokenKind::Symbol, std::string(1, c), line_};
}

}  // namespace testbed
