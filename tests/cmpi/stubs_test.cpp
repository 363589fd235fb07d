/*
 * Provider stubs: the tables hold the right functions in the right places, the factories report
 * what they should.
 */
#include <gtest/gtest.h>

#include <string>

#include "cmpidt.h"
#include "cmpift.h"
#include "cmpimacs.h"

static std::string g_called;

static CMPIStatus Called(const char* name) {
    g_called = name;
    CMReturn(CMPI_RC_OK);
}

#define MI_FUNCTION(name, ...)                   \
    static CMPIStatus Probe##name(__VA_ARGS__) { \
        return Called(#name);                    \
    }
#include "probe_functions.h"
#undef MI_FUNCTION

static CMPIStatus g_initResult = {CMPI_RC_OK, nullptr};
static const void* g_initObject;

static CMPIStatus ProbePropertyInitialize(CMPIPropertyMI* mi, const CMPIContext* ctx) {
    (void)ctx;
    g_initObject = mi;
    return g_initResult;
}

static const CMPIBroker* g_broker;
static const CMPIBroker* g_brokerSeenByHook;

CMInstanceMIStub(Probe, ProbeName, g_broker, CMNoHook)
    CMAssociationMIStub(Probe, ProbeName, g_broker, g_brokerSeenByHook = g_broker)
        CMMethodMIStub(Probe, ProbeName, g_broker, CMNoHook)
            CMPropertyMIStub(Probe, ProbeName, g_broker, CMInitHook(Probe, Property))
                CMIndicationMIStub(Probe, ProbeName, g_broker, CMNoHook)

                    static const CMPIBroker g_theBroker{};

/* Makes an MI and expects the factory to report success. */
template <typename MI>
static const MI* Make(MI* (*factory)(const CMPIBroker*, const CMPIContext*, CMPIStatus*)) {
    CMPIString message{};
    CMPIStatus status{CMPI_RC_ERR_FAILED, &message};
    g_broker = nullptr;
    const MI* mi = factory(&g_theBroker, nullptr, &status);
    EXPECT_EQ(status.rc, CMPI_RC_OK);
    EXPECT_EQ(status.msg, nullptr);
    EXPECT_EQ(g_broker, &g_theBroker);
    EXPECT_EQ(mi->hdl, nullptr);
    EXPECT_EQ(mi->ft->ftVersion, CMPI_VERSION);
    EXPECT_EQ(mi->ft->miVersion, CMPI_VERSION);
    return mi;
}

/* Calls an entry with empty arguments and expects the function of that name. */
template <typename... A>
static void ExpectEntry(CMPIStatus (*entry)(A...), const char* name) {
    g_called.clear();
    entry(A{}...);
    EXPECT_EQ(g_called, name);
}

TEST(Stubs, Instance) {
    const CMPIInstanceMIFT& ft = *Make(ProbeName_Create_InstanceMI)->ft;
    EXPECT_STREQ(ft.miName, "instanceProbeName");
    ExpectEntry(ft.cleanup, "Cleanup");
    ExpectEntry(ft.enumerateInstanceNames, "EnumInstanceNames");
    ExpectEntry(ft.enumerateInstances, "EnumInstances");
    ExpectEntry(ft.getInstance, "GetInstance");
    ExpectEntry(ft.createInstance, "CreateInstance");
    ExpectEntry(ft.modifyInstance, "ModifyInstance");
    ExpectEntry(ft.deleteInstance, "DeleteInstance");
    ExpectEntry(ft.execQuery, "ExecQuery");
    ExpectEntry(ft.enumerateInstancesFiltered, "EnumInstancesFiltered");
}

TEST(Stubs, Association) {
    const CMPIAssociationMIFT& ft = *Make(ProbeName_Create_AssociationMI)->ft;
    EXPECT_STREQ(ft.miName, "associationProbeName");
    ExpectEntry(ft.cleanup, "AssociationCleanup");
    ExpectEntry(ft.associators, "Associators");
    ExpectEntry(ft.associatorNames, "AssociatorNames");
    ExpectEntry(ft.references, "References");
    ExpectEntry(ft.referenceNames, "ReferenceNames");
    ExpectEntry(ft.associatorsFiltered, "AssociatorsFiltered");
    ExpectEntry(ft.referencesFiltered, "ReferencesFiltered");
}

TEST(Stubs, MethodAndProperty) {
    const CMPIMethodMIFT& method = *Make(ProbeName_Create_MethodMI)->ft;
    EXPECT_STREQ(method.miName, "methodProbeName");
    ExpectEntry(method.cleanup, "MethodCleanup");
    ExpectEntry(method.invokeMethod, "InvokeMethod");

    const CMPIPropertyMIFT& property = *Make(ProbeName_Create_PropertyMI)->ft;
    EXPECT_STREQ(property.miName, "propertyProbeName");
    ExpectEntry(property.cleanup, "PropertyCleanup");
    ExpectEntry(property.setProperty, "SetProperty");
    ExpectEntry(property.getProperty, "GetProperty");
    ExpectEntry(property.setPropertyWithOrigin, "SetPropertyWithOrigin");
}

TEST(Stubs, Indication) {
    const CMPIIndicationMIFT& ft = *Make(ProbeName_Create_IndicationMI)->ft;
    EXPECT_STREQ(ft.miName, "IndicationProbeName");
    ExpectEntry(ft.cleanup, "IndicationCleanup");
    ExpectEntry(ft.authorizeFilter, "AuthorizeFilter");
    ExpectEntry(ft.mustPoll, "MustPoll");
    ExpectEntry(ft.activateFilter, "ActivateFilter");
    ExpectEntry(ft.deActivateFilter, "DeActivateFilter");
    ExpectEntry(ft.enableIndications, "EnableIndications");
    ExpectEntry(ft.disableIndications, "DisableIndications");
    ExpectEntry(ft.authorizeFilterCollection, "AuthorizeFilterCollection");
    ExpectEntry(ft.activateFilterCollection, "ActivateFilterCollection");
    ExpectEntry(ft.deActivateFilterCollection, "DeActivateFilterCollection");
}

TEST(Stubs, HookRunsAfterTheBrokerIsStored) {
    g_broker = nullptr;
    g_brokerSeenByHook = nullptr;
    ASSERT_NE(ProbeName_Create_AssociationMI(&g_theBroker, nullptr, nullptr), nullptr);
    EXPECT_EQ(g_brokerSeenByHook, &g_theBroker);
}

TEST(Stubs, InitHookPassesFailureOn) {
    CMPIString message{};
    CMPIStatus status{CMPI_RC_OK, nullptr};
    g_initResult = {CMPI_RC_ERR_ACCESS_DENIED, &message};
    EXPECT_EQ(ProbeName_Create_PropertyMI(&g_theBroker, nullptr, &status), nullptr);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_ACCESS_DENIED);
    EXPECT_EQ(status.msg, &message);
    EXPECT_EQ(ProbeName_Create_PropertyMI(&g_theBroker, nullptr, nullptr), nullptr);

    g_initResult = {CMPI_RC_OK, nullptr};
    const CMPIPropertyMI* mi = ProbeName_Create_PropertyMI(&g_theBroker, nullptr, nullptr);
    EXPECT_NE(mi, nullptr);
    EXPECT_EQ(g_initObject, mi);
}
