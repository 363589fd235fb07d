#include "wbem_client.h"

#include <algorithm>
#include <utility>

#include "cim_xml_read.h"
#include "cim_xml_write.h"
#include "xml_text.h"

namespace testbed {
namespace {

/// Characters of a server's own words that are repeated in a message.
constexpr std::size_t kLongestQuote = 200;
constexpr unsigned kLargestStatus = 255;

/// A request's message with its operation, to which parameters are added.
struct Operation {
    Operation(const char* method, const std::string& nameSpace) {
        pugi::xml_node cim = document.append_child("CIM");
        cim.append_attribute("CIMVERSION") = "2.0";
        cim.append_attribute("DTDVERSION") = "2.0";
        pugi::xml_node message = cim.append_child("MESSAGE");
        message.append_attribute("ID") = "1";
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

    pugi::xml_document document;
    pugi::xml_node call;
};

std::string quoted(std::string text) {
    for (char& c : text)
        if (static_cast<unsigned char>(c) < 0x20 || c == 0x7f) c = ' ';
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
        for (std::size_t i = 0; i < 3; i++)
            bits = bits << 8 | (i < bytes.size() ? static_cast<unsigned char>(bytes[i]) : 0U);
        for (std::size_t i = 0; i < 4; i++)
            encoded += i <= bytes.size() ? kDigits[bits >> (18 - 6 * i) & 63] : '=';
        bytes.remove_prefix(std::min<std::size_t>(3, bytes.size()));
    }
    return encoded;
}

/// What an answer without a CIM message means.
[[noreturn]] void refuse(const PostAnswer& answer) {
    std::string text = "HTTP status " + std::to_string(answer.status);
    if (!answer.reason.empty()) text += " " + quoted(answer.reason);
    if (answer.status == 401) text += ": user name or password are missing or wrong";
    if (answer.status / 100 == 3) text += ": it is at " + quoted(answer.header("Location"));
    for (const char* header : {"CIMError", "PGErrorDetail"})
        if (const std::string& detail = answer.header(header); !detail.empty())
            text += ", " + std::string(header) + " " + quoted(detail);
    throw WbemError(text);
}

pugi::xml_node methodResponse(const pugi::xml_document& document) {
    const pugi::xml_node cim = document.child("CIM");
    if (!cim) throw CimXmlError("no CIM message");
    const pugi::xml_node response =
        requiredChild(requiredChild(requiredChild(cim, "MESSAGE"), "SIMPLERSP"), "IMETHODRESPONSE");
    return response;
}

void readError(pugi::xml_node error, Response& response) {
    const unsigned code = error.attribute("CODE").as_uint();
    // An error without a number of CIM's is an error all the same.
    const bool known = code > 0 && code <= kLargestStatus;
    response.rc = known ? static_cast<CMPIrc>(code) : CMPI_RC_ERR_FAILED;
    if (const pugi::xml_attribute text = error.attribute("DESCRIPTION"))
        response.message = text.value();
}

bool isPath(std::string_view name) {
    return name == "INSTANCENAME" || name == "INSTANCEPATH" || name == "LOCALINSTANCEPATH";
}

void readReturnValue(pugi::xml_node value, const std::string& nameSpace, Response& response) {
    for (const pugi::xml_node node : value.children()) {
        if (node.type() != pugi::node_element) continue;
        const std::string_view name = node.name();
        if (isPath(name))
            response.paths.push_back(readObjectPath(node, nameSpace));
        else if (name == "OBJECTPATH")
            response.paths.push_back(readReference(node, nameSpace));
        else
            response.instances.push_back(readNamedInstance(node, nameSpace));
    }
}

}  // namespace

WbemClient::WbemClient(WbemUrl url, WbemClientOptions options)
    : url_(std::move(url)), options_(std::move(options)) {}

std::string WbemClient::post(const std::string& method, const std::string& nameSpace,
                             const std::string& body) const {
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
    if (const auto& known = url_.credentials)
        request.headers.emplace_back("Authorization",
                                     "Basic " + base64(known->user + ":" + known->password));
    PostAnswer answer = httpPost(request, {options_.deadline, options_.largestAnswer});
    if (answer.status != 200) refuse(answer);
    return std::move(answer.body);
}

void WbemClient::call(const std::string& method, const std::string& nameSpace,
                      const pugi::xml_document& request, Response& response) const {
    const std::string answer = post(method, nameSpace, serialize(request));
    try {
        pugi::xml_document document;
        parseXml(answer, document);
        const pugi::xml_node node = methodResponse(document);
        if (const pugi::xml_node error = node.child("ERROR"))
            readError(error, response);
        else
            readReturnValue(node.child("IRETURNVALUE"), nameSpace, response);
    } catch (const CimXmlError& error) {
        throw WbemError("the answer is no CIM-XML: " + quoted(error.what()));
    }
}

Response WbemClient::enumerateInstanceNames(const std::string& className,
                                            const std::string& nameSpace) const {
    Operation operation("EnumerateInstanceNames", nameSpace);
    writeClassName(operation.parameter("ClassName"), className);
    Response response;
    call("EnumerateInstanceNames", nameSpace, operation.document, response);
    return response;
}

Response WbemClient::enumerateInstances(const std::string& className,
                                        const PropertyList& properties,
                                        const std::string& nameSpace) const {
    Operation operation("EnumerateInstances", nameSpace);
    writeClassName(operation.parameter("ClassName"), className);
    // Servers differ in what they take for granted.
    operation.flag("LocalOnly", false);
    operation.flag("DeepInheritance", true);
    operation.flag("IncludeQualifiers", false);
    operation.flag("IncludeClassOrigin", false);
    operation.propertyList(properties);
    Response response;
    call("EnumerateInstances", nameSpace, operation.document, response);
    return response;
}

Response WbemClient::getInstance(const ObjectPath& path, const PropertyList& properties) const {
    Operation operation("GetInstance", path.nameSpace);
    writeInstanceName(operation.parameter("InstanceName"), path);
    operation.flag("LocalOnly", false);
    operation.flag("IncludeQualifiers", false);
    operation.flag("IncludeClassOrigin", false);
    operation.propertyList(properties);
    Response response;
    call("GetInstance", path.nameSpace, operation.document, response);
    // A got instance comes without its name.
    for (Instance& instance : response.instances) instance.path = path;
    return response;
}

}  // namespace testbed
