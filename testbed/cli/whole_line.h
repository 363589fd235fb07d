// Lines of output that stay whole whichever threads print.
#pragma once

#include <iosfwd>
#include <string>

namespace testbed {

/// Prints the line and its end in one write, and flushes. What others print meanwhile, be it to the
/// other output in the same file or terminal, comes before or behind it.
void printLine(std::ostream& stream, const std::string& line);

}  // namespace testbed
