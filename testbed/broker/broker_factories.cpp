// The table of makers: new instances, paths, strings and arrays, and the tests of types.
#include <cstring>
#include <tuple>

#include "broker_calls.h"
#include "broker_tables.h"
#include "object_array.h"
#include "object_instance.h"
#include "object_path.h"
#include "object_string.h"

namespace testbed {

namespace {

/// A new instance: of a known class with the class's properties, their defaults, and the
/// keys unless the manager leaves those out.
Instance startOf(const BrokerCore& core, const ObjectPath& path) {
    Instance instance{path, {}};
    for (const auto& property : core.repository.allProperties(path.nameSpace, path.className)) {
        const CimValue* key =
            core.options.instancesWithoutKeys ? nullptr : path.findKey(property.name);
        const CimValue& value = key != nullptr ? *key : property.defaultValue;
        instance.set(property.name, value.isNull ? CimValue::null(property.type) : value);
    }
    return instance;
}

CMPIInstance* newInstance(const CMPIBroker* broker, const CMPIObjectPath* instancePath,
                          CMPIStatus* status) {
    const auto path = readPath(instancePath, Entry::NewInstance);
    return answerBroker<CMPIInstance*>(broker, describeCall(Entry::NewInstance, path), status,
                                       [&](BrokerCore& core, CMPIStatus& outcome) -> CMPIInstance* {
                                           if (path) {
                                               return &makeInArena<InstanceObject>(
                                                   core, startOf(core, *path));
                                           }
                                           outcome.rc = CMPI_RC_ERR_INVALID_PARAMETER;
                                           return nullptr;
                                       });
}

CMPIObjectPath* newObjectPath(const CMPIBroker* broker, const char* nameSpace,
                              const char* className, CMPIStatus* status) {
    const ObjectPath path{nameSpace ? nameSpace : "", className ? className : "", {}};
    return answerBroker<CMPIObjectPath*>(broker, describeCall(Entry::NewObjectPath, path), status,
                                         [&](BrokerCore& core, CMPIStatus&) -> CMPIObjectPath* {
                                             return &makeInArena<PathObject>(core, path);
                                         });
}

CMPIString* newString(const CMPIBroker* broker, const char* text, CMPIStatus* status) {
    std::optional<std::string> content;
    if (text != nullptr) content = text;
    return answerBroker<CMPIString*>(broker, describeCall(Entry::NewString), status,
                                     [&](BrokerCore& core, CMPIStatus&) -> CMPIString* {
                                         return &makeInArena<StringObject>(core, content);
                                     });
}

CMPIArray* newArray(const CMPIBroker* broker, CMPICount count, CMPIType type, CMPIStatus* status) {
    return answerBroker<CMPIArray*>(broker, describeCall(Entry::NewArray), status,
                                    [&](BrokerCore& core, CMPIStatus& outcome) -> CMPIArray* {
                                        if ((type & CMPI_ARRAY) != 0) {
                                            outcome.rc = CMPI_RC_ERR_INVALID_PARAMETER;
                                            return nullptr;
                                        }
                                        return &makeInArena<ArrayObject>(
                                            core, type,
                                            std::vector<CimValue>(count, CimValue::null(type)));
                                    });
}

CMPIBoolean classPathIsA(const CMPIBroker* broker, const CMPIObjectPath* classPath,
                         const char* className, CMPIStatus* status) {
    const auto path = readPath(classPath, Entry::ClassPathIsA);
    CallRecord record = describeCall(Entry::ClassPathIsA, path);
    if (className != nullptr) record.name = className;
    return answerBroker<CMPIBoolean>(
        broker, std::move(record), status, [&](BrokerCore& core, CMPIStatus& outcome) {
            if (!path || className == nullptr) outcome.rc = CMPI_RC_ERR_INVALID_PARAMETER;
            const bool is = path && className != nullptr &&
                            core.repository.isA(path->nameSpace, path->className, className);
            return static_cast<CMPIBoolean>(is);
        });
}

/// The name of the CMPI type of a living object; NULL for anything else.
const char* typeOf(const BrokerCore& core, const void* object) {
    static constexpr const char* names[] = {"CMPIContext",   "CMPIResult",      "CMPIString",
                                            "CMPIArray",     "CMPIEnumeration", "CMPIInstance",
                                            "CMPIObjectPath"};
    const auto kind = core.books.kindOf(object);
    return kind ? names[static_cast<std::size_t>(*kind)] : nullptr;
}

std::string instanceText(const Instance& instance) {
    std::string text = instance.path.text() + " {";
    for (const auto& [name, value] : instance.properties) {
        text += " " + name + "=" + value.text() + ";";
    }
    return text + " }";
}

std::string objectText(ObjectKind kind, const void* object) {
    switch (kind) {
        case ObjectKind::String: {
            const char* text = objectOf(static_cast<const CMPIString*>(object)).text();
            return text ? text : "";
        }
        case ObjectKind::Path:
            return objectOf(static_cast<const CMPIObjectPath*>(object)).content().text();
        case ObjectKind::Instance:
            return instanceText(objectOf(static_cast<const CMPIInstance*>(object)).content());
        default:
            return kindName(kind);
    }
}

CMPIString* toString(const CMPIBroker* broker, const void* object, CMPIStatus* status) {
    return answerBroker<CMPIString*>(
        broker, describeCall(Entry::BrokerToString), status,
        [&](BrokerCore& core, CMPIStatus& outcome) -> CMPIString* {
            const auto kind = core.books.kindOf(object);
            if (kind) return &makeInArena<StringObject>(core, objectText(*kind, object));
            core.books.objectUsed(object, entryName(Entry::BrokerToString));
            outcome.rc = CMPI_RC_ERR_INVALID_HANDLE;
            return nullptr;
        });
}

CMPIBoolean isOfType(const CMPIBroker* broker, const void* object, const char* typeName,
                     CMPIStatus* status) {
    return answerBroker<CMPIBoolean>(broker, describeCall(Entry::BrokerTypeTest), status,
                                     [&](BrokerCore& core, CMPIStatus& outcome) {
                                         const char* type = typeOf(core, object);
                                         if (type == nullptr) {
                                             outcome.rc = CMPI_RC_ERR_INVALID_HANDLE;
                                         }
                                         const bool is = type != nullptr && typeName != nullptr &&
                                                         std::strcmp(type, typeName) == 0;
                                         return static_cast<CMPIBoolean>(is);
                                     });
}

CMPIString* getType(const CMPIBroker* broker, const void* object, CMPIStatus* status) {
    return answerBroker<CMPIString*>(broker, describeCall(Entry::BrokerTypeTest), status,
                                     [&](BrokerCore& core, CMPIStatus& outcome) -> CMPIString* {
                                         const char* type = typeOf(core, object);
                                         if (type != nullptr) {
                                             return &makeInArena<StringObject>(core, type);
                                         }
                                         outcome.rc = CMPI_RC_ERR_INVALID_HANDLE;
                                         return nullptr;
                                     });
}

/// Any maker that this broker lacks.
template <class Result, class... Arguments>
Result noMaker(const CMPIBroker* broker, Arguments... arguments) {
    CMPIStatus* status = std::get<sizeof...(Arguments) - 1>(std::tuple(arguments...));
    return answerBroker<Result>(broker, describeCall(Entry::Unsupported), status,
                                [](BrokerCore&, CMPIStatus& outcome) {
                                    outcome.rc = CMPI_RC_ERR_NOT_SUPPORTED;
                                    return refusal<Result>();
                                });
}

CMPIString* getMessage(const CMPIBroker* broker, const char*, const char*, CMPIStatus* status,
                       CMPICount, ...) {
    return noMaker<CMPIString*>(broker, status);
}

template <class Importance>
CMPIStatus noLog(const CMPIBroker* broker, Importance, const char*, const char*,
                 const CMPIString*) {
    CMPIStatus status = statusOk;
    noMaker<Nothing>(broker, &status);
    return status;
}

using Text = const char*;

}  // namespace

const CMPIBrokerEncFT factoryTable = {
    .ftVersion = CMPI_VERSION,
    .newInstance = newInstance,
    .newObjectPath = newObjectPath,
    .newArgs = noMaker<CMPIArgs*, CMPIStatus*>,
    .newString = newString,
    .newArray = newArray,
    .newDateTime = noMaker<CMPIDateTime*, CMPIStatus*>,
    .newDateTimeFromBinary = noMaker<CMPIDateTime*, CMPIUint64, CMPIBoolean, CMPIStatus*>,
    .newDateTimeFromChars = noMaker<CMPIDateTime*, Text, CMPIStatus*>,
    .newSelectExp = noMaker<CMPISelectExp*, Text, Text, CMPIArray**, CMPIStatus*>,
    .classPathIsA = classPathIsA,
    .toString = toString,
    .isOfType = isOfType,
    .getType = getType,
    .getMessage = getMessage,
    .logMessage = noLog<CMPISeverity>,
    .trace = noLog<CMPILevel>,
};

}  // namespace testbed
