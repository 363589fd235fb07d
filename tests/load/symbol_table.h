// What the binary tools say about a library.
#pragma once

#include <string>
#include <vector>

namespace loadtest {

/// One dynamic symbol that a library defines. `kind` is nm's letter.
struct Symbol {
    char kind;
    std::string name;
};

/// The lines that a command prints. Throws std::runtime_error when it fails.
std::vector<std::string> linesOf(const std::string& command);

/// The dynamic symbols that the library defines, with demangled names or as they are.
std::vector<Symbol> exportedSymbols(const std::string& library, bool demangled = false);

}  // namespace loadtest
