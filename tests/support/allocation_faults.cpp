#include "allocation_faults.h"

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <cstdlib>
#include <cstring>

namespace plexortest {
namespace {

std::atomic<bool> active{false};
std::atomic<int> firstRefused{0};
std::atomic<bool> onlyOnce{false};
std::atomic<int> asked{0};
std::atomic<int> refusals{0};
char refusedText[4096];  // written before `active` is set

bool refuse() {
    errno = ENOMEM;
    refusals++;
    return true;
}

/// Whether the allocation that is asked for now fails.
bool refuseNext() {
    if (!active) return false;
    const int number = ++asked;
    if (firstRefused == 0) return false;
    if (onlyOnce ? number == firstRefused : number >= firstRefused) return refuse();
    return false;
}

bool refuseCopyOf(const char* text) {
    if (!active) return false;
    if (refusedText[0] != '\0' && strcmp(text, refusedText) == 0) return refuse();
    return refuseNext();
}

}  // namespace

FailAllocation::FailAllocation(int n, bool once, const std::string& text) {
    firstRefused = n;
    onlyOnce = once;
    asked = 0;
    refusals = 0;
    text.copy(refusedText, sizeof refusedText - 1);
    refusedText[std::min(text.size(), sizeof refusedText - 1)] = '\0';
    active = true;
}

FailAllocation::~FailAllocation() { active = false; }

int FailAllocation::refused() { return refusals; }
int FailAllocation::counted() { return asked; }

}  // namespace plexortest

extern "C" {

void* __real_calloc(size_t count, size_t size);
void* __real_malloc(size_t size);
void* __real_realloc(void* memory, size_t size);
char* __real_strdup(const char* text);

void* __wrap_calloc(size_t count, size_t size) {
    return plexortest::refuseNext() ? nullptr : __real_calloc(count, size);
}

void* __wrap_malloc(size_t size) {
    return plexortest::refuseNext() ? nullptr : __real_malloc(size);
}

void* __wrap_realloc(void* memory, size_t size) {
    return plexortest::refuseNext() ? nullptr : __real_realloc(memory, size);
}

char* __wrap_strdup(const char* text) {
    return plexortest::refuseCopyOf(text) ? nullptr : __real_strdup(text);
}

}  // extern "C"
