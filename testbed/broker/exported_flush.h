// Whether libraries that are loaded later find the manager's function tool_mm_flush.
#pragma once

#include "broker_options.h"

namespace testbed {

/// While it lives, the process exports tool_mm_flush when that manager does. Throws
/// std::runtime_error when the module with the function cannot be loaded.
class ExportedFlush {
public:
    explicit ExportedFlush(const BrokerOptions& options);
    ~ExportedFlush();
    ExportedFlush(const ExportedFlush&) = delete;
    ExportedFlush& operator=(const ExportedFlush&) = delete;

private:
    void* module_ = nullptr;
};

}  // namespace testbed
