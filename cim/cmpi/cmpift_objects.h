/*
 * The encapsulated objects and their function tables. Included by cmpift.h, which states the
 * rules that hold for all tables.
 */
#ifndef _CMPIFT_OBJECTS_H_
#define _CMPIFT_OBJECTS_H_

#include "cmpidt.h"
#include "cmpios.h"

#ifdef __cplusplus
extern "C" {
#endif

struct _CMPIContext {
    const void* hdl;
    const CMPIContextFT* ft;
};

/* Named values that travel with a call. */
struct _CMPIContextFT {
    CMPIVersion ftVersion;
    CMPIStatus (*release)(CMPIContext* ctx);
    CMPIContext* (*clone)(const CMPIContext* ctx, CMPIStatus* status);
    /* Entry by name. */
    CMPIData (*getEntry)(const CMPIContext* ctx, const char* name, CMPIStatus* status);
    /* Entry by position; name (may be NULL) receives its name. */
    CMPIData (*getEntryAt)(const CMPIContext* ctx, CMPICount index, CMPIString** name,
                           CMPIStatus* status);
    CMPICount (*getEntryCount)(const CMPIContext* ctx, CMPIStatus* status);
    /* Adds a copy of the value, or replaces the entry of that name. */
    CMPIStatus (*addEntry)(const CMPIContext* ctx, const char* name, const CMPIValue* value,
                           CMPIType type);
#if defined(PLEXOR_CONTEXT_FLUSH) && PLEXOR_CONTEXT_FLUSH
    /* Our host only, see cmpift.h: gives up what the thread holds uncloned. */
    CMPIStatus (*flush)(const CMPIContext* ctx);
#endif
};

struct _CMPIResult {
    const void* hdl;
    const CMPIResultFT* ft;
};

/* Receiver of what an MI call produces. The entries take or copy their argument; ownership of
 * it does not change. */
struct _CMPIResultFT {
    CMPIVersion ftVersion;
    CMPIStatus (*release)(CMPIResult* result);
    CMPIResult* (*clone)(const CMPIResult* result, CMPIStatus* status);
    /* For values that are neither instance nor path. */
    CMPIStatus (*returnData)(const CMPIResult* result, const CMPIValue* value, CMPIType type);
    CMPIStatus (*returnInstance)(const CMPIResult* result, const CMPIInstance* instance);
    CMPIStatus (*returnObjectPath)(const CMPIResult* result, const CMPIObjectPath* path);
    /* Once, after the last item. */
    CMPIStatus (*returnDone)(const CMPIResult* result);
#ifdef CMPI_VER_200
    /* Adds an error object. */
    CMPIStatus (*returnError)(const CMPIResult* result, const CMPIError* error);
#endif
};

struct _CMPIString {
    const void* hdl;
    const CMPIStringFT* ft;
};

/* Immutable text. */
struct _CMPIStringFT {
    CMPIVersion ftVersion;
    CMPIStatus (*release)(CMPIString* string);
    CMPIString* (*clone)(const CMPIString* string, CMPIStatus* status);
    /* The characters; they live as long as the string. */
    const char* (*getCharPtr)(const CMPIString* string, CMPIStatus* status);
#ifdef CMPI_VER_210
    /* Copy in a codepage, freed with CMPIBrokerMemFT.freeChars. */
    char* (*newCharsCP)(const CMPIString* string, CMPICodepageID codepage, CMPIStatus* status);
#endif
};

struct _CMPIArray {
    const void* hdl;
    const CMPIArrayFT* ft;
};

/* Array of fixed length and element type; elements start as NULL. */
struct _CMPIArrayFT {
    CMPIVersion ftVersion;
    CMPIStatus (*release)(CMPIArray* array);
    CMPIArray* (*clone)(const CMPIArray* array, CMPIStatus* status);
    /* Number of elements. */
    CMPICount (*getSize)(const CMPIArray* array, CMPIStatus* status);
    /* Element type, without CMPI_ARRAY. */
    CMPIType (*getSimpleType)(const CMPIArray* array, CMPIStatus* status);
    CMPIData (*getElementAt)(const CMPIArray* array, CMPICount index, CMPIStatus* status);
    /* Errors: bad index CMPI_RC_ERR_NO_SUCH_PROPERTY, other type CMPI_RC_ERR_TYPE_MISMATCH. */
    CMPIStatus (*setElementAt)(const CMPIArray* array, CMPICount index, const CMPIValue* value,
                               CMPIType type);
};

struct _CMPIEnumeration {
    const void* hdl;
    const CMPIEnumerationFT* ft;
};

/* Forward-only sequence; mixing toArray with getNext on one object is undefined. */
struct _CMPIEnumerationFT {
    CMPIVersion ftVersion;
    CMPIStatus (*release)(CMPIEnumeration* enumeration);
    CMPIEnumeration* (*clone)(const CMPIEnumeration* enumeration, CMPIStatus* status);
    /* Next item; past the end CMPI_RC_NO_MORE_ELEMENTS. */
    CMPIData (*getNext)(const CMPIEnumeration* enumeration, CMPIStatus* status);
    /* Whether an item is left; false on failure too. */
    CMPIBoolean (*hasNext)(const CMPIEnumeration* enumeration, CMPIStatus* status);
    /* All items as an array; NULL on failure. */
    CMPIArray* (*toArray)(const CMPIEnumeration* enumeration, CMPIStatus* status);
};

struct _CMPIInstance {
    const void* hdl;
    const CMPIInstanceFT* ft;
};

/* Instance of a CIM class. Setters copy the value. */
struct _CMPIInstanceFT {
    CMPIVersion ftVersion;
    CMPIStatus (*release)(CMPIInstance* instance);
    CMPIInstance* (*clone)(const CMPIInstance* instance, CMPIStatus* status);
    /* A missing one is CMPI_RC_ERR_NO_SUCH_PROPERTY; one without value has CMPI_nullValue. */
    CMPIData (*getProperty)(const CMPIInstance* instance, const char* name, CMPIStatus* status);
    /* By position; name (may be NULL) receives its name. */
    CMPIData (*getPropertyAt)(const CMPIInstance* instance, CMPICount index, CMPIString** name,
                              CMPIStatus* status);
    CMPICount (*getPropertyCount)(const CMPIInstance* instance, CMPIStatus* status);
    /* A NULL value stores NULL. */
    CMPIStatus (*setProperty)(const CMPIInstance* instance, const char* name,
                              const CMPIValue* value, CMPIType type);
    /* The instance's path; NULL on failure. */
    CMPIObjectPath* (*getObjectPath)(const CMPIInstance* instance, CMPIStatus* status);
    /* Limits the instance to the named properties; keys is ignored. */
    CMPIStatus (*setPropertyFilter)(const CMPIInstance* instance, const char** properties,
                                    const char** keys);
    /* Replaces the path; properties stay as they are. */
    CMPIStatus (*setObjectPath)(const CMPIInstance* instance, const CMPIObjectPath* path);
#ifdef CMPI_VER_200
    /* As setProperty, naming the defining class too. */
    CMPIStatus (*setPropertyWithOrigin)(const CMPIInstance* instance, const char* name,
                                        const CMPIValue* value, CMPIType type, const char* origin);
#endif
};

struct _CMPIObjectPath {
    const void* hdl;
    const CMPIObjectPathFT* ft;
};

/* Reference to a class or instance: host, namespace, class, keys. Setters copy their argument.
 * Managers may leave the qualifier entries NULL. */
struct _CMPIObjectPathFT {
    CMPIVersion ftVersion;
    CMPIStatus (*release)(CMPIObjectPath* path);
    CMPIObjectPath* (*clone)(const CMPIObjectPath* path, CMPIStatus* status);
    CMPIStatus (*setNameSpace)(const CMPIObjectPath* path, const char* nameSpace);
    CMPIString* (*getNameSpace)(const CMPIObjectPath* path, CMPIStatus* status);
    CMPIStatus (*setHostname)(const CMPIObjectPath* path, const char* host);
    CMPIString* (*getHostname)(const CMPIObjectPath* path, CMPIStatus* status);
    CMPIStatus (*setClassName)(const CMPIObjectPath* path, const char* className);
    CMPIString* (*getClassName)(const CMPIObjectPath* path, CMPIStatus* status);
    /* Adds or replaces; a key is never NULL. */
    CMPIStatus (*addKey)(const CMPIObjectPath* path, const char* key, const CMPIValue* value,
                         CMPIType type);
    /* The type may be one of the generic CMPI_key types. */
    CMPIData (*getKey)(const CMPIObjectPath* path, const char* key, CMPIStatus* status);
    /* By position; name (may be NULL) receives its name. */
    CMPIData (*getKeyAt)(const CMPIObjectPath* path, CMPICount index, CMPIString** name,
                         CMPIStatus* status);
    CMPICount (*getKeyCount)(const CMPIObjectPath* path, CMPIStatus* status);
    /* Copies the namespace of source. */
    CMPIStatus (*setNameSpaceFromObjectPath)(const CMPIObjectPath* path,
                                             const CMPIObjectPath* source);
    /* Copies host name and namespace of source. */
    CMPIStatus (*setHostAndNameSpaceFromObjectPath)(const CMPIObjectPath* path,
                                                    const CMPIObjectPath* source);
    CMPIData (*getClassQualifier)(const CMPIObjectPath* path, const char* qualifier,
                                  CMPIStatus* status);
    CMPIData (*getPropertyQualifier)(const CMPIObjectPath* path, const char* name,
                                     const char* qualifier, CMPIStatus* status);
    CMPIData (*getMethodQualifier)(const CMPIObjectPath* path, const char* method,
                                   const char* qualifier, CMPIStatus* status);
    CMPIData (*getParameterQualifier)(const CMPIObjectPath* path, const char* method,
                                      const char* name, const char* qualifier, CMPIStatus* status);
    /* The path as text. */
    CMPIString* (*toString)(const CMPIObjectPath* path, CMPIStatus* status);
};

struct _CMPIArgs {
    const void* hdl;
    const CMPIArgsFT* ft;
};

/* Method arguments by name. addArg copies the value. */
struct _CMPIArgsFT {
    CMPIVersion ftVersion;
    CMPIStatus (*release)(CMPIArgs* args);
    CMPIArgs* (*clone)(const CMPIArgs* args, CMPIStatus* status);
    CMPIStatus (*addArg)(const CMPIArgs* args, const char* name, const CMPIValue* value,
                         CMPIType type);
    CMPIData (*getArg)(const CMPIArgs* args, const char* name, CMPIStatus* status);
    /* By position; name (may be NULL) receives its name. */
    CMPIData (*getArgAt)(const CMPIArgs* args, CMPICount index, CMPIString** name,
                         CMPIStatus* status);
    CMPICount (*getArgCount)(const CMPIArgs* args, CMPIStatus* status);
};

struct _CMPIDateTime {
    const void* hdl;
    const CMPIDateTimeFT* ft;
};

/* Point in time or interval. */
struct _CMPIDateTimeFT {
    CMPIVersion ftVersion;
    CMPIStatus (*release)(CMPIDateTime* dateTime);
    CMPIDateTime* (*clone)(const CMPIDateTime* dateTime, CMPIStatus* status);
    /* Microseconds since 1970 (UTC), or the interval's length. */
    CMPIUint64 (*getBinaryFormat)(const CMPIDateTime* dateTime, CMPIStatus* status);
    /* CIM datetime text. */
    CMPIString* (*getStringFormat)(const CMPIDateTime* dateTime, CMPIStatus* status);
    CMPIBoolean (*isInterval)(const CMPIDateTime* dateTime, CMPIStatus* status);
};

struct _CMPISelectExp {
    const void* hdl;
    const CMPISelectExpFT* ft;
};

/* Parsed query. */
struct _CMPISelectExpFT {
    CMPIVersion ftVersion;
    CMPIStatus (*release)(CMPISelectExp* exp);
    CMPISelectExp* (*clone)(const CMPISelectExp* exp, CMPIStatus* status);
    /* Whether the instance satisfies the query; false on failure too. */
    CMPIBoolean (*evaluate)(const CMPISelectExp* exp, const CMPIInstance* instance,
                            CMPIStatus* status);
    /* The query's text. */
    CMPIString* (*getString)(const CMPISelectExp* exp, CMPIStatus* status);
    /* Where-clause as disjunction of conjunctions; NULL on failure. */
    CMPISelectCond* (*getDOC)(const CMPISelectExp* exp, CMPIStatus* status);
    /* Where-clause as conjunction of disjunctions; NULL on failure. */
    CMPISelectCond* (*getCOD)(const CMPISelectExp* exp, CMPIStatus* status);
    /* As evaluate; values come from accessor(name, opaque). */
    CMPIBoolean (*evaluateUsingAccessor)(const CMPISelectExp* exp, CMPIAccessor* accessor,
                                         void* opaque, CMPIStatus* status);
};

struct _CMPISelectCond {
    const void* hdl;
    const CMPISelectCondFT* ft;
};

/* Where-clause in canonical form, as disjunction (DOC) or conjunction (COD) of conditions. */
struct _CMPISelectCondFT {
    CMPIVersion ftVersion;
    CMPIStatus (*release)(CMPISelectCond* condition);
    CMPISelectCond* (*clone)(const CMPISelectCond* condition, CMPIStatus* status);
    /* Number of inner conditions; kind (may be NULL) receives 0 for DOC, 1 for COD. */
    CMPICount (*getCountAndType)(const CMPISelectCond* condition, int* kind, CMPIStatus* status);
    CMPISubCond* (*getSubCondAt)(const CMPISelectCond* condition, CMPICount index,
                                 CMPIStatus* status);
};

struct _CMPISubCond {
    const void* hdl;
    const CMPISubCondFT* ft;
};

/* One inner condition of a canonical where-clause. */
struct _CMPISubCondFT {
    CMPIVersion ftVersion;
    CMPIStatus (*release)(CMPISubCond* condition);
    CMPISubCond* (*clone)(const CMPISubCond* condition, CMPIStatus* status);
    /* Number of predicates. */
    CMPICount (*getCount)(const CMPISubCond* condition, CMPIStatus* status);
    CMPIPredicate* (*getPredicateAt)(const CMPISubCond* condition, CMPICount index,
                                     CMPIStatus* status);
    /* The predicate with this name on its left side. */
    CMPIPredicate* (*getPredicate)(const CMPISubCond* condition, const char* name,
                                   CMPIStatus* status);
};

struct _CMPIPredicate {
    const void* hdl;
    const CMPIPredicateFT* ft;
};

/* Single comparison. */
struct _CMPIPredicateFT {
    CMPIVersion ftVersion;
    CMPIStatus (*release)(CMPIPredicate* predicate);
    CMPIPredicate* (*clone)(const CMPIPredicate* predicate, CMPIStatus* status);
    /* The parts; each output may be NULL. */
    CMPIStatus (*getData)(const CMPIPredicate* predicate, CMPIType* type, CMPIPredOp* op,
                          CMPIString** lhs, CMPIString** rhs);
    /* Whether it holds for the values that accessor(name, opaque) gives. */
    CMPIBoolean (*evaluateUsingAccessor)(const CMPIPredicate* predicate, CMPIAccessor* accessor,
                                         void* opaque, CMPIStatus* status);
};

#ifdef CMPI_VER_200

struct _CMPIError {
    const void* hdl;
    const CMPIErrorFT* ft;
};

/* Error object with the properties of a CIM error. The setters copy their argument. */
struct _CMPIErrorFT {
    CMPIVersion ftVersion;
    CMPIStatus (*release)(CMPIError* error);
    CMPIError* (*clone)(const CMPIError* error, CMPIStatus* status);
    CMPIErrorType (*getErrorType)(const CMPIError* error, CMPIStatus* status);
    /* Text that goes with OtherErrorType. */
    CMPIString* (*getOtherErrorType)(const CMPIError* error, CMPIStatus* status);
    /* Who defined the message. */
    CMPIString* (*getOwningEntity)(const CMPIError* error, CMPIStatus* status);
    CMPIString* (*getMessageID)(const CMPIError* error, CMPIStatus* status);
    CMPIString* (*getMessage)(const CMPIError* error, CMPIStatus* status);
    CMPIErrorSeverity (*getPerceivedSeverity)(const CMPIError* error, CMPIStatus* status);
    CMPIErrorProbableCause (*getProbableCause)(const CMPIError* error, CMPIStatus* status);
    CMPIString* (*getProbableCauseDescription)(const CMPIError* error, CMPIStatus* status);
    CMPIArray* (*getRecommendedActions)(const CMPIError* error, CMPIStatus* status);
    CMPIString* (*getErrorSource)(const CMPIError* error, CMPIStatus* status);
    CMPIErrorSrcFormat (*getErrorSourceFormat)(const CMPIError* error, CMPIStatus* status);
    /* Text that goes with CMPIErrSrcOther. */
    CMPIString* (*getOtherErrorSourceFormat)(const CMPIError* error, CMPIStatus* status);
    CMPIrc (*getCIMStatusCode)(const CMPIError* error, CMPIStatus* status);
    CMPIString* (*getCIMStatusCodeDescription)(const CMPIError* error, CMPIStatus* status);
    CMPIArray* (*getMessageArguments)(const CMPIError* error, CMPIStatus* status);
    CMPIStatus (*setErrorType)(const CMPIError* error, CMPIErrorType type);
    CMPIStatus (*setOtherErrorType)(const CMPIError* error, const char* text);
    CMPIStatus (*setProbableCauseDescription)(const CMPIError* error, const char* text);
    CMPIStatus (*setRecommendedActions)(const CMPIError* error, const CMPIArray* actions);
    CMPIStatus (*setErrorSource)(const CMPIError* error, const char* source);
    CMPIStatus (*setErrorSourceFormat)(const CMPIError* error, CMPIErrorSrcFormat format);
    CMPIStatus (*setOtherErrorSourceFormat)(const CMPIError* error, const char* text);
    CMPIStatus (*setCIMStatusCodeDescription)(const CMPIError* error, const char* text);
    CMPIStatus (*setMessageArguments)(const CMPIError* error, const CMPIArray* args);
};

#endif /* CMPI_VER_200 */

#ifdef CMPI_VER_210

struct _CMPIPropertyList {
    const void* hdl;
    const CMPIPropertyListFT* ft;
};

/* Parsed list of property names. */
struct _CMPIPropertyListFT {
    CMPIVersion ftVersion;
    CMPIStatus (*release)(CMPIPropertyList* list);
    CMPIPropertyList* (*clone)(const CMPIPropertyList* list, CMPIStatus* status);
    CMPIBoolean (*isPropertyInList)(const CMPIPropertyList* list, const char* name,
                                    CMPIStatus* status);
    /* The names, NULL-terminated; they live as long as the list. */
    const char** (*getProperties)(const CMPIPropertyList* list, CMPIStatus* status);
};

struct _CMPIEnumerationFilter {
    const void* hdl;
    const CMPIEnumerationFilterFT* ft;
};

/* Parsed filter for instances. */
struct _CMPIEnumerationFilterFT {
    CMPIVersion ftVersion;
    CMPIStatus (*release)(CMPIEnumerationFilter* filter);
    CMPIEnumerationFilter* (*clone)(const CMPIEnumerationFilter* filter, CMPIStatus* status);
    /* Whether the instance passes. */
    CMPIBoolean (*match)(const CMPIEnumerationFilter* filter, const CMPIInstance* instance,
                         CMPIStatus* status);
};

#endif /* CMPI_VER_210 */

#ifdef __cplusplus
}
#endif

#endif /* _CMPIFT_OBJECTS_H_ */
