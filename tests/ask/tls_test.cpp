// The client against another implementation of HTTP and TLS.
#include <gtest/gtest.h>
#include <httplib.h>
#include <netdb.h>
#include <openssl/pem.h>

#include <algorithm>

#include "canned_answers.h"
#include "elements.h"
#include "scripted_server.h"
#include "tool_process.h"
#include "wbem_client.h"

namespace testbed {
namespace {

struct Release {
    void operator()(X509* certificate) const { X509_free(certificate); }
    void operator()(EVP_PKEY* key) const { EVP_PKEY_free(key); }
};

/// A certificate that has signed itself, for a host of that name.
struct Identity {
    explicit Identity(const std::string& subject)
        : key(EVP_EC_gen("P-256")), certificate(X509_new()) {
        X509_set_version(certificate.get(), 2);
        ASN1_INTEGER_set(X509_get_serialNumber(certificate.get()), 1);
        X509_gmtime_adj(X509_getm_notBefore(certificate.get()), -3600);
        X509_gmtime_adj(X509_getm_notAfter(certificate.get()), 3600);
        X509_set_pubkey(certificate.get(), key.get());
        X509_NAME* name = X509_get_subject_name(certificate.get());
        X509_NAME_add_entry_by_txt(name, "CN", MBSTRING_ASC,
                                   reinterpret_cast<const unsigned char*>("array"), -1, -1, 0);
        X509_set_issuer_name(certificate.get(), name);
        X509_EXTENSION* hosts =
            X509V3_EXT_conf_nid(nullptr, nullptr, NID_subject_alt_name, subject.c_str());
        X509_add_ext(certificate.get(), hosts, -1);
        X509_EXTENSION_free(hosts);
        X509_sign(certificate.get(), key.get(), EVP_sha256());
        file = ::testing::TempDir() + "plexor-tls-" + std::to_string(getpid()) + ".pem";
        FILE* stream = fopen(file.c_str(), "w");
        PEM_write_X509(stream, certificate.get());
        fclose(stream);
    }
    ~Identity() { unlink(file.c_str()); }

    std::unique_ptr<EVP_PKEY, Release> key;
    std::unique_ptr<X509, Release> certificate;
    std::string file;
};

/// Answers every request with one drive, as long as it lives.
class Serving {
public:
    explicit Serving(std::unique_ptr<httplib::Server> made) : server(std::move(made)) {
        server->Post(".*", [this](const httplib::Request& request, httplib::Response& response) {
            asked = request;
            const std::string body =
                withId(cimInstances(namedInstance(kDrive, "DeviceID", "d", "d - ONLINE", 2, 5)),
                       request.body);
            response.set_chunked_content_provider(
                "application/xml", [body](std::size_t offset, httplib::DataSink& sink) {
                    sink.write(body.data() + offset,
                               std::min<std::size_t>(100, body.size() - offset));
                    if (offset + 100 >= body.size()) sink.done();
                    return true;
                });
        });
        port = server->bind_to_any_port("127.0.0.1");
        thread = std::thread([this] { server->listen_after_bind(); });
        while (!server->is_running()) std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    ~Serving() {
        server->stop();
        thread.join();
    }

    std::unique_ptr<httplib::Server> server;
    httplib::Request asked;
    int port = 0;
    std::thread thread;
};

std::unique_ptr<httplib::Server> secureServer(const Identity& identity) {
    return std::make_unique<httplib::SSLServer>(identity.certificate.get(), identity.key.get());
}

/// What keeps the answer away; "" when it arrives.
std::string failure(const std::string& url, const TlsOptions& tls) {
    WbemClientOptions options;
    options.deadline = std::chrono::steady_clock::now() + std::chrono::seconds(20);
    options.tls = tls;
    try {
        const auto response = WbemClient(parseWbemUrl(url), options).enumerateInstances(kDrive);
        return response.instances.size() == 1 ? "" : "no drive";
    } catch (const WbemError& error) {
        return error.what();
    }
}

std::string urlOf(const Serving& serving, const std::string& begin) {
    return begin + "127.0.0.1:" + std::to_string(serving.port);
}

TEST(OtherServer, IsUnderstood) {
    Serving serving(std::make_unique<httplib::Server>());
    EXPECT_EQ(failure(urlOf(serving, "http://me:my%20word@"), {}), "");
    EXPECT_EQ(serving.asked.path, "/cimom");
    EXPECT_EQ(serving.asked.get_header_value("CIMMethod"), "EnumerateInstances");
    EXPECT_EQ(serving.asked.get_header_value("Authorization"), "Basic bWU6bXkgd29yZA==");
    EXPECT_NE(serving.asked.body.find("<CLASSNAME NAME=\"Tovexa_PlexorStorageExtent\""),
              std::string::npos);
}

TEST(Tls, ServersWithATrustedCertificateAreAsked) {
    const Identity identity("IP:127.0.0.1");
    const Serving serving(secureServer(identity));
    EXPECT_EQ(failure(urlOf(serving, "https://"), {identity.file, true}), "");
}

TEST(Tls, OtherCertificatesAreRefused) {
    const Identity identity("IP:127.0.0.1");
    const Serving serving(secureServer(identity));
    EXPECT_EQ(failure(urlOf(serving, "https://"), {}),
              "the server's certificate is not trusted: self-signed certificate");
    EXPECT_EQ(failure(urlOf(serving, "https://"), {"", false}), "") << "unless one trusts any";
}

TEST(Tls, CertificateMustBeTheHosts) {
    const Identity identity("DNS:other.example.com,IP:127.0.0.2");
    const Serving serving(secureServer(identity));
    EXPECT_EQ(failure(urlOf(serving, "https://"), {identity.file, true}),
              "the server's certificate is not trusted: IP address mismatch");
}

TEST(Tls, CertificateMustBeForTheHostsName) {
    if (gethostbyname("localhost") == nullptr) GTEST_SKIP() << "nobody knows localhost here";
    const Identity identity("DNS:other.example.com,IP:127.0.0.2");
    const Serving serving(secureServer(identity));
    EXPECT_EQ(failure("https://localhost:" + std::to_string(serving.port), {identity.file, true}),
              "the server's certificate is not trusted: hostname mismatch");
}

TEST(Tls, FailuresAreExplained) {
    const Serving plain(std::make_unique<httplib::Server>());
    EXPECT_NE(failure(urlOf(plain, "https://"), {}).find("TLS failed"), std::string::npos);
    const std::string missing = failure(urlOf(plain, "https://"), {"/nowhere.pem", true});
    EXPECT_EQ(missing, "/nowhere.pem: No such file or directory");
    EXPECT_EQ(failure(urlOf(plain, "https://"), {"/", true}), "/: Is a directory");
    EXPECT_EQ(failure(urlOf(plain, "https://"), {"/dev/null", true}),
              "/dev/null: no certificates in PEM form in this file");
}

TEST(Tls, CheckIsUnknownWithoutTrust) {
    const Identity other("DNS:other.example.com,IP:127.0.0.2");
    const Serving secure(secureServer(other));
    const Serving plain(std::make_unique<httplib::Server>());
    const ScriptedServer cut([](const std::string&) { return "\x16\x03\x03"; });
    const std::string silent = "https" + cut.url().substr(4);
    const struct {
        std::string arguments, text;
    } cases[] = {
        {urlOf(secure, "https://"), "the server's certificate is not trusted: self-signed "},
        {urlOf(secure, "https://") + " -C " + other.file,
         "the server's certificate is not trusted: IP address mismatch"},
        {urlOf(secure, "https://") + " -C /nowhere.pem", "/nowhere.pem: No such file or directory"},
        {urlOf(secure, "https://") + " --ca-file /dev/null", "/dev/null: no certificates"},
        {urlOf(plain, "https://"), "TLS failed: "},
        {silent, "no answer in time"},
        {urlOf(secure, "http://"), "the server "},
    };
    for (const auto& [arguments, text] : cases) {
        const Outcome outcome = runTool("ask --check --timeout 1 " + arguments);
        EXPECT_EQ(outcome.status, 3) << arguments;
        EXPECT_EQ(outcome.output.find("PLEXOR UNKNOWN - 127.0.0.1:"), 0u) << outcome.output;
        EXPECT_NE(outcome.output.find(": " + text), std::string::npos) << outcome.output;
        EXPECT_EQ(std::count(outcome.output.begin(), outcome.output.end(), '\n'), 1);
    }
}

}  // namespace
}  // namespace testbed
