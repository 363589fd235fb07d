// A file that has the input, for code that reads files. It lies in memory.
#pragma once

#include <sys/mman.h>
#include <unistd.h>

#include <string>
#include <string_view>

#include "fuzz_target.h"

namespace fuzz {

/// One file for all inputs, as making one takes longer than most inputs do. It stays until the
/// process ends.
class InputFile {
public:
    InputFile() : descriptor_(memfd_create("input", MFD_CLOEXEC)) {
        require(descriptor_ >= 0, "there is memory for a file");
    }
    ~InputFile() { close(descriptor_); }
    InputFile(const InputFile&) = delete;
    InputFile& operator=(const InputFile&) = delete;

    void write(std::string_view bytes) const {
        const bool written =
            ftruncate(descriptor_, 0) == 0 && pwrite(descriptor_, bytes.data(), bytes.size(), 0) ==
                                                  static_cast<ssize_t>(bytes.size());
        require(written, "the file takes the input");
    }
    std::string name() const { return "/proc/self/fd/" + std::to_string(descriptor_); }

private:
    int descriptor_;
};

}  // namespace fuzz
