/*
 * Stubs for plain providers, included by cmpimacs.h. Each is used once at file scope and makes a
 * function table out of functions named prefix + operation, and the exported factory
 * miname + _Create_..MI. The functions must be declared before.
 *
 *   prefix, miname  bare words
 *   brokerVar       variable that keeps the broker pointer
 *   hook            one statement run by the factory, without its semicolon; it sees `mi`, `mb`,
 *                   `ctx` and `rc`. CMNoHook and CMInitHook are ready-made.
 *
 * The factory reports success through rc (which may be NULL) before the hook runs.
 */
#ifndef _CMPIMACS_STUBS_H_
#define _CMPIMACS_STUBS_H_

#include "cmpift.h"

/* Nothing more to do. */
#define CMNoHook

/*
 * Calls prefix + type + Initialize(&mi, ctx). When that fails, its status goes to *rc and the
 * factory returns NULL: the MI is not used.
 */
#define CMInitHook(prefix, type)                                 \
    do {                                                         \
        CMPIStatus cmInit_ = prefix##type##Initialize(&mi, ctx); \
        if (cmInit_.rc != CMPI_RC_OK) {                          \
            if (rc != NULL) *rc = cmInit_;                       \
            return NULL;                                         \
        }                                                        \
    } while (0)

/*
 * The factory common to all kinds. The prototype keeps compilers quiet that ask for one in front
 * of every external function. `brokerVar = mb` must come before the hook, which may use it.
 * Names arrive here pasted together, so that a macro called like a prefix does not interfere.
 */
#define CMPI_STUB_FACTORY_(type, factory, table, brokerVar, hook)                       \
    CMPI_EXTERN_C CMPI##type##MI* factory(const CMPIBroker* mb, const CMPIContext* ctx, \
                                          CMPIStatus* rc);                              \
    CMPI_EXTERN_C CMPI##type##MI* factory(const CMPIBroker* mb, const CMPIContext* ctx, \
                                          CMPIStatus* rc) {                             \
        static CMPI##type##MI mi = {NULL, &table};                                      \
        (void)ctx;                                                                      \
        brokerVar = mb;                                                                 \
        if (rc != NULL) {                                                               \
            rc->rc = CMPI_RC_OK;                                                        \
            rc->msg = NULL;                                                             \
        }                                                                               \
        hook;                                                                           \
        return &mi;                                                                     \
    }

/* Entries that a later version appends to a table. */
#ifdef CMPI_VER_200
#define CMPI_STUB_SINCE_200_(function) , function
#else
#define CMPI_STUB_SINCE_200_(function)
#endif
#ifdef CMPI_VER_210
#define CMPI_STUB_SINCE_210_(function) , function
#else
#define CMPI_STUB_SINCE_210_(function)
#endif

#define CMInstanceMIStub(prefix, miname, brokerVar, hook)                       \
    static CMPIInstanceMIFT instMIFT__ = {                                      \
        CMPI_VERSION,                                                           \
        CMPI_VERSION,                                                           \
        "instance" #miname,                                                     \
        prefix##Cleanup,                                                        \
        prefix##EnumInstanceNames,                                              \
        prefix##EnumInstances,                                                  \
        prefix##GetInstance,                                                    \
        prefix##CreateInstance,                                                 \
        prefix##ModifyInstance,                                                 \
        prefix##DeleteInstance,                                                 \
        prefix##ExecQuery CMPI_STUB_SINCE_210_(prefix##EnumInstancesFiltered)}; \
    CMPI_STUB_FACTORY_(Instance, miname##_Create_InstanceMI, instMIFT__, brokerVar, hook)

#define CMAssociationMIStub(prefix, miname, brokerVar, hook)                     \
    static CMPIAssociationMIFT assocMIFT__ = {                                   \
        CMPI_VERSION,                                                            \
        CMPI_VERSION,                                                            \
        "association" #miname,                                                   \
        prefix##AssociationCleanup,                                              \
        prefix##Associators,                                                     \
        prefix##AssociatorNames,                                                 \
        prefix##References,                                                      \
        prefix##ReferenceNames CMPI_STUB_SINCE_210_(prefix##AssociatorsFiltered) \
            CMPI_STUB_SINCE_210_(prefix##ReferencesFiltered)};                   \
    CMPI_STUB_FACTORY_(Association, miname##_Create_AssociationMI, assocMIFT__, brokerVar, hook)

#define CMMethodMIStub(prefix, miname, brokerVar, hook)                               \
    static CMPIMethodMIFT methMIFT__ = {CMPI_VERSION, CMPI_VERSION, "method" #miname, \
                                        prefix##MethodCleanup, prefix##InvokeMethod}; \
    CMPI_STUB_FACTORY_(Method, miname##_Create_MethodMI, methMIFT__, brokerVar, hook)

#define CMPropertyMIStub(prefix, miname, brokerVar, hook)                         \
    static CMPIPropertyMIFT propMIFT__ = {                                        \
        CMPI_VERSION,                                                             \
        CMPI_VERSION,                                                             \
        "property" #miname,                                                       \
        prefix##PropertyCleanup,                                                  \
        prefix##SetProperty,                                                      \
        prefix##GetProperty CMPI_STUB_SINCE_200_(prefix##SetPropertyWithOrigin)}; \
    CMPI_STUB_FACTORY_(Property, miname##_Create_PropertyMI, propMIFT__, brokerVar, hook)

#define CMIndicationMIStub(prefix, miname, brokerVar, hook)                                \
    static CMPIIndicationMIFT indMIFT__ = {                                                \
        CMPI_VERSION,                                                                      \
        CMPI_VERSION,                                                                      \
        "Indication" #miname,                                                              \
        prefix##IndicationCleanup,                                                         \
        prefix##AuthorizeFilter,                                                           \
        prefix##MustPoll,                                                                  \
        prefix##ActivateFilter,                                                            \
        prefix##DeActivateFilter,                                                          \
        prefix##EnableIndications,                                                         \
        prefix##DisableIndications CMPI_STUB_SINCE_210_(prefix##AuthorizeFilterCollection) \
            CMPI_STUB_SINCE_210_(prefix##ActivateFilterCollection)                         \
                CMPI_STUB_SINCE_210_(prefix##DeActivateFilterCollection)};                 \
    CMPI_STUB_FACTORY_(Indication, miname##_Create_IndicationMI, indMIFT__, brokerVar, hook)

#endif /* _CMPIMACS_STUBS_H_ */
