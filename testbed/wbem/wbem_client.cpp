// Composing the request messages, posting them, and telling a server's failure in its own words.
#include "wbem_client.h"

#include <algorithm>
#include <random>
#include <utility>

#include "cim_response.h"
#include "cim_xml_write.h"
#include "xml_text.h"

namespace testbed {
namespace {

/// Characters of a server's own words that are repeated in a message.
constexpr std::size_t kLongestQuote = 200;

/// A number of eight digits that no earlier answer of this server is likely to have.
std::string newMessageId() {
    static std::mt19937 random(std::random_device{}());
    return std::to_string(std::uniform_int_distribution(10'000'000, 99'999'999)(random));
}

/// A request's message with its operation, to which parameters are added.
struct OperationCall {
    OperationCall(const char* method, const std::string& nameSpace)
        : asked{method, newMessageId(), nameSpace, false} {
        pugi::xml_node cim = document.append_child("CIM");
        cim.append_attribute("CIMVERSION") = "2.0";
        cim.append_attribute("DTDVERSION") = "2.0";
        pugi::xml_node message = cim.append_child("MESSAGE");
        message.append_attribute("ID") = asked.id.c_str();
        message.append_attribute("PROTOCOLVERSION") = "1.0";
        call = message.append_child("SIMPLEREQ").append_child("IMETHODCALL");
        call.append_attribute("NAME") = method;
        writeLocalNamespacePath(call, nameSpace);
    }

    pugi::xml_node parameter(const char* name) {
        pugi::xml_node node = call.append_child("IPARAMVALUE");
        node.append_attribute("NAME") = name;
        return node;
    }

    void flag(const char* name, bool value) {
        writeValue(parameter(name), CimValue::boolean(value));
    }

    void propertyList(const PropertyList& properties) {
        if (!properties) return;
        std::vector<CimValue> names;
        for (const std::string& name : *properties) names.push_back(CimValue::string(name));
        writeValue(parameter("PropertyList"), CimValue::array(CMPI_string, std::move(names)));
    }

    AskedOperation asked;
    pugi::xml_document document;
    pugi::xml_node call;
};

std::string quoted(std::string text) {
    for (char& c : text) {
        if (static_cast<unsigned char>(c) < 0x20 || c == 0x7f) c = ' ';
    }
    if (text.size() > kLongestQuote) text = text.substr(0, kLongestQuote) + "...";
    return xmlText(text);
}

std::string percentEncoded(const std::string& text) {
    constexpr const char* kDigits = "0123456789ABCDEF";
    std::string encoded;
    for (const char c : text) {
        const auto byte = static_cast<unsigned char>(c);
        if (byte > 0x20 && byte < 0x7f && c != '%' && c != '/') {
            encoded += c;
        } else {
            encoded += '%';
            encoded += kDigits[byte >> 4];
            encoded += kDigits[byte & 15];
        }
    }
    return encoded;
}

std::string base64(std::string_view bytes) {
    constexpr const char* kDigits =
        "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
    std::string encoded;
    while (!bytes.empty()) {
        std::uint32_t bits = 0;
        for (std::size_t i = 0; i < 3; i++) {
            bits = bits << 8 | (i < bytes.size() ? static_cast<unsigned char>(bytes[i]) : 0U);
        }
        for (std::size_t i = 0; i < 4; i++) {
            encoded += i <= bytes.size() ? kDigits[bits >> (18 - 6 * i) & 63] : '=';
        }
        bytes.remove_prefix(std::min<std::size_t>(3, bytes.size()));
    }
    return encoded;
}

/// Headers with which a server says that it failed, whatever HTTP's status is.
constexpr const char* kErrorHeaders[] = {"CIMError", "PGErrorDetail"};

bool saysError(const PostAnswer& answer) {
    return std::any_of(std::begin(kErrorHeaders), std::end(kErrorHeaders),
                       [&](const char* header) { return !answer.header(header).empty(); });
}

/// What an answer without a CIM message means.
std::string refusalOf(const PostAnswer& answer) {
    std::string text = "HTTP status " + std::to_string(answer.status);
    if (!answer.reason.empty()) text += " " + quoted(answer.reason);
    if (answer.status == 401) text += ": user name or password are missing or wrong";
    if (answer.status / 100 == 3) text += ": it is at " + quoted(answer.header("Location"));
    for (const char* header : kErrorHeaders) {
        if (const std::string& detail = answer.header(header); !detail.empty()) {
            text += ", " + std::string(header) + " " + quoted(detail);
        }
    }
    return text;
}

/// The status in the headers or behind the body; OK without one. A text without a code fails, too.
Response statusIn(const PostAnswer& answer) {
    const std::string description = answer.header("CIMStatusCodeDescription");
    Response response;
    bool told = false;
    for (const auto& [name, value] : answer.headers) {
        if (!sameName(name, "CIMStatusCode")) continue;
        told = true;
        if (response.rc == CMPI_RC_OK) readHttpStatus(value, description, response);
    }
    if (!told && !description.empty()) readHttpStatus("", description, response);
    return response;
}

void replaceAll(std::string& text, const std::string& part) {
    constexpr std::string_view kHidden = "***";
    if (part.empty()) return;
    for (std::size_t at = 0; (at = text.find(part, at)) != std::string::npos;
         at += kHidden.size()) {
        text.replace(at, part.size(), kHidden);
    }
}

}  // namespace

WbemClient::WbemClient(WbemUrl url, WbemClientOptions options)
    : url_(std::move(url)), options_(std::move(options)) {
    if (const auto& known = url_.credentials) token_ = base64(known->user + ":" + known->password);
}

std::string WbemClient::withoutSecrets(std::string text) const {
    if (!url_.credentials) return text;
    replaceAll(text, token_);
    replaceAll(text, url_.credentials->password);
    return text;
}

PostAnswer WbemClient::post(const std::string& method, const std::string& nameSpace,
                            const std::string& body) {
    PostRequest request{url_.host,
                        url_.port,
                        url_.tls ? std::optional(options_.tls) : std::nullopt,
                        url_.authority(),
                        url_.path,
                        {{"Content-Type", "application/xml; charset=\"utf-8\""},
                         {"Accept", "application/xml, text/xml"},
                         {"CIMOperation", "MethodCall"},
                         {"CIMMethod", method},
                         {"CIMObject", percentEncoded(nameSpace)}},
                        body};
    if (url_.credentials) request.headers.emplace_back("Authorization", "Basic " + token_);
    PostAnswer answer = httpPost(request, {options_.deadline, options_.largestAnswer - received_});
    received_ += answer.body.size();
    if (answer.status != 200 || saysError(answer)) {
        throw WbemError(withoutSecrets(refusalOf(answer)));
    }
    return answer;
}

Response WbemClient::call(const AskedOperation& asked, const pugi::xml_document& request) {
    const PostAnswer answer = post(asked.method, asked.nameSpace, serialize(request));
    Response response = statusIn(answer);
    try {
        // The body of an answer that failed may be empty, or end anywhere.
        if (response.rc == CMPI_RC_OK) response = readCimResponse(answer.body, asked);
    } catch (const CimXmlError& error) {
        throw WbemError(withoutSecrets("the answer is no CIM-XML: " + quoted(error.what())));
    }
    if (response.message) response.message = withoutSecrets(*response.message);
    return response;
}

Response WbemClient::enumerateInstanceNames(const std::string& className,
                                            const std::string& nameSpace) {
    OperationCall operation("EnumerateInstanceNames", nameSpace);
    operation.asked.namesOnly = true;
    writeClassName(operation.parameter("ClassName"), className);
    return call(operation.asked, operation.document);
}

Response WbemClient::enumerateInstances(const std::string& className,
                                        const PropertyList& properties,
                                        const std::string& nameSpace) {
    OperationCall operation("EnumerateInstances", nameSpace);
    writeClassName(operation.parameter("ClassName"), className);
    // Servers differ in what they take for granted.
    operation.flag("LocalOnly", false);
    operation.flag("DeepInheritance", true);
    operation.flag("IncludeQualifiers", false);
    operation.flag("IncludeClassOrigin", false);
    operation.propertyList(properties);
    return call(operation.asked, operation.document);
}

Response WbemClient::getInstance(const ObjectPath& path, const PropertyList& properties) {
    OperationCall operation("GetInstance", path.nameSpace);
    writeInstanceName(operation.parameter("InstanceName"), path);
    operation.flag("LocalOnly", false);
    operation.flag("IncludeQualifiers", false);
    operation.flag("IncludeClassOrigin", false);
    operation.propertyList(properties);
    Response response = call(operation.asked, operation.document);
    if (response.rc == CMPI_RC_OK && response.instances.size() != 1) {
        throw WbemError("the answer has " + std::to_string(response.instances.size()) +
                        " instances instead of one");
    }
    // A got instance comes without its name.
    for (Instance& instance : response.instances) instance.path = path;
    return response;
}

}  // namespace testbed
