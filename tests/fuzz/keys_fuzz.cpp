// What a client names when it asks: class, namespace, keys and properties, to the three operations,
// of a provider with one device of each kind. The same once more with keys as a broker might hand
// them out.
#include "fuzz_target.h"
#include "input_bytes.h"
#include "keys_fake_path.h"
#include "serve_fixture.h"

namespace {

using fuzz::InputBytes;
using plexortest::FakeString;

constexpr const char* kKeyClasses[] = {
    "Tovexa_PlexorController",    "Tovexa_PlexorSoftwareIdentity", "Tovexa_PlexorStorageVolume",
    "Tovexa_PlexorStorageExtent", "Tovexa_PlexorSASSATAPort",      "Tovexa_PlexorBattery"};
constexpr const char* kKeys[] = {
    "Name", "InstanceID", "DeviceID", "SystemName", "SystemCreationClassName", "CreationClassName"};
constexpr const char* kDevices[] = {"tvxControllerC0",       "tovexa:ControllerSoftwareC0",
                                    "tvxStorageVolumeC0_d1", "tvxStorageExtC0_d1",
                                    "tvxPortC0_d1",          "tvxControllerBatteryC0_d1"};
constexpr CMPIType kKeyTypes[] = {CMPI_string,   CMPI_chars,   CMPI_null,         CMPI_boolean,
                                  CMPI_char16,   CMPI_uint8,   CMPI_uint64,       CMPI_sint8,
                                  CMPI_sint64,   CMPI_real64,  CMPI_ref,          CMPI_instance,
                                  CMPI_dateTime, CMPI_ptr,     CMPI_charsptr,     CMPI_stringA,
                                  CMPI_charsA,   CMPI_uint16A, CMPI_numericString};

/// A path of which nothing but the two names and the answer to getKey is there.
class RawPath : public CMPIObjectPath {
public:
    RawPath(const std::string& className, const std::string& nameSpace, InputBytes& input)
        : className_(className.c_str()), nameSpace_(nameSpace.c_str()), text_(input.text()) {
        hdl = nullptr;
        ft = &table();
        answer_.type = input.flag() ? input.pick(kKeyTypes) : input.number<std::uint16_t>();
        answer_.state = input.flag() ? static_cast<CMPIValueState>(CMPI_keyValue)
                                     : input.number<std::uint16_t>();
        // An address that nobody may read, unless it is a text's, which has a value.
        answer_.value.uint64 = input.number<std::uint64_t>();
        constexpr int kNoValue = CMPI_nullValue | CMPI_badValue | CMPI_notFound;
        const bool hasValue = (answer_.state & kNoValue) == 0;
        const bool isThere = input.flag();
        if (answer_.type == CMPI_string && hasValue) {
            answer_.value.string = isThere ? &string_ : nullptr;
        }
        if (answer_.type == CMPI_chars && hasValue) {
            answer_.value.chars = isThere ? text_.data() : nullptr;
        }
        status_ = input.draw(4) == 0 ? CMPI_RC_ERR_FAILED : CMPI_RC_OK;
    }

private:
    static const RawPath& self(const CMPIObjectPath* path) {
        return *static_cast<const RawPath*>(path);
    }
    static CMPIString* string(const FakeString& text) { return const_cast<FakeString*>(&text); }
    static const CMPIObjectPathFT& table() {
        static const CMPIObjectPathFT entries = [] {
            CMPIObjectPathFT made = {};
            made.ftVersion = 100;
            made.getClassName = [](const CMPIObjectPath* path, CMPIStatus*) {
                return string(self(path).className_);
            };
            made.getNameSpace = [](const CMPIObjectPath* path, CMPIStatus*) {
                return string(self(path).nameSpace_);
            };
            made.toString = [](const CMPIObjectPath* path, CMPIStatus*) {
                return string(self(path).string_);
            };
            made.getKey = [](const CMPIObjectPath* path, const char*, CMPIStatus* status) {
                if (status != nullptr) *status = {self(path).status_, nullptr};
                return self(path).answer_;
            };
            return made;
        }();
        return entries;
    }

    FakeString className_;
    FakeString nameSpace_;
    std::string text_;
    FakeString string_{text_.c_str()};
    CMPIData answer_ = {};
    CMPIrc status_ = CMPI_RC_OK;
};

/// One for the whole process: requests leave it as it was.
class Keys : public plexortest::ServeTest {
public:
    Keys() {
        SetUp();
        plexortest::CapturedSyslog::discard(true);
        books().keepCalls(false);
        RaidController_t* controller = plexortest::attach(plexortest::newController("C0"));
        for (const auto& device : plexortest::kDeviceClasses) device.cache(controller, "d1");
    }
    void TestBody() override {}

    void ask(InputBytes input) {
        const unsigned operation = input.draw(5);
        const std::string className = input.flag() ? input.pick(kKeyClasses) : input.text();
        const std::string nameSpace = input.flag() ? "root/cimv2" : input.text();
        const testbed::PropertyList properties = propertiesIn(input);
        if (operation == 0)
            return expectWhole(client().enumerateInstanceNames(className, nameSpace));
        if (operation == 1) {
            return expectWhole(client().enumerateInstances(className, properties, nameSpace));
        }
        if (operation == 2) return askRaw(RawPath(className, nameSpace, input));
        const testbed::ObjectPath path = pathIn(className, nameSpace, input);
        const testbed::Response response = client().getInstance(path, properties);
        const bool found = response.rc == CMPI_RC_OK;
        fuzz::require(response.instances.size() == (found ? 1U : 0U), "a get finds one, or fails");
        fuzz::require(response.doneCalls == (found ? 1 : 0), "only what is found is done");
    }

    void expectClean() {
        const auto misuses = books().misuses();
        fuzz::require(misuses.empty(), misuses.empty() ? "" : misuses.front().c_str());
    }

private:
    static testbed::PropertyList propertiesIn(InputBytes& input) {
        if (input.flag()) return {};
        std::vector<std::string> names;
        for (unsigned i = input.draw(4); i > 0; i--) {
            names.push_back(input.flag() ? input.pick(kKeys) : input.text());
        }
        return names;
    }
    static testbed::ObjectPath pathIn(const std::string& className, const std::string& nameSpace,
                                      InputBytes& input) {
        testbed::ObjectPath path = {nameSpace, className, {}};
        for (unsigned i = input.draw(5); i > 0; i--) {
            const std::string name = input.flag() ? input.pick(kKeys) : input.text();
            switch (input.draw(3)) {
                case 0:
                    path.key(name, input.value());
                    break;
                case 1:
                    path.key(name, testbed::CimValue::string(input.pick(kDevices)));
                    break;
                default:
                    path.key(name, testbed::CimValue::string(input.text()));
                    break;
            }
        }
        return path;
    }
    static void expectWhole(const testbed::Response& response) {
        fuzz::require(response.rc != CMPI_RC_OK || response.doneCalls == 1,
                      "an enumeration that succeeds is done once");
    }
    void askRaw(const RawPath& path) {
        const testbed::Broker::CallScope scope(broker);
        testbed::Broker::Collected collected;
        const CMPIStatus status =
            mi.ft->getInstance(&mi, scope.context(), broker.makeResult(collected), &path, nullptr);
        fuzz::require(collected.instances.size() == (status.rc == CMPI_RC_OK ? 1U : 0U),
                      "a get finds one, or fails");
    }
};

}  // namespace

PLEXOR_FUZZ_HARNESS(keys) {
    // Not ended: its process is.
    static Keys& keys = *new Keys;
    keys.ask(InputBytes(bytes));
    keys.expectClean();
}
