// Compares a settled provider with the array: what clients are told, and the cache behind it.
#pragma once

#include "failures.h"
#include "instance_client.h"
#include "scenario.h"

namespace torture {

/// Answers hold every device of the array once, nothing else, and the values that a refresh
/// follows. A device whose pools have all gone may be there or not: it stays when it was cached
/// before they went, and is turned away afterwards.
void compareAnswers(testbed::InstanceClient& client, const testbed::Scenario& scenario,
                    Failures& failures);

/// The cache's pools are the array's, drives and pools agree on who belongs to whom, and drives
/// stand in the pool that the array says. No thread may be at work.
/// `anyOrder`: the manager gives associated objects in any order.
void compareCache(const testbed::Scenario& scenario, bool anyOrder, Failures& failures);

}  // namespace torture
