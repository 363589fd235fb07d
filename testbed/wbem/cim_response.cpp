// Taking the elements, errors and statuses out of a response message.
#include "cim_response.h"

#include <algorithm>
#include <charconv>
#include <string_view>

#include "xml_text.h"

namespace testbed {
namespace {

constexpr unsigned kLargestStatus = 255;

std::string named(pugi::xml_node node) {
    return xmlText(node.name());
}

bool isBlank(std::string_view text) {
    return text.find_first_not_of(" \t\r\n") == std::string_view::npos;
}

/// The only element in `node`; there may be no text beside it.
pugi::xml_node onlyChild(pugi::xml_node node, const char* name) {
    const pugi::xml_node child = requiredChild(node, name);
    for (const pugi::xml_node other : node.children()) {
        if (other != child && (other.type() == pugi::node_element || !isBlank(other.value()))) {
            throw CimXmlError(named(node) + ": more than one " + name);
        }
    }
    return child;
}

void requireAttribute(pugi::xml_node node, const char* name, const std::string& wanted) {
    const std::string value = requiredAttribute(node, name);
    if (!sameName(value, wanted)) {
        throw CimXmlError(named(node) + ": its " + name + " is \"" + xmlText(value) +
                          "\", not that of the request");
    }
}

pugi::xml_node methodResponse(const pugi::xml_document& document, const AskedOperation& asked) {
    const pugi::xml_node cim = document.child("CIM");
    if (!cim) throw CimXmlError("no CIM message");
    const pugi::xml_node message = onlyChild(cim, "MESSAGE");
    requireAttribute(message, "ID", asked.id);
    const pugi::xml_node response = onlyChild(onlyChild(message, "SIMPLERSP"), "IMETHODRESPONSE");
    requireAttribute(response, "NAME", asked.method);
    return response;
}

void setStatus(unsigned code, Response& response) {
    // An error without a number of CIM's is an error all the same.
    const bool known = code > 0 && code <= kLargestStatus;
    response.rc = known ? static_cast<CMPIrc>(code) : CMPI_RC_ERR_FAILED;
}

void readError(pugi::xml_node error, Response& response) {
    setStatus(error.attribute("CODE").as_uint(), response);
    if (const pugi::xml_attribute text = error.attribute("DESCRIPTION")) {
        response.message = text.value();
    }
}

bool isPath(std::string_view name) {
    return name == "INSTANCENAME" || name == "INSTANCEPATH" || name == "LOCALINSTANCEPATH" ||
           name == "OBJECTPATH";
}

void readElement(pugi::xml_node node, const AskedOperation& asked, Response& response) {
    const std::string_view name = node.name();
    if (isPath(name) != asked.namesOnly) {
        throw CimXmlError("IRETURNVALUE: a " + named(node) + ", which was not asked for");
    }
    if (!isPath(name)) {
        response.instances.push_back(readNamedInstance(node, asked.nameSpace));
    } else if (name == "OBJECTPATH") {
        response.paths.push_back(readReference(node, asked.nameSpace));
    } else {
        response.paths.push_back(readObjectPath(node, asked.nameSpace));
    }
}

void readReturnValue(pugi::xml_node value, const AskedOperation& asked, Response& response) {
    for (const pugi::xml_node node : value.children()) {
        if (node.type() == pugi::node_element) {
            readElement(node, asked, response);
        } else if (!isBlank(node.value())) {
            throw CimXmlError("IRETURNVALUE: a text instead of elements");
        }
    }
}

/// Decodes what it can; a % without two digits stays.
std::string percentDecoded(std::string_view text) {
    std::string decoded;
    for (std::size_t i = 0; i < text.size(); i++) {
        unsigned byte = 0;
        const char* digits = text.data() + i + 1;
        if (text[i] == '%' && i + 2 < text.size() &&
            std::from_chars(digits, digits + 2, byte, 16).ptr == digits + 2) {
            decoded += static_cast<char>(byte);
            i += 2;
        } else {
            decoded += text[i];
        }
    }
    return decoded;
}

}  // namespace

Response readCimResponse(const std::string& message, const AskedOperation& asked) {
    pugi::xml_document document;
    parseXml(message, document);
    const pugi::xml_node node = methodResponse(document, asked);
    Response response;
    if (const pugi::xml_node error = node.child("ERROR")) {
        readError(error, response);
        return response;
    }
    // Servers may leave out the value when it has nothing in it.
    if (!node.first_child()) return response;
    readReturnValue(onlyChild(node, "IRETURNVALUE"), asked, response);
    return response;
}

void readHttpStatus(const std::string& code, const std::string& description, Response& response) {
    unsigned number = 0;
    const char* end = code.data() + code.size();
    const auto [stop, error] = std::from_chars(code.data(), end, number);
    const bool isNumber = error == std::errc() && stop == end;
    if (isNumber && number == 0) return;
    setStatus(isNumber ? number : 0, response);
    if (!description.empty()) response.message = percentDecoded(description);
}

}  // namespace testbed
