// HTTPS: which versions are spoken, with which certificate, and what becomes of other bytes.
#include <openssl/pem.h>
#include <openssl/x509v3.h>

#include <boost/asio/io_context.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/read.hpp>
#include <boost/asio/ssl.hpp>
#include <boost/asio/write.hpp>
#include <filesystem>

#include "wbem_fixture.h"

namespace testbed {
namespace {

namespace asio = boost::asio;
using asio::ip::tcp;

class TlsServer : public WbemFixture {
protected:
    TlsServer() { serveTls(tlsSelfSigned("array")); }

    void serveTls(std::shared_ptr<TlsContext> context) {
        HttpServerOptions options;
        options.tls = std::move(context);
        serve(options);
    }

    struct Session {
        asio::ssl::context context{asio::ssl::context::tls_client};
        asio::io_context io;
        asio::ssl::stream<tcp::socket> stream{io, context};
    };
    /// After the handshake; `error` tells how it went.
    std::unique_ptr<Session> connect(int newestVersion, boost::system::error_code& error) {
        auto session = std::make_unique<Session>();
        SSL* ssl = session->stream.native_handle();
        SSL_set_security_level(ssl, 0);  // or this side would refuse the old versions itself
        SSL_set_min_proto_version(ssl, TLS1_VERSION);
        SSL_set_max_proto_version(ssl, newestVersion);
        session->stream.next_layer().connect({asio::ip::make_address("127.0.0.1"), port()});
        session->stream.handshake(asio::ssl::stream_base::client, error);
        return session;
    }
    std::string ask(Session& session) {
        std::string request =
            callRequest("EnumerateInstanceNames", classNameParameter("Served_Disk"));
        request.insert(request.find("Host:"), "Connection: close\r\n");
        asio::write(session.stream, asio::buffer(request));
        std::string answer;
        boost::system::error_code error;
        asio::read(session.stream, asio::dynamic_buffer(answer), error);
        EXPECT_EQ(error, asio::error::eof) << "no orderly end";
        return answer;
    }
};

TEST_F(TlsServer, SpeaksTheTwoLastVersionsOnly) {
    // The library's own reservations would hide what the server says.
    const auto context = tlsSelfSigned("array");
    SSL_CTX_set_security_level(context->native_handle(), 0);
    serveTls(context);
    for (const auto& [version, isSpoken] :
         {std::pair(TLS1_VERSION, false), std::pair(TLS1_1_VERSION, false),
          std::pair(TLS1_2_VERSION, true), std::pair(TLS1_3_VERSION, true)}) {
        boost::system::error_code error;
        const auto session = connect(version, error);
        EXPECT_EQ(!error, isSpoken) << version << " " << error.message();
        if (!isSpoken) continue;
        EXPECT_NE(ask(*session).find(">s0</KEYVALUE>"), std::string::npos);
    }
}

TEST_F(TlsServer, ThrowAwayCertificateIsForThisHost) {
    boost::system::error_code error;
    const auto session = connect(TLS1_3_VERSION, error);
    ASSERT_FALSE(error) << error.message();
    X509* certificate = SSL_get1_peer_certificate(session->stream.native_handle());
    for (const char* name : {"localhost", "array"})
        EXPECT_EQ(X509_check_host(certificate, name, 0, 0, nullptr), 1) << name;
    EXPECT_EQ(X509_check_ip_asc(certificate, "127.0.0.1", 0), 1);
    EXPECT_EQ(X509_check_host(certificate, "elsewhere", 0, 0, nullptr), 0);
    EXPECT_LT(X509_cmp_current_time(X509_get0_notBefore(certificate)), 0);
    EXPECT_GT(X509_cmp_current_time(X509_get0_notAfter(certificate)), 0);
    EXPECT_EQ(X509_verify(certificate, X509_get0_pubkey(certificate)), 1);
    X509_free(certificate);
}

TEST_F(TlsServer, OtherBytesEndTheConnection) {
    RawClient client(port());
    client.send("POST / HTTP/1.1\r\n\r\n");
    EXPECT_TRUE(client.isClosedWithin(std::chrono::seconds(10)));
    boost::system::error_code error;
    EXPECT_NE(ask(*connect(TLS1_2_VERSION, error)).find("200 OK"), std::string::npos);
}

TEST_F(TlsServer, HandshakeThatNeverEnds) {
    faults_.add(parseServerFault("connection=stall times=1"));
    RawClient client(port());
    client.send("POST / HTTP/1.1\r\n\r\n");
    EXPECT_FALSE(client.isClosedWithin(std::chrono::milliseconds(300)));
    boost::system::error_code error;
    EXPECT_NE(ask(*connect(TLS1_2_VERSION, error)).find("200 OK"), std::string::npos);
}

TEST_F(TlsServer, CertificateAndKeyFromFiles) {
    const std::string base = ::testing::TempDir() + "tls-server-" + std::to_string(getpid());
    const std::string certificate = base + ".pem", key = base + ".key", other = base + ".other";
    const std::string quiet = " 2>/dev/null";
    ASSERT_EQ(
        std::system(("openssl req -x509 -newkey rsa:2048 -nodes -days 2 -subj /CN=box -keyout " +
                     key + " -out " + certificate + quiet)
                        .c_str()),
        0);
    ASSERT_EQ(std::system(("openssl genrsa -out " + other + " 2048" + quiet).c_str()), 0);
    serveTls(tlsFromFiles(certificate, key));
    boost::system::error_code error;
    EXPECT_NE(ask(*connect(TLS1_3_VERSION, error)).find("200 OK"), std::string::npos);
    const auto complaint = [](const std::string& first, const std::string& second) {
        try {
            tlsFromFiles(first, second);
        } catch (const std::runtime_error& failure) {
            return std::string(failure.what());
        }
        return std::string();
    };
    EXPECT_TRUE(complaint("/nonexistent", key).starts_with("/nonexistent: no certificate: "));
    EXPECT_TRUE(complaint(key, key).starts_with(key + ": no certificate: "));
    EXPECT_TRUE(complaint(certificate, other).starts_with(other + ": no key of that certificate"));
    for (const std::string& file : {certificate, key, other}) std::filesystem::remove(file);
}

}  // namespace
}  // namespace testbed
