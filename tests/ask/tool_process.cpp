#include "tool_process.h"

#include <poll.h>
#include <signal.h>
#include <stdlib.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <stdexcept>

namespace {

namespace fs = std::filesystem;

std::string contentOf(const fs::path& file) {
    std::ifstream stream(file);
    std::stringstream text;
    text << stream.rdbuf();
    return text.str();
}

/// The first line that is written there within a minute; "" without one.
std::string firstLine(int descriptor) {
    std::string line;
    const auto end = std::chrono::steady_clock::now() + std::chrono::minutes(1);
    while (std::chrono::steady_clock::now() < end) {
        pollfd entry = {descriptor, POLLIN, 0};
        char byte = 0;
        if (poll(&entry, 1, 1000) <= 0) continue;
        if (read(descriptor, &byte, 1) != 1) return "";
        if (byte == '\n') return line;
        line += byte;
    }
    return "";
}

}  // namespace

Outcome runTool(const std::string& arguments) {
    std::string directory = (fs::temp_directory_path() / "plexor-ask-XXXXXX").string();
    if (!mkdtemp(directory.data())) throw std::runtime_error("no scratch directory");
    const fs::path output = fs::path(directory) / "out";
    const fs::path errors = fs::path(directory) / "err";
    // The tree is to have its lines wherever the tests run.
    const std::string command = "LC_ALL=${PLEXOR_TEST_LOCALE-C.UTF-8} " + std::string(TOOL) + " " +
                                arguments + " >" + output.string() + " 2>" + errors.string();
    const int status = std::system(command.c_str());
    Outcome outcome{WIFEXITED(status) ? WEXITSTATUS(status) : -1, contentOf(output),
                    contentOf(errors)};
    fs::remove_all(directory);
    return outcome;
}

ServingTool::ServingTool(const std::string& arguments) {
    int output[2];
    if (pipe(output) != 0) throw std::runtime_error("no pipe");
    process_ = fork();
    if (process_ == 0) {
        dup2(output[1], STDOUT_FILENO);
        close(output[0]);
        close(output[1]);
        // Standard input stays open and silent: its end would end the session.
        int input[2];
        if (pipe(input) == 0) dup2(input[0], STDIN_FILENO);
        const std::string command = "exec " TOOL " serve --port 0 " + arguments;
        execl("/bin/sh", "sh", "-c", command.c_str(), nullptr);
        _exit(127);
    }
    close(output[1]);
    output_ = output[0];
    const std::string line = firstLine(output_);
    const std::string begin = "serving ";
    if (line.starts_with(begin)) url_ = line.substr(begin.size());
    if (!url_.empty()) return;
    kill(process_, SIGKILL);
    waitpid(process_, nullptr, 0);
    close(output_);
    throw std::runtime_error("serve says \"" + line + "\"");
}

ServingTool::~ServingTool() {
    kill(process_, SIGTERM);
    waitpid(process_, nullptr, 0);
    close(output_);
}
