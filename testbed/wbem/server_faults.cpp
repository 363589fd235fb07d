// The table of a fault's members, reading one, and what it does to connections and responses.
#include "server_faults.h"

#include <algorithm>
#include <charconv>
#include <iomanip>
#include <map>
#include <sstream>

#include "cim_object.h"
#include "cim_status.h"

namespace testbed {
namespace {

using Words = std::map<std::string, std::string>;

Words split(std::string_view text) {
    Words words;
    std::istringstream stream{std::string(text)};
    while (stream >> std::ws && stream.peek() != EOF) {
        std::string name, value;
        std::getline(stream, name, '=');
        if (stream.eof() || name.find_first_of(" \t\"") != std::string::npos) {
            throw ServerFaultError("not NAME=VALUE: " + name);
        }
        const int next = stream.peek();
        if (next != ' ' && next != '\t' && next != EOF) stream >> std::quoted(value);
        if (stream.fail()) throw ServerFaultError(name + ": a quotation mark is missing");
        if (!words.emplace(name, value).second) throw ServerFaultError(name + " comes twice");
    }
    return words;
}

int numberIn(const std::string& name, const std::string& text, int least, int most) {
    int number = 0;
    const char* end = text.data() + text.size();
    const auto [stop, error] = std::from_chars(text.data(), end, number);
    if (error != std::errc() || stop != end || number < least || number > most) {
        throw ServerFaultError(name + ": a number from " + std::to_string(least) + " to " +
                               std::to_string(most) + " expected, not \"" + text + "\"");
    }
    return number;
}

ServerFault::Connection connectionNamed(const std::string& word) {
    using Connection = ServerFault::Connection;
    static const std::map<std::string, Connection> kWords = {
        {"refuse", Connection::Refuse}, {"reset", Connection::Reset}, {"stall", Connection::Stall}};
    const auto known = kWords.find(word);
    if (known == kWords.end()) {
        throw ServerFaultError("connection: refuse, reset or stall expected, not \"" + word + "\"");
    }
    return known->second;
}

struct Member {
    const char* name;
    void (*read)(ServerFault& fault, const std::string& name, const std::string& value);
    bool ofConnections = false;  ///< makes sense before a request is known
};

constexpr int kAny = 1'000'000'000;
constexpr int kLargestCimStatus = 28;

const Member kMembers[] = {
    {"connection",
     [](ServerFault& fault, const std::string&, const std::string& value) {
         fault.connection = connectionNamed(value);
     },
     true},
    {"times",
     [](ServerFault& fault, const std::string& name, const std::string& value) {
         fault.times = numberIn(name, value, 1, kAny);
     },
     true},
    {"delay",
     [](ServerFault& fault, const std::string& name, const std::string& value) {
         fault.delay = std::chrono::milliseconds(numberIn(name, value, 0, kAny));
     }},
    {"http", [](ServerFault& fault, const std::string& name,
                const std::string& value) { fault.httpStatus = numberIn(name, value, 400, 599); }},
    {"status",
     [](ServerFault& fault, const std::string& name, const std::string& value) {
         fault.cimStatus = numberIn(name, value, 1, kLargestCimStatus);
     }},
    {"trailer",
     [](ServerFault& fault, const std::string& name, const std::string& value) {
         fault.trailerStatus = numberIn(name, value, 1, kLargestCimStatus);
     }},
    {"message", [](ServerFault& fault, const std::string&,
                   const std::string& value) { fault.message = value; }},
    {"cut",
     [](ServerFault& fault, const std::string& name, const std::string& value) {
         fault.cutAt = static_cast<std::size_t>(numberIn(name, value, 0, kAny));
     }},
    {"type", [](ServerFault& fault, const std::string&,
                const std::string& value) { fault.contentType = value; }},
    {"operation", [](ServerFault& fault, const std::string&,
                     const std::string& value) { fault.operation = value; }},
    {"class", [](ServerFault& fault, const std::string&,
                 const std::string& value) { fault.className = value; }},
};

const Member& memberNamed(const std::string& name) {
    const auto* known = std::find_if(std::begin(kMembers), std::end(kMembers),
                                     [&](const Member& member) { return name == member.name; });
    if (known == std::end(kMembers)) throw ServerFaultError("no fault has a \"" + name + "\"");
    return *known;
}

bool hasEffect(const ServerFault& fault) {
    return fault.connection != ServerFault::Connection::None || fault.delay.count() > 0 ||
           fault.httpStatus || fault.cimStatus || fault.trailerStatus || fault.cutAt ||
           fault.contentType;
}

/// Header values are one line of printable ASCII.
std::string headerText(std::string text) {
    for (char& c : text) {
        if (c < 0x20 || c > 0x7e) c = '?';
    }
    return text;
}

}  // namespace

ServerFault parseServerFault(std::string_view text) {
    ServerFault fault;
    const Words words = split(text);
    for (const auto& [name, value] : words) memberNamed(name).read(fault, name, value);
    if (!hasEffect(fault)) throw ServerFaultError("what is to go wrong is missing");
    if (fault.connection == ServerFault::Connection::None) return fault;
    for (const auto& [name, value] : words) {
        if (!memberNamed(name).ofConnections) {
            throw ServerFaultError(name + " is nothing that a connection has");
        }
    }
    if (fault.connection == ServerFault::Connection::Refuse && words.contains("times")) {
        throw ServerFaultError("refused connections cannot be counted");
    }
    return fault;
}

void ServerFaults::add(ServerFault fault) {
    const std::lock_guard lock(mutex_);
    faults_.push_back(std::move(fault));
}

void ServerFaults::clear() {
    const std::lock_guard lock(mutex_);
    faults_.clear();
}

bool ServerFaults::refusesConnections() const {
    const std::lock_guard lock(mutex_);
    return std::any_of(faults_.begin(), faults_.end(), [](const ServerFault& fault) {
        return fault.connection == ServerFault::Connection::Refuse;
    });
}

template <class Fits>
std::optional<ServerFault> ServerFaults::take(Fits fits) {
    const std::lock_guard lock(mutex_);
    const auto found = std::find_if(faults_.begin(), faults_.end(), fits);
    if (found == faults_.end()) return std::nullopt;
    const ServerFault fault = *found;
    if (found->times > 0 && --found->times == 0) faults_.erase(found);
    return fault;
}

Welcome ServerFaults::welcome() {
    using Connection = ServerFault::Connection;
    const auto fault = take([](const ServerFault& known) {
        return known.connection == Connection::Reset || known.connection == Connection::Stall;
    });
    if (!fault) return Welcome::Serve;
    return fault->connection == Connection::Reset ? Welcome::Reset : Welcome::Stall;
}

std::optional<ServerFault> ServerFaults::match(std::string_view operation,
                                               std::string_view className) {
    return take([&](const ServerFault& fault) {
        if (fault.connection != ServerFault::Connection::None) return false;
        if (fault.operation && !sameName(*fault.operation, operation)) return false;
        return !fault.className || sameName(*fault.className, className);
    });
}

void befall(const ServerFault& fault, HttpResponse& response) {
    if (fault.httpStatus) {
        response = {*fault.httpStatus, {}, {}};
        if (response.status == 401) {
            response.headers.emplace_back("WWW-Authenticate", "Basic realm=\"plexor-testbed\"");
        }
    }
    response.mishap.delay = fault.delay;
    response.mishap.cutAt = fault.cutAt;
    for (auto& [name, value] : response.headers) {
        if (fault.contentType && name == "Content-Type") value = headerText(*fault.contentType);
    }
    if (!fault.trailerStatus || fault.httpStatus) return;
    const auto code = static_cast<CMPIrc>(*fault.trailerStatus);
    response.mishap.trailers = {
        {"CIMStatusCode", std::to_string(code)},
        {"CIMStatusCodeDescription",
         headerText(fault.message.empty() ? statusName(code) : fault.message)}};
}

}  // namespace testbed
