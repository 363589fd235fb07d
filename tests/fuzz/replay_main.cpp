// Runs a harness over the inputs that are kept: what was found once, and what leads far into the
// code.
//
//   fuzz-replay HARNESS DIRECTORY...
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <iterator>
#include <set>

#include "fuzz_target.h"

namespace {

namespace fs = std::filesystem;

std::string contentOf(const fs::path& file) {
    std::ifstream stream(file, std::ios::binary);
    std::string bytes{std::istreambuf_iterator<char>(stream), {}};
    if (!stream) throw std::runtime_error("cannot read " + file.string());
    return bytes;
}

/// The number of inputs. The name of each is told before it runs, so that the one that ends the
/// process is known.
std::size_t replay(fuzz::Harness harness, const fs::path& directory) {
    std::set<fs::path> files;
    for (const auto& entry : fs::directory_iterator(directory)) files.insert(entry.path());
    for (const fs::path& file : files) {
        std::cout << file.filename().string() << std::endl;
        harness(contentOf(file));
    }
    return files.size();
}

int run(int argc, char** argv) {
    const auto found = argc < 3 ? fuzz::harnesses().end() : fuzz::harnesses().find(argv[1]);
    if (found == fuzz::harnesses().end()) {
        std::cerr << "fuzz-replay HARNESS DIRECTORY...; harnesses:";
        for (const auto& [name, harness] : fuzz::harnesses()) std::cerr << " " << name;
        std::cerr << "\n";
        return 2;
    }
    std::size_t inputs = 0;
    for (int i = 2; i < argc; i++) inputs += replay(found->second, argv[i]);
    std::cout << inputs << " inputs\n";
    return inputs == 0 ? EXIT_FAILURE : EXIT_SUCCESS;
}

}  // namespace

int main(int argc, char** argv) {
    try {
        return run(argc, argv);
    } catch (const fs::filesystem_error& error) {
        std::cerr << error.what() << "\n";
        return EXIT_FAILURE;
    }
}
