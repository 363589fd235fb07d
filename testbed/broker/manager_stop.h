// How a manager stops a provider, on how many threads and with whom asking meanwhile.
#pragma once

#include <chrono>
#include <functional>

#include "provider_library.h"

namespace testbed {

/// Between two calls of a manager that repeats its stop.
constexpr std::chrono::milliseconds kStopInterval{4000};

/// Tells the provider that the manager stops, as the broker's options say. What the
/// first cleanup to return answered; all have returned then, and the provider's threads have left
/// unless they are stuck. `request` is what a client asks meanwhile, again and again, on a thread
/// of its own.
CMPIrc stopProvider(Broker& broker, const InstanceClient& client,
                    const std::function<void()>& request = {},
                    std::chrono::milliseconds interval = kStopInterval);
/// The same, and closes the library when the provider agreed.
CMPIrc stopAndUnload(Broker& broker, ProviderLibrary& library,
                     const std::function<void()>& request = {},
                     std::chrono::milliseconds interval = kStopInterval);

}  // namespace testbed
