// Splitting a client's key, with the outcome in one value.
#pragma once

#include <stdlib.h>

#include <functional>
#include <optional>
#include <ostream>
#include <string>

#include "PlexorProviderIfc.h"
#include "keys_fake_path.h"
#include "provider_fixture.h"

namespace plexortest {

/// What a retrieval function answered. No text where it stored nothing.
struct SplitKey {
    int rc = 0;
    std::optional<std::string> controller;
    std::optional<std::string> device;

    bool operator==(const SplitKey&) const = default;
};

inline void PrintTo(const SplitKey& key, std::ostream* out) {
    *out << "rc " << key.rc << ", controller " << key.controller.value_or("<not stored>")
         << ", device " << key.device.value_or("<not stored>");
}

class KeysTest : public ProviderTest {
protected:
    /// Takes over what was stored in an out parameter, which held `untouched` before.
    static std::optional<std::string> taken(char* stored, const char* untouched) {
        if (stored == untouched) return std::nullopt;
        std::string text = stored != nullptr ? stored : "<null>";
        free(stored);
        return text;
    }

    static SplitKey splitController(const CMPIObjectPath* path, const char* keyName = "Name",
                                    const char* prefix = "tvxController") {
        char untouched[] = "untouched";
        char* controller = untouched;
        SplitKey key;
        key.rc = RetrieveDeviceID(path, keyName, prefix, &controller);
        key.controller = taken(controller, untouched);
        return key;
    }

    static SplitKey splitDevice(const CMPIObjectPath* path, const char* prefix) {
        char untouched[] = "untouched";
        char *controller = untouched, *device = untouched;
        SplitKey key;
        key.rc = RetrieveControllerAndDeviceIDs(path, prefix, &controller, &device);
        key.controller = taken(controller, untouched);
        key.device = taken(device, untouched);
        return key;
    }

    /// Splits a path whose key comes with each status that is not OK: it counts as missing, and the
    /// line says so.
    static void expectMissingWhateverTheStatus(
        const std::string& key, const std::function<SplitKey(const CMPIObjectPath* path)>& split,
        const std::string& line) {
        std::string text = key;
        ScriptedPath path;
        path.answer.type = CMPI_chars;
        path.answer.value.chars = text.data();
        for (const CMPIrc rc : {CMPI_RC_ERR_FAILED, CMPI_RC_ERR_INVALID_HANDLE,
                                CMPI_RC_ERR_NOT_FOUND, CMPI_RC_ERR_NO_SUCH_PROPERTY}) {
            path.answerStatus = rc;
            CapturedSyslog::clear();
            EXPECT_EQ(split(path.handle()), (SplitKey{-3, std::nullopt, std::nullopt})) << rc;
            EXPECT_EQ(CapturedSyslog::lines(), (std::vector<LogLine>{{LOG_ERR, line}})) << rc;
        }
    }

    /// A client's path with one key.
    CMPIObjectPath* pathWith(const std::string& keyName, testbed::CimValue value) {
        return broker.makePath({"root/cimv2", "Tovexa_Any", {{keyName, std::move(value)}}});
    }
    CMPIObjectPath* pathWith(const std::string& keyName, const std::string& text) {
        return pathWith(keyName, testbed::CimValue::string(text));
    }
};

/// Nothing stored.
inline SplitKey refusedKey(int rc) {
    return {rc, std::nullopt, std::nullopt};
}

}  // namespace plexortest
