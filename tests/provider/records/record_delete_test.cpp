// Deleting a device: out of its list, then released.
#include <errno.h>
#include <stdlib.h>

#include <atomic>
#include <thread>

#include "provider_fixture.h"

namespace plexortest {
namespace {

/// One kind of device and what its deletion says.
struct DeletedKind {
    const char* name;
    int (*remove)(RaidController_t* ctrl, void* device);
    List_t* RaidController_t::*list;
    void* (*make)(const char* id);
    void (*release)(void* device);
    std::vector<LogLine> said;  ///< lines after the removal from the list, for the id "X0"
    bool releasedUnderLock;
};

void PrintTo(const DeletedKind& kind, std::ostream* out) {
    *out << kind.name;
}

const DeletedKind kDeletedKinds[] = {
    {"Volume",
     DeleteVolume,
     &RaidController_t::VolumeList,
     [](const char* id) -> void* { return newVolume(id, "P0"); },
     FreeVolume,
     {{LOG_DEBUG, "Volume Name X0 (Volume X0) deleted\n"}},
     false},
    {"Disk",
     DeleteDisk,
     &RaidController_t::DiskList,
     [](const char* id) -> void* { return newDisk(id); },
     FreeDisk,
     {{LOG_INFO, "Disk X0 removed from controller C0(Model C0)\n"},
      {LOG_DEBUG, "Disk X0 deleted\n"}},
     true},
    {"Port",
     DeletePort,
     &RaidController_t::PortList,
     [](const char* id) -> void* { return newPort(id); },
     FreePort,
     {{LOG_INFO, "Port X0 removed from controller C0(Model C0)\n"},
      {LOG_DEBUG, "Port X0 deleted\n"}},
     false},
    {"Battery",
     DeleteBattery,
     &RaidController_t::BatteryList,
     [](const char* id) -> void* { return newBattery(id); },
     FreeBattery,
     {{LOG_DEBUG, "Battery X0 deleted\n"}},
     false},
    {"Chassis",
     DeleteChassis,
     &RaidController_t::ChassisList,
     [](const char* id) -> void* { return newChassis(id); },
     FreeChassis,
     {{LOG_DEBUG, "Chassis X0 deleted\n"}},
     false},
    {"Pool",
     DeletePool,
     &RaidController_t::PoolList,
     [](const char* id) -> void* { return newPool(id); },
     FreePool,
     {{LOG_DEBUG, "Pool Pool X0 deleted\n"}},
     false},
};

class RecordDelete : public ProviderTest, public ::testing::WithParamInterface<DeletedKind> {
protected:
    void SetUp() override {
        ProviderTest::SetUp();
        ctrl = attach(newController("C0"));
    }

    List_t* list() const { return ctrl->*GetParam().list; }
    void* add(const char* id) {
        void* device = GetParam().make(id);
        append(*list(), device);
        return device;
    }
    int remove(void* device) { return GetParam().remove(ctrl, device); }
    bool isLocked() const {
        if (pthread_mutex_trylock(&ctrl->CtrlMutex) == EBUSY) return true;
        pthread_mutex_unlock(&ctrl->CtrlMutex);
        return false;
    }
    /// All lines that are not those of the list's own functions.
    static std::vector<LogLine> said() {
        std::vector<LogLine> lines;
        for (const LogLine& line : CapturedSyslog::lines()) {
            const bool ofAList = line.text.find("list") != std::string::npos ||
                                 line.text.find("List") != std::string::npos;
            if (!ofAList) lines.push_back(line);
        }
        return lines;
    }

    RaidController_t* ctrl = nullptr;
};

INSTANTIATE_TEST_SUITE_P(EveryKind, RecordDelete, ::testing::ValuesIn(kDeletedKinds),
                         [](const auto& kind) { return std::string(kind.param.name); });

TEST_P(RecordDelete, TakesTheRecordOutAndReleasesIt) {
    void* first = add("W0");
    void* device = add("X0");
    void* last = add("Y0");
    EXPECT_EQ(remove(device), 0);
    ASSERT_EQ(list()->Size, 2u);
    EXPECT_EQ(list()->Head->Data, first);
    EXPECT_EQ(list()->Tail->Data, last);
    EXPECT_EQ(said(), GetParam().said);
    EXPECT_TRUE(loggedInOrder({{LOG_DEBUG, formatted("Removing data %p from list %p\n",
                                                     static_cast<void*>(list()), device)},
                               {LOG_DEBUG, formatted("Data %p removed from list %p, size 2\n",
                                                     device, static_cast<void*>(list()))},
                               GetParam().said.back()}));
}

TEST_P(RecordDelete, RecordThatIsNotInTheListStays) {
    add("W0");
    void* device = GetParam().make("X0");
    EXPECT_EQ(remove(device), -3);
    EXPECT_EQ(list()->Size, 1u);
    EXPECT_EQ(said(), std::vector<LogLine>{});
    EXPECT_FALSE(isLocked());
    CapturedSyslog::clear();
    GetParam().release(device);
    EXPECT_EQ(said(), std::vector<LogLine>{GetParam().said.back()});
}

TEST_P(RecordDelete, NothingIsInAnEmptyList) {
    void* device = GetParam().make("X0");
    EXPECT_EQ(remove(device), -3);
    GetParam().release(device);
}

TEST_P(RecordDelete, NullDeviceIsRefused) {
    add("W0");
    EXPECT_EQ(remove(nullptr), -1);
    EXPECT_EQ(list()->Size, 1u);
    EXPECT_FALSE(isLocked());
}

TEST_P(RecordDelete, NullControllerIsRefused) {
    void* device = add("X0");
    EXPECT_EQ(GetParam().remove(nullptr, device), -1);
    EXPECT_EQ(list()->Size, 1u);
}

TEST_P(RecordDelete, OnlyRecordCanBeReplaced) {
    EXPECT_EQ(remove(add("X0")), 0);
    EXPECT_EQ(list()->Size, 0u);
    void* next = GetParam().make("X1");
    EXPECT_EQ(AddEntryAtListTail(list(), next), 0);
    ASSERT_NE(list()->Head, nullptr);
    EXPECT_EQ(list()->Head->Data, next);
    EXPECT_EQ(list()->Tail, list()->Head);
}

TEST_P(RecordDelete, ListChangesUnderTheControllersMutex) {
    void* device = add("X0");
    int changes = 0;
    CapturedSyslog::onLine([&](const LogLine& line) {
        if (line.text.find("removed from list " + formatted("%p", static_cast<void*>(list()))) ==
            std::string::npos) {
            return;
        }
        changes++;
        EXPECT_TRUE(isLocked());
    });
    EXPECT_EQ(remove(device), 0);
    EXPECT_EQ(changes, 1);
    EXPECT_FALSE(isLocked());
}

TEST_P(RecordDelete, ReleaseIsUnderTheMutexForDisksOnly) {
    void* device = add("X0");
    int lines = 0;
    CapturedSyslog::onLine([&](const LogLine& line) {
        for (const LogLine& wanted : GetParam().said) {
            if (line != wanted) continue;
            lines++;
            EXPECT_EQ(isLocked(), GetParam().releasedUnderLock) << line.text;
        }
    });
    EXPECT_EQ(remove(device), 0);
    EXPECT_EQ(lines, static_cast<int>(GetParam().said.size()));
}

TEST_P(RecordDelete, WaitsForAReader) {
    void* device = add("X0");
    std::atomic<bool> done = false;
    pthread_mutex_lock(&ctrl->CtrlMutex);
    std::thread thread([&] {
        EXPECT_EQ(remove(device), 0);
        done = true;
    });
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    EXPECT_FALSE(done);
    EXPECT_EQ(list()->Size, 1u);
    pthread_mutex_unlock(&ctrl->CtrlMutex);
    thread.join();
    EXPECT_EQ(list()->Size, 0u);
}

TEST_P(RecordDelete, NeedsNoMemory) {
    void* device = add("X0");
    const auto fault = FailAllocation::from(1);
    EXPECT_EQ(remove(device), 0);
    EXPECT_EQ(fault.calls(), 0u);
}

TEST_P(RecordDelete, RecordOfAnotherControllerStays) {
    RaidController_t* other = attach(newController("C1"));
    void* device = add("X0");
    EXPECT_EQ(GetParam().remove(other, device), -3);
    EXPECT_EQ(list()->Size, 1u);
}

}  // namespace
}  // namespace plexortest
