// GetInstance, EnumerateInstances and EnumerateInstanceNames.
#include "cim_status.h"
#include "cim_xml_write.h"
#include "instance_view.h"
#include "operations.h"

namespace testbed {
namespace {

ViewOptions viewOptions(const CimRequest& request) {
    ViewOptions options;
    request.flag("LocalOnly", true);  // must be a truth value; what it says is ignored
    options.withQualifiers = request.flag("IncludeQualifiers", false);
    options.withClassOrigin = request.flag("IncludeClassOrigin", false);
    return options;
}

}  // namespace

void enumerateInstanceNames(const OperationContext& context, const CimRequest& request,
                            pugi::xml_node result) {
    for (const ObjectPath& name :
         context.manager.instanceNames(request.nameSpace(), request.className())) {
        writeInstanceName(result, name, KeyTypes::Told);
    }
}

void enumerateInstances(const OperationContext& context, const CimRequest& request,
                        pugi::xml_node result) {
    const std::string className = request.className();
    ViewOptions options = viewOptions(request);
    if (!request.flag("DeepInheritance", true)) options.shallowClass = className;
    InstanceView view(context.manager.repository(), options);
    for (Instance& instance :
         context.manager.instances(request.nameSpace(), className, request.propertyList())) {
        view.apply(instance);
        writeNamedInstance(result, instance, view.detailsOf(instance));
    }
}

void getInstance(const OperationContext& context, const CimRequest& request,
                 pugi::xml_node result) {
    const ObjectPath path = context.manager.withKeyName(request.objectPath("InstanceName"));
    if (request.isClassPath("InstanceName")) {
        throw CimStatus(CMPI_RC_ERR_INVALID_PARAMETER, "InstanceName: names no instance");
    }
    InstanceView view(context.manager.repository(), viewOptions(request));
    Instance instance = context.manager.instance(path, request.propertyList());
    view.apply(instance);
    writeInstance(result, instance, view.detailsOf(instance));
}

}  // namespace testbed
