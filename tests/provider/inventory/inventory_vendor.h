// A vendor with two controllers of every kind of device.
#pragma once

#include <string>
#include <vector>

#include "vendor_objects.h"

namespace plexortest {

/// Two controllers "C0" and "C1"; each has a primordial and a concrete pool, one chassis, four
/// drives in the concrete pool and in the chassis's slots, two volumes, three ports, a battery and
/// a fan. Devices appear whole: a walk that finds one finds everything around it as well.
class TwoControllers {
public:
    using Path = testbed::ObjectPath;

    explicit TwoControllers(testbed::Repository& repository) : objects_(repository) {
        objects_.host();
        const Path profile = objects_.profile();
        for (const char* id : {"C0", "C1"}) addArray(profile, id);
    }

    Path addDrive(std::size_t controller, const std::string& id) {
        const Array& array = arrays_[controller];
        const Path drive = objects_.drive(kNone, id, array.pool, array.chassis, 1).drive;
        objects_.tie("CIM_SystemDevice", array.controller.system, drive);
        return drive;
    }
    Path addVolume(std::size_t controller, const std::string& id) {
        const Array& array = arrays_[controller];
        const Path volume = objects_.volume(kNone, id, array.pool).volume;
        objects_.tie("CIM_SystemDevice", array.controller.system, volume);
        return volume;
    }

private:
    struct Array {
        VendorController controller;
        Path pool, chassis;
    };

    void addArray(const Path& profile, const std::string& id) {
        Array array;
        array.controller = objects_.controller(id, profile);
        objects_.software(array.controller.system, 10, "7.1-" + id);
        objects_.pool(array.controller, id + "-free", true);
        array.pool = objects_.pool(array.controller, id + "-pool");
        array.chassis = objects_.chassis(array.controller, id + "_E0");
        arrays_.push_back(array);
        const std::size_t index = arrays_.size() - 1;
        for (const char* number : {"0", "1", "2", "3"}) addDrive(index, id + "D" + number);
        for (const char* number : {"0", "1"}) addVolume(index, id + "V" + number);
        for (const char* number : {"0", "1", "2"}) {
            objects_.port(array.controller, id + "P" + number);
        }
        objects_.battery(array.controller, id + "B0");
        objects_.fan(array.controller, id + "F0");
    }

    inline static const VendorController kNone = {};

    VendorObjects objects_;
    std::vector<Array> arrays_;
};

}  // namespace plexortest
