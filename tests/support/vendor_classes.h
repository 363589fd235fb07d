// The CIM classes that a RAID vendor implements, and the vendor's subclasses of them.
#pragma once

#include <string>
#include <string_view>

#include "repository.h"

namespace plexortest {

/// The vendor's namespace.
inline constexpr char kVendorNamespace[] = "root/sample";

/// Defines the CIM classes, and below each that a vendor has instances of a class named Sample_ and
/// the CIM name without CIM_.
void defineVendorClasses(testbed::Repository& repository, std::string_view nameSpace);

/// The vendor's subclass of a CIM class: "Sample_DiskDrive" for "CIM_DiskDrive".
std::string vendorClass(std::string_view cimClass);

}  // namespace plexortest
