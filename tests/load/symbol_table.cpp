#include "symbol_table.h"

#include <stdio.h>

#include <memory>
#include <sstream>
#include <stdexcept>

namespace loadtest {

std::vector<std::string> linesOf(const std::string& command) {
    FILE* pipe = popen(command.c_str(), "r");
    if (pipe == nullptr) throw std::runtime_error("cannot run " + command);
    std::string output;
    char part[4096];
    for (std::size_t got; (got = fread(part, 1, sizeof part, pipe)) > 0;) output.append(part, got);
    if (pclose(pipe) != 0) throw std::runtime_error(command + " failed");

    std::vector<std::string> lines;
    std::istringstream stream(output);
    for (std::string line; std::getline(stream, line);) lines.push_back(line);
    return lines;
}

std::vector<Symbol> exportedSymbols(const std::string& library, bool demangled) {
    const std::string command =
        std::string(NM) + " -D --defined-only " + (demangled ? "-C " : "") + library;
    std::vector<Symbol> symbols;
    for (const std::string& line : linesOf(command)) {
        // "0000000000026210 B ActiveThreads"
        std::istringstream stream(line);
        std::string address;
        Symbol symbol;
        stream >> address >> symbol.kind >> std::ws;
        std::getline(stream, symbol.name);
        symbols.push_back(symbol);
    }
    return symbols;
}

}  // namespace loadtest
