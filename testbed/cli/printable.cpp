// Characters that show nothing or mislead, the width of texts, and folding them into lines.
#include "printable.h"

#include <unictype.h>
#include <unistr.h>
#include <uniwidth.h>

#include <algorithm>

namespace testbed {
namespace {

/// A character, or a byte that belongs to none, and the bytes that it takes.
struct Unit {
    ucs4_t character;
    std::size_t size;
    bool isValid;
};

Unit firstUnit(std::string_view text) {
    ucs4_t character = 0;
    const auto* bytes = reinterpret_cast<const std::uint8_t*>(text.data());
    const int size = u8_mbtoucr(&character, bytes, text.size());
    return size > 0 ? Unit{character, static_cast<std::size_t>(size), true} : Unit{0, 1, false};
}

bool shows(const Unit& unit) {
    constexpr std::uint32_t kHidden =
        UC_CATEGORY_MASK_C | UC_CATEGORY_MASK_Zl | UC_CATEGORY_MASK_Zp;
    return unit.isValid && !uc_is_general_category_withtable(unit.character, kHidden);
}

std::size_t columnsOf(const Unit& unit) {
    return static_cast<std::size_t>(std::max(uc_width(unit.character, "UTF-8"), 0));
}

template <class Keep>
std::string replaced(std::string_view text, Keep keep) {
    std::string result;
    while (!text.empty()) {
        const Unit unit = firstUnit(text);
        if (keep(unit)) {
            result += text.substr(0, unit.size);
        } else {
            result += '?';
        }
        text.remove_prefix(unit.size);
    }
    return result;
}

/// Where the line that begins at `begin` has to end, a blank before it included if need be.
std::size_t lineEnd(std::string_view text, std::size_t begin, std::size_t columns) {
    std::size_t used = 0, lastBlank = begin;
    for (std::size_t at = begin; at < text.size();) {
        const Unit unit = firstUnit(text.substr(at));
        if (text[at] == ' ' && at > begin && text[at - 1] != ' ') lastBlank = at;
        used += columnsOf(unit);
        if (used > columns && at > begin) return lastBlank > begin ? lastBlank : at;
        at += unit.size;
    }
    return text.size();
}

}  // namespace

std::string printable(std::string_view text) {
    return replaced(text, shows);
}

std::string printableAscii(std::string_view text) {
    return replaced(text, [](const Unit& unit) { return shows(unit) && unit.character < 0x80; });
}

std::vector<TextPart> foldedLines(std::string_view text, std::size_t first, std::size_t rest) {
    std::vector<TextPart> lines;
    std::size_t begin = 0;
    do {
        const std::size_t end = lineEnd(text, begin, lines.empty() ? first : rest);
        lines.push_back({begin, end});
        begin = std::min(text.find_first_not_of(' ', end), text.size());
    } while (begin < text.size());
    return lines;
}

std::size_t columnsOf(std::string_view text) {
    std::size_t columns = 0;
    while (!text.empty()) {
        const Unit unit = firstUnit(text);
        columns += columnsOf(unit);
        text.remove_prefix(unit.size);
    }
    return columns;
}

}  // namespace testbed
