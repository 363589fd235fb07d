// Random changes of the vendor's array.
#pragma once

#include <random>
#include <string>

#include "broker.h"
#include "fault_listener.h"
#include "naming.h"
#include "scenario.h"

namespace modeltest {

/// Changes the scenario and, with it, the repository. The same seed gives the same changes.
class ArrayChanger {
public:
    ArrayChanger(testbed::Broker& broker, testbed::Scenario& scenario,
                 const testbed::Naming& naming, FaultListener& listener, unsigned seed);

    /// Makes one change (some fall through when there is nothing to change).
    void change();
    /// A number from 0 to `below` - 1.
    unsigned draw(unsigned below) { return below == 0 ? 0 : random_() % below; }

    static testbed::Scenario startingScenario();

private:
    using Controller = testbed::ControllerDescription;

    void changeDriveStatus(Controller& controller);
    void removeDrive(Controller& controller);
    void insertDrive(Controller& controller);
    void moveDrive(Controller& controller);
    void replaceDriveClass(Controller& controller);
    void changeVolumeStatus(Controller& controller);
    void resizeVolume(Controller& controller);
    void renameVolume(Controller& controller);
    void createVolume(Controller& controller);
    void deleteVolume(Controller& controller);
    void changeBattery(Controller& controller);
    void swapBattery(Controller& controller);
    void changePort(Controller& controller);
    void swapPort(Controller& controller);
    void createPool(Controller& controller);
    void deletePool(Controller& controller);
    void resizePool(Controller& controller);
    void failWalk(Controller& controller);
    void failExtent(Controller& controller);

    std::vector<std::string> somePools(const Controller& controller);
    std::uint16_t status();
    std::uint16_t extentStatus();

    testbed::Broker& broker_;
    testbed::Repository& repository_;
    testbed::Scenario& scenario_;
    const testbed::Naming& naming_;
    FaultListener& listener_;
    std::mt19937 random_;
    unsigned nextId_ = 100;
};

}  // namespace modeltest
