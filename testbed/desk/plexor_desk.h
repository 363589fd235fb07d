/* A manager on the desk with a simulated RAID vendor, for programs in C that load it at run time:
 * dlopen libplexor-desk.so and look the functions up by name. The types behind the names
 * (plexor_desk_open_fn, …) are for the pointers.
 *
 * Handles belong to the caller until they are closed. Functions may be called on any thread; one
 * desk's command function on one thread at a time. No function throws. */
#ifndef PLEXOR_DESK_H
#define PLEXOR_DESK_H

#include <cmpidt.h>
#include <cmpift.h>
#include <stddef.h>

#ifdef __cplusplus
extern "C" {
#endif

typedef struct plexor_desk plexor_desk;
typedef struct plexor_desk_call plexor_desk_call;

/* Objects of the broker's at this moment, and what the provider has done wrong so far. */
typedef struct plexor_desk_books {
    size_t live;    /* all objects */
    size_t clones;  /* those that were cloned and not released */
    size_t defects; /* see plexor_desk_defect */
} plexor_desk_books;

/* A desk with that scenario file. `manager` is a list such as "large,random-order"; NULL or "" for
 * the scenario's. NULL when it cannot be had; the reason, one line, is in `error` then. */
typedef plexor_desk* plexor_desk_open_fn(const char* scenario, const char* manager, char* error,
                                         size_t error_size);
plexor_desk_open_fn plexor_desk_open;

/* To be called when the provider has been unloaded and no call is open. */
typedef void plexor_desk_close_fn(plexor_desk* desk);
plexor_desk_close_fn plexor_desk_close;

/* Good until the desk is closed. */
typedef const CMPIBroker* plexor_desk_broker_fn(plexor_desk* desk);
plexor_desk_broker_fn plexor_desk_broker;

/* A manager's call into the provider on this thread, with its context; ended on the same thread. */
typedef plexor_desk_call* plexor_desk_begin_call_fn(plexor_desk* desk);
plexor_desk_begin_call_fn plexor_desk_begin_call;
typedef const CMPIContext* plexor_desk_context_fn(plexor_desk_call* call);
plexor_desk_context_fn plexor_desk_context;
typedef void plexor_desk_end_call_fn(plexor_desk_call* call);
plexor_desk_end_call_fn plexor_desk_end_call;

/* Requests in root/cimv2, each in a call of its own. Enumerating gives the number of instances, or
 * minus the status when that is not OK. Getting asks for the instance whose name is at `index` of
 * the class's enumeration and gives the status, 6 when there is no such name. */
typedef long plexor_desk_enumerate_fn(plexor_desk* desk, CMPIInstanceMI* mi,
                                      const char* class_name);
plexor_desk_enumerate_fn plexor_desk_enumerate;
typedef int plexor_desk_get_fn(plexor_desk* desk, CMPIInstanceMI* mi, const char* class_name,
                               size_t index);
plexor_desk_get_fn plexor_desk_get;

/* One cleanup; its status. While the manager stops, the behaviour of its kind is in force. */
typedef int plexor_desk_cleanup_fn(plexor_desk* desk, CMPIInstanceMI* mi, int terminating);
plexor_desk_cleanup_fn plexor_desk_cleanup;

/* A command such as "fail drive C0 32_1". 0, or -1 with the reason in `error`. */
typedef int plexor_desk_command_fn(plexor_desk* desk, const char* command, char* error,
                                   size_t error_size);
plexor_desk_command_fn plexor_desk_command;

typedef plexor_desk_books plexor_desk_totals_fn(plexor_desk* desk);
plexor_desk_totals_fn plexor_desk_totals;
/* The text of a defect; 0, or -1 when there is none with that number. */
typedef int plexor_desk_defect_fn(plexor_desk* desk, size_t index, char* text, size_t text_size);
plexor_desk_defect_fn plexor_desk_defect;

#ifdef __cplusplus
}
#endif

#endif
