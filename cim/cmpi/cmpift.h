/*
 * Object structures and function tables of the provider interface.
 *
 * Rules for all tables:
 * - `hdl` belongs to whoever made the object. The tables only grow at their end: ftVersion (in
 *   CMPIBrokerFT brokerVersion) tells how many entries an object's table has.
 * - A `status` output may be NULL. A failing call that returns a pointer returns NULL.
 * - clone makes a copy that its caller frees with release; nothing but a clone may be released.
 *   Everything else that the manager returns stays its own and lives until the MI call returns, or
 *   on an attached thread until the thread is detached, unless it is part of an object that dies
 *   earlier. What is passed in stays the caller's.
 * - A `properties` array ends with NULL; a NULL array means all properties, an empty one none.
 * - A value of type CMPI_chars is passed as the address of the characters themselves, every other
 *   type as the address of a variable of that type or of a CMPIValue.
 *
 * Build switch PLEXOR_CONTEXT_FLUSH (set it to 1 for our host): the host's context table has one
 * entry behind addEntry. A running program cannot find out whether it is there, and calling it on
 * any other manager jumps through memory behind the table; so it is declared only on request.
 */
#ifndef _CMPIFT_H_
#define _CMPIFT_H_

#include "cmpidt.h"
#include "cmpift_broker.h"
#include "cmpift_mi.h"
#include "cmpift_objects.h"
#include "cmpios.h"

#endif /* _CMPIFT_H_ */
