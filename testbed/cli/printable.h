// Texts of vendors and servers on terminals and in lines of a check.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace testbed {

/// The text in UTF-8 with "?" for each byte that is none and for each character that shows nothing
/// or changes how others show: control and format characters (direction marks among them), line and
/// paragraph separators, private and unassigned ones.
std::string printable(std::string_view text);

/// printable() with "?" for everything beyond ASCII.
std::string printableAscii(std::string_view text);

/// A part of a text: where it begins and ends.
struct TextPart {
    std::size_t begin;
    std::size_t end;
};

/// Breaks a printable text at blanks into lines of at most that many columns, `rest` columns for
/// all but the first. A word that is longer is broken where the line ends. At least one line.
std::vector<TextPart> foldedLines(std::string_view text, std::size_t first, std::size_t rest);

/// The columns that a printable text takes on a terminal.
std::size_t columnsOf(std::string_view text);

}  // namespace testbed
