// What the system says about this process.
#pragma once

#include <chrono>
#include <cstddef>
#include <string>

namespace torture {

std::size_t threadCount();
/// The same before any other thread is started: makes one first, because a sanitizer adds a thread
/// of its own then.
std::size_t threadCountAtRest();
/// Waits until the process has that many threads; false when it does not come to that in time.
bool waitForThreadCount(std::size_t count, std::chrono::milliseconds limit);
/// Whether a file whose path contains `part` is mapped into the process.
bool isMapped(const std::string& part);
/// Memory in use, kilobytes.
std::size_t residentKilobytes();

}  // namespace torture
