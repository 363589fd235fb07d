// Decoding UTF-8 strictly, and replacing what XML cannot carry.
#include "xml_text.h"

namespace testbed {
namespace {

constexpr char32_t kReplacement = 0xfffd;

bool isSurrogate(char32_t character) {
    return character >= 0xd800 && character <= 0xdfff;
}

bool isXmlCharacter(char32_t character) {
    if (character < 0x20) return character == '\t' || character == '\n' || character == '\r';
    return !isSurrogate(character) && character != 0xfffe && character != 0xffff;
}

/// Bytes that a sequence with this first byte takes; 0 for a byte that begins none.
std::size_t sequenceSize(unsigned char first) {
    if (first < 0x80) return 1;
    if (first < 0xc2) return 0;
    if (first < 0xe0) return 2;
    if (first < 0xf0) return 3;
    return first < 0xf5 ? 4 : 0;
}

/// The smallest character that needs that many bytes; a smaller one is written too long.
char32_t smallestOf(std::size_t size) {
    return size == 2 ? 0x80 : size == 3 ? 0x800 : 0x10000;
}

}  // namespace

Utf8Character firstCharacter(std::string_view text) {
    if (text.empty()) return {kReplacement, 0};
    const auto first = static_cast<unsigned char>(text[0]);
    const std::size_t size = sequenceSize(first);
    if (size == 1) return {first, 1};
    if (size == 0 || size > text.size()) return {kReplacement, 1};
    char32_t character = first & (0x7fU >> size);
    for (std::size_t i = 1; i < size; i++) {
        const auto next = static_cast<unsigned char>(text[i]);
        if ((next & 0xc0) != 0x80) return {kReplacement, 1};
        character = (character << 6) | (next & 0x3fU);
    }
    const bool bad = character < smallestOf(size) || character > 0x10ffff || isSurrogate(character);
    return bad ? Utf8Character{kReplacement, 1} : Utf8Character{character, size};
}

std::string utf8Character(char32_t character) {
    if (character > 0x10ffff || isSurrogate(character)) character = kReplacement;
    if (character < 0x80) return {static_cast<char>(character)};
    std::string text;
    int shift = character < 0x800 ? 6 : character < 0x10000 ? 12 : 18;
    const unsigned lead = shift == 6 ? 0xc0 : shift == 12 ? 0xe0 : 0xf0;
    text += static_cast<char>(lead | (character >> shift));
    for (shift -= 6; shift >= 0; shift -= 6) {
        text += static_cast<char>(0x80 | ((character >> shift) & 0x3f));
    }
    return text;
}

std::string xmlText(std::string_view text) {
    static const std::string replacement = utf8Character(kReplacement);
    std::string result;
    result.reserve(text.size());
    while (!text.empty()) {
        const auto [character, size] = firstCharacter(text);
        const bool isKept = isXmlCharacter(character) && character != kReplacement;
        result += isKept ? text.substr(0, size) : replacement;
        text.remove_prefix(size);
    }
    return result;
}

}  // namespace testbed
