// Associators, References and their names: reading the filters and walking the repository.
#include "cim_status.h"
#include "cim_xml_write.h"
#include "instance_view.h"
#include "operations.h"

namespace testbed {
namespace {

/// Where the walk begins. Class paths, which ask for association classes, are not served.
ObjectPath sourceOf(const OperationContext& context, const CimRequest& request) {
    const ObjectPath source = context.manager.withKeyName(request.objectPath("ObjectName"));
    if (request.isClassPath("ObjectName")) {
        throw CimStatus(CMPI_RC_ERR_NOT_SUPPORTED, "associations of classes are not served");
    }
    return source;
}

/// A role that is empty stands for any.
std::optional<std::string> roleOf(const CimRequest& request, const char* name) {
    auto role = request.text(name);
    return role && role->empty() ? std::nullopt : role;
}

std::vector<Instance> walkAssociators(const OperationContext& context, const CimRequest& request) {
    AssociationFilter filter;
    filter.assocClass = request.optionalClassName("AssocClass");
    filter.resultClass = request.optionalClassName("ResultClass");
    filter.role = roleOf(request, "Role");
    filter.resultRole = roleOf(request, "ResultRole");
    return context.manager.associators(sourceOf(context, request), filter);
}

std::vector<Instance> walkReferences(const OperationContext& context, const CimRequest& request) {
    return context.manager.references(sourceOf(context, request),
                                      request.optionalClassName("ResultClass").value_or(""),
                                      roleOf(request, "Role").value_or(""));
}

void writeObjects(const OperationContext& context, const CimRequest& request,
                  std::vector<Instance> instances, pugi::xml_node result) {
    ViewOptions options;
    options.withQualifiers = request.flag("IncludeQualifiers", false);
    options.withClassOrigin = request.flag("IncludeClassOrigin", false);
    InstanceView view(context.manager.repository(), options);
    const PropertyList properties = request.propertyList();
    for (Instance& instance : instances) {
        restrictTo(properties, instance);
        writeObjectWithPath(result, instance, context.host, view.detailsOf(instance));
    }
}

void writePaths(const OperationContext& context, const std::vector<Instance>& instances,
                pugi::xml_node result) {
    for (const Instance& instance : instances) {
        writeInstancePath(result.append_child("OBJECTPATH"), instance.path, context.host);
    }
}

}  // namespace

void associators(const OperationContext& context, const CimRequest& request,
                 pugi::xml_node result) {
    writeObjects(context, request, walkAssociators(context, request), result);
}

void associatorNames(const OperationContext& context, const CimRequest& request,
                     pugi::xml_node result) {
    writePaths(context, walkAssociators(context, request), result);
}

void references(const OperationContext& context, const CimRequest& request, pugi::xml_node result) {
    writeObjects(context, request, walkReferences(context, request), result);
}

void referenceNames(const OperationContext& context, const CimRequest& request,
                    pugi::xml_node result) {
    writePaths(context, walkReferences(context, request), result);
}

}  // namespace testbed
