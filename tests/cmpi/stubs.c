/*
 * Uses every provider stub and both hooks. Compiled, never run: as C and as C++, for each version.
 * stubs_test.cpp checks what the stubs do.
 */
#include "cmpidt.h"
#include "cmpift.h"
#include "cmpimacs.h"

#define MI_FUNCTION(name, ...) CMPIStatus Probe##name(__VA_ARGS__);
#include "probe_functions.h"
#undef MI_FUNCTION

CMPIStatus ProbeMethodInitialize(CMPIMethodMI* mi, const CMPIContext* ctx);

static const CMPIBroker* g_broker;

const CMPIBroker* probeBroker(void);
const CMPIBroker* probeBroker(void) {
    return g_broker;
}

/* A macro called like the prefix must not reach into the names that the stubs make. */
#define Probe wrong

CMInstanceMIStub(Probe, StubsCompile, g_broker, CMNoHook)
    CMAssociationMIStub(Probe, StubsCompile, g_broker, CMNoHook)
        CMMethodMIStub(Probe, StubsCompile, g_broker, ProbeMethodInitialize(&mi, ctx))
            CMPropertyMIStub(Probe, StubsCompile, g_broker, CMNoHook)
                CMIndicationMIStub(Probe, StubsCompile, g_broker, CMSetStatus(rc, CMPI_RC_OK))

#undef Probe

    /* The second hook, in a factory written by hand: a second stub of one kind would clash here. */
    CMPIInstanceMI* initHook(const CMPIContext* ctx, CMPIStatus* rc);
CMPIStatus ProbeInstanceInitialize(CMPIInstanceMI* mi, const CMPIContext* ctx);
CMPIInstanceMI* initHook(const CMPIContext* ctx, CMPIStatus* rc) {
    static CMPIInstanceMI mi = {NULL, &instMIFT__};
    CMInitHook(Probe, Instance);
    return &mi;
}
