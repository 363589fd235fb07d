// The three operations that clients have, asked for one drive after the other.
#pragma once

#include "instance_client.h"

namespace bench {

struct Operation {
    const char* name;
    testbed::Response (*ask)(testbed::InstanceClient client, const testbed::ObjectPath& path);
};

inline constexpr Operation kOperations[] = {
    {"names",
     [](testbed::InstanceClient client, const testbed::ObjectPath& path) {
         return client.enumerateInstanceNames(path.className);
     }},
    {"instances",
     [](testbed::InstanceClient client, const testbed::ObjectPath& path) {
         return client.enumerateInstances(path.className);
     }},
    {"get", [](testbed::InstanceClient client,
               const testbed::ObjectPath& path) { return client.getInstance(path); }},
};

}  // namespace bench
