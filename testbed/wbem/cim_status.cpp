// The names of the codes, and what a client gets for a code that is none of CIM's.
#include "cim_status.h"

#include <iterator>

namespace testbed {
namespace {

constexpr const char* kNames[] = {
    "success",
    "CIM_ERR_FAILED",
    "CIM_ERR_ACCESS_DENIED",
    "CIM_ERR_INVALID_NAMESPACE",
    "CIM_ERR_INVALID_PARAMETER",
    "CIM_ERR_INVALID_CLASS",
    "CIM_ERR_NOT_FOUND",
    "CIM_ERR_NOT_SUPPORTED",
    "CIM_ERR_CLASS_HAS_CHILDREN",
    "CIM_ERR_CLASS_HAS_INSTANCES",
    "CIM_ERR_INVALID_SUPERCLASS",
    "CIM_ERR_ALREADY_EXISTS",
    "CIM_ERR_NO_SUCH_PROPERTY",
    "CIM_ERR_TYPE_MISMATCH",
    "CIM_ERR_QUERY_LANGUAGE_NOT_SUPPORTED",
    "CIM_ERR_INVALID_QUERY",
    "CIM_ERR_METHOD_NOT_AVAILABLE",
    "CIM_ERR_METHOD_NOT_FOUND",
    "CIM_ERR_FAILED",  // 18 and 19 stand for nothing
    "CIM_ERR_FAILED",
    "CIM_ERR_NAMESPACE_NOT_EMPTY",
    "CIM_ERR_INVALID_ENUMERATION_CONTEXT",
    "CIM_ERR_INVALID_OPERATION_TIMEOUT",
    "CIM_ERR_PULL_HAS_BEEN_ABANDONED",
    "CIM_ERR_PULL_CANNOT_BE_ABANDONED",
    "CIM_ERR_FILTERED_ENUMERATION_NOT_SUPPORTED",
    "CIM_ERR_CONTINUATION_ON_ERROR_NOT_SUPPORTED",
    "CIM_ERR_SERVER_LIMITS_EXCEEDED",
    "CIM_ERR_SERVER_IS_SHUTTING_DOWN",
};

bool isCimStatus(CMPIrc code) {
    return code > 0 && static_cast<std::size_t>(code) < std::size(kNames);
}

}  // namespace

const char* statusName(CMPIrc code) {
    return isCimStatus(code) ? kNames[code] : "CIM_ERR_FAILED";
}

CimStatus providerStatus(CMPIrc code, const std::string& description) {
    const CMPIrc known = isCimStatus(code) ? code : CMPI_RC_ERR_FAILED;
    if (!description.empty()) return {known, description};
    if (known == code) return {known, statusName(code)};
    return {known, "the provider answered status " + std::to_string(code)};
}

}  // namespace testbed
