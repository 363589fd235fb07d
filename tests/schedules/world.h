// A manager with a vendor's array and the provider, for one schedule after the other in one
// process.
#pragma once

#include <set>
#include <stdexcept>
#include <string>

#include "PlexorProvider.h"
#include "broker.h"
#include "instance_client.h"
#include "repository.h"

namespace schedules {

/// What a schedule brought to light.
struct Finding : std::runtime_error {
    using std::runtime_error::runtime_error;
};

void require(bool holds, const std::string& what);

class World {
public:
    World();

    /// One call of the factory.
    void callFactory();
    CMPIrc cleanUp(bool terminating);
    /// The devices that a request names; it fails a schedule when it fails.
    std::set<std::string> names(const std::string& className);
    /// The same from their instances, each of which has to be whole.
    std::set<std::string> instances(const std::string& className);

    /// What there is of the class when everything is known.
    const std::set<std::string>& all(const std::string& className) const;
    /// Every name is one of those.
    void requireKnown(const std::string& className, const std::set<std::string>& names) const;
    /// Takes one of the array's drives out, or puts it back.
    void pullDrive();
    void returnDrive();

    /// Nothing is queued, cached, kept or misused. For the time between two lives.
    void requireNothingLeft();
    /// What there is now is no finding later.
    void acceptWhatIsLeft();

    static constexpr const char* kDrives = "Tovexa_PlexorStorageExtent";
    static constexpr const char* kVolumes = "Tovexa_PlexorStorageVolume";
    static constexpr const char* kControllers = "Tovexa_PlexorController";
    static constexpr const char* kDevices[] = {kDrives, kVolumes, "Tovexa_PlexorSASSATAPort",
                                               "Tovexa_PlexorBattery"};

private:
    testbed::Repository repository_;
    testbed::Broker broker_;
    CMPIInstanceMI provider_ = {nullptr, &instMIFT__};
    std::set<std::string> drives_, volumes_, controllers_;
    std::size_t acceptedClones_ = 0;
    testbed::Instance pulled_;
};

}  // namespace schedules
