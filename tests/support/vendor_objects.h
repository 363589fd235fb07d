// Small builders that put a vendor's objects into a repository, one at a time.
//
// Everything lives in root/sample in classes "Sample_X" below "CIM_X", but the profiles (root/interop)
// and the host (root/cimv2). Each function returns the object's path; `with` adds or replaces
// properties through Repository::setProperty.
#pragma once

#include <cstdint>
#include <initializer_list>
#include <string>

#include "repository.h"

namespace plexortest {

class VendorObjects {
public:
    using Path = testbed::ObjectPath;
    using Properties = std::initializer_list<testbed::NamedValue>;

    /// Defines namespaces and classes.
    explicit VendorObjects(testbed::Repository& repository);

    /// Adds an object of `Sample_<cimSuffix>` with one key, shown as a property as well.
    Path object(const std::string& cimSuffix, const std::string& keyName, const std::string& key,
                Properties properties = {}, const std::string& nameSpace = "root/sample");
    void link(const std::string& assocClass, const Path& left, const Path& right);
    void set(const Path& path, const std::string& name, testbed::CimValue value);

    Path host(const std::string& name = "host-1", const std::string& elementName = "host.example",
              const std::string& creationClass = "OMC_UnitaryComputerSystem");
    Path profile(const std::string& id,
                 const std::string& registeredName = "Host Hardware RAID Controller");
    /// Port controller conforming to the profile.
    Path portController(const Path& profile, const std::string& deviceId);
    /// Computer system behind a port controller; OperationalStatus [2].
    Path system(const Path& portController, const std::string& name);
    Path card(const Path& portController, const std::string& model, std::uint16_t health = 5);
    Path software(const Path& owner, const std::string& id, std::uint16_t classification,
                  const std::string& version);

    Path pool(const Path& system, const std::string& instanceId, bool primordial = false);
    Path chassis(const Path& system, const std::string& tag);
    /// Drive alone; OperationalStatus [2].
    Path drive(const Path& system, const std::string& deviceId);
    Path extent(const Path& drive, const std::string& deviceId);
    /// Extent in pool.
    void inPool(const Path& extent, const Path& pool);
    /// Package and slot of a drive, in the chassis.
    Path slot(const Path& drive, const std::string& tag, std::uint16_t number);
    void inChassis(const Path& slot, const Path& chassis);
    Path volume(const Path& system, const std::string& deviceId);
    Path setting(const Path& volume, const std::string& id, const std::string& raidLevel);
    void fromPool(const Path& volume, const Path& pool);
    Path port(const Path& system, const std::string& deviceId, const std::string& name);
    Path battery(const Path& system, const std::string& deviceId, std::uint16_t batteryStatus);

    testbed::Repository& repository() { return repository_; }

private:
    testbed::Repository& repository_;
};

}  // namespace plexortest
