// What the functions say of the locks they need, for clang to check (scripts/check-locks). Other
// compilers see nothing of it.
#pragma once

#if defined(__clang__)
#define PLEXOR_LOCKS(attribute) __attribute__((attribute))
#else
#define PLEXOR_LOCKS(attribute)
#endif

// Of a variable: read and written by holders of the mutex only. For a look at a word alone
// LoadShared does.
#define PLEXOR_GUARDED_BY(mutex) PLEXOR_LOCKS(guarded_by(mutex))

// Of a function: called with these mutexes held, or without them because it takes them itself.
#define PLEXOR_HOLDS(...) PLEXOR_LOCKS(requires_capability(__VA_ARGS__))
#define PLEXOR_WITHOUT(...) PLEXOR_LOCKS(locks_excluded(__VA_ARGS__))

// Of a scoped guard, and of its functions that take and give back.
#define PLEXOR_SCOPED_LOCK PLEXOR_LOCKS(scoped_lockable)
#define PLEXOR_TAKES(...) PLEXOR_LOCKS(acquire_capability(__VA_ARGS__))
#define PLEXOR_GIVES_BACK(...) PLEXOR_LOCKS(release_capability(__VA_ARGS__))

// Of a function that clang cannot follow: one that gets a guard passed, is a guard itself, or looks
// at a guarded word without its mutex.
#define PLEXOR_LOCKS_UNCHECKED PLEXOR_LOCKS(no_thread_safety_analysis)
