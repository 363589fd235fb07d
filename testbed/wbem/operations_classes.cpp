// GetClass, EnumerateClasses and EnumerateClassNames.
#include <algorithm>

#include "cim_status.h"
#include "cim_xml_write.h"
#include "operations.h"

namespace testbed {
namespace {

/// The class as the request's parameters want it.
ClassView viewOf(const Repository& repository, const CimRequest& request,
                 ClassDefinition definition) {
    ClassView view;
    view.withQualifiers = request.flag("IncludeQualifiers", true);
    view.withClassOrigin = request.flag("IncludeClassOrigin", false);
    const bool isLocal = request.flag("LocalOnly", true);
    view.properties = isLocal ? definition.properties
                              : repository.allProperties(request.nameSpace(), definition.name);
    view.methods =
        isLocal ? definition.methods : repository.allMethods(request.nameSpace(), definition.name);
    view.definition = std::move(definition);
    return view;
}

void keepListed(const PropertyList& list, std::vector<PropertyDefinition>& properties) {
    if (!list) return;
    std::erase_if(properties, [&](const PropertyDefinition& property) {
        return std::none_of(list->begin(), list->end(),
                            [&](const std::string& name) { return sameName(name, property.name); });
    });
}

/// True when the class is asked for, given a start class or none.
bool isBelow(const Repository& repository, const std::string& nameSpace,
             const ClassDefinition& definition, const std::string& start, bool deep) {
    if (start.empty()) return deep || !repository.hasClass(nameSpace, definition.superclass);
    if (sameName(definition.name, start)) return false;
    if (!deep) return sameName(definition.superclass, start);
    return repository.isA(nameSpace, definition.name, start);
}

std::vector<ClassDefinition> classesBelow(const OperationContext& context,
                                          const CimRequest& request) {
    const Repository& repository = context.manager.repository();
    const std::string& nameSpace = request.nameSpace();
    const std::string start = request.optionalClassName("ClassName").value_or("");
    if (!start.empty()) context.manager.requireClass(nameSpace, start);
    const bool deep = request.flag("DeepInheritance", false);
    std::vector<ClassDefinition> classes;
    for (const std::string& name : repository.classNames(nameSpace)) {
        auto definition = repository.findClass(nameSpace, name);
        if (definition && isBelow(repository, nameSpace, *definition, start, deep)) {
            classes.push_back(std::move(*definition));
        }
    }
    return classes;
}

}  // namespace

void getClass(const OperationContext& context, const CimRequest& request, pugi::xml_node result) {
    const Repository& repository = context.manager.repository();
    const std::string name = request.className();
    auto definition = repository.findClass(request.nameSpace(), name);
    if (!definition) {
        throw CimStatus(CMPI_RC_ERR_NOT_FOUND, "no class " + name + " in " + request.nameSpace());
    }
    ClassView view = viewOf(repository, request, std::move(*definition));
    keepListed(request.propertyList(), view.properties);
    writeClass(result, view);
}

void enumerateClasses(const OperationContext& context, const CimRequest& request,
                      pugi::xml_node result) {
    for (ClassDefinition& definition : classesBelow(context, request)) {
        writeClass(result, viewOf(context.manager.repository(), request, std::move(definition)));
    }
}

void enumerateClassNames(const OperationContext& context, const CimRequest& request,
                         pugi::xml_node result) {
    for (const ClassDefinition& definition : classesBelow(context, request)) {
        writeClassName(result, definition.name);
    }
}

}  // namespace testbed
