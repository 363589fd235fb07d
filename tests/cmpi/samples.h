/*
 * One argument of every type that the convenience layer takes. Where a call takes several of a
 * type, there are several.
 */
#ifndef PLEXOR_TESTS_CMPI_SAMPLES_H
#define PLEXOR_TESTS_CMPI_SAMPLES_H

#include "cmpidt.h"
#include "cmpift.h"

typedef struct Samples {
    CMPIContext* context;
    CMPIResult* result;
    CMPIString* string;
    CMPIArray* array;
    CMPIEnumeration* enumeration;
    CMPIInstance* instance;
    CMPIObjectPath* path;
    CMPIArgs* args;
    CMPIDateTime* dateTime;
    CMPISelectExp* selectExp;
    CMPISelectCond* selectCond;
    CMPISubCond* subCond;
    CMPIPredicate* predicate;
    CMPIBroker* broker;
    CMPIObjectPath* source;
    CMPIArgs* outArgs;
    const char** names[2];
    const char* text[6];
    CMPIStatus* status;
    CMPIValue* value;
    CMPIType type;
    CMPICount count;
    CMPIString** strings[2];
    CMPIType* types;
    CMPIPredOp* op;
    int* kind;
    CMPIArray** arrays;
    void* opaque;
    CMPISeverity severity;
    CMPILevel level;
    CMPIrc code;
    size_t bytes[2];
    CMPIUint64 microseconds;
    CMPIBoolean flag;
    CMPIMsgFileHandle handle;
    CMPIMsgFileHandle* handles;
    CMPIAccessor* accessor;
    CMPIGcStat* mark;
    char* chars;
#ifdef CMPI_VER_200
    CMPIError* error;
    CMPIErrorSeverity errorSeverity;
    CMPIErrorProbableCause cause;
    CMPIErrorType errorType;
    CMPIErrorSrcFormat format;
#endif
#ifdef CMPI_VER_210
    CMPIPropertyList* propertyList;
    CMPIEnumerationFilter* enumerationFilter;
    CMPICodepageID codepage;
#endif
} Samples;

#endif
