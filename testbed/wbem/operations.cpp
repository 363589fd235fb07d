// The table of operations, with the parameters that each of them takes.
#include "operations.h"

namespace testbed {
namespace {

const std::vector<Operation>& operations() {
    static const std::vector<Operation> table = {
        {"EnumerateInstanceNames", enumerateInstanceNames, {"ClassName"}, true},
        {"EnumerateInstances",
         enumerateInstances,
         {"ClassName", "LocalOnly", "DeepInheritance", "IncludeQualifiers", "IncludeClassOrigin",
          "PropertyList"},
         true},
        {"GetInstance",
         getInstance,
         {"InstanceName", "LocalOnly", "IncludeQualifiers", "IncludeClassOrigin", "PropertyList"},
         true},
        {"Associators",
         associators,
         {"ObjectName", "AssocClass", "ResultClass", "Role", "ResultRole", "IncludeQualifiers",
          "IncludeClassOrigin", "PropertyList"}},
        {"AssociatorNames",
         associatorNames,
         {"ObjectName", "AssocClass", "ResultClass", "Role", "ResultRole"}},
        {"References",
         references,
         {"ObjectName", "ResultClass", "Role", "IncludeQualifiers", "IncludeClassOrigin",
          "PropertyList"}},
        {"ReferenceNames", referenceNames, {"ObjectName", "ResultClass", "Role"}},
        {"GetClass",
         getClass,
         {"ClassName", "LocalOnly", "IncludeQualifiers", "IncludeClassOrigin", "PropertyList"}},
        {"EnumerateClasses",
         enumerateClasses,
         {"ClassName", "DeepInheritance", "LocalOnly", "IncludeQualifiers", "IncludeClassOrigin"}},
        {"EnumerateClassNames", enumerateClassNames, {"ClassName", "DeepInheritance"}},
    };
    return table;
}

}  // namespace

const Operation* findOperation(const std::string& name) {
    for (const Operation& operation : operations()) {
        if (sameName(operation.name, name)) return &operation;
    }
    return nullptr;
}

}  // namespace testbed
