#include <openssl/err.h>
#include <openssl/ssl.h>
#include <openssl/x509v3.h>

#include <array>
#include <utility>

#include "byte_stream.h"

namespace testbed {
namespace {

struct Release {
    void operator()(SSL_CTX* context) const { SSL_CTX_free(context); }
    void operator()(SSL* session) const { SSL_free(session); }
    void operator()(ASN1_OCTET_STRING* address) const { ASN1_OCTET_STRING_free(address); }
};

/// What OpenSSL says about its last error; clears it.
std::string lastError() {
    const unsigned long code = ERR_get_error();
    ERR_clear_error();
    const char* reason = ERR_reason_error_string(code);
    return reason ? reason : "the connection was cut";
}

/// TLS between memory and a transport, so that deadlines and signals stay the transport's matter.
class TlsStream : public ByteStream {
public:
    TlsStream(std::unique_ptr<ByteStream> transport, const std::string& host,
              const TlsOptions& options)
        : transport_(std::move(transport)), context_(SSL_CTX_new(TLS_client_method())) {
        if (!context_) throw WbemError("no TLS: " + lastError());
        SSL_CTX_set_min_proto_version(context_.get(), TLS1_2_VERSION);
        if (options.verify) trust(options.authorities);
        session_.reset(SSL_new(context_.get()));
        incoming_ = BIO_new(BIO_s_mem());
        outgoing_ = BIO_new(BIO_s_mem());
        if (!session_ || !incoming_ || !outgoing_) throw std::bad_alloc();
        SSL_set_bio(session_.get(), incoming_, outgoing_);
        expectHost(host, options.verify);
        advance([this] { return SSL_connect(session_.get()); });
    }

    std::size_t read(char* buffer, std::size_t size) override {
        std::size_t count = 0;
        advance([&] { return SSL_read_ex(session_.get(), buffer, size, &count); });
        return count;
    }

    void write(std::string_view bytes) override {
        std::size_t count = 0;
        advance([&] { return SSL_write_ex(session_.get(), bytes.data(), bytes.size(), &count); });
    }

private:
    void trust(const std::string& authorities) {
        SSL_CTX_set_verify(context_.get(), SSL_VERIFY_PEER, nullptr);
        const int loaded = authorities.empty() ? SSL_CTX_set_default_verify_paths(context_.get())
                                               : SSL_CTX_load_verify_locations(
                                                     context_.get(), authorities.c_str(), nullptr);
        if (loaded != 1) throw WbemError(authorities + ": no certificates: " + lastError());
    }

    void expectHost(const std::string& host, bool verify) {
        const std::unique_ptr<ASN1_OCTET_STRING, Release> address(a2i_IPADDRESS(host.c_str()));
        ERR_clear_error();
        if (!address) SSL_set_tlsext_host_name(session_.get(), host.c_str());
        if (!verify) return;
        if (address)
            X509_VERIFY_PARAM_set1_ip_asc(SSL_get0_param(session_.get()), host.c_str());
        else
            SSL_set1_host(session_.get(), host.c_str());
    }

    /// Repeats a step until it is done, with what it wants carried to and from the transport.
    template <class Step>
    void advance(Step step) {
        for (;;) {
            const int result = step();
            const int state = result == 1 ? SSL_ERROR_NONE : SSL_get_error(session_.get(), result);
            flush();
            if (state == SSL_ERROR_NONE || state == SSL_ERROR_ZERO_RETURN) return;
            if (state != SSL_ERROR_WANT_READ) fail();
            receive();
        }
    }

    [[noreturn]] void fail() {
        const long verdict = SSL_get_verify_result(session_.get());
        if (verdict != X509_V_OK)
            throw WbemError("the server's certificate is not trusted: " +
                            std::string(X509_verify_cert_error_string(verdict)));
        throw WbemError("TLS failed: " + lastError());
    }

    void flush() {
        char* bytes = nullptr;
        const long size = BIO_get_mem_data(outgoing_, &bytes);
        if (size <= 0) return;
        transport_->write({bytes, static_cast<std::size_t>(size)});
        (void)BIO_reset(outgoing_);
    }

    void receive() {
        std::array<char, 16384> buffer;
        const std::size_t size = transport_->read(buffer.data(), buffer.size());
        if (size == 0) throw WbemError("TLS failed: the connection was cut");
        BIO_write(incoming_, buffer.data(), static_cast<int>(size));
    }

    std::unique_ptr<ByteStream> transport_;
    std::unique_ptr<SSL_CTX, Release> context_;
    std::unique_ptr<SSL, Release> session_;
    BIO* incoming_ = nullptr;  // the session's
    BIO* outgoing_ = nullptr;  // the session's
};

}  // namespace

std::unique_ptr<ByteStream> startTls(std::unique_ptr<ByteStream> transport, const std::string& host,
                                     const TlsOptions& options) {
    return std::make_unique<TlsStream>(std::move(transport), host, options);
}

}  // namespace testbed
