#include "http_server.h"

#include <netdb.h>
#include <sys/epoll.h>
#include <sys/eventfd.h>
#include <sys/socket.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <stdexcept>

namespace testbed {
namespace {

constexpr std::uint64_t kListenerId = 0;
constexpr std::uint64_t kWakeId = 1;
constexpr int kTickMilliseconds = 200;

[[noreturn]] void fail(const HttpServerOptions& options, const std::string& why) {
    throw std::runtime_error("cannot listen on " + options.address + " port " +
                             std::to_string(options.port) + ": " + why);
}

FileDescriptor listenOn(const HttpServerOptions& options) {
    addrinfo hints = {};
    hints.ai_flags = AI_NUMERICHOST | AI_NUMERICSERV | AI_PASSIVE;
    hints.ai_socktype = SOCK_STREAM;
    addrinfo* found = nullptr;
    const int error =
        getaddrinfo(options.address.c_str(), std::to_string(options.port).c_str(), &hints, &found);
    if (error != 0) fail(options, gai_strerror(error));
    const std::unique_ptr<addrinfo, decltype(&freeaddrinfo)> owner(found, freeaddrinfo);
    FileDescriptor listener(
        socket(found->ai_family, SOCK_STREAM | SOCK_NONBLOCK | SOCK_CLOEXEC, 0));
    const int on = 1;
    if (listener.isOpen()) setsockopt(listener.get(), SOL_SOCKET, SO_REUSEADDR, &on, sizeof on);
    if (!listener.isOpen() || bind(listener.get(), found->ai_addr, found->ai_addrlen) != 0 ||
        listen(listener.get(), SOMAXCONN) != 0)
        fail(options, std::strerror(errno));
    return listener;
}

std::uint16_t portOf(const FileDescriptor& listener) {
    sockaddr_storage address = {};
    socklen_t size = sizeof address;
    char port[NI_MAXSERV] = "0";
    auto* generic = reinterpret_cast<sockaddr*>(&address);
    if (getsockname(listener.get(), generic, &size) == 0)
        getnameinfo(generic, size, nullptr, 0, port, sizeof port, NI_NUMERICSERV);
    return static_cast<std::uint16_t>(std::stoul(port));
}

void watch(const FileDescriptor& epoll, int operation, int descriptor, std::uint32_t events,
           std::uint64_t id) {
    epoll_event event = {};
    event.events = events;
    event.data.u64 = id;
    epoll_ctl(epoll.get(), operation, descriptor, &event);
}

std::uint32_t eventsFor(HttpConnection::Phase phase) {
    switch (phase) {
        case HttpConnection::Phase::Writing:
            return EPOLLOUT;
        case HttpConnection::Phase::Received:
        case HttpConnection::Phase::Working:
            return 0;  // errors and a lost client are reported all the same
        default:
            return EPOLLIN;
    }
}

}  // namespace

HttpServer::HttpServer(const HttpServerOptions& options, Handler handler)
    : options_(options),
      handler_(std::move(handler)),
      listener_(listenOn(options)),
      epoll_(epoll_create1(EPOLL_CLOEXEC)),
      wake_(eventfd(0, EFD_NONBLOCK | EFD_CLOEXEC)),
      port_(portOf(listener_)) {
    if (!epoll_.isOpen() || !wake_.isOpen()) fail(options, std::strerror(errno));
    watch(epoll_, EPOLL_CTL_ADD, listener_.get(), EPOLLIN, kListenerId);
    watch(epoll_, EPOLL_CTL_ADD, wake_.get(), EPOLLIN, kWakeId);
    pool_ = std::make_unique<WorkerPool>(options.workers);
    thread_ = std::thread([this] { run(); });
}

HttpServer::~HttpServer() {
    stopping_ = true;
    eventfd_write(wake_.get(), 1);
    thread_.join();
    pool_.reset();
}

void HttpServer::run() {
    epoll_event events[64];
    while (!stopping_) {
        const int count = epoll_wait(epoll_.get(), events, std::size(events), kTickMilliseconds);
        for (int i = 0; i < count; i++) {
            const std::uint64_t id = events[i].data.u64;
            if (id == kListenerId)
                acceptAll();
            else if (id == kWakeId)
                deliverAnswers();
            else
                handle(id, events[i].events);
        }
        closeLate();
    }
}

void HttpServer::acceptAll() {
    while (true) {
        FileDescriptor socket(
            accept4(listener_.get(), nullptr, nullptr, SOCK_NONBLOCK | SOCK_CLOEXEC));
        if (socket.isOpen()) {
            if (connections_.size() < options_.connections || makeRoom()) add(std::move(socket));
            continue;
        }
        if (errno == EINTR || errno == ECONNABORTED) continue;
        // Out of descriptors: a client is given up for the next one, or there is a pause.
        const bool exhausted = errno == EMFILE || errno == ENFILE;
        if (exhausted && !makeRoom())
            std::this_thread::sleep_for(std::chrono::milliseconds(kTickMilliseconds));
        return;
    }
}

/// Closes the connection that the server owes least. False when all are at work.
bool HttpServer::makeRoom() {
    const auto rank = [](const Connections::value_type& entry) {
        return std::pair(entry.second.phase(), entry.second.since());
    };
    const auto victim =
        std::min_element(connections_.begin(), connections_.end(),
                         [&](const auto& a, const auto& b) { return rank(a) < rank(b); });
    if (victim == connections_.end() || !victim->second.mayBeGivenUp()) return false;
    connections_.erase(victim);
    return true;
}

void HttpServer::add(FileDescriptor socket) {
    const std::uint64_t id = nextId_++;
    const auto [position, isNew] =
        connections_.try_emplace(id, std::move(socket), options_.limits, options_.times);
    watch(epoll_, EPOLL_CTL_ADD, position->second.socket(), EPOLLIN, id);
    // A request that is there already must not wait until the next client needs its place.
    position->second.receive();
    follow(position);
}

void HttpServer::handle(std::uint64_t id, std::uint32_t events) {
    const auto position = connections_.find(id);
    if (position == connections_.end()) return;
    HttpConnection& connection = position->second;
    if (!connection.mayBeGivenUp()) {
        // The client is gone. Its place stays taken until the worker is done, or requests could
        // pile up without bounds.
        if ((events & (EPOLLHUP | EPOLLERR)) != 0)
            epoll_ctl(epoll_.get(), EPOLL_CTL_DEL, connection.socket(), nullptr);
        return;
    }
    if ((events & EPOLLIN) != 0 || connection.phase() != HttpConnection::Phase::Writing)
        connection.receive();
    connection.send();
    follow(position);
}

void HttpServer::follow(Connections::iterator position) {
    auto& [id, connection] = *position;
    if (connection.phase() == HttpConnection::Phase::Closed) {
        connections_.erase(position);
        return;
    }
    watch(epoll_, EPOLL_CTL_MOD, connection.socket(), eventsFor(connection.phase()), id);
    if (connection.phase() != HttpConnection::Phase::Received) return;
    pool_->add([this, number = id, request = connection.takeRequest()] { work(number, request); });
}

void HttpServer::work(std::uint64_t id, const HttpRequest& request) {
    HttpResponse response;
    try {
        response = handler_(request);
    } catch (const std::exception&) {
        response = {500, {}, {}};
    }
    {
        const std::lock_guard lock(answersMutex_);
        answers_.push_back({id, std::move(response)});
    }
    eventfd_write(wake_.get(), 1);
}

void HttpServer::deliverAnswers() {
    eventfd_t count = 0;
    eventfd_read(wake_.get(), &count);
    std::vector<Answer> answers;
    {
        const std::lock_guard lock(answersMutex_);
        answers.swap(answers_);
    }
    for (const Answer& answer : answers) {
        const auto position = connections_.find(answer.connection);
        if (position == connections_.end()) continue;
        position->second.respond(answer.response);
        follow(position);
    }
}

void HttpServer::closeLate() {
    const auto now = HttpConnection::Clock::now();
    std::erase_if(connections_, [&](const auto& entry) { return entry.second.isLate(now); });
}

}  // namespace testbed
