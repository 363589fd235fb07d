// The tables of abstract classes, of references and of value maps, and adding them to the classes.
#include "standard_qualifiers.h"

#include <algorithm>
#include <iterator>

namespace testbed {
namespace {

constexpr const char* kAbstract[] = {
    "CIM_ManagedElement",
    "CIM_ManagedSystemElement",
    "CIM_LogicalElement",
    "CIM_EnabledLogicalElement",
    "CIM_LogicalDevice",
    "CIM_Controller",
    "CIM_PowerSource",
    "CIM_System",
    "CIM_ResourcePool",
    "CIM_PhysicalElement",
    "CIM_Dependency",
    "CIM_Component",
    "CIM_ElementAllocatedFromPool",
    "CIM_LogicalIdentity",
    "CIM_SettingData",
};

struct ReferenceClass {
    const char* className;
    const char* role;
    const char* target;
};

constexpr ReferenceClass kReferences[] = {
    {"CIM_ElementConformsToProfile", "ConformantStandard", "CIM_RegisteredProfile"},
    {"CIM_ElementConformsToProfile", "ManagedElement", "CIM_ManagedElement"},
    {"CIM_LogicalIdentity", "SystemElement", "CIM_ManagedElement"},
    {"CIM_LogicalIdentity", "SameElement", "CIM_ManagedElement"},
    {"CIM_Realizes", "Antecedent", "CIM_PhysicalElement"},
    {"CIM_Realizes", "Dependent", "CIM_LogicalDevice"},
    {"CIM_ElementSoftwareIdentity", "Antecedent", "CIM_SoftwareIdentity"},
    {"CIM_ElementSoftwareIdentity", "Dependent", "CIM_ManagedElement"},
    {"CIM_HostedStoragePool", "GroupComponent", "CIM_System"},
    {"CIM_HostedStoragePool", "PartComponent", "CIM_StoragePool"},
    {"CIM_SystemPackaging", "Antecedent", "CIM_PhysicalElement"},
    {"CIM_SystemPackaging", "Dependent", "CIM_System"},
    {"CIM_SystemDevice", "GroupComponent", "CIM_System"},
    {"CIM_SystemDevice", "PartComponent", "CIM_LogicalDevice"},
    {"CIM_MediaPresent", "Antecedent", "CIM_MediaAccessDevice"},
    {"CIM_MediaPresent", "Dependent", "CIM_StorageExtent"},
    {"CIM_ConcreteComponent", "GroupComponent", "CIM_ManagedElement"},
    {"CIM_ConcreteComponent", "PartComponent", "CIM_ManagedElement"},
    {"CIM_PackageInConnector", "Antecedent", "CIM_PhysicalConnector"},
    {"CIM_PackageInConnector", "Dependent", "CIM_PhysicalPackage"},
    {"CIM_Container", "GroupComponent", "CIM_PhysicalPackage"},
    {"CIM_Container", "PartComponent", "CIM_PhysicalElement"},
    {"CIM_ElementSettingData", "ManagedElement", "CIM_ManagedElement"},
    {"CIM_ElementSettingData", "SettingData", "CIM_SettingData"},
    {"CIM_AllocatedFromStoragePool", "Antecedent", "CIM_StoragePool"},
    {"CIM_AllocatedFromStoragePool", "Dependent", "CIM_LogicalElement"},
};

/// One number of a property and what it means.
struct Meaning {
    const char* className;
    const char* property;
    const char* number;
    const char* text;
};

constexpr Meaning kMeanings[] = {
    {"CIM_ManagedSystemElement", "OperationalStatus", "0", "Unknown"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "1", "Other"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "2", "OK"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "3", "Degraded"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "4", "Stressed"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "5", "Predictive Failure"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "6", "Error"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "7", "Non-Recoverable Error"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "8", "Starting"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "9", "Stopping"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "10", "Stopped"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "11", "In Service"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "12", "No Contact"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "13", "Lost Communication"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "14", "Aborted"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "15", "Dormant"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "16", "Supporting Entity in Error"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "17", "Completed"},
    {"CIM_ManagedSystemElement", "OperationalStatus", "18", "Power Mode"},
    {"CIM_ManagedSystemElement", "HealthState", "0", "Unknown"},
    {"CIM_ManagedSystemElement", "HealthState", "5", "OK"},
    {"CIM_ManagedSystemElement", "HealthState", "10", "Degraded/Warning"},
    {"CIM_ManagedSystemElement", "HealthState", "15", "Minor failure"},
    {"CIM_ManagedSystemElement", "HealthState", "20", "Major failure"},
    {"CIM_ManagedSystemElement", "HealthState", "25", "Critical failure"},
    {"CIM_ManagedSystemElement", "HealthState", "30", "Non-recoverable error"},
    {"CIM_EnabledLogicalElement", "EnabledState", "0", "Unknown"},
    {"CIM_EnabledLogicalElement", "EnabledState", "1", "Other"},
    {"CIM_EnabledLogicalElement", "EnabledState", "2", "Enabled"},
    {"CIM_EnabledLogicalElement", "EnabledState", "3", "Disabled"},
    {"CIM_EnabledLogicalElement", "EnabledState", "4", "Shutting Down"},
    {"CIM_EnabledLogicalElement", "EnabledState", "5", "Not Applicable"},
    {"CIM_StorageExtent", "ExtentStatus", "0", "Other"},
    {"CIM_StorageExtent", "ExtentStatus", "1", "Unknown"},
    {"CIM_StorageExtent", "ExtentStatus", "2", "None/Not Applicable"},
    {"CIM_StorageExtent", "ExtentStatus", "3", "Broken"},
    {"CIM_StorageExtent", "ExtentStatus", "4", "Data Lost"},
    {"CIM_StorageExtent", "ExtentStatus", "5", "Dynamic Reconfig"},
    {"CIM_StorageExtent", "ExtentStatus", "6", "Exposed"},
    {"CIM_StorageExtent", "ExtentStatus", "7", "Fractionally Exposed"},
    {"CIM_StorageExtent", "ExtentStatus", "8", "Partially Exposed"},
    {"CIM_StorageExtent", "ExtentStatus", "9", "Protection Disabled"},
    {"CIM_StorageExtent", "ExtentStatus", "10", "Readying"},
    {"CIM_StorageExtent", "ExtentStatus", "11", "Rebuild"},
    {"CIM_StorageExtent", "ExtentStatus", "12", "Recalculate"},
    {"CIM_StorageExtent", "ExtentStatus", "13", "Spare in Use"},
    {"CIM_StorageExtent", "ExtentStatus", "14", "Verify In Progress"},
    {"CIM_StorageExtent", "ExtentStatus", "15", "In-Band Access Granted"},
    {"CIM_StorageExtent", "ExtentStatus", "16", "Imported"},
    {"CIM_StorageExtent", "ExtentStatus", "17", "Exported"},
    {"CIM_StorageExtent", "ExtentStatus", "18", "Relocating"},
    {"CIM_Battery", "BatteryStatus", "1", "Other"},
    {"CIM_Battery", "BatteryStatus", "2", "Unknown"},
    {"CIM_Battery", "BatteryStatus", "3", "Fully Charged"},
    {"CIM_Battery", "BatteryStatus", "4", "Low"},
    {"CIM_Battery", "BatteryStatus", "5", "Critical"},
    {"CIM_Battery", "BatteryStatus", "6", "Charging"},
    {"CIM_Battery", "BatteryStatus", "7", "Charging and High"},
    {"CIM_Battery", "BatteryStatus", "8", "Charging and Low"},
    {"CIM_Battery", "BatteryStatus", "9", "Charging and Critical"},
    {"CIM_Battery", "BatteryStatus", "10", "Undefined"},
    {"CIM_Battery", "BatteryStatus", "11", "Partially Charged"},
    {"CIM_Battery", "BatteryStatus", "12", "Learning"},
    {"CIM_Battery", "BatteryStatus", "13", "Overcharged"},
    {"CIM_RegisteredProfile", "RegisteredOrganization", "1", "Other"},
    {"CIM_RegisteredProfile", "RegisteredOrganization", "2", "DMTF"},
    {"CIM_RegisteredProfile", "RegisteredOrganization", "11", "SNIA"},
};

bool hasQualifier(const Qualifiers& qualifiers, const char* name) {
    return std::any_of(qualifiers.begin(), qualifiers.end(), [&](const NamedValue& qualifier) {
        return sameName(qualifier.first, name);
    });
}

void addAbstract(ClassDefinition& definition) {
    if (hasQualifier(definition.qualifiers, "Abstract")) return;
    for (const char* name : kAbstract) {
        if (sameName(name, definition.name)) {
            definition.qualifiers.emplace_back("Abstract", CimValue::boolean(true));
        }
    }
}

void addReferenceClass(const ClassDefinition& definition, PropertyDefinition& property) {
    if (property.type != CMPI_ref || !property.referenceClass.empty()) return;
    for (const ReferenceClass& row : kReferences) {
        if (sameName(row.className, definition.name) && sameName(row.role, property.name)) {
            property.referenceClass = row.target;
        }
    }
}

void addMeanings(const ClassDefinition& definition, PropertyDefinition& property) {
    if (hasQualifier(property.qualifiers, "ValueMap")) return;
    std::vector<CimValue> numbers, texts;
    for (const Meaning& row : kMeanings) {
        if (!sameName(row.className, definition.name) || !sameName(row.property, property.name)) {
            continue;
        }
        numbers.push_back(CimValue::string(row.number));
        texts.push_back(CimValue::string(row.text));
    }
    if (numbers.empty()) return;
    property.qualifiers.emplace_back("ValueMap", CimValue::array(CMPI_string, std::move(numbers)));
    property.qualifiers.emplace_back("Values", CimValue::array(CMPI_string, std::move(texts)));
}

}  // namespace

void qualifyStandardClasses(Repository& repository, const std::string& nameSpace) {
    for (const std::string& name : repository.classNames(nameSpace)) {
        auto definition = repository.findClass(nameSpace, name);
        if (!definition || !foldName(name).starts_with("cim_")) continue;
        addAbstract(*definition);
        for (PropertyDefinition& property : definition->properties) {
            addReferenceClass(*definition, property);
            addMeanings(*definition, property);
        }
        repository.defineClass(nameSpace, std::move(*definition));
    }
}

}  // namespace testbed
