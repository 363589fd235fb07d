// The intrinsic operations that are served. Each reads its parameters from the request and appends
// what the client gets to `result`, the element IRETURNVALUE. Failures throw CimStatus.
#pragma once

#include <pugixml.hpp>
#include <string>
#include <vector>

#include "cim_request.h"
#include "object_manager.h"

namespace testbed {

/// What an operation works on.
struct OperationContext {
    const ObjectManager& manager;
    std::string host;  ///< of the server as the client calls it, for paths that tell it
};

using OperationFunction = void (*)(const OperationContext& context, const CimRequest& request,
                                   pugi::xml_node result);

struct Operation {
    const char* name;
    OperationFunction run;
    /// The first names the class or the object that it is about.
    std::vector<const char*> parameters;
    bool asksProvider = false;  ///< for the classes that have one
};

/// NULL for an operation that is not served.
const Operation* findOperation(const std::string& name);

void enumerateInstanceNames(const OperationContext&, const CimRequest&, pugi::xml_node result);
void enumerateInstances(const OperationContext&, const CimRequest&, pugi::xml_node result);
void getInstance(const OperationContext&, const CimRequest&, pugi::xml_node result);
void associators(const OperationContext&, const CimRequest&, pugi::xml_node result);
void associatorNames(const OperationContext&, const CimRequest&, pugi::xml_node result);
void references(const OperationContext&, const CimRequest&, pugi::xml_node result);
void referenceNames(const OperationContext&, const CimRequest&, pugi::xml_node result);
void getClass(const OperationContext&, const CimRequest&, pugi::xml_node result);
void enumerateClasses(const OperationContext&, const CimRequest&, pugi::xml_node result);
void enumerateClassNames(const OperationContext&, const CimRequest&, pugi::xml_node result);

}  // namespace testbed
