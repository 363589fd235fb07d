// Checking HTTP's headers and the message's against each other, and reading the parameters.
#include "cim_request.h"

#include <algorithm>
#include <set>
#include <sstream>

#include "cim_status.h"
#include "cim_xml_read.h"
#include "xml_well_formed.h"

namespace testbed {
namespace {

[[noreturn]] void refuse(const char* cimError, const std::string& why, int status = 400) {
    throw MessageError(status, cimError, why);
}

constexpr const char* kNotValid = "request-not-loosely-valid";

/// The version's major number must be the one that is served.
void requireVersion(const std::string& version, const char* major, const char* cimError) {
    if (!version.starts_with(std::string(major) + ".")) {
        refuse(cimError, "version \"" + version + "\"", 501);
    }
}

int hexDigit(char digit) {
    if (digit >= '0' && digit <= '9') return digit - '0';
    if (digit >= 'a' && digit <= 'f') return digit - 'a' + 10;
    return digit >= 'A' && digit <= 'F' ? digit - 'A' + 10 : -1;
}

/// What a header says whose special characters are written as %XX.
std::string unescaped(const std::string& text) {
    std::string result;
    for (std::size_t i = 0; i < text.size(); i++) {
        const bool isEscape = text[i] == '%' && i + 2 < text.size();
        const int high = isEscape ? hexDigit(text[i + 1]) : -1;
        const int low = isEscape ? hexDigit(text[i + 2]) : -1;
        if (high < 0 || low < 0) {
            result += text[i];
            continue;
        }
        result += static_cast<char>(high * 16 + low);
        i += 2;
    }
    return result;
}

std::string trimmed(const std::string& text) {
    const std::size_t first = text.find_first_not_of(" \t\"");
    if (first == std::string::npos) return {};
    return text.substr(first, text.find_last_not_of(" \t\"") - first + 1);
}

/// The value of a header's parameter without its quotation marks; empty when it has none.
std::string parameterOf(const std::string& header, const std::string& name) {
    std::istringstream parts(header.substr(std::min(header.find(';'), header.size())));
    for (std::string part; std::getline(parts, part, ';');) {
        const std::size_t equals = part.find('=');
        if (equals != std::string::npos && sameName(trimmed(part.substr(0, equals)), name)) {
            return trimmed(part.substr(equals + 1));
        }
    }
    return {};
}

void checkContent(const HttpRequest& request) {
    const std::string* type = request.header("Content-Type");
    const std::string media = type ? trimmed(type->substr(0, type->find(';'))) : "";
    if (!sameName(media, "text/xml") && !sameName(media, "application/xml")) {
        throw MessageError(415, "", "Content-Type is not XML");
    }
    const std::string charset = parameterOf(*type, "charset");
    if (!charset.empty() && !sameName(charset, "utf-8")) {
        throw MessageError(415, "", "the charset is not UTF-8");
    }
    const std::string* coding = request.header("Content-Encoding");
    if (coding && !sameName(trimmed(*coding), "identity")) {
        throw MessageError(415, "", "no Content-Encoding is understood");
    }
}

void checkHttpHeaders(const HttpRequest& request) {
    const std::string* operation = request.header("CIMOperation");
    if (operation == nullptr || !sameName(*operation, "MethodCall")) {
        refuse("unsupported-operation", "CIMOperation is not MethodCall");
    }
    const std::string* version = request.header("CIMProtocolVersion");
    if (version != nullptr) requireVersion(*version, "1", "unsupported-protocol-version");
    checkContent(request);
    const auto hosts =
        std::count_if(request.headers.begin(), request.headers.end(),
                      [](const auto& field) { return sameName(field.first, "Host"); });
    if (hosts > 1 || (hosts == 0 && request.version >= 11)) {
        throw MessageError(400, "", "not exactly one Host");
    }
}

[[noreturn]] void refuseParameter(const char* name, const std::string& why) {
    throw CimStatus(CMPI_RC_ERR_INVALID_PARAMETER, std::string(name) + ": " + why);
}

/// Runs read(); what is not understood there makes the parameter an invalid one.
template <class Read>
auto readParameter(const char* name, Read read) {
    try {
        return read();
    } catch (const CimXmlError& error) {
        refuseParameter(name, error.what());
    }
}

}  // namespace

CimRequest::CimRequest(const HttpRequest& request)
    : document_(std::make_shared<pugi::xml_document>()) {
    checkHttpHeaders(request);
    try {
        requireWellFormed(request.body);
        parseXml(request.body, *document_);
    } catch (const CimXmlError& error) {
        refuse("request-not-well-formed", error.what());
    }
    try {
        readMessage(request);
    } catch (const CimXmlError& error) {
        refuse(kNotValid, error.what());
    }
}

void CimRequest::readMessage(const HttpRequest& request) {
    const pugi::xml_node cim = requiredChild(*document_, "CIM");
    requireVersion(requiredAttribute(cim, "CIMVERSION"), "2", "unsupported-cim-version");
    requireVersion(requiredAttribute(cim, "DTDVERSION"), "2", "unsupported-dtd-version");
    const pugi::xml_node message = requiredChild(cim, "MESSAGE");
    messageId_ = requiredAttribute(message, "ID");
    requireVersion(requiredAttribute(message, "PROTOCOLVERSION"), "1",
                   "unsupported-protocol-version");
    if (message.child("MULTIREQ")) {
        refuse("multiple-requests-unsupported", "one request in a message is served", 501);
    }
    readCall(requiredChild(message, "SIMPLEREQ"));
    compareHeaders(request);
}

void CimRequest::readCall(pugi::xml_node simpleRequest) {
    call_ = simpleRequest.child("IMETHODCALL");
    isExtrinsic_ = !call_;
    if (isExtrinsic_) {
        call_ = requiredChild(simpleRequest, "METHODCALL");
        const pugi::xml_node path = firstElement(call_);
        if (!isElement(path, "LOCALCLASSPATH") && !isElement(path, "LOCALINSTANCEPATH")) {
            throw CimXmlError("METHODCALL: no object path");
        }
        nameSpace_ = readNamespace(requiredChild(path, "LOCALNAMESPACEPATH"));
    } else {
        nameSpace_ = readNamespace(requiredChild(call_, "LOCALNAMESPACEPATH"));
    }
    method_ = requiredAttribute(call_, "NAME");
}

void CimRequest::compareHeaders(const HttpRequest& request) const {
    const std::string* method = request.header("CIMMethod");
    if (method == nullptr || !sameName(unescaped(*method), method_)) {
        refuse("header-mismatch", "CIMMethod does not name the method in the message");
    }
    const std::string* object = request.header("CIMObject");
    // Of a method of an object the whole object path is said; its namespace is enough here.
    const std::string path = object ? unescaped(*object) : "";
    const std::string named = isExtrinsic_ ? path.substr(0, path.find(':')) : path;
    if (!sameName(named, nameSpace_)) {
        refuse("header-mismatch", "CIMObject does not name the object in the message");
    }
}

void CimRequest::allowParameters(const std::vector<const char*>& names) const {
    std::set<std::string> seen;
    for (const pugi::xml_node parameter : call_.children("IPARAMVALUE")) {
        const char* name = parameter.attribute("NAME").value();
        if (std::none_of(names.begin(), names.end(),
                         [&](const char* known) { return sameName(known, name); })) {
            refuseParameter(name, "is no parameter of " + method_);
        }
        if (!seen.insert(foldName(name)).second) refuseParameter(name, "comes twice");
    }
}

pugi::xml_node CimRequest::value(const char* name) const {
    for (const pugi::xml_node parameter : call_.children("IPARAMVALUE")) {
        if (sameName(parameter.attribute("NAME").value(), name)) return firstElement(parameter);
    }
    return {};
}

std::string CimRequest::className() const {
    const auto name = optionalClassName("ClassName");
    if (!name) refuseParameter("ClassName", "is missing");
    return *name;
}

std::optional<std::string> CimRequest::optionalClassName(const char* name) const {
    const pugi::xml_node node = value(name);
    if (!node) return std::nullopt;
    if (!isElement(node, "CLASSNAME")) refuseParameter(name, "is no CLASSNAME");
    return readParameter(name, [&] { return requiredAttribute(node, "NAME"); });
}

bool CimRequest::flag(const char* name, bool absent) const {
    const auto value = text(name);
    if (!value) return absent;
    return readParameter(name,
                         [&] { return scalarFromText(*value, CMPI_boolean).asUnsigned() != 0; });
}

std::optional<std::string> CimRequest::text(const char* name) const {
    const pugi::xml_node node = value(name);
    if (!node) return std::nullopt;
    if (!isElement(node, "VALUE")) refuseParameter(name, "is no VALUE");
    return elementText(node);
}

PropertyList CimRequest::propertyList() const {
    constexpr const char* kName = "PropertyList";
    const pugi::xml_node node = value(kName);
    if (!node) return std::nullopt;
    if (!isElement(node, "VALUE.ARRAY")) refuseParameter(kName, "is no VALUE.ARRAY");
    std::vector<std::string> names;
    for (const pugi::xml_node name : node.children("VALUE")) names.push_back(elementText(name));
    return names;
}

ObjectPath CimRequest::objectPath(const char* name) const {
    const pugi::xml_node node = value(name);
    if (!node) refuseParameter(name, "is missing");
    return readParameter(name, [&] { return readObjectPath(node, nameSpace_); });
}

bool CimRequest::isClassPath(const char* name) const {
    return isElement(value(name), "CLASSNAME");
}

std::string CimRequest::classIn(const char* name) const {
    const pugi::xml_node node = value(name);
    return node.attribute(isElement(node, "CLASSNAME") ? "NAME" : "CLASSNAME").value();
}

}  // namespace testbed
