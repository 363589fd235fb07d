// The sanitizer that this is compiled with: gcc says it with macros of its own, clang has features.
#pragma once

#if defined(__has_feature)
#define PLEXOR_HAS_FEATURE(name) __has_feature(name)
#else
#define PLEXOR_HAS_FEATURE(name) 0
#endif

#if defined(__SANITIZE_ADDRESS__) || PLEXOR_HAS_FEATURE(address_sanitizer)
#define PLEXOR_ADDRESS_SANITIZER
#endif
#if defined(__SANITIZE_THREAD__) || PLEXOR_HAS_FEATURE(thread_sanitizer)
#define PLEXOR_THREAD_SANITIZER
#endif
