// Class names and keys of the host, of controllers and of their devices.
#include "naming.h"

namespace testbed {
namespace {

constexpr const char* kHostClass = "OMC_UnitaryComputerSystem";

ObjectPath tweakedPath(ObjectPath path, const Tweaks& tweaks) {
    for (const auto& [name, value] : tweaks.keys) path.key(name, value);
    for (const std::string& name : tweaks.omitKeys) {
        std::erase_if(path.keys, [&](const NamedValue& key) { return sameName(key.first, name); });
    }
    return path;
}

NamedValue textKey(const char* name, const std::string& text) {
    return {name, CimValue::string(text)};
}

std::string hostClassOf(const HostDescription& host) {
    return host.tweaks.className.empty() ? kHostClass : host.tweaks.className;
}

}  // namespace

Naming::Naming(const VendorDescription& vendor, const HostDescription& host)
    : vendor_(vendor), hostClass_(hostClassOf(host)), hostName_(host.id) {}

std::string Naming::vendorClass(std::string_view suffix) const {
    return vendor_.classPrefix + "_" + std::string(suffix);
}

std::string Naming::classOf(std::string_view suffix, const Tweaks& tweaks) const {
    return tweaks.className.empty() ? vendorClass(suffix) : tweaks.className;
}

ObjectPath Naming::path(std::string_view suffix, const Tweaks& tweaks,
                        std::vector<NamedValue> keys) const {
    return tweakedPath({vendor_.nameSpace, classOf(suffix, tweaks), std::move(keys)}, tweaks);
}

ObjectPath Naming::device(const ControllerDescription& controller, std::string_view suffix,
                          const std::string& deviceId, const Tweaks& tweaks) const {
    const ObjectPath owner = system(controller);
    const CimValue* name = owner.findKey("Name");
    return path(
        suffix, tweaks,
        {textKey("SystemCreationClassName", owner.className),
         textKey("SystemName", name ? name->asString() : ""),
         textKey("CreationClassName", classOf(suffix, tweaks)), textKey("DeviceID", deviceId)});
}

ObjectPath Naming::physical(std::string_view suffix, const std::string& tag,
                            const Tweaks& tweaks) const {
    return path(suffix, tweaks,
                {textKey("CreationClassName", classOf(suffix, tweaks)), textKey("Tag", tag)});
}

ObjectPath Naming::identified(const ControllerDescription& controller, std::string_view suffix,
                              const std::string& id, const Tweaks& tweaks) const {
    const std::string text =
        vendor_.classPrefix + ":" + controller.id + ":" + std::string(suffix) + ":" + id;
    return path(suffix, tweaks, {textKey("InstanceID", text)});
}

ObjectPath Naming::host(const HostDescription& host) const {
    return tweakedPath({kHostNamespace,
                        hostClass_,
                        {textKey("CreationClassName", hostClass_), textKey("Name", host.id)}},
                       host.tweaks);
}

ObjectPath Naming::profile(const ProfileDescription& profile) const {
    ObjectPath made = path("RegisteredProfile", profile.tweaks,
                           {textKey("InstanceID", vendor_.classPrefix + ":Profile:" + profile.id)});
    made.nameSpace = kProfileNamespace;
    return made;
}

ObjectPath Naming::portController(const ControllerDescription& controller) const {
    return path("PortController", controller.tweaks,
                {textKey("SystemCreationClassName", hostClass_), textKey("SystemName", hostName_),
                 textKey("CreationClassName", classOf("PortController", controller.tweaks)),
                 textKey("DeviceID", controller.id)});
}

ObjectPath Naming::system(const ControllerDescription& controller) const {
    const Tweaks& tweaks = controller.part("system");
    return path("ControllerSystem", tweaks,
                {textKey("CreationClassName", classOf("ControllerSystem", tweaks)),
                 textKey("Name", hostName_ + ":" + controller.id)});
}

ObjectPath Naming::card(const ControllerDescription& controller) const {
    return physical("ControllerCard", "Controller_" + controller.id, controller.part("package"));
}

ObjectPath Naming::software(const ControllerDescription& controller,
                            const SoftwareDescription& software) const {
    return identified(controller, "SoftwareIdentity", software.id, software.tweaks);
}

ObjectPath Naming::pool(const ControllerDescription& controller,
                        const PoolDescription& pool) const {
    return identified(controller, "StoragePool", pool.id, pool.tweaks);
}

ObjectPath Naming::enclosure(const ControllerDescription&,
                             const EnclosureDescription& enclosure) const {
    return physical("Enclosure", enclosure.tag, enclosure.tweaks);
}

ObjectPath Naming::drive(const ControllerDescription& controller,
                         const DriveDescription& drive) const {
    return device(controller, drive.interface + "Drive", drive.id, drive.tweaks);
}

ObjectPath Naming::driveExtent(const ControllerDescription& controller,
                               const DriveDescription& drive) const {
    return device(controller, "DriveExtent", "Extent_" + drive.id, drive.part("extent"));
}

ObjectPath Naming::drivePackage(const ControllerDescription& controller,
                                const DriveDescription& drive) const {
    return physical("DrivePackage", "Drive_" + controller.id + "_" + drive.id,
                    drive.part("package"));
}

ObjectPath Naming::driveSlot(const ControllerDescription& controller,
                             const DriveDescription& drive) const {
    const std::string tag = "Slot_" + controller.id + "_" + drive.enclosure + "_" +
                            std::to_string(drive.slot.value_or(0));
    return physical("DriveSlot", tag, drive.part("slotObject"));
}

ObjectPath Naming::driveFirmware(const ControllerDescription& controller,
                                 const DriveDescription& drive) const {
    return identified(controller, "DriveFirmware", drive.id, drive.part("software"));
}

ObjectPath Naming::volume(const ControllerDescription& controller,
                          const VolumeDescription& volume) const {
    return device(controller, "StorageVolume", volume.id, volume.tweaks);
}

ObjectPath Naming::volumeSetting(const ControllerDescription& controller,
                                 const VolumeDescription& volume) const {
    return identified(controller, "StorageSetting", volume.id, volume.part("setting"));
}

ObjectPath Naming::port(const ControllerDescription& controller,
                        const PortDescription& port) const {
    return device(controller, "Port", port.id, port.tweaks);
}

ObjectPath Naming::battery(const ControllerDescription& controller,
                           const BatteryDescription& battery) const {
    return device(controller, "Battery", battery.id, battery.tweaks);
}

ObjectPath Naming::other(const ControllerDescription& controller,
                         const OtherDescription& other) const {
    return device(controller, "Fan", other.id, other.tweaks);
}

}  // namespace testbed
