// What the provider has of the heap, and how often it asks for some: in front of the C library's
// allocator, in a program that links this. Nobody else's allocations are counted.
#pragma once

#include <cstddef>
#include <string>

namespace bench {

/// Maps the library, so that from now on what it allocates is known as its own. Before the provider
/// is loaded from it. Throws BenchError.
void countAllocationsOf(const std::string& library);

/// Calls of calloc, malloc, realloc, strdup and operator new so far.
std::size_t allocations();
/// Bytes that are allocated now, with what the allocator adds to each.
std::size_t allocatedBytes();

}  // namespace bench
