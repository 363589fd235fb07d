// Requests that come in while a drive is built.
//
// A request renders a volume with the controller's lock in hand and waits for the record of each
// member of the volume's pool. Were a member to be seen before its record, it would wait for a
// builder that waits for the lock. Here a request comes in at the worst moment, when a drive has
// just become a member; and the lock is one that an unlock hands to the thread that waits for it.
#include <sched.h>
#include <unistd.h>

#include <fstream>

#include "PlexorProviderIfc.h"
#include "disk_fixture.h"

namespace plexortest {
namespace {

class DiskBuildUnderRequests : public DiskTest {
protected:
    static constexpr int kBuilds = 60;

    void SetUp() override {
        DiskTest::SetUp();
        makeLockFair();
        volume_ = attach(ctrl, newVolume("V1", "P1"));
        addMember(pool_, "D0");
        attach(ctrl, newDisk("D0", "P1"));
        const void* const list = pool_->Drives;
        const std::string joined = formatted(" added to the list %p, ", list);
        CapturedSyslog::onLine([this, joined](const LogLine& line) {
            if (line.text.find(joined) != std::string::npos) callForRequest();
        });
    }

    /// With priority inheritance the kernel passes the lock on to the waiting thread.
    void makeLockFair() {
        pthread_mutex_destroy(&ctrl->CtrlMutex);
        pthread_mutexattr_t attributes;
        pthread_mutexattr_init(&attributes);
        ASSERT_EQ(pthread_mutexattr_setprotocol(&attributes, PTHREAD_PRIO_INHERIT), 0);
        ASSERT_EQ(pthread_mutex_init(&ctrl->CtrlMutex, &attributes), 0);
        pthread_mutexattr_destroy(&attributes);
    }

    /// On the builder's thread, with the lock held: goes on once a request waits for it.
    void callForRequest() {
        called_ = true;
        EXPECT_TRUE(eventually([&] { return !called_ && isAsleep(requestThread_); }));
    }

    static bool isAsleep(pid_t thread) {
        std::ifstream file("/proc/self/task/" + std::to_string(thread) + "/stat");
        std::string number, name, state;
        file >> number >> name >> state;
        return state == "S";
    }

    /// On the thread of the requests.
    void serve() {
        requestThread_ = gettid();
        while (!done_) {
            if (!called_) {
                sched_yield();
                continue;
            }
            serving_ = true;
            called_ = false;
            request();
            serving_ = false;
        }
    }

    bool anyMemberWithoutRecord() const {
        const List_Entry_t* entry = pool_->Drives->Head;
        for (; entry != nullptr; entry = entry->Next)
            if (FindDiskByDeviceID(ctrl, static_cast<char*>(entry->Data)) == nullptr) return true;
        return false;
    }

    /// What a request would wait for in vain it does not render here, but counts.
    void request() {
        pthread_mutex_lock(&ctrl->CtrlMutex);
        if (anyMemberWithoutRecord()) {
            orphans_++;
        } else {
            testbed::Broker::CallScope scope(broker);
            const Path path{"root/cimv2", "Tovexa_PlexorStorageVolume", {}};
            CMPIInstance* inst = broker.makeInstance({path, {}});
            FillVolumeInstance(inst, ctrl, volume_);
            const testbed::Instance rendered = testbed::Broker::toInstance(inst);
            const testbed::CimValue* name = rendered.find("ElementName");
            complete_ += name != nullptr && name->text().find("(D0,D1)") != std::string::npos;
        }
        pthread_mutex_unlock(&ctrl->CtrlMutex);
    }

    void buildAndDelete() {
        ASSERT_EQ(buildDisk(), 0);
        while (serving_) sched_yield();
        void* built = ctrl->DiskList->Tail->Data;
        ASSERT_EQ(DeleteDisk(ctrl, built), 0);
        broker.flushThread();
        CapturedSyslog::clear();
    }

    StorageVolume_t* volume_ = nullptr;
    std::atomic<pid_t> requestThread_ = 0;
    std::atomic<bool> called_ = false, serving_ = false, done_ = false;
    int orphans_ = 0, complete_ = 0;  // guarded by CtrlMutex
};

TEST_F(DiskBuildUnderRequests, ShowsNoMemberWithoutItsRecord) {
    std::thread requests([&] { serve(); });
    EXPECT_TRUE(eventually([&] { return requestThread_ != 0; }));
    for (int i = 0; i < kBuilds && !HasFailure(); i++) buildAndDelete();
    done_ = true;
    requests.join();
    EXPECT_EQ(orphans_, 0);
    EXPECT_EQ(complete_, kBuilds);
}

}  // namespace
}  // namespace plexortest
