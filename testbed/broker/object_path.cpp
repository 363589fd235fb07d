// The function table of object paths: namespace, host, class and keys.
#include "object_path.h"

#include <tuple>

#include "conversions.h"
#include "object_string.h"

namespace testbed {

namespace {

template <std::string ObjectPath::*member>
CMPIStatus setText(const CMPIObjectPath* path, const char* text) {
    return statusOn(path, Entry::OtherObjectCall, nullptr, [&](PathObject& object) {
        object.content().*member = text ? text : "";
        return CMPI_RC_OK;
    });
}

template <Entry entry, std::string ObjectPath::*member>
CMPIString* getText(const CMPIObjectPath* path, CMPIStatus* status) {
    return answerOn<CMPIString*>(path, entry, nullptr, status, [](PathObject& object, CMPIStatus&) {
        return derivedString(object, object.content().*member);
    });
}

CMPIStatus setHostname(const CMPIObjectPath* path, const char* host) {
    return statusOn(path, Entry::OtherObjectCall, nullptr, [&](PathObject& object) {
        object.content().host = host ? host : "";
        return CMPI_RC_OK;
    });
}

CMPIString* getHostname(const CMPIObjectPath* path, CMPIStatus* status) {
    return answerOn<CMPIString*>(path, Entry::OtherObjectCall, nullptr, status,
                                 [](PathObject& object, CMPIStatus&) {
                                     return derivedString(object, object.content().host);
                                 });
}

CMPIStatus addKey(const CMPIObjectPath* path, const char* key, const CMPIValue* value,
                  CMPIType type) {
    return statusOn(path, Entry::PathAddKey, key,
                    [&](PathObject& object) { return object.addKey(key, value, type); });
}

CMPIData keyData(const PathObject& object, const CimValue& value) {
    CMPIData data = toData(object, value);
    data.state = static_cast<CMPIValueState>(data.state | CMPI_keyValue);
    return data;
}

CMPIData getKey(const CMPIObjectPath* path, const char* key, CMPIStatus* status) {
    return answerOn<CMPIData>(
        path, Entry::PathGetKey, key, status, [&](PathObject& object, CMPIStatus& outcome) {
            const CimValue* value = key ? object.content().findKey(key) : nullptr;
            if (value != nullptr) return keyData(object, *value);
            outcome.rc = CMPI_RC_ERR_NOT_FOUND;
            return dataWithout(CMPI_notFound);
        });
}

CMPIData getKeyAt(const CMPIObjectPath* path, CMPICount index, CMPIString** name,
                  CMPIStatus* status) {
    return answerOn<CMPIData>(path, Entry::OtherObjectCall, nullptr, status,
                              [&](PathObject& object, CMPIStatus& outcome) {
                                  const auto& keys = object.content().keys;
                                  if (index >= keys.size()) {
                                      outcome.rc = CMPI_RC_ERR_NO_SUCH_PROPERTY;
                                      return dataWithout(CMPI_notFound);
                                  }
                                  if (name != nullptr) {
                                      *name = derivedString(object, keys[index].first);
                                  }
                                  return keyData(object, keys[index].second);
                              });
}

CMPICount getKeyCount(const CMPIObjectPath* path, CMPIStatus* status) {
    return answerOn<CMPICount>(path, Entry::OtherObjectCall, nullptr, status,
                               [](PathObject& object, CMPIStatus&) {
                                   return static_cast<CMPICount>(object.content().keys.size());
                               });
}

CMPIStatus copyPlace(const CMPIObjectPath* path, const CMPIObjectPath* source, bool withHost) {
    return statusOn(path, Entry::OtherObjectCall, nullptr, [&](PathObject& object) {
        PathObject* from = usable(source, Entry::OtherObjectCall);
        if (from == nullptr) return CMPI_RC_ERR_INVALID_PARAMETER;
        object.content().nameSpace = from->content().nameSpace;
        if (withHost) object.content().host = from->content().host;
        return CMPI_RC_OK;
    });
}

CMPIStatus setNameSpaceFrom(const CMPIObjectPath* path, const CMPIObjectPath* source) {
    return copyPlace(path, source, false);
}

CMPIStatus setHostAndNameSpaceFrom(const CMPIObjectPath* path, const CMPIObjectPath* source) {
    return copyPlace(path, source, true);
}

/// The qualifier entries, whatever names they take.
template <class... Names>
CMPIData noQualifier(const CMPIObjectPath* path, Names... names) {
    CMPIStatus* status = std::get<sizeof...(Names) - 1>(std::tuple(names...));
    return answerOn<CMPIData>(path, Entry::OtherObjectCall, nullptr, status,
                              [](PathObject&, CMPIStatus& outcome) {
                                  outcome.rc = CMPI_RC_ERR_NOT_SUPPORTED;
                                  return dataWithout(CMPI_notFound);
                              });
}

CMPIString* toString(const CMPIObjectPath* path, CMPIStatus* status) {
    return answerOn<CMPIString*>(path, Entry::PathToString, nullptr, status,
                                 [](PathObject& object, CMPIStatus&) {
                                     return derivedString(object, object.content().text());
                                 });
}

using Text = const char*;

const CMPIObjectPathFT pathTable = {
    .ftVersion = CMPI_VERSION,
    .release = releaseEntry<CMPIObjectPath>,
    .clone = cloneEntry<CMPIObjectPath>,
    .setNameSpace = setText<&ObjectPath::nameSpace>,
    .getNameSpace = getText<Entry::PathGetNameSpace, &ObjectPath::nameSpace>,
    .setHostname = setHostname,
    .getHostname = getHostname,
    .setClassName = setText<&ObjectPath::className>,
    .getClassName = getText<Entry::PathGetClassName, &ObjectPath::className>,
    .addKey = addKey,
    .getKey = getKey,
    .getKeyAt = getKeyAt,
    .getKeyCount = getKeyCount,
    .setNameSpaceFromObjectPath = setNameSpaceFrom,
    .setHostAndNameSpaceFromObjectPath = setHostAndNameSpaceFrom,
    .getClassQualifier = noQualifier<Text, CMPIStatus*>,
    .getPropertyQualifier = noQualifier<Text, Text, CMPIStatus*>,
    .getMethodQualifier = noQualifier<Text, Text, CMPIStatus*>,
    .getParameterQualifier = noQualifier<Text, Text, Text, CMPIStatus*>,
    .toString = toString,
};

}  // namespace

PathObject::PathObject(BrokerCore& brokerCore, ObjectPath content)
    : Object(brokerCore, ObjectKind::Path),
      CMPIObjectPath{nullptr, &pathTable},
      content_(std::move(content)) {
    hdl = this;
}

void PathObject::describe(CallRecord& record) const {
    record.path = content_.text();
    record.className = content_.className;
}

std::shared_ptr<PathObject> PathObject::copy() const {
    return std::make_shared<PathObject>(core(), content_);
}

CMPIrc PathObject::addKey(const char* name, const CMPIValue* value, CMPIType type) {
    if (name == nullptr || *name == '\0') return CMPI_RC_ERR_INVALID_PARAMETER;
    CimValue key;
    const CMPIrc rc = readValue(value, type, key);
    if (rc == CMPI_RC_OK) content_.key(name, std::move(key));
    return rc;
}

void PathObject::drop() {
    content_ = {};
}

}  // namespace testbed
