#include "wbem_fixture.h"

#include <sstream>

namespace testbed {
namespace {

PropertyDefinition property(const char* name, CMPIType type, const char* origin,
                            bool isKey = false) {
    return {name, type, isKey, origin, CimValue::null(type), {}};
}

void defineThings(Repository& repository, const char* nameSpace) {
    PropertyDefinition name = property("Name", CMPI_string, "CIM_Thing", true);
    name.qualifiers = {{"MaxLen", CimValue::uint32(256)}};
    repository.defineClass(nameSpace, {"CIM_Thing",
                                       "",
                                       {name, property("Caption", CMPI_string, "CIM_Thing")},
                                       {{"Description", CimValue::string("Anything.")}},
                                       false});
    repository.defineClass(nameSpace, {"CIM_Disk",
                                       "CIM_Thing",
                                       {property("Caption", CMPI_string, "CIM_Thing"),
                                        property("Size", CMPI_uint64, "CIM_Disk")},
                                       {},
                                       false});
}

void defineServed(Repository& repository) {
    defineThings(repository, "root/cimv2");
    repository.defineClass(
        "root/cimv2",
        {"Served_Disk", "CIM_Disk", {property("Speed", CMPI_uint32, "Served_Disk")}, {}, false});
    repository.defineClass("root/cimv2", {"Local_Disk", "CIM_Disk", {}, {}, false});
    Instance local{{"root/cimv2", "Local_Disk", {}}, {}};
    local.path.key("Name", CimValue::string("l0"));
    local.set("Name", CimValue::string("l0")).set("Caption", CimValue::string("a local disk"));
    local.set("Size", CimValue::uint64(7)).set("Extra", CimValue::boolean(true));
    repository.put(local);
}

void buildVendorSide(Repository& repository) {
    defineThings(repository, "root/vendor");
    repository.defineClass("root/vendor", {"Vendor_Box", "CIM_Thing", {}, {}, false});
    repository.defineClass("root/vendor", {"Vendor_Disk", "CIM_Disk", {}, {}, false});
    repository.defineClass("root/vendor", {"CIM_Component",
                                           "",
                                           {property("Group", CMPI_ref, "CIM_Component", true),
                                            property("Part", CMPI_ref, "CIM_Component", true)},
                                           {},
                                           true});
    repository.defineClass("root/vendor", {"Vendor_Holds", "CIM_Component", {}, {}, true});
    const ObjectPath box = vendorPath("Vendor_Box", "b");
    Instance boxInstance{box, {}};
    repository.put(boxInstance.set("Name", CimValue::string("b")));
    for (const char* name : {"d0", "d1"}) {
        const ObjectPath disk = vendorPath("Vendor_Disk", name);
        Instance instance{disk, {}};
        instance.set("Name", CimValue::string(name)).set("Size", CimValue::uint64(5));
        repository.put(instance);
        repository.associate("Vendor_Holds", {"Group", box}, {"Part", disk});
    }
}

std::string element(const char* name, const std::string& value) {
    return "<IPARAMVALUE NAME=\"" + std::string(name) + "\">" + value + "</IPARAMVALUE>";
}

}  // namespace

ObjectPath vendorPath(const char* className, const char* name) {
    ObjectPath path{"root/vendor", className, {}};
    return path.key("Name", CimValue::string(name));
}

std::string localNamespace(const std::string& nameSpace) {
    std::istringstream parts(nameSpace);
    std::string text = "<LOCALNAMESPACEPATH>";
    for (std::string part; std::getline(parts, part, '/');)
        text += "<NAMESPACE NAME=\"" + part + "\"/>";
    return text + "</LOCALNAMESPACEPATH>";
}

std::string callMessage(const std::string& method, const std::string& parameters,
                        const std::string& nameSpace) {
    return "<?xml version=\"1.0\" encoding=\"utf-8\"?>\n<CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\">"
           "<MESSAGE ID=\"m1\" PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"" +
           method + "\">" + localNamespace(nameSpace) + parameters +
           "</IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>";
}

std::string httpRequest(const std::string& headers, const std::string& body) {
    return "POST /cimom HTTP/1.1\r\nHost: box:5988\r\nContent-Type: application/xml\r\n" + headers +
           "Content-Length: " + std::to_string(body.size()) + "\r\n\r\n" + body;
}

std::string callHeaders(const std::string& method, const std::string& nameSpace) {
    return "CIMOperation: MethodCall\r\nCIMMethod: " + method + "\r\nCIMObject: " + nameSpace +
           "\r\n";
}

std::string callRequest(const std::string& method, const std::string& parameters,
                        const std::string& nameSpace) {
    return httpRequest(callHeaders(method, nameSpace), callMessage(method, parameters, nameSpace));
}

std::string classNameParameter(const std::string& className, const char* name) {
    return element(name, "<CLASSNAME NAME=\"" + className + "\"/>");
}

std::string valueParameter(const char* name, const std::string& value) {
    return element(name, "<VALUE>" + value + "</VALUE>");
}

std::string listParameter(const char* name, const std::vector<std::string>& values) {
    std::string list;
    for (const std::string& value : values) list += "<VALUE>" + value + "</VALUE>";
    return element(name, "<VALUE.ARRAY>" + list + "</VALUE.ARRAY>");
}

std::string instanceNameParameter(const char* name, const std::string& className,
                                  const std::vector<std::pair<std::string, std::string>>& keys) {
    std::string bindings;
    for (const auto& [key, value] : keys)
        bindings += "<KEYBINDING NAME=\"" + key + "\"><KEYVALUE VALUETYPE=\"string\">" + value +
                    "</KEYVALUE></KEYBINDING>";
    return element(name,
                   "<INSTANCENAME CLASSNAME=\"" + className + "\">" + bindings + "</INSTANCENAME>");
}

WbemFixture::WbemFixture() {
    defineServed(repository_);
    buildVendorSide(repository_);
    Instance served{{"root/cimv2", "Served_Disk", {}}, {}};
    served.path.key("Name", CimValue::string("s0"));
    served.set("Name", CimValue::string("s0")).set("Caption", CimValue::string("a served disk"));
    served.set("Size", CimValue::uint64(9)).set("Speed", CimValue::uint32(3));
    provider_.instances = {served};
    serve();
}

void WbemFixture::serve(HttpServerOptions options, std::optional<Credentials> credentials) {
    http_.reset();
    options.port = 0;
    manager_ = std::make_unique<ObjectManager>(
        repository_, Registration{provider_.client(), "root/cimv2", {"Served_Disk"}});
    cim_ = std::make_unique<CimServer>(*manager_, "host", std::move(credentials));
    cim_->failBy(faults_);
    options.welcome = [this] { return faults_.welcome(); };
    http_ = std::make_unique<HttpServer>(
        options, [this](const HttpRequest& request) { return cim_->answer(request); });
}

std::string WbemFixture::call(const std::string& method, const std::string& parameters,
                              const std::string& nameSpace) {
    const Reply reply = exchange(port(), callRequest(method, parameters, nameSpace));
    if (reply.status != 200)
        return "HTTP " + std::to_string(reply.status) + " " + reply.header("CIMError");
    pugi::xml_document document;
    EXPECT_TRUE(document.load_string(reply.body.c_str())) << reply.body;
    const pugi::xml_node error = document.select_node("//ERROR").node();
    if (error)
        return std::string("status ") + error.attribute("CODE").value() + ": " +
               error.attribute("DESCRIPTION").value();
    return reply.body;
}

std::vector<std::string> WbemFixture::callFor(const std::string& path, const std::string& method,
                                              const std::string& parameters,
                                              const std::string& nameSpace) {
    const std::string text = call(method, parameters, nameSpace);
    pugi::xml_document document;
    EXPECT_TRUE(document.load_string(text.c_str())) << text;
    std::vector<std::string> found;
    for (const pugi::xpath_node& node : document.select_nodes(path.c_str()))
        found.emplace_back(node.attribute() ? node.attribute().value() : node.node().child_value());
    return found;
}

bool WbemFixture::isAlive() {
    return callFor("//KEYVALUE", "EnumerateInstanceNames", classNameParameter("Served_Disk")) ==
           std::vector<std::string>{"s0"};
}

}  // namespace testbed
