// What a benchmark has found, for people and for scripts/costs.
#pragma once

#include <nlohmann/json.hpp>
#include <string>

namespace bench {

/// Prints each measurement as it comes and keeps it for a file.
class Measurements {
public:
    /// `name` has its parts between slashes, as google-benchmark's names have.
    void add(const std::string& name, double value, const std::string& unit);
    /// Writes {"measurements": [{"name", "value", "unit"}]}; "" writes nothing. Throws BenchError.
    void write(const std::string& file) const;

private:
    nlohmann::json all_ = nlohmann::json::array();
};

}  // namespace bench
