// CIM status codes, which CMPI's numbers repeat.
#pragma once

#include <cmpidt.h>

#include <stdexcept>
#include <string>

namespace testbed {

/// Ends an operation with a status for the client. The text is its description.
struct CimStatus : std::runtime_error {
    CimStatus(CMPIrc status, const std::string& description)
        : std::runtime_error(description), code(status) {}
    CMPIrc code;
};

/// The CIM status that a provider's status stands for: the same number as far as CIM has it, else
/// 1. `description` "" gets the status's name.
CimStatus providerStatus(CMPIrc code, const std::string& description);

/// "CIM_ERR_NOT_FOUND"; "CIM_ERR_FAILED" for numbers that CIM has not.
const char* statusName(CMPIrc code);

}  // namespace testbed
