// What a server sends to the client, after HTTP: the message, and statuses in headers.
#include <string>

#include "cim_response.h"
#include "cim_xml_write.h"
#include "fuzz_target.h"
#include "xml_well_formed.h"

namespace {

/// What has been read can be told to others.
void writeAgain(const testbed::Response& response) {
    pugi::xml_document document;
    pugi::xml_node root = document.append_child("R");
    for (const auto& path : response.paths) testbed::writeInstancePath(root, path, "host");
    for (const auto& instance : response.instances) testbed::writeNamedInstance(root, instance);
    for (const auto& instance : response.instances) instance.path.identity();
    testbed::requireWellFormed(testbed::serialize(document));
}

void readAs(const std::string& message, const testbed::AskedOperation& asked) {
    try {
        writeAgain(testbed::readCimResponse(message, asked));
    } catch (const testbed::CimXmlError& error) {
        fuzz::require(*error.what() != '\0', "a refusal has a text");
    }
}

}  // namespace

PLEXOR_FUZZ_HARNESS(answer) {
    const std::string message(bytes);
    readAs(message, {"EnumerateInstances", "1", "root/cimv2", false});
    readAs(message, {"EnumerateInstanceNames", "1", "root/cimv2", true});
    testbed::Response response;
    const std::string code = message.substr(0, 3);
    testbed::readHttpStatus(code, message.substr(code.size()), response);
}
