#include "vendor_classes.h"

namespace plexortest {
namespace {

struct CimClass {
    const char* name;
    const char* superclass;
    bool vendorHasIt;
};

constexpr CimClass kClasses[] = {
    {"CIM_ManagedElement", "", false},
    {"CIM_RegisteredProfile", "CIM_ManagedElement", true},
    {"CIM_StorageSetting", "CIM_ManagedElement", true},
    {"CIM_PhysicalElement", "CIM_ManagedElement", false},
    {"CIM_PhysicalPackage", "CIM_PhysicalElement", true},
    {"CIM_Chassis", "CIM_PhysicalPackage", true},
    {"CIM_Slot", "CIM_PhysicalElement", true},
    {"CIM_LogicalElement", "CIM_ManagedElement", false},
    {"CIM_SoftwareIdentity", "CIM_LogicalElement", true},
    {"CIM_StoragePool", "CIM_LogicalElement", true},
    {"CIM_ComputerSystem", "CIM_LogicalElement", true},
    {"CIM_LogicalDevice", "CIM_LogicalElement", false},
    {"CIM_PortController", "CIM_LogicalDevice", true},
    {"CIM_StorageExtent", "CIM_LogicalDevice", true},
    {"CIM_StorageVolume", "CIM_StorageExtent", true},
    {"CIM_DiskDrive", "CIM_LogicalDevice", true},
    {"CIM_SASSATAPort", "CIM_LogicalDevice", true},
    {"CIM_Battery", "CIM_LogicalDevice", true},
    {"CIM_Fan", "CIM_LogicalDevice", true},
    {"CIM_Dependency", "", false},
    {"CIM_Component", "", false},
    {"CIM_ElementConformsToProfile", "CIM_Dependency", true},
    {"CIM_LogicalIdentity", "CIM_Dependency", true},
    {"CIM_Realizes", "CIM_Dependency", true},
    {"CIM_ElementSoftwareIdentity", "CIM_Dependency", true},
    {"CIM_HostedStoragePool", "CIM_Dependency", true},
    {"CIM_SystemPackaging", "CIM_Dependency", true},
    {"CIM_SystemDevice", "CIM_Component", true},
    {"CIM_MediaPresent", "CIM_Dependency", true},
    {"CIM_ConcreteComponent", "CIM_Component", true},
    {"CIM_PackageInConnector", "CIM_Dependency", true},
    {"CIM_Container", "CIM_Component", true},
    {"CIM_ElementSettingData", "CIM_Dependency", true},
    {"CIM_AllocatedFromStoragePool", "CIM_Dependency", true},
};

void define(testbed::Repository& repository, std::string_view nameSpace, std::string name,
            std::string superclass) {
    testbed::ClassDefinition definition;
    definition.name = std::move(name);
    definition.superclass = std::move(superclass);
    repository.defineClass(nameSpace, std::move(definition));
}

}  // namespace

std::string vendorClass(std::string_view cimClass) {
    constexpr std::string_view kSchema = "CIM_";
    return "Sample_" + std::string(cimClass.substr(kSchema.size()));
}

void defineVendorClasses(testbed::Repository& repository, std::string_view nameSpace) {
    for (const CimClass& cimClass : kClasses) {
        define(repository, nameSpace, cimClass.name, cimClass.superclass);
        if (cimClass.vendorHasIt) {
            define(repository, nameSpace, vendorClass(cimClass.name), cimClass.name);
        }
    }
}

}  // namespace plexortest
