#include "bench_program.h"

#include <syslog.h>

#include <CLI/CLI.hpp>
#include <cstdlib>
#include <iostream>

namespace bench {

int runProgram(CLI::App& options, int argc, char** argv, int logged,
               const std::function<void()>& measure) {
    CLI11_PARSE(options, argc, argv);
    setlogmask(LOG_UPTO(logged));
    try {
        measure();
        return EXIT_SUCCESS;
    } catch (const std::exception& error) {
        std::cerr << error.what() << std::endl;
        return EXIT_FAILURE;
    }
}

}  // namespace bench
