// A RAID vendor's objects, put into the repository one by one.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "repository.h"
#include "vendor_classes.h"

namespace plexortest {

/// A controller with the objects around it.
struct VendorController {
    testbed::ObjectPath port;     ///< CIM_PortController
    testbed::ObjectPath system;   ///< CIM_ComputerSystem, source of the device walks
    testbed::ObjectPath package;  ///< CIM_PhysicalPackage
};

/// A drive with the objects around it.
struct VendorDrive {
    testbed::ObjectPath drive;
    testbed::ObjectPath extent;
    testbed::ObjectPath software;
    testbed::ObjectPath package;
    testbed::ObjectPath slot;
};

struct VendorVolume {
    testbed::ObjectPath volume;
    testbed::ObjectPath setting;
};

/// Builders. Each puts an instance with its key properties and the values named here into the
/// repository, ties it to what it belongs to, and returns its path. Change what differs afterwards
/// with Repository::setProperty, eraseProperty, remove, dissociate. Properties have the types of
/// the CIM schema: uint16 arrays for OperationalStatus, ExtentStatus and Classifications.
class VendorObjects {
public:
    /// Defines the vendor's classes in root/sample and root/interop, and the host class in
    /// root/cimv2.
    explicit VendorObjects(testbed::Repository& repository);

    /// The OMC_UnitaryComputerSystem of root/cimv2, with that Name; ElementName is "host" and
    /// CreationClassName "OMC_UnitaryComputerSystem".
    testbed::ObjectPath host(const std::string& name = "host-uuid");
    /// A CIM_RegisteredProfile of root/interop; organization 11, version "1.0.0".
    testbed::ObjectPath profile(const std::string& name = "Host Hardware RAID Controller",
                                const std::string& instanceID = "profile-1");

    /// A port controller without anything around it.
    testbed::ObjectPath portController(const std::string& deviceID);
    /// Port controller, computer system "system-<id>" (status 2), package (model "Model <id>",
    /// health 5), the associations between them, and the one from `profile` when that has a class.
    VendorController controller(const std::string& deviceID,
                                const testbed::ObjectPath& profile = {});
    /// Software of a computer system (or drive): InstanceID is "software-<version>".
    testbed::ObjectPath software(const testbed::ObjectPath& system, std::uint16_t classification,
                                 const std::string& version);
    /// PoolID "Pool <id>", total 1000, remaining 400, status 2.
    testbed::ObjectPath pool(const VendorController& controller, const std::string& instanceID,
                             bool primordial = false);
    /// Status 2.
    testbed::ObjectPath chassis(const VendorController& controller, const std::string& tag);
    /// Name "Disk <id>", EnabledState 2, status 2; extent "extent-<id>": 2000 and 1000 blocks,
    /// ExtentStatus 2, in `pool`; firmware "FW-<id>"; package, slot with that number, in `chassis`.
    /// A pool or chassis without a class is left out.
    VendorDrive drive(const VendorController& controller, const std::string& deviceID,
                      const testbed::ObjectPath& pool = {}, const testbed::ObjectPath& chassis = {},
                      std::uint16_t slot = 0);
    /// ElementName "Volume <id>", Name "Name <id>", NameFormat 2, NameNameSpace 7, 5000 and 100
    /// blocks, redundancy 1 and 2, DeltaReservation 3, based on redundancy, not primordial, status
    /// 2, ExtentStatus 2; setting with that RAID level; from `pool`.
    VendorVolume volume(const VendorController& controller, const std::string& deviceID,
                        const testbed::ObjectPath& pool = {},
                        const std::string& raidLevel = "RAID5");
    /// ElementName "Port <id>", PortType 94, UsageRestriction 2, status 2.
    testbed::ObjectPath port(const VendorController& controller, const std::string& deviceID);
    /// BatteryStatus 3, status 2.
    testbed::ObjectPath battery(const VendorController& controller, const std::string& deviceID);
    /// A device of none of the kinds above (CIM_Fan).
    testbed::ObjectPath fan(const VendorController& controller, const std::string& deviceID);

    /// Ties two objects with the vendor's subclass of a CIM association.
    void tie(const std::string& cimAssociation, const testbed::ObjectPath& left,
             const testbed::ObjectPath& right);

    /// The path that a device of the vendor has.
    static testbed::ObjectPath devicePath(const std::string& cimClass, const std::string& deviceID);

private:
    testbed::ObjectPath device(const VendorController& controller, const std::string& cimClass,
                               const std::string& deviceID,
                               const std::vector<testbed::NamedValue>& properties);
    testbed::ObjectPath put(testbed::ObjectPath path,
                            const std::vector<testbed::NamedValue>& properties);
    void tieIfNamed(const std::string& cimAssociation, const testbed::ObjectPath& left,
                    const testbed::ObjectPath& right);
    testbed::Repository& repository_;
};

}  // namespace plexortest
