/*
 * Data types, constants and the names of all structures. Which of them exist depends on
 * CMPI_VERSION (100, 200 or 210), which must be the same in every file of a program.
 */
#ifndef _CMPIDT_H_
#define _CMPIDT_H_

#include "cmpios.h"
#include "cmpipl.h"

#define CMPIVersion100 100
#define CMPIVersion200 200
#define CMPIVersion210 210

#ifndef CMPI_VERSION
#define CMPI_VERSION CMPIVersion210
#endif

/* CMPI_VER_n is defined when the features of version n are wanted. */
#if CMPI_VERSION == CMPIVersion100
#define CMPI_VER_100 1
#elif CMPI_VERSION == CMPIVersion200
#define CMPI_VER_100 1
#define CMPI_VER_200 1
#elif CMPI_VERSION == CMPIVersion210
#define CMPI_VER_100 1
#define CMPI_VER_200 1
#define CMPI_VER_210 1
#else
#error "CMPI_VERSION must be 100, 200 or 210."
#endif

/* The newest version that these declarations know, whatever was chosen. */
#define CMPICurrentVersion CMPIVersion210

#include "cmpidt_constants.h"
#ifdef CMPI_VER_200
#include "cmpidt_errors.h"
#endif

#ifdef __cplusplus
extern "C" {
#endif

/* Scalars of CIM. A CMPIBoolean is false when 0 and true otherwise. */
typedef unsigned char CMPIBoolean;
typedef unsigned short CMPIChar16;
typedef unsigned char CMPIUint8;
typedef unsigned short CMPIUint16;
typedef unsigned int CMPIUint32;
typedef unsigned long long CMPIUint64;
typedef signed char CMPISint8;
typedef short CMPISint16;
typedef signed int CMPISint32;
typedef long long CMPISint64;
typedef float CMPIReal32;
typedef double CMPIReal64;

/* Counts, CMPI_ type codes, value state flags, invocation flags, versions. */
typedef unsigned int CMPICount;
typedef unsigned short CMPIType;
typedef unsigned short CMPIValueState;
typedef unsigned int CMPIFlags;
typedef int CMPIVersion;

/* Message catalogue opened by the broker; opaque. */
typedef void* CMPIMsgFileHandle;

/* Mark in the broker's allocations; opaque. */
typedef void CMPIGcStat;

/* Thread body, one-time initialiser, destructor of a per-thread value. */
typedef CMPI_THREAD_RETURN(CMPI_THREAD_CDECL* CMPIThreadFunc)(void* opaque);
typedef void (*CMPIThreadOnceFunc)(void);
typedef void (*CMPIThreadKeyCleanupFunc)(void* value);

/* The objects and their function tables; cmpift.h completes them. */
typedef struct _CMPIBroker CMPIBroker;
typedef struct _CMPIBrokerFT CMPIBrokerFT;
typedef struct _CMPIBrokerEncFT CMPIBrokerEncFT;
typedef struct _CMPIBrokerExtFT CMPIBrokerExtFT;
typedef struct _CMPIContext CMPIContext;
typedef struct _CMPIContextFT CMPIContextFT;
typedef struct _CMPIResult CMPIResult;
typedef struct _CMPIResultFT CMPIResultFT;
typedef struct _CMPIString CMPIString;
typedef struct _CMPIStringFT CMPIStringFT;
typedef struct _CMPIArray CMPIArray;
typedef struct _CMPIArrayFT CMPIArrayFT;
typedef struct _CMPIEnumeration CMPIEnumeration;
typedef struct _CMPIEnumerationFT CMPIEnumerationFT;
typedef struct _CMPIInstance CMPIInstance;
typedef struct _CMPIInstanceFT CMPIInstanceFT;
typedef struct _CMPIObjectPath CMPIObjectPath;
typedef struct _CMPIObjectPathFT CMPIObjectPathFT;
typedef struct _CMPIArgs CMPIArgs;
typedef struct _CMPIArgsFT CMPIArgsFT;
typedef struct _CMPIDateTime CMPIDateTime;
typedef struct _CMPIDateTimeFT CMPIDateTimeFT;
typedef struct _CMPISelectExp CMPISelectExp;
typedef struct _CMPISelectExpFT CMPISelectExpFT;
typedef struct _CMPISelectCond CMPISelectCond;
typedef struct _CMPISelectCondFT CMPISelectCondFT;
typedef struct _CMPISubCond CMPISubCond;
typedef struct _CMPISubCondFT CMPISubCondFT;
typedef struct _CMPIPredicate CMPIPredicate;
typedef struct _CMPIPredicateFT CMPIPredicateFT;
#ifdef CMPI_VER_200
typedef struct _CMPIBrokerMemFT CMPIBrokerMemFT;
typedef struct _CMPIError CMPIError;
typedef struct _CMPIErrorFT CMPIErrorFT;
#endif
#ifdef CMPI_VER_210
typedef struct _CMPIPropertyList CMPIPropertyList;
typedef struct _CMPIPropertyListFT CMPIPropertyListFT;
typedef struct _CMPIEnumerationFilter CMPIEnumerationFilter;
typedef struct _CMPIEnumerationFilterFT CMPIEnumerationFilterFT;
#endif

/* Untyped data of a given length; the memory is the owner's of the value. */
typedef struct _CMPIValuePtr {
    void* ptr;
    CMPICount length;
} CMPIValuePtr;

/*
 * One value of any type; the CMPIType that travels with it tells the member. Assign by member
 * name: the order of the members is not the same everywhere, so a brace initialiser is not
 * portable. All members start at offset 0.
 */
typedef union _CMPIValue {
    CMPIBoolean boolean;
    CMPIChar16 char16;
    CMPIUint8 uint8;
    CMPIUint16 uint16;
    CMPIUint32 uint32;
    CMPIUint64 uint64;
    CMPISint8 sint8;
    CMPISint16 sint16;
    CMPISint32 sint32;
    CMPISint64 sint64;
    CMPIReal32 real32;
    CMPIReal64 real64;
    CMPIInstance* inst;
    CMPIObjectPath* ref;
    CMPIArgs* args;
    CMPISelectExp* filter;
    CMPIEnumeration* Enum;
    CMPIArray* array;
    CMPIString* string;
    char* chars;
    CMPIDateTime* dateTime;
    CMPIValuePtr dataPtr;
    /* Old names of the signed integers and the reals. */
    CMPISint8 Byte;
    CMPISint16 Short;
    CMPISint32 Int;
    CMPISint64 Long;
    CMPIReal32 Float;
    CMPIReal64 Double;
} CMPIValue;

/* A value with its type and the CMPI_nullValue, CMPI_keyValue, ... flags. */
typedef struct _CMPIData {
    CMPIType type;
    CMPIValueState state;
    CMPIValue value;
} CMPIData;

/* Gives the value of the named property; `opaque` comes from the evaluating caller. */
typedef CMPIData CMPIAccessor(const char* name, void* opaque);

/* Result of a call; up to 29 the numbers are CIM status codes. */
typedef enum _CMPIrc {
    CMPI_RC_OK = 0,
    CMPI_RC_ERR_FAILED = 1,
    CMPI_RC_ERR_ACCESS_DENIED = 2,
    CMPI_RC_ERR_INVALID_NAMESPACE = 3,
    CMPI_RC_ERR_INVALID_PARAMETER = 4,
    CMPI_RC_ERR_INVALID_CLASS = 5,
    CMPI_RC_ERR_NOT_FOUND = 6,
    CMPI_RC_ERR_NOT_SUPPORTED = 7,
    CMPI_RC_ERR_CLASS_HAS_CHILDREN = 8,
    CMPI_RC_ERR_CLASS_HAS_INSTANCES = 9,
    CMPI_RC_ERR_INVALID_SUPERCLASS = 10,
    CMPI_RC_ERR_ALREADY_EXISTS = 11,
    CMPI_RC_ERR_NO_SUCH_PROPERTY = 12,
    CMPI_RC_ERR_TYPE_MISMATCH = 13,
    CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED = 14,
    CMPI_RC_ERR_INVALID_QUERY = 15,
    CMPI_RC_ERR_METHOD_NOT_AVAILABLE = 16,
    CMPI_RC_ERR_METHOD_NOT_FOUND = 17,
    CMPI_RC_NO_MORE_ELEMENTS = 18,
    CMPI_RC_ERR_SERVER_LIMITS_EXCEEDED = 27,
    CMPI_RC_ERR_QUERY_FEATURE_NOT_SUPPORTED = 29,
    /* Answers of a cleanup only: not now; not before the manager ends. */
    CMPI_RC_DO_NOT_UNLOAD = 50,
    CMPI_RC_NEVER_UNLOAD = 51,
    /* Misuse of the interface itself. */
    CMPI_RC_ERR_INVALID_HANDLE = 60,
    CMPI_RC_ERR_INVALID_DATA_TYPE = 61,
    CMPI_RC_ERR_NOT_IN_CODEPAGE = 62,
    /* Reserved for errors of the operating system. */
    CMPI_RC_ERROR_SYSTEM = 100,
    CMPI_RC_ERROR = 200,
} CMPIrc;

/* Result with an optional message (NULL: none). The message is the manager's. */
typedef struct _CMPIStatus {
    CMPIrc rc;
    CMPIString* msg;
} CMPIStatus;

/* Operator of a predicate. */
typedef enum _CMPIPredOp {
    CMPI_PredOp_Equals = 1,
    CMPI_PredOp_NotEquals = 2,
    CMPI_PredOp_LessThan = 3,
    CMPI_PredOp_GreaterThanOrEquals = 4,
    CMPI_PredOp_GreaterThan = 5,
    CMPI_PredOp_LessThanOrEquals = 6,
    CMPI_PredOp_Isa = 7,
    CMPI_PredOp_NotIsa = 8,
    CMPI_PredOp_Like = 9,
    CMPI_PredOp_NotLike = 10,
#ifdef CMPI_VER_200
    CMPI_PredOp_Not_Null = 11,
    CMPI_PredOp_Null = 12,
    CMPI_PredOp_And = 13,
    CMPI_PredOp_Or = 14,
#endif
} CMPIPredOp;

/* Severity of a log message. The fourth name really begins with CMPI_DEV. */
typedef enum _CMPISeverity {
    CMPI_SEV_ERROR = 1,
    CMPI_SEV_INFO = 2,
    CMPI_SEV_WARNING = 3,
    CMPI_DEV_DEBUG = 4,
} CMPISeverity;

/* Verbosity of a trace message. */
typedef enum _CMPILevel {
    CMPI_LEV_INFO = 1,
    CMPI_LEV_WARNING = 2,
    CMPI_LEV_VERBOSE = 3,
} CMPILevel;

#ifdef CMPI_DEFINE_CMPISelectCondType
/* Form of a select condition; the table entries use int for it. */
typedef enum _CMPISelectCondType {
    CMPI_COND_DOC = 0,
    CMPI_COND_COD = 1,
} CMPISelectCondType;
#endif

#ifdef CMPI_VER_210
/* Codepage of a text. */
typedef enum _CMPICodepageID {
    CMPI_CPID_SYSTEM = 1,
    CMPI_CPID_USASCII = 2,
    CMPI_CPID_UTF16 = 3,
} CMPICodepageID;
#endif

#ifdef __cplusplus
}
#endif

#endif /* _CMPIDT_H_ */
