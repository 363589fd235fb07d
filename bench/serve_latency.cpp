// How long a client waits while the server has idle, dribbling, many and hanging clients.
//
//   serve-latency [--seconds N] [--limit MS]
//
// The server of "plexor-testbed serve" over a provider of its own: 1,000 connections are idle, 250
// send a byte now and then, 16 requests hang in the provider, and once a second 1,000 requests are
// sent at once. Meanwhile one client asks, in turn, what needs the provider and
// what does not. Exit status 1 when it waits longer than the limit in one of 100 requests.
#include <CLI/CLI.hpp>
#include <algorithm>
#include <atomic>
#include <condition_variable>
#include <cstdio>
#include <thread>

#include "cim_server.h"
#include "descriptor_limit.h"
#include "fake_provider.h"
#include "raw_client.h"

namespace bench {
namespace {

using testbed::CimValue;
using testbed::RawClient;
using Clock = std::chrono::steady_clock;
using Clients = std::vector<std::unique_ptr<RawClient>>;

constexpr int kIdle = 1000, kDribbling = 250, kParallel = 1000, kHanging = 16;

std::string request(const std::string& className) {
    const std::string body =
        "<CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\"><MESSAGE ID=\"1\" PROTOCOLVERSION=\"1.0\">"
        "<SIMPLEREQ><IMETHODCALL NAME=\"EnumerateInstances\"><LOCALNAMESPACEPATH>"
        "<NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/></LOCALNAMESPACEPATH>"
        "<IPARAMVALUE NAME=\"ClassName\"><CLASSNAME NAME=\"" +
        className + "\"/></IPARAMVALUE></IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>";
    return "POST /cimom HTTP/1.1\r\nHost: box\r\nContent-Type: text/xml\r\nCIMOperation: "
           "MethodCall\r\nCIMMethod: EnumerateInstances\r\nCIMObject: root/cimv2\r\n"
           "Content-Length: " +
           std::to_string(body.size()) + "\r\n\r\n" + body;
}

/// A repository with ten disks of its own and a provider that answers with ten others.
class Host {
public:
    Host() {
        using testbed::PropertyDefinition;
        const PropertyDefinition name{"Name", CMPI_string, true, "CIM_Disk", {}};
        repository_.defineClass("root/cimv2", {"CIM_Disk", "", {name}});
        for (const char* className : {"Local_Disk", "Served_Disk"})
            repository_.defineClass("root/cimv2", {className, "CIM_Disk", {}});
        for (int i = 0; i < 10; i++) {
            repository_.put(disk("Local_Disk", i));
            provider_.instances.push_back(disk("Served_Disk", i));
        }
        provider_.hook = [this] {
            std::unique_lock lock(mutex_);
            if (hanging_ >= kHanging) return;
            hanging_++;
            released_.wait(lock, [this] { return isReleased_; });
        };
        options_.port = 0;
        http_ = std::make_unique<testbed::HttpServer>(
            options_, [this](const testbed::HttpRequest& asked) { return cim_.answer(asked); });
    }
    ~Host() {
        {
            const std::lock_guard lock(mutex_);
            isReleased_ = true;
        }
        released_.notify_all();
        http_.reset();
    }

    Clients connect(int count) const {
        Clients clients;
        for (int i = 0; i < count; i++)
            clients.push_back(std::make_unique<RawClient>(http_->port()));
        return clients;
    }
    void waitForHanging() {
        for (;; std::this_thread::sleep_for(std::chrono::milliseconds(5))) {
            const std::lock_guard lock(mutex_);
            if (hanging_ == kHanging) return;
        }
    }

private:
    static testbed::Instance disk(const char* className, int number) {
        testbed::Instance instance{{"root/cimv2", className, {}}, {}};
        const auto name = CimValue::string(std::to_string(number));
        instance.path.key("Name", name);
        return instance.set("Name", name);
    }

    testbed::Repository repository_;
    testbed::Broker broker_{repository_};
    testbed::FakeProvider provider_{broker_};
    testbed::ObjectManager manager_{
        repository_, testbed::Registration{provider_.client(), "root/cimv2", {"Served_Disk"}}};
    testbed::CimServer cim_{manager_, "host"};
    std::mutex mutex_;
    std::condition_variable released_;
    bool isReleased_ = false;  // guarded by mutex_
    int hanging_ = 0;          // guarded by mutex_
    testbed::HttpServerOptions options_;
    std::unique_ptr<testbed::HttpServer> http_;
};

void sendAll(Clients& clients, const std::string& text) {
    for (auto& client : clients) client->send(text);
}

/// A burst of requests each second until `stopping`; the number of answers.
std::size_t burst(Clients& clients, const std::atomic<bool>& stopping) {
    std::size_t answers = 0;
    for (int round = 0; !stopping; round++) {
        sendAll(clients, request(round % 2 == 0 ? "Served_Disk" : "Local_Disk"));
        for (auto& client : clients) answers += client->receive().status == 200 ? 1 : 0;
        std::this_thread::sleep_for(std::chrono::seconds(1));
    }
    return answers;
}

void dribble(const Host& host, Clients& clients, const std::atomic<bool>& stopping) {
    const std::string text = request("Local_Disk");
    for (std::size_t byte = 0; !stopping; byte++) {
        for (auto& client : clients)
            if (!client->send(text.substr(byte % text.size(), 1)))
                client = std::move(host.connect(1).front());
        std::this_thread::sleep_for(std::chrono::milliseconds(200));
    }
}

double milli(Clock::duration time) {
    return std::chrono::duration<double, std::milli>(time).count();
}

/// Prints median, 99 of 100 and worst; true when 99 of 100 are below the limit.
bool judge(const char* what, std::vector<Clock::duration>& times, double limit) {
    if (times.empty()) return false;
    std::sort(times.begin(), times.end());
    const double rare = milli(times[times.size() * 99 / 100]);
    std::printf("%-28s %8zu %10.2f %10.2f %10.2f\n", what, times.size(),
                milli(times[times.size() / 2]), rare, milli(times.back()));
    return rare <= limit;
}

bool measure(int seconds, double limit) {
    if (testbed::raiseDescriptorLimit(6000) < 6000) throw std::runtime_error("too few descriptors");
    Host host;
    Clients idle = host.connect(kIdle), dribbling = host.connect(kDribbling),
            hanging = host.connect(kHanging), parallel = host.connect(kParallel);
    sendAll(hanging, request("Served_Disk"));
    host.waitForHanging();
    std::atomic<bool> stopping = false;
    std::size_t answers = 0;
    std::thread bursts([&] { answers = burst(parallel, stopping); });
    std::thread drips([&] { dribble(host, dribbling, stopping); });
    std::vector<Clock::duration> local, served;
    RawClient client = std::move(*host.connect(1).front());
    for (const auto end = Clock::now() + std::chrono::seconds(seconds); Clock::now() < end;) {
        for (auto& [className, times] :
             {std::pair("Local_Disk", &local), std::pair("Served_Disk", &served)}) {
            const auto begin = Clock::now();
            client.send(request(className));
            if (client.receive().status != 200) throw std::runtime_error("no answer");
            times->push_back(Clock::now() - begin);
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }
    stopping = true;
    bursts.join();
    drips.join();
    std::printf("%-28s %8s %10s %10s %10s\n", "milliseconds", "requests", "median", "99 of 100",
                "worst");
    const bool isGood = judge("without the provider", local, limit);
    const bool isAlsoGood = judge("with the provider", served, limit);
    std::printf("meanwhile %zu answers to bursts of %d\n", answers, kParallel);
    return isGood && isAlsoGood;
}

}  // namespace
}  // namespace bench

int main(int argc, char** argv) {
    CLI::App app("Measures how long a client waits while the server is busy with others");
    int seconds = 20;
    double limit = 100;
    app.add_option("--seconds", seconds, "how long to measure")->capture_default_str();
    app.add_option("--limit", limit, "milliseconds")->capture_default_str();
    CLI11_PARSE(app, argc, argv);
    return bench::measure(seconds, limit) ? 0 : 1;
}
