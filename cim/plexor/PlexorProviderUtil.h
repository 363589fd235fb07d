// Reading what the broker hands out, for the units above Util. Nothing here follows a pointer out
// of a value whose type says that it is a scalar, and every reader copes with null objects.
#pragma once

#include "PlexorProvider.h"

/// How often the vendor is asked about a class when the host does not say otherwise.
constexpr int kDefaultIntervalSeconds = 20;

/// Forgets the host's names without releasing them: somebody may still read them.
void GiveUpSystemInfo();

/// The broker of the latest factory call.
const CMPIBroker* CurrentBroker();

/// True when the process's log mask lets lines of that priority through.
bool LogEnabled(int priority);

/// The path as text for a log line of that priority; "NULL" for a null path. Masked lines get ""
/// without a call to the broker. The text is the broker's.
const char* PathText(int priority, const CMPIObjectPath* path);

/// How an absent text is shown in a log line.
inline const char* OrNull(const char* text) {
    return text != nullptr ? text : "NULL";
}

/// The characters of a string object; null for a null object or one without text.
const char* StringText(const CMPIString* string);
/// The characters of a string value (CMPI_string or CMPI_chars); null for every other value.
const char* ValueText(const CMPIData& data);
/// The message of a status, "NULL" without one.
const char* StatusText(const CMPIStatus& status);

/// A property of an instance; a null value when the instance, the property or its value is missing.
CMPIData ReadProperty(const CMPIInstance* inst, const char* name);
/// Text of a string property, the broker's; null when absent or not a string.
const char* ReadString(const CMPIInstance* inst, const char* name);
/// Number or truth value of a scalar property; 0 when absent or not a number.
CMPIUint64 ReadUint64(const CMPIInstance* inst, const char* name);
CMPIUint16 ReadUint16(const CMPIInstance* inst, const char* name);
CMPIUint8 ReadUint8(const CMPIInstance* inst, const char* name);
CMPIBoolean ReadBoolean(const CMPIInstance* inst, const char* name);
/// First element of an array property as a number; 0 without an array or a number in it.
CMPIUint16 ReadArrayUint16(const CMPIInstance* inst, const char* name);
/// Text of a string key, the broker's; null when the path, the key or its text is missing.
const char* ReadKey(const CMPIObjectPath* path, const char* name);
/// Class name of a path, the broker's; null when missing.
const char* ClassNameText(const CMPIObjectPath* path);

/// Path of an instance, the broker's; null for a null instance.
CMPIObjectPath* InstancePath(const CMPIInstance* inst);
/// An owned clone; null for a null path or a failed clone.
CMPIObjectPath* ClonePath(const CMPIObjectPath* path);
CMPIInstance* CloneInstance(const CMPIInstance* inst);
/// Releases a clone and clears the pointer; null is ignored.
void ReleasePath(CMPIObjectPath*& path);
void ReleaseInstance(CMPIInstance*& inst);

/// Whether the enumeration has a further element; false for a null enumeration.
bool HasNext(const CMPIEnumeration* enumeration);
/// Next instance (path); elements of another type are passed over, up to a thousand in a row. Null
/// at the end, for a null enumeration, and when the enumeration cannot give its next element or
/// gives no end of others, which `failed`, when given, then tells.
CMPIInstance* NextInstance(const CMPIEnumeration* enumeration, bool* failed = nullptr);
CMPIObjectPath* NextPath(const CMPIEnumeration* enumeration);
