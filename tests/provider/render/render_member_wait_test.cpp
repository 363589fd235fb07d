// A volume's member drive whose record is not there yet: the renderer waits for it.
#include <cstdlib>
#include <string>
#include <thread>

#include "PlexorProviderIfc.h"
#include "PlexorProviderUtilLife.h"
#include "owned_text.h"
#include "render_recorder.h"
#include "serve_fixture.h"

namespace plexortest {
namespace {

class RenderMemberWait : public ServeTest {
protected:
    void SetUp() override {
        ServeTest::SetUp();
        ctrl = attach(newController("C0"));
        volume = attach(ctrl, newVolume("1", "pool1"));
        pool = attach(ctrl, newPool("pool1"));
        for (const char* id : {"d1", "late", "d3"}) addMember(pool, id);
        attach(ctrl, newDisk("d1"));
        attach(ctrl, newDisk("d3"));
    }
    /// Lets another thread append the drive's record when it has been missed that often.
    void appearAfterMisses(const char* id, int misses) {
        missed = 0;
        const std::string miss = std::string("FindDiskByDeviceID: can not find disk ") + id + " ";
        CapturedSyslog::onLine([this, id, miss, misses](const LogLine& line) {
            if (!line.text.starts_with(miss)) return;
            missed++;
            if (missed == misses) std::thread([this, id] { attach(ctrl, newDisk(id)); }).join();
            // A renderer that never ends must not fill the memory with its log.
            if (missed > misses + 1000) std::abort();
        });
    }
    static size_t lookupsOf(const char* id, const char* outcome) {
        size_t found = 0;
        for (const LogLine& line : CapturedSyslog::lines()) {
            if (!line.text.starts_with(std::string("FindDiskByDeviceID: ") + outcome)) continue;
            if (line.text.find(std::string(" ") + id + " ") != std::string::npos) found++;
        }
        return found;
    }

    RaidController_t* ctrl = nullptr;
    StorageVolume_t* volume = nullptr;
    StoragePool_t* pool = nullptr;
    int missed = 0;
};

constexpr const char* kNameOfAll =
    "RAID5 Volume 1 Logical Volume 1 on controller C0, Drives(d1,late,d3) - OPTIMAL";

TEST_F(RenderMemberWait, TheSameMemberIsLookedUpAgainUntilItAppears) {
    for (const int misses : {1, 5, 200}) {
        CapturedSyslog::clear();
        appearAfterMisses("late", misses);
        EXPECT_EQ(kNameOfAll, valueOf(rowsOf(FillVolumeInstance, ctrl, volume), "ElementName"));
        EXPECT_EQ(static_cast<size_t>(misses), lookupsOf("late", "can not find"));
        EXPECT_EQ(1u, lookupsOf("late", "found"));
        // The walk went on from there, without a second look at the others.
        EXPECT_EQ(1u, lookupsOf("d1", "found"));
        EXPECT_EQ(1u, lookupsOf("d3", "found"));
        DeleteDisk(ctrl, ctrl->DiskList->Tail->Data);
    }
}

TEST_F(RenderMemberWait, ARequestIsAnsweredWhenTheRecordAppears) {
    appearAfterMisses("late", 3);
    const testbed::Response response = client().enumerateInstances("Tovexa_PlexorStorageVolume");
    ASSERT_EQ(1u, response.instances.size());
    EXPECT_EQ(kNameOfAll, property(response.instances[0], "ElementName"));
    EXPECT_EQ(1, response.doneCalls);
}

TEST_F(RenderMemberWait, NamesOfVolumesNeedNoMembers) {
    EXPECT_EQ(1u, client().enumerateInstanceNames("Tovexa_PlexorStorageVolume").paths.size());
    EXPECT_EQ(0u, lookupsOf("late", "can not find"));
}

TEST_F(RenderMemberWait, AMemberIsWaitedForUntilTheLifeOfTheRequestEnds) {
    missed = 0;
    CapturedSyslog::onLine([this](const LogLine& line) {
        if (line.text.starts_with("FindDiskByDeviceID: can not find disk late ") && ++missed == 5) {
            RequestStop();
        }
        if (missed > 1000) std::abort();
    });
    const LifeMember member;
    EXPECT_EQ("RAID5 Volume 1 Logical Volume 1 on controller C0, Drives(d1, - OPTIMAL",
              valueOf(rowsOf(FillVolumeInstance, ctrl, volume), "ElementName"));
    EXPECT_EQ(5, missed);
    EXPECT_EQ(0u, lookupsOf("d3", "found")) << "nor are the others looked for";
}

}  // namespace
}  // namespace plexortest
