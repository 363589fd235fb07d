// Splits MOF text into tokens.
#pragma once

#include <string>
#include <string_view>

namespace testbed {

enum class MofTokenKind { End, Word, Alias, Number, String, Character, Symbol };

struct MofToken {
    MofTokenKind kind = MofTokenKind::End;
    /// Words, aliases (without "$") and numbers as written, strings with their escapes resolved,
    /// characters as the decimal number of their code.
    std::string text;
    int line = 0;

    bool isSymbol(char symbol) const {
        return kind == MofTokenKind::Symbol && text.size() == 1 && text[0] == symbol;
    }
    /// Keywords are compared without regard to letter case.
    bool isWord(std::string_view keyword) const;
    /// The token as an error message shows it.
    std::string shown() const;
};

/// Comments and white space are skipped. Throws MofError for what is no token.
class MofLexer {
public:
    /// The text must outlive the lexer; `file` is for messages.
    MofLexer(std::string_view text, std::string file);

    /// The next token; End for ever at the end of the text.
    MofToken next();
    const std::string& file() const { return file_; }

private:
    [[noreturn]] void fail(int line, const std::string& what) const;
    char peek(std::size_t ahead = 0) const;
    bool atEnd() const { return place_ >= text_.size(); }
    void skipSpace();
    void skipBlockComment();
    MofToken read(MofTokenKind kind, bool (*belongs)(char));
    MofToken readNumber();
    MofToken readString();
    MofToken readCharacter();
    /// One character of a literal, escape resolved: the number of its code or byte.
    unsigned readEscape();

    std::string_view text_;
    std::string file_;
    std::size_t place_ = 0;
    int line_ = 1;
};

}  // namespace testbed
