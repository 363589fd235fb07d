#include "allocation_faults.h"

#include <errno.h>
#include <stdlib.h>
#include <string.h>

#include <atomic>
#include <stdexcept>

extern "C" {
void* __real_calloc(size_t count, size_t size);
void* __real_malloc(size_t size);
void* __real_realloc(void* block, size_t size);
char* __real_strdup(const char* text);
}

namespace plexortest {
namespace {

// Written only while nothing is armed; what the threads under test read is relaxed, so that an
// allocation orders nothing between them.
std::atomic<bool> armed{false};
std::atomic<std::size_t> seen{0};
std::atomic<std::size_t> failed{0};
std::size_t firstToFail = 0;
bool allFurtherFail = false;
unsigned watched = 0;
std::string* textToFail = nullptr;

bool shouldFail(Allocator which, const char* text) {
    if (!armed.load(std::memory_order_acquire)) return false;
    if ((watched & static_cast<unsigned>(which)) == 0) return false;
    if (textToFail != nullptr && (text == nullptr || *textToFail != text)) return false;
    const std::size_t index = seen.fetch_add(1, std::memory_order_relaxed) + 1;
    const bool fails = index == firstToFail || (allFurtherFail && index > firstToFail);
    if (!fails) return false;
    failed.fetch_add(1, std::memory_order_relaxed);
    errno = ENOMEM;
    return true;
}

void arm(std::size_t first, bool further, Allocator which, std::string* text) {
    if (armed) throw std::logic_error("allocation faults are armed already");
    seen = 0;
    failed = 0;
    firstToFail = first;
    allFurtherFail = further;
    watched = static_cast<unsigned>(which);
    textToFail = text;
    armed.store(true, std::memory_order_release);
}

}  // namespace

FailAllocation FailAllocation::nth(std::size_t n, Allocator which) {
    arm(n, false, which, nullptr);
    return FailAllocation();
}

FailAllocation FailAllocation::from(std::size_t n, Allocator which) {
    arm(n, true, which, nullptr);
    return FailAllocation();
}

FailAllocation FailAllocation::strdupOf(std::string text) {
    arm(1, true, Allocator::Strdup, new std::string(std::move(text)));
    return FailAllocation();
}

FailAllocation FailAllocation::none(Allocator which) {
    arm(0, false, which, nullptr);
    return FailAllocation();
}

FailAllocation::~FailAllocation() {
    armed = false;
    delete textToFail;
    textToFail = nullptr;
}

std::size_t FailAllocation::calls() const {
    return seen;
}
std::size_t FailAllocation::failures() const {
    return failed;
}

std::size_t forEachFailingAllocation(const std::function<void(std::size_t n)>& act) {
    for (std::size_t n = 1;; n++) {
        std::size_t failures = 0;
        {
            const auto fault = FailAllocation::nth(n);
            act(n);
            failures = fault.failures();
        }
        if (failures == 0) return n - 1;
        const auto fault = FailAllocation::from(n);
        act(n);
    }
}

}  // namespace plexortest

extern "C" {

void* __wrap_calloc(size_t count, size_t size) {
    if (plexortest::shouldFail(plexortest::Allocator::Calloc, nullptr)) return nullptr;
    return __real_calloc(count, size);
}

void* __wrap_malloc(size_t size) {
    if (plexortest::shouldFail(plexortest::Allocator::Malloc, nullptr)) return nullptr;
    return __real_malloc(size);
}

void* __wrap_realloc(void* block, size_t size) {
    if (plexortest::shouldFail(plexortest::Allocator::Realloc, nullptr)) return nullptr;
    return __real_realloc(block, size);
}

char* __wrap_strdup(const char* text) {
    if (plexortest::shouldFail(plexortest::Allocator::Strdup, text)) return nullptr;
    return __real_strdup(text);
}

}  // extern "C"
