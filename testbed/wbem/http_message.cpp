// Finding a header by its name.
#include "http_message.h"

#include "cim_object.h"

namespace testbed {

const std::string* findHeader(const HttpHeaders& headers, std::string_view name) {
    for (const auto& [known, value] : headers) {
        if (sameName(known, name)) return &value;
    }
    return nullptr;
}

}  // namespace testbed
