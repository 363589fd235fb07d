#include "process_view.h"

#include <filesystem>
#include <fstream>
#include <iterator>
#include <thread>

namespace torture {

std::size_t threadCount() {
    const std::filesystem::directory_iterator tasks("/proc/self/task");
    return static_cast<std::size_t>(std::distance(begin(tasks), end(tasks)));
}

std::size_t threadCountAtRest() {
    std::thread([] {}).join();
    std::this_thread::sleep_for(std::chrono::milliseconds(100));
    return threadCount();
}

bool waitForThreadCount(std::size_t count, std::chrono::milliseconds limit) {
    using Clock = std::chrono::steady_clock;
    const auto deadline = Clock::now() + limit;
    // A thread that was joined may still be listed for a moment.
    while (threadCount() != count) {
        if (Clock::now() >= deadline) return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    return true;
}

bool isMapped(const std::string& part) {
    std::ifstream maps("/proc/self/maps");
    for (std::string line; std::getline(maps, line);)
        if (line.find(part) != std::string::npos) return true;
    return false;
}

std::size_t residentKilobytes() {
    std::ifstream status("/proc/self/status");
    constexpr char kField[] = "VmRSS:";
    for (std::string line; std::getline(status, line);)
        if (line.starts_with(kField)) return std::stoul(line.substr(sizeof kField - 1));
    return 0;
}

}  // namespace torture
