// Printing a line in one piece.
#include "whole_line.h"

#include <ostream>

namespace testbed {

void printLine(std::ostream& stream, const std::string& line) {
    // In pieces, a line of standard error would flush the first ones of standard output.
    stream << (line + "\n") << std::flush;
}

}  // namespace testbed
