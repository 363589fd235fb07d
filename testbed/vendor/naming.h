// Object paths of everything that the vendor publishes, as they follow from the descriptions.
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "cim_object.h"
#include "scenario.h"

namespace testbed {

inline constexpr const char* kHostNamespace = "root/cimv2";
inline constexpr const char* kProfileNamespace = "root/interop";

/// Makes object paths. The same description always gives the same path, so an object that was
/// built at the start can be found again later. Tweaks of class and keys are taken into account.
class Naming {
public:
    Naming(const VendorDescription& vendor, const HostDescription& host);

    const std::string& nameSpace() const { return vendor_.nameSpace; }
    /// "Sample_" + suffix.
    std::string vendorClass(std::string_view suffix) const;
    std::string classOf(std::string_view suffix, const Tweaks& tweaks) const;

    ObjectPath host(const HostDescription& host) const;
    ObjectPath profile(const ProfileDescription& profile) const;

    ObjectPath portController(const ControllerDescription& controller) const;
    ObjectPath system(const ControllerDescription& controller) const;
    ObjectPath card(const ControllerDescription& controller) const;
    ObjectPath software(const ControllerDescription& controller,
                        const SoftwareDescription& software) const;
    ObjectPath pool(const ControllerDescription& controller, const PoolDescription& pool) const;
    ObjectPath enclosure(const ControllerDescription& controller,
                         const EnclosureDescription& enclosure) const;

    ObjectPath drive(const ControllerDescription& controller, const DriveDescription& drive) const;
    ObjectPath driveExtent(const ControllerDescription& controller,
                           const DriveDescription& drive) const;
    ObjectPath drivePackage(const ControllerDescription& controller,
                            const DriveDescription& drive) const;
    ObjectPath driveSlot(const ControllerDescription& controller,
                         const DriveDescription& drive) const;
    ObjectPath driveFirmware(const ControllerDescription& controller,
                             const DriveDescription& drive) const;

    ObjectPath volume(const ControllerDescription& controller,
                      const VolumeDescription& volume) const;
    ObjectPath volumeSetting(const ControllerDescription& controller,
                             const VolumeDescription& volume) const;
    ObjectPath port(const ControllerDescription& controller, const PortDescription& port) const;
    ObjectPath battery(const ControllerDescription& controller,
                       const BatteryDescription& battery) const;
    ObjectPath other(const ControllerDescription& controller, const OtherDescription& other) const;

private:
    ObjectPath path(std::string_view suffix, const Tweaks& tweaks,
                    std::vector<NamedValue> keys) const;
    ObjectPath device(const ControllerDescription& controller, std::string_view suffix,
                      const std::string& deviceId, const Tweaks& tweaks) const;
    ObjectPath physical(std::string_view suffix, const std::string& tag,
                        const Tweaks& tweaks) const;
    /// "Sample:C0:kind:id", unique among all objects that are named by an InstanceID.
    ObjectPath identified(const ControllerDescription& controller, std::string_view suffix,
                          const std::string& id, const Tweaks& tweaks) const;

    VendorDescription vendor_;
    std::string hostClass_;
    std::string hostName_;
};

}  // namespace testbed
