// What is wrong with a MOF file, and where.
#pragma once

#include <stdexcept>
#include <string>

namespace testbed {

/// Its text is `FILE:LINE: what is wrong`, for the user.
class MofError : public std::runtime_error {
public:
    MofError(const std::string& file, int line, const std::string& what)
        : std::runtime_error(file + ":" + std::to_string(line) + ": " + what), line_(line) {}

    int line() const { return line_; }

private:
    int line_;
};

}  // namespace testbed
