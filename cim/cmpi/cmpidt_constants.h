/*
 * Type codes, flags, capability masks and context entry names. All are macros, so that they can
 * be tested by the preprocessor. Included by cmpidt.h, which sets the version macros.
 */
#ifndef _CMPIDT_CONSTANTS_H_
#define _CMPIDT_CONSTANTS_H_

/*
 * Type codes: a group base plus an index inside the group. The group names are masks for tests,
 * not types. CMPI_UINT is a subset of CMPI_SINT: to tell signed from unsigned, compare codes.
 */
#define CMPI_null 0

#define CMPI_SIMPLE 2
#define CMPI_boolean (CMPI_SIMPLE + 0)
#define CMPI_char16 (CMPI_SIMPLE + 1)

#define CMPI_REAL (2 << 2)
#define CMPI_real32 ((2 + 0) << 2)
#define CMPI_real64 ((2 + 1) << 2)

#define CMPI_UINT (8 << 4)
#define CMPI_uint8 ((8 + 0) << 4)
#define CMPI_uint16 ((8 + 1) << 4)
#define CMPI_uint32 ((8 + 2) << 4)
#define CMPI_uint64 ((8 + 3) << 4)

#define CMPI_SINT ((8 + 4) << 4)
#define CMPI_sint8 ((8 + 4) << 4)
#define CMPI_sint16 ((8 + 5) << 4)
#define CMPI_sint32 ((8 + 6) << 4)
#define CMPI_sint64 ((8 + 7) << 4)
#define CMPI_INTEGER (CMPI_UINT | CMPI_SINT)

#define CMPI_ENC (16 << 8)
#define CMPI_instance ((16 + 0) << 8)
#define CMPI_ref ((16 + 1) << 8)
#define CMPI_args ((16 + 2) << 8)
#define CMPI_class ((16 + 3) << 8) /* reserved */
#define CMPI_filter ((16 + 4) << 8)
#define CMPI_enumeration ((16 + 5) << 8)
#define CMPI_string ((16 + 6) << 8)
#define CMPI_chars ((16 + 7) << 8)
#define CMPI_dateTime ((16 + 8) << 8)
#define CMPI_ptr ((16 + 9) << 8)
#define CMPI_charsptr ((16 + 10) << 8) /* reserved */

/* An array of T has the code of T with this bit added. */
#define CMPI_ARRAY (1 << 13)

#define CMPI_SIMPLEA (CMPI_ARRAY | CMPI_SIMPLE)
#define CMPI_booleanA (CMPI_ARRAY | CMPI_boolean)
#define CMPI_char16A (CMPI_ARRAY | CMPI_char16)
#define CMPI_REALA (CMPI_ARRAY | CMPI_REAL)
#define CMPI_real32A (CMPI_ARRAY | CMPI_real32)
#define CMPI_real64A (CMPI_ARRAY | CMPI_real64)
#define CMPI_UINTA (CMPI_ARRAY | CMPI_UINT)
#define CMPI_uint8A (CMPI_ARRAY | CMPI_uint8)
#define CMPI_uint16A (CMPI_ARRAY | CMPI_uint16)
#define CMPI_uint32A (CMPI_ARRAY | CMPI_uint32)
#define CMPI_uint64A (CMPI_ARRAY | CMPI_uint64)
#define CMPI_SINTA (CMPI_ARRAY | CMPI_SINT)
#define CMPI_sint8A (CMPI_ARRAY | CMPI_sint8)
#define CMPI_sint16A (CMPI_ARRAY | CMPI_sint16)
#define CMPI_sint32A (CMPI_ARRAY | CMPI_sint32)
#define CMPI_sint64A (CMPI_ARRAY | CMPI_sint64)
#define CMPI_INTEGERA (CMPI_ARRAY | CMPI_INTEGER)
#define CMPI_ENCA (CMPI_ARRAY | CMPI_ENC)
#define CMPI_instanceA (CMPI_ARRAY | CMPI_instance)
#define CMPI_refA (CMPI_ARRAY | CMPI_ref)
#define CMPI_stringA (CMPI_ARRAY | CMPI_string)
#define CMPI_charsA (CMPI_ARRAY | CMPI_chars)
#define CMPI_dateTimeA (CMPI_ARRAY | CMPI_dateTime)
#define CMPI_charsptrA (CMPI_ARRAY | CMPI_charsptr)

/* Types of keys whose exact type the manager does not know. */
#define CMPI_keyInteger CMPI_sint64
#define CMPI_keyString CMPI_string
#define CMPI_keyBoolean CMPI_boolean
#define CMPI_keyRef CMPI_ref

/* Types that occur in predicates only. They are combinations, so some coincide. */
#define CMPI_charString CMPI_string
#define CMPI_integerString (CMPI_string | CMPI_sint64)
#define CMPI_realString (CMPI_string | CMPI_real64)
#define CMPI_numericString (CMPI_string | CMPI_sint64 | CMPI_real64)
#define CMPI_booleanString (CMPI_string | CMPI_boolean)
#define CMPI_dateTimeString (CMPI_string | CMPI_dateTime)
#define CMPI_classNameString (CMPI_string | CMPI_class)
#define CMPI_nameString (CMPI_string | CMPI_dateTime)

#ifndef CMPI_NO_SYNONYM_SUPPORT
#define CMPI_Byte CMPI_sint8
#define CMPI_Short CMPI_sint16
#define CMPI_Int CMPI_sint32
#define CMPI_Long CMPI_sint64
#define CMPI_Float CMPI_real32
#define CMPI_Double CMPI_real64
#define CMPI_ByteA CMPI_sint8A
#define CMPI_ShortA CMPI_sint16A
#define CMPI_IntA CMPI_sint32A
#define CMPI_LongA CMPI_sint64A
#define CMPI_FloatA CMPI_real32A
#define CMPI_DoubleA CMPI_real64A
#endif

/* Value states. None lies in the low byte: a test narrowed to CMPIBoolean is always false. */
#define CMPI_goodValue 0
#define CMPI_nullValue (1 << 8)
#define CMPI_keyValue (2 << 8)
#define CMPI_notFound (4 << 8)
#define CMPI_badValue (0x80 << 8)

/* Invocation flags, carried in the context entry CMPIInvocationFlags. */
#define CMPI_FLAG_LocalOnly 1
#define CMPI_FLAG_DeepInheritance 2
#define CMPI_FLAG_IncludeQualifiers 4
#define CMPI_FLAG_IncludeClassOrigin 8

/*
 * Broker capabilities. A mask carries the bits of what it depends on; a capability is there when
 * (brokerCapabilities & mask) == mask.
 */
#define CMPI_MB_BasicRead 0x00000001
#define CMPI_MB_BasicWrite (0x00000002 | CMPI_MB_BasicRead)
#define CMPI_MB_InstanceManipulation (0x00000004 | CMPI_MB_BasicWrite)
#define CMPI_MB_AssociationTraversal (0x00000008 | CMPI_MB_BasicRead)
#define CMPI_MB_QueryExecution (0x00000010 | CMPI_MB_BasicRead)
#define CMPI_MB_QueryNormalization (0x00000020 | CMPI_MB_QueryExecution)
#define CMPI_MB_BasicQualifierSupport (0x00000040 | CMPI_MB_InstanceManipulation)
#define CMPI_MB_Indications (0x00000080 | CMPI_MB_BasicRead)
#define CMPI_MB_OSEncapsulationSupport 0x00000100
#ifdef CMPI_VER_200
#define CMPI_MB_Supports_MemEnhancements 0x00004000
#define CMPI_MB_Supports_Extended_Error 0x00008000
#endif
#ifdef CMPI_VER_210
#define CMPI_MB_Logging 0x00010000
#define CMPI_MB_Tracing 0x00020000
#define CMPI_MB_PropertyFiltering (0x00040000 | CMPI_MB_BasicRead)
#define CMPI_MB_CodepageConversion 0x00080000
#endif

#ifndef CMPI_NO_SYNONYM_SUPPORT
#define CMPI_MB_Class_0 CMPI_MB_BasicRead
#define CMPI_MB_Class_1 CMPI_MB_BasicWrite
#define CMPI_MB_Class_2 CMPI_MB_InstanceManipulation
#endif

/* Old bits that clash with those above: only for code that insists on them. */
#ifdef CMPI_PRE_STANDARD_CAPABILITY_SUPPORT
#define CMPI_MB_Supports_PropertyMI 0x00000100
#define CMPI_MB_Supports_IndicationMI 0x00000200
#define CMPI_MB_Supports_IndicationPolling 0x00000400
#define CMPI_MB_Supports_QueryNormalization 0x00000800
#define CMPI_MB_Supports_Qualifier 0x00001000
#define CMPI_MB_Supports_Schema 0x00003000
#endif

/* Names of context entries; all hold strings but the flags, which are CMPI_uint32. */
#define CMPIInitNameSpace "CMPIInitNameSpace"
#define CMPIInvocationFlags "CMPIInvocationFlags"
#define CMPIPrincipal "CMPIPrincipal"
#define CMPIRole "CMPIRole"
#define CMPIAcceptLanguage "CMPIAcceptLanguage"
#define CMPIContentLanguage "CMPIContentLanguage"

#endif /* _CMPIDT_CONSTANTS_H_ */
