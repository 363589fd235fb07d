// What the three served operations have in common: trace lines, the idle timer, classes that are
// not served, an inventory without controllers.
#include <string>

#include "serve_fixture.h"

namespace plexortest {
namespace {

using testbed::Response;

class ServeOpening : public ServeTest {
protected:
    /// A full path of the only device or controller.
    static testbed::ObjectPath knownPath(const std::string& className) {
        if (className == kController) return controllerPath("C0");
        if (className == kSoftwareIdentity) return softwarePath("C0");
        for (const DeviceClass& device : kDeviceClasses) {
            if (className == device.name) return devicePath(device, "C0", "d1");
        }
        ADD_FAILURE() << "no such class " << className;
        return {};
    }
    static void smallInventory() {
        RaidController_t* ctrl = attach(newController("C0"));
        for (const DeviceClass& device : kDeviceClasses) device.cache(ctrl, "d1");
    }
    /// The lines that begin with the name of the function that serves the request.
    static std::vector<LogLine> ownLines(const Operation& operation) {
        std::vector<LogLine> found;
        for (const LogLine& line : CapturedSyslog::lines()) {
            if (line.text.starts_with(std::string(operation.name) + ":")) found.push_back(line);
        }
        return found;
    }
};

TEST_F(ServeOpening, TracesPathClassAndExit) {
    smallInventory();
    for (const Operation& operation : allOperations()) {
        const std::string name = operation.name;
        for (const std::string& className : servedClasses()) {
            testbed::ObjectPath path = knownPath(className);
            if (name != getOperation().name) path.keys.clear();
            CapturedSyslog::clear();
            operation.ask(client(), path);
            const std::vector<LogLine> expected = {
                {LOG_DEBUG, name + ": ObjectPath - " + path.text() + "\n"},
                {LOG_DEBUG, name + ": " + className + "\n"},
                {LOG_DEBUG, name + ": exiting\n"}};
            EXPECT_EQ(expected, ownLines(operation));
            EXPECT_EQ(LogLine(expected[0]), CapturedSyslog::lines().front());
            EXPECT_EQ(LogLine(expected[2]), CapturedSyslog::lines().back());
        }
    }
}

TEST_F(ServeOpening, TracesTheServedClassNotTheClientsSpelling) {
    for (const Operation& operation : allOperations()) {
        CapturedSyslog::clear();
        operation.ask(client(), {"root/cimv2", "TOVEXA_PLEXORbattery", {}});
        EXPECT_TRUE(logged(LOG_DEBUG, std::string(operation.name) + ": Tovexa_PlexorBattery\n"));
    }
}

TEST_F(ServeOpening, EveryRequestMovesTheUnloadTime) {
    smallInventory();
    std::vector<std::string> classes = servedClasses();
    classes.insert(classes.end(), {"CIM_StorageVolume", "", "No_SuchClass"});
    for (const Operation& operation : allOperations()) {
        for (const std::string& className : classes) {
            NextUnloadTime = 0;
            VirtualClock::advance(7);
            operation.ask(client(), {"root/cimv2", className, {}});
            EXPECT_EQ(VirtualClock::now() + 300, NextUnloadTime)
                << operation.name << " of " << className;
        }
    }
}

TEST_F(ServeOpening, ThePathIsTracedBeforeTheUnloadTimeMoves) {
    std::vector<time_t> atLines;
    CapturedSyslog::onLine([&](const LogLine&) { atLines.push_back(NextUnloadTime); });
    for (const Operation& operation : allOperations()) {
        NextUnloadTime = 0;
        atLines.clear();
        operation.ask(client(), {"root/cimv2", "No_SuchClass", {}});
        ASSERT_GE(atLines.size(), 2u) << operation.name;
        EXPECT_EQ(atLines[0], 0) << operation.name;
        EXPECT_EQ(atLines[1], kStart + 300) << operation.name;
    }
}

TEST_F(ServeOpening, TheExitIsTracedBeforeTheResultIsDone) {
    smallInventory();
    std::vector<std::string> lastLines;
    testbed::FaultRule watch;
    watch.entry = testbed::Entry::ResultReturnDone;
    watch.hook = [&] { lastLines.push_back(CapturedSyslog::lines().back().text); };
    faults().add(watch);
    for (const Operation& operation : allOperations()) {
        lastLines.clear();
        operation.ask(client(), knownPath("Tovexa_PlexorBattery"));
        EXPECT_EQ(lastLines, std::vector<std::string>{std::string(operation.name) + ": exiting\n"});
    }
}

TEST_F(ServeOpening, ARequestClampsTheIdleTime) {
    IdleTimeBeforeTerminating = 25;
    client().enumerateInstanceNames(kController);
    EXPECT_EQ(10u, IdleTimeBeforeTerminating);
    EXPECT_EQ(VirtualClock::now() + 600, NextUnloadTime);
}

const char* const kForeignClasses[] = {"CIM_StorageVolume",
                                       "CIM_ManagedElement",
                                       "Tovexa_PlexorStorageVolum",
                                       "Tovexa_PlexorStorageVolumes",
                                       " Tovexa_PlexorBattery",
                                       "Tovexa_Plexor",
                                       "%s%n",
                                       ""};

TEST_F(ServeOpening, EnumerationsOfAForeignClassAreEmpty) {
    smallInventory();
    for (const Operation& operation : enumerations()) {
        const std::string name = operation.name;
        for (const char* className : kForeignClasses) {
            const testbed::ObjectPath path = {"root/cimv2", className, {}};
            CapturedSyslog::clear();
            const Response response = operation.ask(client(), path);
            EXPECT_EQ(CMPI_RC_OK, response.rc);
            EXPECT_FALSE(response.message);
            EXPECT_EQ(1, response.doneCalls);
            EXPECT_TRUE(response.paths.empty());
            EXPECT_TRUE(response.instances.empty());
            const std::vector<LogLine> expected = {
                {LOG_DEBUG, name + ": ObjectPath - " + path.text() + "\n"},
                {LOG_DEBUG, name + ": unsupported class " + className + "\n"},
                {LOG_DEBUG, name + ": exiting\n"}};
            EXPECT_EQ(expected, CapturedSyslog::lines());
        }
    }
}

TEST_F(ServeOpening, AGetOfAForeignClassIsRefusedAtOnce) {
    smallInventory();
    for (const char* className : kForeignClasses) {
        testbed::ObjectPath path = knownPath("Tovexa_PlexorBattery");
        path.className = className;
        CapturedSyslog::clear();
        const Response response = client().getInstance(path);
        EXPECT_EQ(CMPI_RC_ERR_INVALID_CLASS, response.rc);
        EXPECT_FALSE(response.message);
        EXPECT_EQ(0, response.doneCalls);
        EXPECT_TRUE(response.instances.empty());
        const std::vector<LogLine> expected = {
            {LOG_DEBUG, "PlexorProviderGetInstance: ObjectPath - " + path.text() + "\n"},
            {LOG_DEBUG,
             std::string("PlexorProviderGetInstance: unsupported class ") + className + "\n"}};
        EXPECT_EQ(expected, CapturedSyslog::lines());
    }
}

TEST_F(ServeOpening, AnEmptyInventoryGivesEmptyEnumerations) {
    for (const Operation& operation : enumerations()) {
        for (const std::string& className : servedClasses()) {
            CapturedSyslog::clear();
            const Response response = operation.ask(client(), {"root/cimv2", className, {}});
            EXPECT_EQ(CMPI_RC_OK, response.rc);
            EXPECT_EQ(1, response.doneCalls);
            EXPECT_TRUE(response.paths.empty());
            EXPECT_TRUE(response.instances.empty());
            EXPECT_EQ(3u, CapturedSyslog::lines().size());
            EXPECT_EQ(3u, CapturedSyslog::linesAt(LOG_DEBUG).size());
        }
    }
}

TEST_F(ServeOpening, AnEmptyInventoryHasNothingToGet) {
    for (const std::string& className : servedClasses()) {
        const Response response = client().getInstance(knownPath(className));
        EXPECT_EQ(CMPI_RC_ERR_NOT_FOUND, response.rc) << className;
        EXPECT_EQ(0, response.doneCalls);
    }
}

/// Serves a request as the manager would, without a path.
struct PathlessRequest {
    explicit PathlessRequest(testbed::Broker& broker) : result(broker.makeResult(collected)) {}

    testbed::Broker::Collected collected;
    CMPIResult* result;
};

TEST_F(ServeOpening, EnumerationsWithoutPathAreEmpty) {
    smallInventory();
    PathlessRequest request(broker);
    CMPIStatus status = PlexorProviderEnumInstanceNames(&mi, ctx(), request.result, nullptr);
    EXPECT_EQ(CMPI_RC_OK, status.rc);
    EXPECT_EQ(nullptr, status.msg);
    EXPECT_EQ(1, request.collected.doneCalls);
    EXPECT_TRUE(logged(LOG_DEBUG, "PlexorProviderEnumInstanceNames: ObjectPath - NULL\n"));
    EXPECT_TRUE(logged(LOG_DEBUG, "PlexorProviderEnumInstanceNames: unsupported class NULL\n"));
    EXPECT_TRUE(logged(LOG_DEBUG, "PlexorProviderEnumInstanceNames: exiting\n"));

    const char* properties[] = {"Caption", nullptr};
    status = PlexorProviderEnumInstances(&mi, ctx(), request.result, nullptr, properties);
    EXPECT_EQ(CMPI_RC_OK, status.rc);
    EXPECT_EQ(nullptr, status.msg);
    EXPECT_EQ(2, request.collected.doneCalls);
    EXPECT_TRUE(logged(LOG_DEBUG, "PlexorProviderEnumInstances: ObjectPath - NULL\n"));
    EXPECT_TRUE(logged(LOG_DEBUG, "PlexorProviderEnumInstances: unsupported class NULL\n"));
    EXPECT_TRUE(request.collected.paths.empty());
    EXPECT_TRUE(request.collected.instances.empty());
}

TEST_F(ServeOpening, AGetWithoutPathIsRefused) {
    smallInventory();
    PathlessRequest request(broker);
    const CMPIStatus status =
        PlexorProviderGetInstance(&mi, ctx(), request.result, nullptr, nullptr);
    EXPECT_EQ(CMPI_RC_ERR_INVALID_CLASS, status.rc);
    EXPECT_EQ(nullptr, status.msg);
    EXPECT_EQ(0, request.collected.doneCalls);
    EXPECT_TRUE(logged(LOG_DEBUG, "PlexorProviderGetInstance: ObjectPath - NULL\n"));
    EXPECT_TRUE(logged(LOG_DEBUG, "PlexorProviderGetInstance: unsupported class NULL\n"));
    EXPECT_EQ(VirtualClock::now() + 300, NextUnloadTime);
}

}  // namespace
}  // namespace plexortest
