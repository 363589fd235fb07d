// Profiles with controllers behind them, and the building of their records.
#pragma once

#include "vendor_fixture.h"

namespace plexortest {

class ControllerTest : public VendorTest {
protected:
    /// A registration that the building walks.
    Path addProfile(const std::string& id = "profile-1") {
        const Path path = vendor.profile(kProfileName, id);
        profiles_.Array[profiles_.Count++] = instanceAt(path);
        return path;
    }
    /// A controller with software of every kind: firmware "FW-<id>", BIOS "BIOS-<id>", driver
    /// "DRV-<id>", bundle "PKG-<id>", in this order.
    VendorController addFullController(const Path& profile, const std::string& id) {
        const VendorController controller = vendor.controller(id, profile);
        vendor.software(controller.system, 10, "FW-" + id);
        vendor.software(controller.system, 11, "BIOS-" + id);
        vendor.software(controller.system, 2, "DRV-" + id);
        vendor.software(controller.system, 13, "PKG-" + id);
        return controller;
    }
    static Path softwarePath(const std::string& version) {
        Path path = {"root/sample", "Sample_SoftwareIdentity", {}};
        path.key("InstanceID", testbed::CimValue::string("software-" + version));
        return path;
    }

    /// Releases what an earlier building left, and builds; log and calls are the building's alone.
    int build() {
        FreeList(RaidControllerList, FreeController);
        startOver();
        return BuildControllerInfo(&mi, ctx(), &profiles_);
    }
    static std::vector<RaidController_t*> controllers() {
        return recordsOf<RaidController_t>(RaidControllerList);
    }
    /// DeviceIDs of the cached controllers.
    static Texts cached() {
        Texts ids;
        for (const RaidController_t* ctrl : controllers()) ids.push_back(ctrl->DeviceID);
        return ids;
    }
    /// The text; "absent" for a null pointer.
    static std::string textOf(const char* text) { return text != nullptr ? text : "absent"; }
    /// Model, the four versions, HealthState and OperationalStatus in one text.
    static std::string summary(const RaidController_t* ctrl) {
        return textOf(ctrl->Model) + " " + textOf(ctrl->FirmwareVersion) + " " +
               textOf(ctrl->BiosVersion) + " " + textOf(ctrl->DriverVersion) + " " +
               textOf(ctrl->BundleVersion) + " " + std::to_string(ctrl->HealthState) + " " +
               std::to_string(ctrl->OperationalStatus);
    }

    Array_t profiles_ = {};
};

}  // namespace plexortest
