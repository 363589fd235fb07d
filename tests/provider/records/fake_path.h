// An object path that tells what was the case when it was released.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <functional>

namespace plexortest {

/// Stands in a record for a clone; only its release may be called.
struct FakePath {
    std::function<void()> onRelease;  ///< called in each release
    int released = 0;
    CMPIObjectPathFT table = {};
    CMPIObjectPath path = {};

    explicit FakePath(std::function<void()> hook = nullptr) : onRelease(std::move(hook)) {
        path.hdl = this;
        path.ft = &table;
        table.release = [](CMPIObjectPath* self) {
            auto* fake = static_cast<FakePath*>(const_cast<void*>(self->hdl));
            fake->released++;
            if (fake->onRelease) fake->onRelease();
            return CMPIStatus{CMPI_RC_OK, nullptr};
        };
    }
    FakePath(const FakePath&) = delete;
    FakePath& operator=(const FakePath&) = delete;
};

}  // namespace plexortest
