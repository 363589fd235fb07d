// Texts that XML 1.0 can carry.
#pragma once

#include <string>
#include <string_view>

namespace testbed {

/// The text with U+FFFD in the place of everything that no XML 1.0 document may hold, not even
/// escaped: control characters but tab and line ends, surrogates, U+FFFE, U+FFFF, bad UTF-8.
std::string xmlText(std::string_view text);

/// One character in UTF-8; U+FFFD for a number that is no character.
std::string utf8Character(char32_t character);

/// The first character of the text, and how many bytes it takes. Bad UTF-8 is U+FFFD of one byte;
/// of an empty text it is U+FFFD of none.
struct Utf8Character {
    char32_t character;
    std::size_t size;
};
Utf8Character firstCharacter(std::string_view text);

}  // namespace testbed
