// What a server's message says to one operation.
#pragma once

#include <string>

#include "cim_xml_read.h"
#include "instance_client.h"

namespace testbed {

/// The request that a response has to belong to.
struct AskedOperation {
    std::string method;      ///< "EnumerateInstances"
    std::string id;          ///< of the message
    std::string nameSpace;   ///< where names are that tell no namespace of their own
    bool namesOnly = false;  ///< paths are returned; otherwise instances
};

/// Reads a message: the status of its ERROR, or what its IRETURNVALUE has. Throws CimXmlError for
/// all that is no whole answer to that request: another message's id, another method, a value of
/// another kind, elements and texts that do not belong there.
Response readCimResponse(const std::string& message, const AskedOperation& asked);

/// Reads a status that HTTP carries, in a header or behind the body: a code and the percent-encoded
/// text for it. A code that is no number of CIM's is "failed". Sets the response's status only.
void readHttpStatus(const std::string& code, const std::string& description, Response& response);

}  // namespace testbed
