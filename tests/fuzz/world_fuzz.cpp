// A vendor as the bytes have it, and a whole life of the provider with it: load, inventory,
// requests, refreshes while things change and calls fail, unload. Nothing may be left behind.
//
// The factory and the cleanup are the real ones; the workers are played, unless PLEXOR_FUZZ_WORKERS
// is "real": each life is then mostly waiting. PLEXOR_FUZZ_MANAGER names the kind of manager.
#include <cstdlib>

#include "entry_fixture.h"
#include "fuzz_target.h"
#include "input_bytes.h"
#include "manager_kinds.h"
#include "played_workers.h"

// A volume that is turned away for want of a pool leaves its texts behind, on purpose.
extern "C" const char* __lsan_default_suppressions() {
    return "leak:BuildVolumeInfo\n";
}

namespace {

using fuzz::InputBytes;
using testbed::CimValue;
using testbed::Entry;
using testbed::ObjectPath;

constexpr const char* kAskedClasses[] = {
    "Tovexa_PlexorController",    "Tovexa_PlexorSoftwareIdentity", "Tovexa_PlexorStorageVolume",
    "Tovexa_PlexorStorageExtent", "Tovexa_PlexorSASSATAPort",      "Tovexa_PlexorBattery"};
/// All that the provider reads, and two that name things.
constexpr const char* kProperties[] = {"OperationalStatus",
                                       "ExtentStatus",
                                       "DeviceID",
                                       "InstanceID",
                                       "ElementName",
                                       "Name",
                                       "PoolID",
                                       "Tag",
                                       "Number",
                                       "HealthState",
                                       "Model",
                                       "Primordial",
                                       "NumberOfBlocks",
                                       "ConsumableBlocks",
                                       "DeltaReservation",
                                       "TotalManagedSpace",
                                       "RemainingManagedSpace",
                                       "UsageRestriction",
                                       "RegisteredOrganization",
                                       "PortType",
                                       "PackageRedundancy",
                                       "NameNameSpace",
                                       "NameFormat",
                                       "EnabledState",
                                       "DataRedundancy",
                                       "RegisteredVersion",
                                       "RegisteredName",
                                       "VersionString",
                                       "IsBasedOnUnderlyingRedundancy",
                                       "Classifications",
                                       "BatteryStatus",
                                       "CreationClassName"};
constexpr const char* kAssociations[] = {"CIM_AllocatedFromStoragePool",
                                         "CIM_ConcreteComponent",
                                         "CIM_Container",
                                         "CIM_ElementSettingData",
                                         "CIM_ElementSoftwareIdentity",
                                         "CIM_HostedStoragePool",
                                         "CIM_MediaPresent",
                                         "CIM_PackageInConnector",
                                         "CIM_Realizes",
                                         "CIM_SystemDevice",
                                         "CIM_SystemPackaging",
                                         "CIM_LogicalIdentity"};
/// A manager that refuses to take an object back keeps it, and after a failed attachment all is
/// misuse: these two do not fail.
constexpr Entry kFailing[] = {Entry::PrepareAttachThread,
                              Entry::EnumerateInstanceNames,
                              Entry::EnumerateInstances,
                              Entry::GetInstance,
                              Entry::Associators,
                              Entry::AssociatorNames,
                              Entry::ClassPathIsA,
                              Entry::NewInstance,
                              Entry::NewObjectPath,
                              Entry::NewString,
                              Entry::NewArray,
                              Entry::ResultReturnInstance,
                              Entry::ResultReturnDone,
                              Entry::StringGetCharPtr,
                              Entry::ArrayGetSize,
                              Entry::ArrayGetElementAt,
                              Entry::EnumerationHasNext,
                              Entry::EnumerationGetNext,
                              Entry::InstanceGetProperty,
                              Entry::InstanceSetProperty,
                              Entry::InstanceGetObjectPath,
                              Entry::PathAddKey,
                              Entry::PathGetKey,
                              Entry::PathGetClassName,
                              Entry::PathGetNameSpace,
                              Entry::PathToString,
                              Entry::Clone,
                              Entry::ResultReturnObjectPath,
                              Entry::InstanceSetPropertyFilter};

testbed::BrokerOptions manager() {
    const char* kind = getenv("PLEXOR_FUZZ_MANAGER");
    testbed::BrokerOptions options;
    testbed::setManagerKind(options, kind != nullptr ? kind : "host");
    return options;
}

bool workersArePlayed() {
    const char* workers = getenv("PLEXOR_FUZZ_WORKERS");
    return workers == nullptr || std::string_view(workers) != "real";
}

/// Mostly all of them are there.
constexpr unsigned kWorkers[] = {2, 2, 2, 2, 2, 1, 1, 0};

class World : public plexortest::EntryTest {
public:
    explicit World(InputBytes input) : EntryTest(manager()), input_(input) {
        const unsigned workers = input_.pick(kWorkers);
        if (workersArePlayed()) played_.emplace(broker, workers);
    }
    void TestBody() override {}

    void live() {
        SetUp();
        books().keepCalls(false);
        presentHost();
        changeSome(12);
        failSome(3);
        callFactory();
        settle();
        for (unsigned steps = 0; steps < 8 && !input_.isEmpty(); steps++) step();
        faults().clear();
        unloadAndForget();
        expectNothingLeft();
        TearDown();
        fuzz::require(!HasFailure(), "the expectations of the fixture");
    }

private:
    void presentHost() {
        if (input_.draw(8) != 0) vendor.host();
        const ObjectPath profile = vendor.profile();
        for (unsigned i = input_.draw(3); i > 0; i--) {
            presentController("C" + std::to_string(i), profile);
        }
        if (input_.flag()) repository.shuffleResults(input_.byte());
    }

    void presentController(const std::string& id, const ObjectPath& profile) {
        const plexortest::VendorController controller = vendor.controller(id, profile);
        add(controller.port), add(controller.system), add(controller.package);
        std::vector<ObjectPath> pools(1), chassis(1);  // the first: none
        const auto each = [&](const char* kind, auto make) {
            for (unsigned i = input_.draw(4); i > 0; i--) make(id + kind + std::to_string(i));
        };
        each("p", [&](const std::string& name) {
            pools.push_back(add(vendor.pool(controller, name, input_.flag())));
        });
        each("e", [&](const std::string& name) {
            chassis.push_back(add(vendor.chassis(controller, name)));
        });
        each("d", [&](const std::string& name) {
            const plexortest::VendorDrive made = vendor.drive(controller, name, input_.pick(pools),
                                                              input_.pick(chassis), input_.byte());
            add(made.drive), add(made.extent), add(made.software), add(made.package);
            add(made.slot);
        });
        each("v", [&](const std::string& name) {
            const plexortest::VendorVolume made =
                vendor.volume(controller, name, input_.pick(pools), input_.text());
            add(made.volume), add(made.setting);
        });
        each("o", [&](const std::string& name) { add(vendor.port(controller, name)); });
        each("b", [&](const std::string& name) { add(vendor.battery(controller, name)); });
        if (input_.flag()) add(vendor.fan(controller, id + "fan"));
        add(vendor.software(controller.system, input_.draw(16), input_.text()));
    }

    ObjectPath add(ObjectPath path) {
        objects_.push_back(path);
        return path;
    }

    void changeSome(unsigned most) {
        for (unsigned i = input_.draw(most + 1); i > 0 && !objects_.empty(); i--) change();
    }
    void change() {
        const ObjectPath object = input_.pick(objects_);
        switch (input_.draw(6)) {
            case 0:
                repository.remove(object);
                break;
            case 1:
                repository.eraseProperty(object, input_.pick(kProperties));
                break;
            case 2:
                repository.dissociate(plexortest::vendorClass(input_.pick(kAssociations)), object,
                                      input_.pick(objects_));
                break;
            case 3:
                vendor.tie(input_.pick(kAssociations), object, input_.pick(objects_));
                break;
            default:
                repository.setProperty(object, input_.pick(kProperties), input_.value());
                break;
        }
    }

    void failSome(unsigned most) {
        for (unsigned i = input_.draw(most + 1); i > 0; i--) {
            testbed::FaultRule rule = refusal(input_.pick(kFailing));
            rule.skip = input_.byte();
            rule.times = static_cast<int>(input_.draw(4)) - 1;
            switch (input_.draw(4)) {
                case 0:
                    rule.rc = CMPI_RC_OK;
                    rule.nullResult = true;
                    break;
                case 1:
                    rule.rc = CMPI_RC_OK;
                    rule.wrongType = true;
                    break;
                case 2:
                    rule.keepResult = true;
                    break;
                default:
                    rule.rc = static_cast<CMPIrc>(1 + input_.draw(28));
                    break;
            }
            faults().add(rule);
        }
    }

    void step() {
        plexortest::VirtualClock::advance(input_.draw(60));
        switch (input_.draw(4)) {
            case 0:
                changeSome(6);
                break;
            case 1:
                failSome(2);
                break;
            default:
                ask();
                break;
        }
        if (input_.flag()) settle();
    }

    void ask() {
        testbed::InstanceClient client(broker, &mi);
        const std::string className = input_.pick(kAskedClasses);
        const testbed::Response names = client.enumerateInstanceNames(className);
        if (input_.flag()) client.enumerateInstances(className);
        if (input_.flag() && !names.paths.empty()) client.getInstance(input_.pick(names.paths));
    }

    void settle() {
        if (played_) return played_->work();
        const bool hasWorkers = PlexorThreads[0] != 0 || PlexorThreads[1] != 0;
        fuzz::require(!hasWorkers || plexortest::WorkersMeet::untilIdle(),
                      "the workers come to rest");
    }

    /// A volume that is turned away leaves its path behind on purpose, and nothing else does.
    void expectNothingLeft() {
        using plexortest::CapturedSyslog;
        const std::size_t turnedAway =
            CapturedSyslog::countContaining("No pool associated with volume ") +
            CapturedSyslog::countContaining("failed to add volume to list");
        const std::size_t clones = books().liveClones();
        fuzz::require(clones <= turnedAway, "no clone is left but those of volumes turned away");
        fuzz::require(controllers() == 0, "no controller is left");
        fuzz::require(IsFifoEmpty(&__FIFO) != 0, "no work is left");
        for (const std::string& misuse : books().misuses()) fuzz::require(false, misuse.c_str());
        expectLeftClones(clones);
    }

    InputBytes input_;
    std::optional<fuzz::PlayedWorkers> played_;
    std::vector<ObjectPath> objects_;
};

}  // namespace

PLEXOR_FUZZ_HARNESS(world) {
    World(InputBytes(bytes)).live();
}
