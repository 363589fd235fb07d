#include "counted_memory.h"

#include <dlfcn.h>
#include <link.h>
#include <malloc.h>

#include <atomic>
#include <cstdint>
#include <cstring>
#include <new>

#include "bench_clients.h"

namespace bench {
namespace {

constexpr std::size_t kChunkHead = sizeof(std::size_t);  // what glibc keeps in front of a block

std::uintptr_t libraryBegin = 0, libraryEnd = 0;
std::atomic<std::size_t> calls = 0, bytes = 0;

bool isProvider(const void* caller) {
    const auto address = reinterpret_cast<std::uintptr_t>(caller);
    return address >= libraryBegin && address < libraryEnd;
}

std::size_t sizeOf(void* block) {
    return malloc_usable_size(block) + kChunkHead;
}

void* taken(void* block, const void* caller) {
    if (block == nullptr || !isProvider(caller)) return block;
    ++calls;
    bytes += sizeOf(block);
    return block;
}

void given(void* block, const void* caller) {
    if (block != nullptr && isProvider(caller)) bytes -= sizeOf(block);
}

}  // namespace

void countAllocationsOf(const std::string& library) {
    void* handle = dlopen(library.c_str(), RTLD_NOW);
    link_map* map = nullptr;
    if (handle == nullptr || dlinfo(handle, RTLD_DI_LINKMAP, &map) != 0)
        throw BenchError("cannot load " + library);
    dl_iterate_phdr(
        [](dl_phdr_info* info, std::size_t, void* wanted) {
            if (info->dlpi_addr != static_cast<link_map*>(wanted)->l_addr) return 0;
            libraryBegin = info->dlpi_addr;
            for (int i = 0; i < info->dlpi_phnum; i++)
                if (info->dlpi_phdr[i].p_type == PT_LOAD)
                    libraryEnd =
                        info->dlpi_addr + info->dlpi_phdr[i].p_vaddr + info->dlpi_phdr[i].p_memsz;
            return 1;
        },
        map);
}

std::size_t allocations() {
    return calls;
}

std::size_t allocatedBytes() {
    return bytes;
}

}  // namespace bench

// The allocator behind these, by the names that glibc has for those who stand in front of it.
extern "C" {
void* __libc_malloc(std::size_t size);
void* __libc_calloc(std::size_t count, std::size_t size);
void* __libc_realloc(void* block, std::size_t size);
void __libc_free(void* block);

void* malloc(std::size_t size) {
    return bench::taken(__libc_malloc(size), __builtin_return_address(0));
}
void* calloc(std::size_t count, std::size_t size) {
    return bench::taken(__libc_calloc(count, size), __builtin_return_address(0));
}
void* realloc(void* block, std::size_t size) {
    bench::given(block, __builtin_return_address(0));
    return bench::taken(__libc_realloc(block, size), __builtin_return_address(0));
}
void free(void* block) {
    bench::given(block, __builtin_return_address(0));
    __libc_free(block);
}
char* strdup(const char* text) {
    const std::size_t size = std::strlen(text) + 1;
    void* copy = bench::taken(__libc_malloc(size), __builtin_return_address(0));
    return copy == nullptr ? nullptr : static_cast<char*>(std::memcpy(copy, text, size));
}
}

// The C++ library's would come from there, and not from the provider, or go straight to free.
void* operator new(std::size_t size) {
    void* block = bench::taken(__libc_malloc(size), __builtin_return_address(0));
    if (block == nullptr) throw std::bad_alloc();
    return block;
}
void operator delete(void* block) noexcept {
    bench::given(block, __builtin_return_address(0));
    __libc_free(block);
}
void operator delete(void* block, std::size_t) noexcept {
    bench::given(block, __builtin_return_address(0));
    __libc_free(block);
}
