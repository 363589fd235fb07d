// What a harness is: a function that takes any bytes, and comes back.
//
// Built for libFuzzer (PLEXOR_FUZZ) each harness is a program of its own, which libFuzzer calls. In
// all other builds the harnesses are one program, which runs them over the inputs that are kept.
#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>
#include <string_view>

namespace fuzz {

using Harness = void (*)(std::string_view bytes);

/// The harnesses of the program, by name.
inline std::map<std::string, Harness>& harnesses() {
    static std::map<std::string, Harness> known;
    return known;
}

/// Ends the process as a finding when the code under test has not kept a promise.
void require(bool kept, const char* promise);

}  // namespace fuzz

#if defined(PLEXOR_FUZZ)
/// Begins the harness of that name; its body follows, and has `bytes`.
#define PLEXOR_FUZZ_HARNESS(name)                                                       \
    static void name##Harness(std::string_view bytes);                                  \
    extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);  \
    extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) { \
        name##Harness({reinterpret_cast<const char*>(data), size});                     \
        return 0;                                                                       \
    }                                                                                   \
    static void name##Harness([[maybe_unused]] std::string_view bytes)
#else
#define PLEXOR_FUZZ_HARNESS(name)                               \
    static void name##Harness(std::string_view bytes);          \
    [[maybe_unused]] static const bool name##Known =            \
        fuzz::harnesses().emplace(#name, name##Harness).second; \
    static void name##Harness([[maybe_unused]] std::string_view bytes)
#endif
