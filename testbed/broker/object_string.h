// The broker's CMPIString.
#pragma once

#include <memory>
#include <optional>
#include <string>

#include "object.h"
#include "object_calls.h"

namespace testbed {

/// The text pointer stands in `hdl`, where some providers read it directly; NULL for a null string.
class StringObject final : public Object, public CMPIString {
public:
    StringObject(BrokerCore& core, const std::optional<std::string>& content);

    const void* handle() const override { return static_cast<const CMPIString*>(this); }
    std::shared_ptr<StringObject> copy() const;
    /// NULL for a null string.
    const char* text() const { return text_.get(); }

private:
    void drop() override;
    std::unique_ptr<char[]> text_;  // on the heap, so that the memory checkers see it go
};

template <>
struct ObjectOf<CMPIString> {
    using Type = StringObject;
};

/// A string read out of another object (see makeDerived).
CMPIString* derivedString(const Object& source, const std::string& text);

}  // namespace testbed
