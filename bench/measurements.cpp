#include "measurements.h"

#include <cstdio>
#include <fstream>

#include "bench_clients.h"

namespace bench {

void Measurements::add(const std::string& name, double value, const std::string& unit) {
    std::printf("%-40s %14.6g %s\n", name.c_str(), value, unit.c_str());
    std::fflush(stdout);
    all_.push_back({{"name", name}, {"value", value}, {"unit", unit}});
}

void Measurements::write(const std::string& file) const {
    if (file.empty()) return;
    std::ofstream out(file);
    out << nlohmann::json{{"measurements", all_}}.dump(1) << std::endl;
    if (!out) throw BenchError("cannot write " + file);
}

}  // namespace bench
