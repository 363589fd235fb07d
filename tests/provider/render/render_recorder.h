// Stands in for the manager while one record is rendered: notes every property that the provider
// sets, in order, with the type codes and the arrays exactly as they were passed.
#pragma once

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <ostream>
#include <string>
#include <vector>

#include "PlexorProvider.h"
#include "PlexorProviderLock.h"
#include "captured_syslog.h"

namespace plexortest {

/// One setProperty call. An array reads "made-for[size]{index:element-type value}".
struct PropertyCall {
    std::string name;
    CMPIType type = CMPI_null;
    std::string value;

    bool operator==(const PropertyCall&) const = default;
};

inline void PrintTo(const PropertyCall& call, std::ostream* out) {
    *out << call.name << " (type " << call.type << ") = " << call.value;
}

// The rows of a class's table, as a test spells them out.
inline PropertyCall charsRow(const char* name, const std::string& text) {
    return {name, CMPI_chars, text};
}
inline PropertyCall booleanRow(const char* name, bool value) {
    return {name, CMPI_boolean, value ? "true" : "false"};
}
inline PropertyCall uint8Row(const char* name, unsigned value) {
    return {name, CMPI_uint8, std::to_string(value)};
}
inline PropertyCall uint16Row(const char* name, unsigned value) {
    return {name, CMPI_uint16, std::to_string(value)};
}
inline PropertyCall uint64Row(const char* name, unsigned long long value) {
    return {name, CMPI_uint64, std::to_string(value)};
}
inline PropertyCall uint16ArrayRow(const char* name, unsigned value) {
    return {name, CMPI_uint16A, formatted("uint16[1]{0:uint16 %u}", value)};
}
inline PropertyCall charsArrayRow(const char* name, const std::string& text) {
    return {name, CMPI_charsA, formatted("string[1]{0:chars %s}", text.c_str())};
}

/// How a missing text shows in a row.
inline constexpr const char* kNullText = "<null>";

/// Puts itself in front of the current broker for as long as it lives: arrays come from here,
/// everything else from the broker behind it.
class RenderRecorder {
public:
    RenderRecorder()
        : behind_(::Broker), factories_(*behind_->eft), instance_{this, &instanceTable()} {
        factories_.newArray = makeArray;
        broker_.bft = behind_->bft;
        broker_.xft = behind_->xft;
        broker_.hdl = behind_->hdl;
        broker_.eft = &factories_;
        broker_.owner = this;
        ::Broker = &broker_;
    }
    ~RenderRecorder() { ::Broker = behind_; }
    RenderRecorder(const RenderRecorder&) = delete;
    RenderRecorder& operator=(const RenderRecorder&) = delete;

    /// The instance to render.
    CMPIInstance* instance() { return &instance_; }
    const std::vector<PropertyCall>& calls() const { return calls_; }
    /// From now on newArray answers null.
    void refuseArrays() { arraysRefused_ = true; }

private:
    struct FrontBroker : CMPIBroker {
        RenderRecorder* owner = nullptr;
    };
    struct NotedArray : CMPIArray {
        std::string text;
    };

    static std::string typeText(CMPIType type) {
        switch (type) {
            case CMPI_string:
                return "string";
            case CMPI_chars:
                return "chars";
            case CMPI_boolean:
                return "boolean";
            case CMPI_uint8:
                return "uint8";
            case CMPI_uint16:
                return "uint16";
            case CMPI_uint32:
                return "uint32";
            case CMPI_uint64:
                return "uint64";
            default:
                return formatted("type %u", static_cast<unsigned>(type));
        }
    }
    template <class Number>
    static std::string numberText(const CMPIValue* value) {
        Number number;
        std::memcpy(&number, static_cast<const void*>(value), sizeof number);
        return std::to_string(number);
    }
    static std::string valueText(const CMPIValue* value, CMPIType type) {
        if (value == nullptr) return kNullText;
        switch (type) {
            case CMPI_chars:
                return static_cast<const char*>(static_cast<const void*>(value));
            case CMPI_boolean:
                return numberText<CMPIBoolean>(value) == "0" ? "false" : "true";
            case CMPI_uint8:
                return numberText<CMPIUint8>(value);
            case CMPI_uint16:
                return numberText<CMPIUint16>(value);
            case CMPI_uint64:
                return numberText<CMPIUint64>(value);
            case CMPI_uint16A:
            case CMPI_charsA:
                return value->array ? static_cast<NotedArray*>(value->array)->text : kNullText;
            default:
                return formatted("a value of %s", typeText(type).c_str());
        }
    }

    static CMPIStatus setProperty(const CMPIInstance* instance, const char* name,
                                  const CMPIValue* value, CMPIType type) {
        auto* recorder = static_cast<RenderRecorder*>(const_cast<void*>(instance->hdl));
        recorder->calls_.push_back({name, type, valueText(value, type)});
        // Nobody may care.
        return {CMPI_RC_ERR_FAILED, nullptr};
    }
    static CMPIArray* makeArray(const CMPIBroker* broker, CMPICount count, CMPIType type,
                                CMPIStatus* status) {
        auto* recorder = static_cast<const FrontBroker*>(broker)->owner;
        if (status != nullptr) *status = {CMPI_RC_OK, nullptr};
        if (recorder->arraysRefused_) return nullptr;
        auto array = std::make_unique<NotedArray>();
        array->hdl = recorder;
        array->ft = &arrayTable();
        array->text = formatted("%s[%u]", typeText(type).c_str(), static_cast<unsigned>(count));
        recorder->arrays_.push_back(std::move(array));
        return recorder->arrays_.back().get();
    }
    static CMPIStatus setElementAt(const CMPIArray* array, CMPICount index, const CMPIValue* value,
                                   CMPIType type) {
        auto* noted = static_cast<NotedArray*>(const_cast<CMPIArray*>(array));
        noted->text += formatted("{%u:%s %s}", static_cast<unsigned>(index), typeText(type).c_str(),
                                 valueText(value, type).c_str());
        // A refused number is nobody's concern; a refused text is set again on some managers.
        return {type == CMPI_chars ? CMPI_RC_OK : CMPI_RC_ERR_FAILED, nullptr};
    }
    template <class Handle>
    static CMPIStatus releaseNobodyAskedFor(Handle*) {
        ADD_FAILURE() << "the renderer released an object of the broker";
        return {CMPI_RC_OK, nullptr};
    }

    static const CMPIInstanceFT& instanceTable() {
        static const CMPIInstanceFT table = [] {
            CMPIInstanceFT entries{};
            entries.ftVersion = CMPI_VERSION;
            entries.release = releaseNobodyAskedFor<CMPIInstance>;
            entries.setProperty = setProperty;
            return entries;
        }();
        return table;
    }
    static const CMPIArrayFT& arrayTable() {
        static const CMPIArrayFT table = [] {
            CMPIArrayFT entries{};
            entries.ftVersion = CMPI_VERSION;
            entries.release = releaseNobodyAskedFor<CMPIArray>;
            entries.setElementAt = setElementAt;
            return entries;
        }();
        return table;
    }

    const CMPIBroker* const behind_;
    CMPIBrokerEncFT factories_;
    FrontBroker broker_{};
    CMPIInstance instance_;
    std::vector<PropertyCall> calls_;
    std::vector<std::unique_ptr<NotedArray>> arrays_;
    bool arraysRefused_ = false;
};

/// Renders into the recorder, with the controller's lock held as a request holds it.
template <typename Fill, typename... Rest>
void fillLocked(RenderRecorder& recorder, Fill fill, RaidController_t* ctrl, Rest*... rest) {
    const MutexGuard lock(ctrl->CtrlMutex);
    fill(recorder.instance(), ctrl, rest...);
}

/// The rows that a renderer sets, in order.
template <class... Records>
std::vector<PropertyCall> rowsOf(void (*fill)(CMPIInstance*, Records*...), Records*... records) {
    RenderRecorder recorder;
    fillLocked(recorder, fill, records...);
    return recorder.calls();
}

/// Value of the first row of that name; "<not set>" without one.
inline std::string valueOf(const std::vector<PropertyCall>& rows, const std::string& name) {
    for (const PropertyCall& row : rows) {
        if (row.name == name) return row.value;
    }
    return "<not set>";
}

/// The rows without those that are arrays.
inline std::vector<PropertyCall> withoutArrays(std::vector<PropertyCall> rows) {
    std::erase_if(rows, [](const PropertyCall& row) { return (row.type & CMPI_ARRAY) != 0; });
    return rows;
}

/// The rows that a renderer sets when the manager has no arrays to give.
template <class... Records>
std::vector<PropertyCall> rowsWithoutArraysToHave(void (*fill)(CMPIInstance*, Records*...),
                                                  Records*... records) {
    RenderRecorder recorder;
    recorder.refuseArrays();
    fillLocked(recorder, fill, records...);
    return recorder.calls();
}

}  // namespace plexortest
