/*
 * Convenience layer over the function tables: status helpers, one call per table entry, message
 * inserts, and the stubs that make a provider's tables and factories.
 *
 * The calls are inline functions, or macros when CMPI_NO_INLINE is defined. The statements and
 * the type-independent calls in this file are macros in both forms.
 */
#ifndef _CMPIMACS_H_
#define _CMPIMACS_H_

#include "cmpift.h"

#if defined(CMPI_INLINE) && defined(CMPI_NO_INLINE)
#error "CMPI_INLINE and CMPI_NO_INLINE exclude each other."
#endif

#ifdef CMPI_NO_INLINE
#include "cmpimacs_macro.h"
#else
#ifndef CMPI_INLINE
#define CMPI_INLINE
#endif
#include "cmpimacs_inline_broker.h"
#include "cmpimacs_inline_objects.h"
#endif

#include "cmpimacs_stubs.h"

/* Leaves the enclosing function, which returns CMPIStatus. */
#define CMReturn(code)                         \
    do {                                       \
        CMPIStatus cmReturn_ = {(code), NULL}; \
        return cmReturn_;                      \
    } while (0)

/* The same with a message, which stays the manager's. */
#define CMReturnWithString(code, string)           \
    do {                                           \
        CMPIStatus cmReturn_ = {(code), (string)}; \
        return cmReturn_;                          \
    } while (0)

/* The same with a text; without a broker the message is NULL. */
#define CMReturnWithChars(broker, code, text)                                               \
    do {                                                                                    \
        CMPIStatus cmReturn_ = {(code), NULL};                                              \
        const CMPIBroker* cmReturnBroker_ = (broker);                                       \
        if (cmReturnBroker_ != NULL) {                                                      \
            cmReturn_.msg = cmReturnBroker_->eft->newString(cmReturnBroker_, (text), NULL); \
        }                                                                                   \
        return cmReturn_;                                                                   \
    } while (0)

/* Copy of any object that has a clone entry; the caller releases it. NULL on failure. */
#define CMClone(object, st) ((object)->ft->clone((object), (st)))

/* Frees a clone. Nothing else may be passed. */
#define CMRelease(object) ((object)->ft->release((object)))

/* Translated message; inserts is one of the CMFmtArgs lists. */
#define CMGetMessage(broker, id, defaultText, st, inserts) \
    ((broker)->eft->getMessage((broker), (id), (defaultText), (st), inserts))

#ifdef CMPI_VER_200
/* The same from a catalogue that CMOpenMessageFile opened. */
#define CMGetMessage2(broker, id, handle, defaultText, st, inserts) \
    ((broker)->eft->getMessage2((broker), (id), (handle), (defaultText), (st), inserts))
#endif

/*
 * Message inserts: a count, then for each insert its type and its value. The lists go into a
 * variable argument list, so the casts fix the type that the receiver reads back.
 */
#define CMFmtSint(v) CMPI_sint32, (long int)(v)
#define CMFmtUint(v) CMPI_uint32, (unsigned long int)(v)
#define CMFmtSint64(v) CMPI_sint64, (long long int)(v)
#define CMFmtUint64(v) CMPI_uint64, (unsigned long long int)(v)
#define CMFmtReal(v) CMPI_real64, (double)(v)
#define CMFmtBoolean(v) CMPI_boolean, (int)(v)
#define CMFmtChars(v) CMPI_chars, (char*)(v)
#define CMFmtString(v) CMPI_string, (CMPIString*)(v)

#define CMFmtArgs0() 0
#define CMFmtArgs1(a1) 1, a1
#define CMFmtArgs2(a1, a2) 2, a1, a2
#define CMFmtArgs3(a1, a2, a3) 3, a1, a2, a3
#define CMFmtArgs4(a1, a2, a3, a4) 4, a1, a2, a3, a4
#define CMFmtArgs5(a1, a2, a3, a4, a5) 5, a1, a2, a3, a4, a5
#define CMFmtArgs6(a1, a2, a3, a4, a5, a6) 6, a1, a2, a3, a4, a5, a6
#define CMFmtArgs7(a1, a2, a3, a4, a5, a6, a7) 7, a1, a2, a3, a4, a5, a6, a7
#define CMFmtArgs8(a1, a2, a3, a4, a5, a6, a7, a8) 8, a1, a2, a3, a4, a5, a6, a7, a8
#define CMFmtArgs9(a1, a2, a3, a4, a5, a6, a7, a8, a9) 9, a1, a2, a3, a4, a5, a6, a7, a8, a9
#define CMFmtArgs10(a1, a2, a3, a4, a5, a6, a7, a8, a9, a10) \
    10, a1, a2, a3, a4, a5, a6, a7, a8, a9, a10

#endif /* _CMPIMACS_H_ */
