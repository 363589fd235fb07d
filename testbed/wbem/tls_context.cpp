// Making contexts from PEM files, or from a key and certificate of the server's own making.
#include "tls_context.h"

#include <openssl/evp.h>
#include <openssl/rand.h>
#include <openssl/ssl.h>
#include <openssl/x509v3.h>

#include <boost/asio/ssl/context.hpp>
#include <stdexcept>

namespace testbed {
namespace {

namespace ssl = boost::asio::ssl;

constexpr long kMonth = 31L * 24 * 60 * 60;
constexpr long kHour = 60L * 60;  // clocks differ

template <auto Free>
struct FreedBy {
    template <class Object>
    void operator()(Object* object) const {
        Free(object);
    }
};
using Key = std::unique_ptr<EVP_PKEY, FreedBy<EVP_PKEY_free>>;
using Certificate = std::unique_ptr<X509, FreedBy<X509_free>>;
using Extension = std::unique_ptr<X509_EXTENSION, FreedBy<X509_EXTENSION_free>>;

void require(bool success) {
    if (!success) throw std::runtime_error("cannot make a certificate");
}

std::shared_ptr<TlsContext> emptyContext() {
    auto context = std::make_shared<TlsContext>(TlsContext::tls_server);
    SSL_CTX_set_min_proto_version(context->native_handle(), TLS1_2_VERSION);
    return context;
}

void addNames(X509* certificate, const std::string& host) {
    X509_NAME* name = X509_get_subject_name(certificate);
    const auto* text = reinterpret_cast<const unsigned char*>("plexor-testbed");
    require(X509_NAME_add_entry_by_txt(name, "CN", MBSTRING_ASC, text, -1, -1, 0) == 1);
    require(X509_set_issuer_name(certificate, name) == 1);
    const std::string names = "DNS:localhost,IP:127.0.0.1,IP:::1,DNS:" + host;
    const Extension extension(
        X509V3_EXT_conf_nid(nullptr, nullptr, NID_subject_alt_name, names.c_str()));
    require(extension && X509_add_ext(certificate, extension.get(), -1) == 1);
}

Certificate certificateFor(EVP_PKEY* key, const std::string& host) {
    Certificate certificate(X509_new());
    require(certificate != nullptr);
    std::uint64_t serial = 0;
    require(RAND_bytes(reinterpret_cast<unsigned char*>(&serial), sizeof serial) == 1);
    ASN1_INTEGER_set_uint64(X509_get_serialNumber(certificate.get()), serial >> 1);
    X509_set_version(certificate.get(), X509_VERSION_3);
    X509_gmtime_adj(X509_getm_notBefore(certificate.get()), -kHour);
    X509_gmtime_adj(X509_getm_notAfter(certificate.get()), kMonth);
    require(X509_set_pubkey(certificate.get(), key) == 1);
    addNames(certificate.get(), host);
    require(X509_sign(certificate.get(), key, EVP_sha256()) > 0);
    return certificate;
}

}  // namespace

std::shared_ptr<TlsContext> tlsFromFiles(const std::string& certificate, const std::string& key) {
    auto context = emptyContext();
    boost::system::error_code error;
    context->use_certificate_chain_file(certificate, error);
    if (error) throw std::runtime_error(certificate + ": no certificate: " + error.message());
    context->use_private_key_file(key, TlsContext::pem, error);
    if (error) throw std::runtime_error(key + ": no key of that certificate: " + error.message());
    return context;
}

std::shared_ptr<TlsContext> tlsSelfSigned(const std::string& host) {
    const Key key(EVP_EC_gen("P-256"));
    require(key != nullptr);
    const Certificate certificate = certificateFor(key.get(), host);
    auto context = emptyContext();
    require(SSL_CTX_use_certificate(context->native_handle(), certificate.get()) == 1);
    require(SSL_CTX_use_PrivateKey(context->native_handle(), key.get()) == 1);
    return context;
}

}  // namespace testbed
