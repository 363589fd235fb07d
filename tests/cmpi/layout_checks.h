/*
 * Compile-time checks of sizes, offsets and constants, for C and C++.
 */
#ifndef PLEXOR_TESTS_CMPI_LAYOUT_CHECKS_H
#define PLEXOR_TESTS_CMPI_LAYOUT_CHECKS_H

#include <assert.h>
#include <stddef.h>
#ifdef __cplusplus
#include <type_traits>
#endif

#include "cmpidt.h"
#include "cmpift.h"

#ifdef CMPI_VER_210
#define BY_VERSION(v100, v200, v210) (v210)
#elif defined(CMPI_VER_200)
#define BY_VERSION(v100, v200, v210) (v200)
#else
#define BY_VERSION(v100, v200, v210) (v100)
#endif

#ifndef PLEXOR_CONTEXT_FLUSH
#define PLEXOR_CONTEXT_FLUSH 0
#endif
#if PLEXOR_CONTEXT_FLUSH
#define WITH_FLUSH(without, with) (with)
#else
#define WITH_FLUSH(without, with) (without)
#endif

#define SIZE(type, size) static_assert(sizeof(type) == (size), "size of " #type);

/* A member of a structure: where it stands and how long it is. */
#define MEMBER(type, member, offset, size)                                             \
    static_assert(offsetof(type, member) == (offset), "offset of " #type "." #member); \
    static_assert(sizeof(((type*)0)->member) == (size), "size of " #type "." #member);

#define VALUE(name, value) static_assert((name) == (value), "value of " #name);

/* A number type: its length, and whether it has negative values or fractions. */
#define SIGNED(type, size) SIZE(type, size) static_assert((type)-1 < (type)1, #type " is signed");
#define UNSIGNED(type, size) \
    SIZE(type, size) static_assert((type)-1 > (type)1, #type " is unsigned");
#ifdef __cplusplus
#define HAS_FRACTIONS(type) std::is_floating_point_v<type>
#else
#define HAS_FRACTIONS(type) _Generic((type)0, float : 1, double : 1, default : 0)
#endif
#define FLOATING(type, size) \
    SIZE(type, size) static_assert(HAS_FRACTIONS(type), #type " has fractions");

#endif
