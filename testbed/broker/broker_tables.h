// The broker's function tables, filled in by kind of entry.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

namespace testbed {

/// prepareAttachThread, attachThread, detachThread.
void fillThreadEntries(CMPIBrokerFT& table);
/// Enumerating, getting and following associations.
void fillQueryEntries(CMPIBrokerFT& table);
/// Everything that answers "not supported".
void fillUnsupportedEntries(CMPIBrokerFT& table);

/// Makers of objects, type tests and texts.
extern const CMPIBrokerEncFT factoryTable;
/// Threads and locks of the manager: none of them is supported.
extern const CMPIBrokerExtFT systemTable;

}  // namespace testbed
