// A simple model of what the cache must hold after each request, and of what must be logged.
//
// It knows the vendor's truth from the repository and the rules of the refresh (dependency chain,
// interval, matching by class and key, what an update reads again and what it does not), nothing of
// the provider's code.
#pragma once

#include <ctime>
#include <map>
#include <string>
#include <vector>

#include "cache_state.h"
#include "fault_listener.h"
#include "naming.h"
#include "repository.h"
#include "scenario.h"

namespace modeltest {

class CacheModel : public FaultListener {
public:
    CacheModel(testbed::Repository& repository, const testbed::Naming& naming,
               const testbed::Scenario& scenario, std::time_t interval);

    /// The first inventory, complete at `now`.
    void buildInventory(std::time_t now);
    /// A client asked for all devices of a kind (Drive, Volume, Port or Battery) at `now`.
    void request(Kind kind, std::time_t now);

    void failNextWalk(Kind kind) override { failingWalks_[kind]++; }
    void failNextExtent() override { failingExtents_++; }

    const std::vector<ControllerState>& controllers() const { return controllers_; }
    /// Change lines since the last call, in order.
    std::vector<std::string> takeLines();

private:
    struct Times {
        std::map<Kind, std::time_t> last;
    };

    void refresh(std::size_t index, Kind kind, std::time_t now);
    std::vector<testbed::Instance> walk(std::size_t index, Kind kind) const;
    void reconcile(std::size_t index, Kind kind);
    void buildAll(std::size_t index, Kind kind, const std::vector<testbed::Instance>& found);

    void build(ControllerState& ctrl, Kind kind, const testbed::Instance& inst);
    void buildPool(ControllerState& ctrl, const testbed::Instance& inst);
    void buildDrive(ControllerState& ctrl, const testbed::Instance& inst);
    void buildVolume(ControllerState& ctrl, const testbed::Instance& inst);
    void buildPort(ControllerState& ctrl, const testbed::Instance& inst);
    void buildBattery(ControllerState& ctrl, const testbed::Instance& inst);

    void updateDrive(ControllerState& ctrl, DriveState& drive, const testbed::Instance& inst);
    void updateDriveStatus(DriveState& drive, const testbed::Instance& inst,
                           const testbed::Instance& extent);
    void updateVolume(VolumeState& volume, const testbed::Instance& inst);
    void updateBattery(BatteryState& battery, const testbed::Instance& inst);

    void removePool(ControllerState& ctrl, std::size_t i);
    void removeDrive(ControllerState& ctrl, std::size_t i);
    void removeVolume(ControllerState& ctrl, std::size_t i);
    void removePort(ControllerState& ctrl, std::size_t i);
    void removeBattery(ControllerState& ctrl, std::size_t i);

    std::vector<testbed::Instance> related(const testbed::ObjectPath& path, const char* assocClass,
                                           const char* resultClass = nullptr) const;
    std::vector<std::string> poolIds(const testbed::ObjectPath& path, const char* assocClass) const;
    void line(std::string text) { lines_.push_back(std::move(text)); }

    testbed::Repository& repository_;
    const testbed::Naming& naming_;
    const testbed::Scenario& scenario_;
    std::time_t interval_;
    std::vector<ControllerState> controllers_;
    std::vector<Times> times_;
    std::map<Kind, int> failingWalks_;
    int failingExtents_ = 0;
    std::vector<std::string> lines_;
    /// Extent paths of cached drives: a drive keeps the extent it was built with.
    std::map<std::string, testbed::ObjectPath> extents_;
};

}  // namespace modeltest
