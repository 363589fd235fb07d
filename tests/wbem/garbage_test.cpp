// Whatever a client sends: an answer or a closed connection, never an end of the server.
#include <fstream>
#include <random>

#include "sanitizers.h"
#include "wbem_fixture.h"

namespace testbed {
namespace {

// What an address sanitizer keeps of what was given back, so that it sees who still uses it.
#ifdef PLEXOR_ADDRESS_SANITIZER
constexpr std::size_t kQuarantine = 256'000'000;
#else
constexpr std::size_t kQuarantine = 0;
#endif

class Garbage : public WbemFixture {
protected:
    /// Bytes of memory that the process holds.
    static std::size_t residentSize() {
        std::size_t total = 0, resident = 0;
        std::ifstream("/proc/self/statm") >> total >> resident;
        return resident * static_cast<std::size_t>(sysconf(_SC_PAGESIZE));
    }
    Reply post(const std::string& body) {
        return exchange(port(), httpRequest(callHeaders("GetInstance"), body));
    }

    const std::string parameters_ =
        instanceNameParameter("InstanceName", "Local_Disk", {{"Name", "l0"}}) +
        valueParameter("LocalOnly", "FALSE") + listParameter("PropertyList", {"Name", "Size"});
    const std::string message_ = callMessage("GetInstance", parameters_);
};

TEST_F(Garbage, RandomBytes) {
    std::mt19937 random(4711);
    for (int i = 0; i < 300; i++) {
        std::string bytes(1 + random() % 2000, '\0');
        for (char& byte : bytes) byte = static_cast<char>(random());
        RawClient client(port());
        client.send(bytes);
        client.endSending();
        const int status = client.receive().status;
        EXPECT_TRUE(status == 0 || status >= 400) << status;
        EXPECT_GE(post(bytes).status, 400);
    }
    EXPECT_TRUE(isAlive());
}

TEST_F(Garbage, RandomChangesOfAGoodMessage) {
    std::mt19937 random(4711);
    for (int i = 0; i < 2000; i++) {
        std::string message = message_;
        for (unsigned changes = 1 + random() % 4; changes > 0; changes--) {
            const std::size_t position = random() % message.size();
            switch (random() % 3) {
                case 0:
                    message[position] = static_cast<char>(random());
                    break;
                case 1:
                    message.erase(position, 1 + random() % 20);
                    break;
                default:
                    message.insert(position, message.substr(random() % message.size(), 30));
            }
        }
        EXPECT_NE(post(message).status, 0);
    }
    EXPECT_TRUE(isAlive());
}

TEST_F(Garbage, MessageCutShortAnywhere) {
    const std::string request = httpRequest(callHeaders("GetInstance"), message_);
    for (std::size_t size = 0; size < message_.size(); size++)
        EXPECT_EQ(post(message_.substr(0, size)).header("CIMError"), "request-not-well-formed")
            << size;
    for (std::size_t size = 0; size < request.size(); size++) {
        RawClient client(port());
        client.send(request.substr(0, size));
        client.endSending();
        EXPECT_EQ(client.receive().status, 0) << size;
    }
    EXPECT_EQ(exchange(port(), request).status, 200);
}

TEST_F(Garbage, DeepNesting) {
    std::string open, close;
    for (int i = 0; i < 100'000; i++) open += "<a>";
    for (int i = 0; i < 37'000; i++) close += "</a>";
    EXPECT_EQ(post(open).status, 413);
    EXPECT_EQ(post(open.substr(0, 3UL * 37'000) + close).header("CIMError"),
              "request-not-well-formed");
    EXPECT_EQ(post(open.substr(0, 240'000)).header("CIMError"), "request-not-well-formed");
    std::string references = "<VALUE.REFERENCE><INSTANCENAME CLASSNAME='a'><KEYBINDING NAME='a'>";
    std::string many;
    while (many.size() < 200'000) many += references;
    EXPECT_EQ(post(many).header("CIMError"), "request-not-well-formed");
    EXPECT_TRUE(isAlive());
}

TEST_F(Garbage, Entities) {
    const std::string bomb =
        "<!DOCTYPE CIM [<!ENTITY a \"lol\"><!ENTITY b \"&a;&a;&a;&a;&a;&a;&a;&a;&a;&a;\">"
        "<!ENTITY c SYSTEM \"file:///etc/passwd\">]>";
    std::string message = message_;
    const std::size_t before = residentSize();
    message.insert(message.find("<CIM "), bomb);
    message.replace(message.find(">l0<"), 4, ">&b;&c;<");
    EXPECT_EQ(post(message).header("CIMError"), "request-not-well-formed");
    EXPECT_LT(residentSize(), before + 20'000'000);
}

TEST_F(Garbage, MemoryStaysBounded) {
    std::string nodes;
    while (nodes.size() < HttpLimits().body) nodes += "<a/>";
    nodes.resize(HttpLimits().body);
    const auto flood = [&] {
        for (int i = 0; i < 50; i++) EXPECT_EQ(post(nodes).status, 400);
    };
    flood();
    const std::size_t before = residentSize();
    flood();
    flood();
    EXPECT_LT(residentSize(), before + 30'000'000 + kQuarantine);
}

}  // namespace
}  // namespace testbed
