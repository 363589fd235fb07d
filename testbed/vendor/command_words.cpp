// Splitting a line at blanks, with quoted texts and JSON values kept whole.
#include "command_words.h"

#include "json_document.h"
#include "scenario.h"

namespace testbed {
namespace {

using nlohmann::json;

bool isBlank(char c) {
    return c == ' ' || c == '\t' || c == '\r';
}

/// Where the JSON value that begins at `begin` ends: behind its quotation mark or last bracket.
std::size_t endOfJson(const std::string& text, std::size_t begin) {
    std::size_t depth = 0;
    bool quoted = false;
    for (std::size_t i = begin; i < text.size(); ++i) {
        const char c = text[i];
        if (quoted && c == '\\') {
            ++i;
            continue;
        }
        if (c == '"') quoted = !quoted;
        if (quoted) continue;
        if (c == '{' || c == '[') ++depth;
        if ((c == '}' || c == ']') && depth > 0) --depth;
        if (depth == 0) return i + 1;
    }
    refuseCommand(quoted ? "a quotation mark is missing" : "a bracket is missing");
}

/// Reads one word after the other.
class WordReader {
public:
    explicit WordReader(const std::string& text) : text_(text) {}

    bool next(CommandWord& word) {
        while (at_ < text_.size() && isBlank(text_[at_])) ++at_;
        if (at_ == text_.size()) return false;
        word = text_[at_] == '"' ? wordOf(takeJson().get<std::string>()) : takePlain();
        return true;
    }

private:
    json takeJson() {
        const std::size_t end = endOfJson(text_, at_);
        if (end < text_.size() && !isBlank(text_[end])) {
            refuseCommand("a blank is missing behind " + text_.substr(at_, end - at_));
        }
        json value = parseJson(text_.substr(at_, end - at_), "command");
        at_ = end;
        return value;
    }

    CommandWord takePlain() {
        const std::size_t begin = at_;
        while (at_ < text_.size() && !isBlank(text_[at_])) {
            const bool valueFollows = text_[at_] == '=' && at_ > begin && at_ + 1 < text_.size();
            ++at_;
            if (!valueFollows || std::string("\"{[").find(text_[at_]) == std::string::npos) {
                continue;
            }
            if (text_.find('=', begin) != at_ - 1) continue;
            const std::string name = text_.substr(begin, at_ - 1 - begin);
            json value = takeJson();
            return {text_.substr(begin, at_ - begin), name, std::move(value)};
        }
        return wordOf(text_.substr(begin, at_ - begin));
    }

    static CommandWord wordOf(const std::string& text) {
        const std::size_t equals = text.find('=');
        if (equals == std::string::npos || equals == 0) return {text, "", nullptr};
        return {text, text.substr(0, equals), plainValue(text.substr(equals + 1))};
    }

    static json plainValue(const std::string& text) {
        json value = json::parse(text, nullptr, false);
        return value.is_discarded() || value.is_structured() || value.is_string() ? json(text)
                                                                                  : value;
    }

    const std::string& text_;
    std::size_t at_ = 0;
};

/// What is in a document can be written; JSON has only texts in UTF-8.
void requireUtf8(const std::string& command) {
    try {
        json(command).dump();
    } catch (const json::type_error&) {
        refuseCommand("it is not in UTF-8");
    }
}

}  // namespace

void refuseCommand(const std::string& what) {
    throw ScenarioError("command: " + what);
}

std::string quotedWord(const std::string& text) {
    const bool plain = !text.empty() && text.find_first_of(" \t\"=\\") == std::string::npos;
    return plain ? text : json(text).dump();
}

std::vector<CommandWord> commandWords(const std::string& command) {
    requireUtf8(command);
    WordReader reader(command);
    std::vector<CommandWord> words;
    for (CommandWord word; reader.next(word);) words.push_back(std::move(word));
    return words;
}

}  // namespace testbed
