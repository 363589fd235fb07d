// From the HTTP request through the operation to the response message, or to the refusal.
#include "cim_server.h"

#include "cim_status.h"
#include "cim_xml_write.h"
#include "xml_text.h"

namespace testbed {
namespace {

/// Header values are one line of printable ASCII.
std::string headerText(std::string text) {
    for (char& c : text) {
        if (c < 0x20 || c > 0x7e) c = '?';
    }
    return text;
}

HttpResponse refusal(const MessageError& error) {
    HttpResponse response{error.status, {}, {}};
    if (!error.error.empty()) response.headers.emplace_back("CIMError", error.error);
    response.headers.emplace_back("Content-Type", "text/plain; charset=\"utf-8\"");
    response.body = headerText(error.what()) + "\n";
    return response;
}

void writeError(pugi::xml_node response, const CimStatus& status) {
    pugi::xml_node error = response.append_child("ERROR");
    error.append_attribute("CODE") = static_cast<int>(status.code);
    error.append_attribute("DESCRIPTION") = xmlText(status.what()).c_str();
}

/// The message around the answer to a method, whose element is returned.
pugi::xml_node openResponse(pugi::xml_document& document, const CimRequest& request) {
    pugi::xml_node declaration = document.append_child(pugi::node_declaration);
    declaration.append_attribute("version") = "1.0";
    declaration.append_attribute("encoding") = "utf-8";
    pugi::xml_node cim = document.append_child("CIM");
    cim.append_attribute("CIMVERSION") = "2.0";
    cim.append_attribute("DTDVERSION") = "2.0";
    pugi::xml_node message = cim.append_child("MESSAGE");
    message.append_attribute("ID") = xmlText(request.messageId()).c_str();
    message.append_attribute("PROTOCOLVERSION") = "1.0";
    pugi::xml_node response =
        message.append_child("SIMPLERSP")
            .append_child(request.isExtrinsic() ? "METHODRESPONSE" : "IMETHODRESPONSE");
    response.append_attribute("NAME") = xmlText(request.method()).c_str();
    return response;
}

}  // namespace

HttpOutcome CimServer::answer(const HttpRequest& request) const {
    if (request.method == "M-POST") return HttpResponse{501, {}, {}};
    if (request.method != "POST") return HttpResponse{405, {{"Allow", "POST"}}, {}};
    const std::string* authorization = request.header("Authorization");
    if (credentials_ && (!authorization || !isAuthorized(*authorization, *credentials_))) {
        return HttpResponse{401, {{"WWW-Authenticate", "Basic realm=\"plexor-testbed\""}}, {}};
    }
    try {
        return answerCall(request);
    } catch (const MessageError& error) {
        return refusal(error);
    }
}

HttpOutcome CimServer::answerCall(const HttpRequest& request) const {
    const CimRequest call(request);
    const std::string* named = request.header("Host");
    const std::string host = named && !named->empty() ? *named : host_;
    const Operation* operation = call.isExtrinsic() ? nullptr : findOperation(call.method());
    const std::string about = operation ? call.classIn(operation->parameters.front()) : "";
    std::optional<ServerFault> fault;
    if (faults_) fault = faults_->match(call.method(), about);
    const bool isSlow =
        operation && operation->asksProvider && manager_.asksProvider(call.nameSpace(), about);
    if (!isSlow) return answerTo(call, host, fault);
    return SlowWork([this, call, host, fault] { return answerTo(call, host, fault); });
}

HttpResponse CimServer::answerTo(const CimRequest& call, const std::string& host,
                                 const std::optional<ServerFault>& fault) const {
    pugi::xml_document document;
    pugi::xml_node response = openResponse(document, call);
    try {
        if (fault && fault->cimStatus) {
            throw providerStatus(static_cast<CMPIrc>(*fault->cimStatus), fault->message);
        }
        carryOut(call, host, response.append_child("IRETURNVALUE"));
    } catch (const CimStatus& status) {
        response.remove_child("IRETURNVALUE");
        writeError(response, status);
    }
    HttpResponse answer{200,
                        {{"Content-Type", "application/xml; charset=\"utf-8\""},
                         {"CIMOperation", "MethodResponse"},
                         {"Cache-Control", "no-cache"}},
                        serialize(document)};
    if (fault) befall(*fault, answer);
    return answer;
}

void CimServer::carryOut(const CimRequest& request, const std::string& host,
                         pugi::xml_node result) const {
    const Operation* operation = request.isExtrinsic() ? nullptr : findOperation(request.method());
    if (operation == nullptr) {
        throw CimStatus(CMPI_RC_ERR_NOT_SUPPORTED, request.method() + " is not served");
    }
    manager_.requireNamespace(request.nameSpace());
    request.allowParameters(operation->parameters);
    operation->run({manager_, host}, request, result);
}

}  // namespace testbed
