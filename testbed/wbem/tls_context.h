// What a server needs to speak TLS 1.2 and later.
#pragma once

#include <memory>
#include <string>

namespace boost::asio::ssl {
class context;
}

namespace testbed {

using TlsContext = boost::asio::ssl::context;

/// A context with the certificate chain and the key of two PEM files. Throws std::runtime_error for
/// files that cannot be read and a key that is not the certificate's.
std::shared_ptr<TlsContext> tlsFromFiles(const std::string& certificate, const std::string& key);

/// A context with a key and a certificate made now, for this process only: signed with that key,
/// for localhost, the loopback addresses and `host`, good for a month.
std::shared_ptr<TlsContext> tlsSelfSigned(const std::string& host);

}  // namespace testbed
