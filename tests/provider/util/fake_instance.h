// Objects that answer with any CMPIData at all, also with what no broker of ours would make.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <string.h>

namespace plexortest {

/// Data of one type and state whose value is this number.
inline CMPIData dataOf(CMPIType type, CMPIUint64 number, CMPIValueState state = CMPI_goodValue) {
    CMPIData data;
    memset(&data, 0, sizeof data);
    data.type = type;
    data.state = state;
    data.value.uint64 = number;
    return data;
}

/// An array whose every element is `element`, whatever index is asked for.
struct FakeArray {
    CMPIData element;
    CMPIrc rc = CMPI_RC_OK;
    int asked = 0;  ///< elements asked for
    CMPIArrayFT table = {};
    CMPIArray array = {};

    explicit FakeArray(const CMPIData& data) : element(data) {
        array.hdl = this;
        array.ft = &table;
        table.getElementAt = [](const CMPIArray* self, CMPICount, CMPIStatus* status) {
            auto* fake = static_cast<FakeArray*>(const_cast<void*>(self->hdl));
            fake->asked++;
            if (status != nullptr) *status = CMPIStatus{fake->rc, nullptr};
            return fake->element;
        };
    }
    FakeArray(const FakeArray&) = delete;
};

/// An instance whose every property is `property`, with the status `rc`.
struct FakeInstance {
    CMPIData property;
    CMPIrc rc = CMPI_RC_OK;
    CMPIInstanceFT table = {};
    CMPIInstance instance = {};

    explicit FakeInstance(const CMPIData& data) : property(data) {
        instance.hdl = this;
        instance.ft = &table;
        table.getProperty = [](const CMPIInstance* self, const char*, CMPIStatus* status) {
            const auto* fake = static_cast<const FakeInstance*>(self->hdl);
            if (status != nullptr) *status = CMPIStatus{fake->rc, nullptr};
            return fake->property;
        };
    }
    FakeInstance(const FakeInstance&) = delete;
};

/// Data of an array type that carries `array`.
inline CMPIData dataOf(CMPIType type, FakeArray& array, CMPIValueState state = CMPI_goodValue) {
    CMPIData data = dataOf(type, CMPIUint64{0}, state);
    data.value.array = &array.array;
    return data;
}

}  // namespace plexortest
