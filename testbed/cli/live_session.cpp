#include "live_session.h"

#include <sys/stat.h>
#include <syslog.h>

#include <CLI/CLI.hpp>
#include <cstdlib>
#include <iostream>

#include "library_locator.h"
#include "provider_log.h"
#include "scenario_parser.h"
#include "schema_choice.h"

namespace testbed {

void addLiveOptions(CLI::App& command, LiveOptions& options) {
    command.add_option("--scenario", options.scenario, "scenario file")->required();
    command.add_option("--library", options.library, "the provider's shared library")
        ->envname("PLEXOR_PROVIDER_LIBRARY");
    command.add_option("--provider", options.provider, "name that the factory begins with")
        ->capture_default_str();
    command.add_option("--schema", options.schema, kSchemaHelp);
}

void Printer::line(const std::string& text) {
    const std::lock_guard lock(mutex_);
    std::cout << text << std::endl;
}

bool FileWatch::changed() {
    const auto now = stamp();
    return now != std::exchange(seen_, now);
}

std::pair<long, long> FileWatch::stamp() const {
    struct stat status = {};
    if (stat(file_.c_str(), &status) != 0) return {0, 0};
    return {status.st_mtim.tv_sec, status.st_mtim.tv_nsec};
}

LiveSession::LiveSession(const LiveOptions& options)
    : file_(options.scenario),
      session_(
          readScenario(options.scenario).manager,
          [&](Broker& broker) {
              if (options.onBroker) options.onBroker(broker);
              if (options.intervalSeconds) polling_.emplace(*options.intervalSeconds);
              array_ = std::make_unique<LiveArray>(broker, options.scenario);
              defineChosenClasses(broker.repository(), kServedNamespace, options.schema);
          },
          locateLibrary(options.library), options.provider) {}

LiveSession::~LiveSession() {
    directProviderLog(LOG_ERR, nullptr);
}

Inventory LiveSession::ask() {
    std::vector<std::string> names;
    for (const ServedClass& served : servedClasses()) names.push_back(served.name);
    InstanceClient client = session_.client();
    return collectInventory(client, names, kServedNamespace);
}

template <typename Change>
void LiveSession::change(Change makeChange) {
    try {
        makeChange();
    } catch (const std::runtime_error& error) {
        printer_.line(std::string("? ") + error.what());
    }
}

void LiveSession::takeNewFile() {
    if (file_.changed()) change([this] { array_->reload(); });
}

bool LiveSession::execute(const std::string& line) {
    if (line == "quit") return false;
    if (line.empty() || line[0] == '#') return true;
    if (line == "show") {
        show();
    } else if (line.starts_with("wait ")) {
        wait(std::atoi(line.c_str() + 5));
    } else {
        printer_.line("> " + line);
        change([&] {
            if (!executeOwn(line)) array_->apply(line);
        });
    }
    return true;
}

}  // namespace testbed
