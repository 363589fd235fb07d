// Answers of WBEM servers.
#pragma once

#include <string>

/// An HTTP answer with that body and its length.
inline std::string http(const std::string& body, const std::string& status = "200 OK",
                        const std::string& headers = "") {
    return "HTTP/1.1 " + status + "\r\nContent-Type: application/xml; charset=\"utf-8\"\r\n" +
           headers + "Content-Length: " + std::to_string(body.size()) + "\r\n\r\n" + body;
}

/// Stands for the id of the request's message, and is as long.
inline constexpr const char* kSameId = "asked-id";

/// The answer with the id of the request in the place of kSameId.
inline std::string withId(std::string answer, const std::string& request) {
    const std::string begin = "<MESSAGE ID=\"";
    const std::string id = request.substr(request.find(begin) + begin.size(), 8);
    const std::size_t at = answer.find(kSameId);
    return at == std::string::npos || request.find(begin) == std::string::npos
               ? answer
               : answer.replace(at, id.size(), id);
}

/// A CIM message with that in its IMETHODRESPONSE.
inline std::string cimResponse(const std::string& content,
                               const std::string& method = "EnumerateInstances") {
    return "<?xml version=\"1.0\" encoding=\"utf-8\"?>\n<CIM CIMVERSION=\"2.0\" "
           "DTDVERSION=\"2.0\"><MESSAGE ID=\"" +
           std::string(kSameId) +
           "\" PROTOCOLVERSION=\"1.0\"><SIMPLERSP>"
           "<IMETHODRESPONSE NAME=\"" +
           method + "\">" + content + "</IMETHODRESPONSE></SIMPLERSP></MESSAGE></CIM>\n";
}

inline std::string cimInstances(const std::string& instances,
                                const std::string& method = "EnumerateInstances") {
    return cimResponse("<IRETURNVALUE>" + instances + "</IRETURNVALUE>", method);
}

inline std::string cimError(int code, const std::string& description) {
    return cimResponse("<ERROR CODE=\"" + std::to_string(code) + "\" DESCRIPTION=\"" + description +
                       "\"/>");
}

/// VALUE.NAMEDINSTANCE of one of the provider's classes.
inline std::string namedInstance(const std::string& className, const std::string& key,
                                 const std::string& id, const std::string& name, int status,
                                 int health) {
    return "<VALUE.NAMEDINSTANCE><INSTANCENAME CLASSNAME=\"" + className +
           "\"><KEYBINDING NAME=\"" + key + "\"><KEYVALUE VALUETYPE=\"string\">" + id +
           "</KEYVALUE></KEYBINDING></INSTANCENAME><INSTANCE CLASSNAME=\"" + className +
           "\"><PROPERTY NAME=\"ElementName\" TYPE=\"string\"><VALUE>" + name +
           "</VALUE></PROPERTY><PROPERTY.ARRAY NAME=\"OperationalStatus\" "
           "TYPE=\"uint16\"><VALUE.ARRAY><VALUE>" +
           std::to_string(status) +
           "</VALUE></VALUE.ARRAY></PROPERTY.ARRAY><PROPERTY NAME=\"HealthState\" "
           "TYPE=\"uint16\"><VALUE>" +
           std::to_string(health) + "</VALUE></PROPERTY></INSTANCE></VALUE.NAMEDINSTANCE>";
}

/// What a server with one controller, one volume and one drive says to each of the classes.
class SmallArray {
public:
    int driveStatus = 2;
    int driveHealth = 5;
    std::string driveState = "ONLINE";

    std::string answerTo(const std::string& request) const {
        return http(cimInstances(instancesFor(request)));
    }

private:
    std::string instancesFor(const std::string& request) const {
        if (asks(request, "Tovexa_PlexorController"))
            return namedInstance("Tovexa_PlexorController", "Name", "tvxControllerC0",
                                 "Controller C0 (M)", 2, 5);
        if (asks(request, "Tovexa_PlexorStorageVolume"))
            return namedInstance("Tovexa_PlexorStorageVolume", "DeviceID", "tvxStorageVolumeC0_0",
                                 "RAID1 v Logical Volume 0 on controller C0 - OPTIMAL", 2, 5);
        if (asks(request, "Tovexa_PlexorStorageExtent"))
            return namedInstance("Tovexa_PlexorStorageExtent", "DeviceID", "tvxStorageExtC0_d0",
                                 "Drive d0 on controller C0 Fw: 1 - " + driveState, driveStatus,
                                 driveHealth);
        return "";
    }

    static bool asks(const std::string& request, const std::string& className) {
        return request.find("\"" + className + "\"") != std::string::npos;
    }
};
