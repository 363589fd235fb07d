// The word for a drive's condition, and its health.
#include <string>

#include "PlexorProviderIfc.h"
#include "PlexorProviderLock.h"
#include "owned_text.h"
#include "provider_fixture.h"

namespace plexortest {
namespace {

enum Membership { kPrimordial, kNotPrimordial };

struct DriveState {
    CMPIUint16 opStatus;
    Membership membership;
    CMPIUint16 extentStatus;
    const char* word;
    CMPIUint16 health;
};

constexpr DriveState kDriveStates[] = {
    {2, kPrimordial, 13, "HOT SPARE", 5},
    {2, kPrimordial, 2, "UNCONFIGURED GOOD", 5},
    {2, kPrimordial, 0, "UNCONFIGURED GOOD", 5},
    {2, kPrimordial, 3, "UNCONFIGURED GOOD", 5},
    {2, kPrimordial, 11, "UNCONFIGURED GOOD", 5},
    {2, kPrimordial, 12, "UNCONFIGURED GOOD", 5},
    {2, kPrimordial, 14, "UNCONFIGURED GOOD", 5},
    {2, kNotPrimordial, 13, "HOT SPARE", 5},
    {2, kNotPrimordial, 11, "REBUILD", 5},
    {2, kNotPrimordial, 2, "ONLINE", 5},
    {2, kNotPrimordial, 0, "ONLINE", 5},
    {2, kNotPrimordial, 3, "ONLINE", 5},
    {2, kNotPrimordial, 10, "ONLINE", 5},
    {2, kNotPrimordial, 12, "ONLINE", 5},
    {2, kNotPrimordial, 14, "ONLINE", 5},
    {2, kNotPrimordial, 65535, "ONLINE", 5},
    {6, kPrimordial, 2, "UNCONFIGURED BAD", 10},
    {6, kPrimordial, 0, "UNCONFIGURED BAD", 10},
    {6, kPrimordial, 4, "UNCONFIGURED BAD", 10},
    {6, kPrimordial, 11, "UNCONFIGURED BAD", 10},
    {6, kPrimordial, 13, "UNCONFIGURED BAD", 10},
    {6, kPrimordial, 3, "FAILED", 30},
    {6, kNotPrimordial, 3, "FAILED", 30},
    {6, kNotPrimordial, 2, "FAILED", 30},
    {6, kNotPrimordial, 0, "FAILED", 30},
    {6, kNotPrimordial, 11, "FAILED", 30},
    {6, kNotPrimordial, 13, "FAILED", 30},
    {12, kPrimordial, 2, "OFFLINE", 20},
    {12, kPrimordial, 13, "OFFLINE", 20},
    {12, kNotPrimordial, 3, "OFFLINE", 20},
    {12, kNotPrimordial, 11, "OFFLINE", 20},
    {15, kPrimordial, 2, "UNCONFIGURED GOOD", 5},
    {15, kPrimordial, 13, "UNCONFIGURED GOOD", 5},
    {15, kNotPrimordial, 2, "UNCONFIGURED GOOD", 5},
    {15, kNotPrimordial, 11, "UNCONFIGURED GOOD", 5},
};

class RenderDriveState : public ProviderTest {
protected:
    void SetUp() override {
        ProviderTest::SetUp();
        ctrl = attach(newController("C0"));
        disk = attach(ctrl, newDisk("d1"));
    }
    /// "WORD health" of the drive as it is.
    std::string state() {
        CMPIUint16 health = 4711;
        const MutexGuard lock(ctrl->CtrlMutex);
        const char* word = GetDiskPhysicalStatus(ctrl, disk, &health);
        return std::string(word) + " " + std::to_string(health);
    }
    void become(const DriveState& state) {
        disk->OperationalStatus = state.opStatus;
        disk->ExtentStatus = state.extentStatus;
    }
    static std::string wanted(const DriveState& state) {
        return std::string(state.word) + " " + std::to_string(state.health);
    }

    RaidController_t* ctrl = nullptr;
    DiskDrive_t* disk = nullptr;
};

TEST_F(RenderDriveState, OfADriveWithoutPoolFollowsItsOwnFlag) {
    for (const DriveState& state : kDriveStates) {
        become(state);
        disk->Primordial = state.membership == kPrimordial;
        EXPECT_EQ(wanted(state), this->state())
            << "status " << state.opStatus << ", extent " << state.extentStatus;
    }
}

TEST_F(RenderDriveState, OfADriveInAPoolFollowsThePoolsFlag) {
    StoragePool_t* pool = attach(ctrl, newPool("pool1"));
    setText(disk->Pool, "pool1");
    for (const DriveState& state : kDriveStates) {
        become(state);
        pool->Primordial = state.membership == kPrimordial;
        disk->Primordial = state.membership != kPrimordial;
        EXPECT_EQ(wanted(state), this->state())
            << "status " << state.opStatus << ", extent " << state.extentStatus;
    }
}

TEST_F(RenderDriveState, OfADriveWhosePoolIsUnknownFollowsItsOwnFlag) {
    attach(ctrl, newPool("pool1"))->Primordial = 0;
    setText(disk->Pool, "POOL1");
    disk->Primordial = 1;
    disk->OperationalStatus = 2;
    disk->ExtentStatus = 2;
    EXPECT_EQ("UNCONFIGURED GOOD 5", state());
    disk->Primordial = 0;
    EXPECT_EQ("ONLINE 5", state());
}

TEST_F(RenderDriveState, OfAnyOtherStatusIsUndefined) {
    for (unsigned status = 0; status < 20; status++) {
        if (status == 2 || status == 6 || status == 12 || status == 15) continue;
        for (const CMPIUint16 extentStatus : {2, 3, 11, 13}) {
            for (const CMPIBoolean primordial : {0, 1}) {
                disk->OperationalStatus = static_cast<CMPIUint16>(status);
                disk->ExtentStatus = extentStatus;
                disk->Primordial = primordial;
                EXPECT_EQ("UNDEFINED 10", state()) << "status " << status;
            }
        }
    }
    disk->OperationalStatus = 65535;
    EXPECT_EQ("UNDEFINED 10", state());
}

}  // namespace
}  // namespace plexortest
