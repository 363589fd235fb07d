// An object path of the test's own: answers every key with one value, and notes the keys added to
// it with their types exactly as they were passed.
#pragma once

#include <cstring>
#include <optional>
#include <ostream>
#include <string>
#include <vector>

#include "PlexorProvider.h"

namespace plexortest {

/// One addKey call; no text for a null value.
struct AddedKey {
    std::string name;
    std::optional<std::string> text;
    CMPIType type = CMPI_chars;

    bool operator==(const AddedKey&) const = default;
};

inline void PrintTo(const AddedKey& key, std::ostream* out) {
    *out << key.name << " (type " << key.type << ") = " << key.text.value_or("<null>");
}

/// A string object with that text, which may be null. Must outlive its use.
class FakeString : public CMPIString {
public:
    explicit FakeString(const char* content) : text(content) {
        hdl = const_cast<char*>(content);
        ft = &table();
    }
    const char* text;

private:
    static const char* charsOf(const CMPIString* string, CMPIStatus* status) {
        if (status != nullptr) *status = {CMPI_RC_OK, nullptr};
        return static_cast<const FakeString*>(string)->text;
    }
    static const CMPIStringFT& table() {
        static const CMPIStringFT entries = [] {
            CMPIStringFT made = {};
            made.ftVersion = 100;
            made.getCharPtr = charsOf;
            return made;
        }();
        return entries;
    }
};

class ScriptedPath : public CMPIObjectPath {
public:
    ScriptedPath() {
        hdl = nullptr;
        ft = &table();
    }

    CMPIObjectPath* handle() { return this; }

    CMPIData answer = {};                             ///< of getKey
    std::optional<CMPIrc> answerStatus = CMPI_RC_OK;  ///< of getKey; none: it tells none
    CMPIrc addKeyStatus = CMPI_RC_OK;  ///< of addKey, which notes the key nevertheless
    std::vector<AddedKey> added;
    mutable std::vector<std::string> asked;  ///< names that getKey was called with
    FakeString text{"the path"};             ///< of toString

private:
    static ScriptedPath& self(const CMPIObjectPath* path) {
        return *static_cast<ScriptedPath*>(const_cast<CMPIObjectPath*>(path));
    }
    static CMPIStatus addKey(const CMPIObjectPath* path, const char* name, const CMPIValue* value,
                             CMPIType type) {
        AddedKey key = {name, std::nullopt, type};
        // The characters of a CMPI_chars value stand where the value pointer points.
        if (value != nullptr) key.text = static_cast<const char*>(static_cast<const void*>(value));
        self(path).added.push_back(std::move(key));
        return {self(path).addKeyStatus, nullptr};
    }
    static CMPIData getKey(const CMPIObjectPath* path, const char* name, CMPIStatus* status) {
        self(path).asked.emplace_back(name);
        const std::optional<CMPIrc> rc = self(path).answerStatus;
        if (status != nullptr && rc) *status = {*rc, nullptr};
        return self(path).answer;
    }
    static CMPIString* toString(const CMPIObjectPath* path, CMPIStatus* status) {
        if (status != nullptr) *status = {CMPI_RC_OK, nullptr};
        return &self(path).text;
    }
    static const CMPIObjectPathFT& table() {
        static const CMPIObjectPathFT entries = [] {
            CMPIObjectPathFT made = {};
            made.ftVersion = 100;
            made.addKey = addKey;
            made.getKey = getKey;
            made.toString = toString;
            return made;
        }();
        return entries;
    }
};

}  // namespace plexortest
