// The function table of strings, and strings that live as long as another object.
#include "object_string.h"

#include <cstring>

namespace testbed {

namespace {

const char* getCharPtr(const CMPIString* string, CMPIStatus* status) {
    return answerOn<const char*>(string, Entry::StringGetCharPtr, nullptr, status,
                                 [](StringObject& object, CMPIStatus&) { return object.text(); });
}

const CMPIStringFT stringTable = {
    .ftVersion = CMPI_VERSION,
    .release = releaseEntry<CMPIString>,
    .clone = cloneEntry<CMPIString>,
    .getCharPtr = getCharPtr,
};

}  // namespace

StringObject::StringObject(BrokerCore& brokerCore, const std::optional<std::string>& content)
    : Object(brokerCore, ObjectKind::String), CMPIString{nullptr, &stringTable} {
    if (!content) return;
    text_ = std::make_unique<char[]>(content->size() + 1);
    std::memcpy(text_.get(), content->c_str(), content->size() + 1);
    hdl = text_.get();
}

std::shared_ptr<StringObject> StringObject::copy() const {
    std::optional<std::string> content;
    if (text_) content = text_.get();
    return std::make_shared<StringObject>(core(), content);
}

void StringObject::drop() {
    hdl = nullptr;
    text_.reset();
}

CMPIString* derivedString(const Object& source, const std::string& text) {
    return &makeDerived<StringObject>(source, text);
}

}  // namespace testbed
