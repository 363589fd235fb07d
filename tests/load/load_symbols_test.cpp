// The library's dynamic symbol table and the flags that it was linked with.
#include <gtest/gtest.h>

#include <algorithm>
#include <set>
#include <string>
#include <vector>

#include "symbol_table.h"

namespace {

using loadtest::exportedSymbols;
using loadtest::linesOf;
using loadtest::Symbol;

const std::set<std::string>& functions() {
    static const std::set<std::string> names = {
        // entry, unload, requests
        "PlexorProvider_Create_InstanceMI",
        "PlexorProviderCleanup",
        "PlexorProviderEnumInstanceNames",
        "PlexorProviderEnumInstances",
        "PlexorProviderGetInstance",
        "PlexorProviderCreateInstance",
        "PlexorProviderModifyInstance",
        "PlexorProviderDeleteInstance",
        "PlexorProviderExecQuery",
        "ResetNextUnloadTime",
        // lists, queue
        "CMStringCmp",
        "AddEntryAtListHead",
        "AddEntryAtListTail",
        "RemoveEntryFromList",
        "RemoveEntryFromListByKey",
        "IsListEmpty",
        "PutItem",
        "GetItem",
        "IsFifoEmpty",
        "FreeList",
        // host
        "InitSystemInfo",
        "ReleaseSystemInfo",
        "GetHostName",
        "GetSystemName",
        "GetSystemClassName",
        "GetArrayProperty",
        "GetOperationalStatus",
        "GetSampelInterval",
        // records
        "GetVolumeOp",
        "GetDiskOp",
        "GetPortOp",
        "GetBatteryOp",
        "GetPoolOp",
        "GetChassisOp",
        "GetControllerOp",
        "FreeVolume",
        "FreeDisk",
        "FreePort",
        "FreeBattery",
        "FreeChassis",
        "FreePool",
        "FreeController",
        "DeleteVolume",
        "DeleteDisk",
        "DeletePort",
        "DeleteBattery",
        "DeleteChassis",
        "DeletePool",
        "AddDiskToPool",
        "RemoveDiskFromPool",
        "FindStoragePoolByID",
        "FindDiskByDeviceID",
        "FindChassisByTag",
        // inventory
        "GetHHRCProfiles",
        "BuildControllerInfo",
        "NeedUpdate",
        "CheckAndUpdateControllerInfo",
        "BuildPoolInfo",
        "BuildChassisInfo",
        "BuildLogicalDeviceInfo",
        "ProcessBuildLogicalDeviceInfo",
        "BuildSinglePoolInfo",
        "BuildSingleChassisInfo",
        "BuildDiskInfo",
        "BuildVolumeInfo",
        "BuildPortInfo",
        "BuildBatteryInfo",
        "CheckAndUpdatePoolInfo",
        "CheckAndUpdateChassisInfo",
        "CheckAndUpdateDiskInfo",
        "CheckAndUpdateVolumeInfo",
        "CheckAndUpdatePortInfo",
        "CheckAndUpdateBatteryInfo",
        // refresh, workers
        "HandleDeviceConfigChange",
        "DoDeviceConfigChange",
        "ProcessDeviceConfigChange",
        "CrossoutDuplicatedEntries",
        "InitPlexorThreads",
        "BuildDeviceInfoAsync",
        "DoBuildDeviceInfoAsync",
        "PlexorThread",
        "CleanupPlexorThreads",
    };
    return names;
}

const std::set<std::string>& variables() {
    static const std::set<std::string> names = {
        "Broker",
        "_ProviderInitialized",
        "IdleTimeBeforeTerminating",
        "NextUnloadTime",
        "waitDebug",
        "InitCompleteTime",
        "instMIFT__",
        "RaidControllerList",
        "__FIFO",
        "__SystemName",
        "__HostName",
        "__SystemClassName",
        "PlexorThreads",
        "PlexorThreadAttr",
        "PlexorThreadMutex",
        "PlexorThreadCond",
        "ActiveThreads",
        "TerminateThread",
        "ThreadActivityDone",
        "StateUpdateInterval",
    };
    return names;
}

/// Names that stay inside one source file, or inside the library.
constexpr const char* kInternalNames[] = {
    "PlexorProviderInit",
    "PlexorInit",
    "WaitDebug",
    "CanUnload",
    "MakeDeviceID",
    "MakeLogicalDeviceID",
    "StringClone",
    "FillControllerObjectPath",
    "FillSoftwareIdentityObjectPath",
    "FillLogicalDeviceObjectPath",
    "RetrieveDeviceID",
    "RetrieveControllerAndDeviceIDs",
    "FillControllerInstance",
    "FillSoftwareIdentityInstance",
    "FillVolumeInstance",
    "FillExtentInstance",
    "FillPortInstance",
    "FillBatteryInstance",
    "GetHealthStateByOpStatus",
    "GetDiskPhysicalStatus",
    "AdmitWork",
    "QuiesceWorkers",
    "StopRequested",
    "CurrentBroker",
};

std::set<std::string> exportedOfKind(const std::string& kinds) {
    std::set<std::string> names;
    for (const Symbol& symbol : exportedSymbols(PROVIDER)) {
        if (kinds.find(symbol.kind) != std::string::npos) names.insert(symbol.name);
    }
    return names;
}

/// Whether readelf prints a line with that text in it.
bool elfHas(const std::string& option, const std::string& text) {
    const std::vector<std::string> lines =
        linesOf(std::string(READELF) + " -W " + option + " " + PROVIDER);
    return std::any_of(lines.begin(), lines.end(), [&](const std::string& line) {
        return line.find(text) != std::string::npos;
    });
}

TEST(LoadSymbolsTest, ExportsTheFunctionsUnderTheirPlainNames) {
    EXPECT_EQ(exportedOfKind("T"), functions());
}

TEST(LoadSymbolsTest, ExportsTheVariablesUnderTheirPlainNames) {
    EXPECT_EQ(exportedOfKind("BDR"), variables());
}

// A weak symbol of the C++ library would do harm, too: that library binds its own references to it.
TEST(LoadSymbolsTest, ExportsNothingElse) {
    for (const Symbol& symbol : exportedSymbols(PROVIDER)) {
        EXPECT_TRUE(functions().contains(symbol.name) || variables().contains(symbol.name))
            << symbol.kind << " " << symbol.name;
    }
}

TEST(LoadSymbolsTest, KeepsInternalNamesToItself) {
    for (const Symbol& symbol : exportedSymbols(PROVIDER, true)) {
        for (const char* name : kInternalNames) {
            const bool isThat = symbol.name == name ||
                                symbol.name.find(std::string(name) + "(") != std::string::npos;
            EXPECT_FALSE(isThat) << symbol.name;
        }
    }
}

// One of these keeps a library in memory until the process ends.
TEST(LoadSymbolsTest, HasNoUniqueSymbols) {
    for (const Symbol& symbol : exportedSymbols(PROVIDER))
        EXPECT_NE(symbol.kind, 'u') << symbol.name;
}

TEST(LoadSymbolsTest, IsBoundWhenLoadedAndReadOnlyAfterwards) {
    EXPECT_TRUE(elfHas("-d", "BIND_NOW"));
    EXPECT_TRUE(elfHas("-l", "GNU_RELRO"));
}

TEST(LoadSymbolsTest, HasAStackThatIsNotExecutable) {
    const std::vector<std::string> lines =
        linesOf(std::string(READELF) + " -W -l " + PROVIDER + " | grep GNU_STACK");
    ASSERT_EQ(lines.size(), 1u);
    EXPECT_NE(lines[0].find(" RW "), std::string::npos) << lines[0];
    EXPECT_EQ(lines[0].find("RWE"), std::string::npos) << lines[0];
}

TEST(LoadSymbolsTest, HasNoTextRelocations) {
    EXPECT_FALSE(elfHas("-d", "TEXTREL"));
}

TEST(LoadSymbolsTest, MayBeUnloaded) {
    EXPECT_FALSE(elfHas("-d", "NODELETE"));
}

}  // namespace
