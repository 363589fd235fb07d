// One request message: from HTTP headers and CIM-XML to an operation with its parameters.
#pragma once

#include <memory>
#include <optional>
#include <pugixml.hpp>
#include <stdexcept>
#include <string>
#include <vector>

#include "http_message.h"
#include "instance_client.h"

namespace testbed {

/// A message that is refused before any operation is known: HTTP status and header CIMError.
struct MessageError : std::runtime_error {
    MessageError(int httpStatus, std::string cimError, const std::string& why)
        : std::runtime_error(why), status(httpStatus), error(std::move(cimError)) {}
    int status;
    std::string error;
};

/// An operation that a client asks for. Parameters that are missing, or are not what their name
/// foresees, throw CimStatus 4.
class CimRequest {
public:
    /// Throws MessageError.
    explicit CimRequest(const HttpRequest& request);

    const std::string& messageId() const { return messageId_; }
    const std::string& method() const { return method_; }
    bool isExtrinsic() const { return isExtrinsic_; }
    const std::string& nameSpace() const { return nameSpace_; }

    /// Throws CimStatus 4 for a parameter that is not among `names`, or comes twice.
    void allowParameters(const std::vector<const char*>& names) const;
    std::string className() const;
    std::optional<std::string> optionalClassName(const char* name) const;
    bool flag(const char* name, bool absent) const;
    std::optional<std::string> text(const char* name) const;
    PropertyList propertyList() const;
    /// INSTANCENAME, or CLASSNAME: then without keys.
    ObjectPath objectPath(const char* name) const;
    bool isClassPath(const char* name) const;
    /// The class that the parameter names, as CLASSNAME or in INSTANCENAME; empty for none.
    std::string classIn(const char* name) const;

private:
    void readMessage(const HttpRequest& request);
    void readCall(pugi::xml_node simpleRequest);
    void compareHeaders(const HttpRequest& request) const;
    /// The element in the parameter; empty when the parameter is absent or NULL.
    pugi::xml_node value(const char* name) const;

    std::shared_ptr<pugi::xml_document> document_;
    pugi::xml_node call_;
    std::string messageId_;
    std::string method_;
    std::string nameSpace_;
    bool isExtrinsic_ = false;
};

}  // namespace testbed
