/*
 * The tables that a provider fills in (MI, management interface), one kind of MI each.
 * Included by cmpift.h.
 *
 * ftVersion tells the manager how many entries it may look at; miVersion and miName are the
 * provider's own. cleanup runs while nothing else of the MI runs. With terminating it has to clean
 * up; otherwise it may do nothing and answer CMPI_RC_DO_NOT_UNLOAD or CMPI_RC_NEVER_UNLOAD. Any
 * other answer means that the MI is gone. Arguments belong to the manager and are valid during the
 * call. A property list that is NULL means all properties, an empty one none.
 */
#ifndef _CMPIFT_MI_H_
#define _CMPIFT_MI_H_

#include "cmpidt.h"
#include "cmpios.h"

#ifdef __cplusplus
extern "C" {
#endif

typedef struct _CMPIInstanceMI CMPIInstanceMI;
typedef struct _CMPIInstanceMIFT CMPIInstanceMIFT;
typedef struct _CMPIAssociationMI CMPIAssociationMI;
typedef struct _CMPIAssociationMIFT CMPIAssociationMIFT;
typedef struct _CMPIMethodMI CMPIMethodMI;
typedef struct _CMPIMethodMIFT CMPIMethodMIFT;
typedef struct _CMPIPropertyMI CMPIPropertyMI;
typedef struct _CMPIPropertyMIFT CMPIPropertyMIFT;
typedef struct _CMPIIndicationMI CMPIIndicationMI;
typedef struct _CMPIIndicationMIFT CMPIIndicationMIFT;

struct _CMPIInstanceMI {
    const void* hdl;
    const CMPIInstanceMIFT* ft;
};

/* Instance provider. */
struct _CMPIInstanceMIFT {
    CMPIVersion ftVersion;
    int miVersion;
    const char* miName;
    CMPIStatus (*cleanup)(CMPIInstanceMI* mi, const CMPIContext* ctx, CMPIBoolean terminating);
    CMPIStatus (*enumerateInstanceNames)(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                         const CMPIResult* result, const CMPIObjectPath* classPath);
    CMPIStatus (*enumerateInstances)(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                     const CMPIResult* result, const CMPIObjectPath* classPath,
                                     const char** properties);
    /* Exactly one instance, or CMPI_RC_ERR_NOT_FOUND. */
    CMPIStatus (*getInstance)(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* result,
                              const CMPIObjectPath* path, const char** properties);
    /* Returns the new instance's path through result. */
    CMPIStatus (*createInstance)(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                 const CMPIResult* result, const CMPIObjectPath* classPath,
                                 const CMPIInstance* instance);
    CMPIStatus (*modifyInstance)(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                 const CMPIResult* result, const CMPIObjectPath* path,
                                 const CMPIInstance* instance, const char** properties);
    CMPIStatus (*deleteInstance)(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                 const CMPIResult* result, const CMPIObjectPath* path);
    CMPIStatus (*execQuery)(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* result,
                            const CMPIObjectPath* classPath, const char* query,
                            const char* language);
#ifdef CMPI_VER_210
    CMPIStatus (*enumerateInstancesFiltered)(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                             const CMPIResult* result,
                                             const CMPIObjectPath* classPath,
                                             const char** properties, const char* filterLanguage,
                                             const char* filterText, CMPIStatus* status);
#endif
};

struct _CMPIAssociationMI {
    const void* hdl;
    const CMPIAssociationMIFT* ft;
};

/* Association provider. A filter class or role that is NULL means "any". */
struct _CMPIAssociationMIFT {
    CMPIVersion ftVersion;
    int miVersion;
    const char* miName;
    CMPIStatus (*cleanup)(CMPIAssociationMI* mi, const CMPIContext* ctx, CMPIBoolean terminating);
    CMPIStatus (*associators)(CMPIAssociationMI* mi, const CMPIContext* ctx,
                              const CMPIResult* result, const CMPIObjectPath* path,
                              const char* assocClass, const char* resultClass, const char* role,
                              const char* resultRole, const char** properties);
    CMPIStatus (*associatorNames)(CMPIAssociationMI* mi, const CMPIContext* ctx,
                                  const CMPIResult* result, const CMPIObjectPath* path,
                                  const char* assocClass, const char* resultClass, const char* role,
                                  const char* resultRole);
    CMPIStatus (*references)(CMPIAssociationMI* mi, const CMPIContext* ctx,
                             const CMPIResult* result, const CMPIObjectPath* path,
                             const char* resultClass, const char* role, const char** properties);
    CMPIStatus (*referenceNames)(CMPIAssociationMI* mi, const CMPIContext* ctx,
                                 const CMPIResult* result, const CMPIObjectPath* path,
                                 const char* resultClass, const char* role);
#ifdef CMPI_VER_210
    CMPIStatus (*associatorsFiltered)(CMPIAssociationMI* mi, const CMPIContext* ctx,
                                      const CMPIResult* result, const CMPIObjectPath* path,
                                      const char* assocClass, const char* resultClass,
                                      const char* role, const char* resultRole,
                                      const char** properties, const char* filterLanguage,
                                      const char* filterText, CMPIBoolean continueOnError);
    CMPIStatus (*referencesFiltered)(CMPIAssociationMI* mi, const CMPIContext* ctx,
                                     const CMPIResult* result, const CMPIObjectPath* path,
                                     const char* resultClass, const char* role,
                                     const char** properties, const char* filterLanguage,
                                     const char* filterText, CMPIBoolean continueOnError);
#endif
};

struct _CMPIMethodMI {
    const void* hdl;
    const CMPIMethodMIFT* ft;
};

/* Method provider. */
struct _CMPIMethodMIFT {
    CMPIVersion ftVersion;
    int miVersion;
    const char* miName;
    CMPIStatus (*cleanup)(CMPIMethodMI* mi, const CMPIContext* ctx, CMPIBoolean terminating);
    /* The return value goes to result, output arguments to out. */
    CMPIStatus (*invokeMethod)(CMPIMethodMI* mi, const CMPIContext* ctx, const CMPIResult* result,
                               const CMPIObjectPath* path, const char* method, const CMPIArgs* in,
                               CMPIArgs* out);
};

struct _CMPIPropertyMI {
    const void* hdl;
    const CMPIPropertyMIFT* ft;
};

/* Property provider (deprecated; new providers serve instances). */
struct _CMPIPropertyMIFT {
    CMPIVersion ftVersion;
    int miVersion;
    const char* miName;
    CMPIStatus (*cleanup)(CMPIPropertyMI* mi, const CMPIContext* ctx, CMPIBoolean terminating);
    CMPIStatus (*setProperty)(CMPIPropertyMI* mi, const CMPIContext* ctx, const CMPIResult* result,
                              const CMPIObjectPath* path, const char* name, CMPIData data);
    CMPIStatus (*getProperty)(CMPIPropertyMI* mi, const CMPIContext* ctx, const CMPIResult* result,
                              const CMPIObjectPath* path, const char* name);
#ifdef CMPI_VER_200
    CMPIStatus (*setPropertyWithOrigin)(CMPIPropertyMI* mi, const CMPIContext* ctx,
                                        const CMPIResult* result, CMPIObjectPath* path,
                                        const char* name, CMPIData data, const char* origin);
#endif
};

struct _CMPIIndicationMI {
    const void* hdl;
    const CMPIIndicationMIFT* ft;
};

/* Indication provider. */
struct _CMPIIndicationMIFT {
    CMPIVersion ftVersion;
    int miVersion;
    const char* miName;
    CMPIStatus (*cleanup)(CMPIIndicationMI* mi, const CMPIContext* ctx, CMPIBoolean terminating);
    /* Whether owner may have such a subscription. */
    CMPIStatus (*authorizeFilter)(CMPIIndicationMI* mi, const CMPIContext* ctx,
                                  const CMPISelectExp* filter, const char* className,
                                  const CMPIObjectPath* classPath, const char* owner);
    /* Whether the manager has to poll for this filter. */
    CMPIStatus (*mustPoll)(CMPIIndicationMI* mi, const CMPIContext* ctx, const CMPIResult* result,
                           const CMPISelectExp* filter, const char* className,
                           const CMPIObjectPath* classPath);
    /* Starts watching; first when no such filter was active. */
    CMPIStatus (*activateFilter)(CMPIIndicationMI* mi, const CMPIContext* ctx,
                                 const CMPISelectExp* filter, const char* className,
                                 const CMPIObjectPath* classPath, CMPIBoolean first);
    /* Stops watching; last when none remains active. */
    CMPIStatus (*deActivateFilter)(CMPIIndicationMI* mi, const CMPIContext* ctx,
                                   const CMPISelectExp* filter, const char* className,
                                   const CMPIObjectPath* classPath, CMPIBoolean last);
    /* From now on indications may be delivered. */
    CMPIStatus (*enableIndications)(CMPIIndicationMI* mi, const CMPIContext* ctx);
    /* No indications from now on. */
    CMPIStatus (*disableIndications)(CMPIIndicationMI* mi, const CMPIContext* ctx);
#ifdef CMPI_VER_210
    CMPIStatus (*authorizeFilterCollection)(CMPIIndicationMI* mi, const CMPIContext* ctx,
                                            const CMPIInstance* collection);
    CMPIStatus (*activateFilterCollection)(CMPIIndicationMI* mi, const CMPIContext* ctx,
                                           const CMPIInstance* collection, CMPIBoolean first);
    CMPIStatus (*deActivateFilterCollection)(CMPIIndicationMI* mi, const CMPIContext* ctx,
                                             const CMPIInstance* collection, CMPIBoolean last);
#endif
};

#ifdef __cplusplus
}
#endif

#endif /* _CMPIFT_MI_H_ */
