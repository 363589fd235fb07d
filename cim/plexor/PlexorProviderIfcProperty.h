// Setting properties of an instance, and texts of bounded length.
#pragma once

#include <stdarg.h>
#include <stddef.h>
#include <stdio.h>

#include "PlexorProviderUtil.h"

// Each sets one property; the broker's answer is not looked at. The array forms make an array of
// one element and set nothing when the broker gives no array.
void SetChars(CMPIInstance* inst, const char* name, const char* value);
void SetUint8(CMPIInstance* inst, const char* name, CMPIUint8 value);
void SetUint16(CMPIInstance* inst, const char* name, CMPIUint16 value);
void SetUint64(CMPIInstance* inst, const char* name, CMPIUint64 value);
void SetBoolean(CMPIInstance* inst, const char* name, bool value);
void SetUint16Array(CMPIInstance* inst, const char* name, CMPIUint16 value);
void SetCharsArray(CMPIInstance* inst, const char* name, const char* value);

/// ElementName and Caption are always the same text.
void SetNameAndCaption(CMPIInstance* inst, const char* text);

/// A text that grows piece by piece; what does not fit into Size - 1 characters is cut.
template <size_t Size>
class BoundedText {
public:
    __attribute__((format(printf, 2, 3))) void Append(const char* format, ...) {
        va_list args;
        va_start(args, format);
        const int wanted = vsnprintf(text_ + used_, Size - used_, format, args);
        va_end(args);
        if (wanted < 0) return;
        const size_t room = Size - 1 - used_;
        used_ += static_cast<size_t>(wanted) < room ? static_cast<size_t>(wanted) : room;
    }
    const char* Text() const { return text_; }

private:
    char text_[Size] = "";
    size_t used_ = 0;
};

/// The version, or "n/a" for a null or empty one.
inline const char* VersionOrNone(const char* version) {
    return version != nullptr && version[0] != '\0' ? version : "n/a";
}
