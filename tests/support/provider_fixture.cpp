#include "provider_fixture.h"

#include <cstdlib>
#include <cstring>

namespace plexortest {

ProviderTest::ProviderTest() : mi_{nullptr, &instMIFT__} {}

void ProviderTest::SetUp() {
    VirtualClock::set(kStartTime);
    VirtualClock::clearSleeps();
    resetProviderState();
    broker_ = std::make_unique<testbed::Broker>(repository_);
    scope_ = std::make_unique<testbed::Broker::CallScope>(*broker_);
    ::Broker = broker_->handle();
    CapturedSyslog::capture(true);
    CapturedSyslog::clear();
}

void ProviderTest::TearDown() {
    broker_->faults().clear();
    FreeList(RaidControllerList, FreeController);
    ReleaseSystemInfo();
    while (!IsFifoEmpty(&__FIFO)) {
        auto* item = static_cast<Thread_Args_t*>(GetItem(&__FIFO));
        if (item->Func == ProcessBuildLogicalDeviceInfo) {
            ReleaseDeviceItem(item);
        } else {
            free(item);
        }
    }
    resetProviderState();
    EXPECT_EQ(books().liveClones(), expectedClones_);
    if (!allowMisuse_) {
        for (const std::string& misuse : books().misuses()) ADD_FAILURE() << "misuse: " << misuse;
    }
    scope_.reset();
    broker_.reset();
    ::Broker = nullptr;
}

RaidController_t* ProviderTest::newController(const std::string& deviceId,
                                              const std::string& model) {
    auto* ctrl = static_cast<RaidController_t*>(calloc(1, sizeof(RaidController_t)));
    for (pthread_mutex_t* mutex :
         {&ctrl->CtrlMutex, &ctrl->DiskCfgMutex, &ctrl->VolumeCfgMutex, &ctrl->PortCfgMutex,
          &ctrl->BatteryCfgMutex, &ctrl->PoolCfgMutex, &ctrl->ChassisCfgMutex})
        pthread_mutex_init(mutex, nullptr);
    ctrl->VolumeList = &ctrl->__VolumeList;
    ctrl->DiskList = &ctrl->__DiskList;
    ctrl->PoolList = &ctrl->__PoolList;
    ctrl->BatteryList = &ctrl->__BatteryList;
    ctrl->ChassisList = &ctrl->__ChassisList;
    ctrl->PortList = &ctrl->__PortList;
    ctrl->DeviceID = ownedText(deviceId);
    ctrl->Model = ownedText(model);
    return ctrl;
}

RaidController_t* ProviderTest::addController(const std::string& deviceId,
                                              const std::string& model) {
    RaidController_t* ctrl = newController(deviceId, model);
    AddEntryAtListTail(RaidControllerList, ctrl);
    return ctrl;
}

char* ownedText(const std::string& text) { return text.empty() ? nullptr : strdup(text.c_str()); }

namespace {

template <typename Record>
Record* zeroed() {
    return static_cast<Record*>(calloc(1, sizeof(Record)));
}

}  // namespace

StoragePool_t* newPool(const std::string& instanceId, const std::string& poolId, bool primordial) {
    auto* pool = zeroed<StoragePool_t>();
    pool->InstanceID = ownedText(instanceId);
    pool->PoolID = ownedText(poolId);
    pool->Primordial = primordial ? 1 : 0;
    pool->Drives = &pool->_Drives;
    return pool;
}

DiskDrive_t* newDisk(const std::string& deviceId, const std::string& name, const std::string& pool,
                     const std::string& chassis) {
    auto* disk = zeroed<DiskDrive_t>();
    disk->DeviceID = ownedText(deviceId);
    disk->Name = ownedText(name);
    disk->Pool = ownedText(pool);
    disk->Chassis = ownedText(chassis);
    return disk;
}

StorageVolume_t* newVolume(const std::string& deviceId, const std::string& elementName,
                           const std::string& fromPool) {
    auto* volume = zeroed<StorageVolume_t>();
    volume->DeviceID = ownedText(deviceId);
    volume->ElementName = ownedText(elementName);
    volume->FromPool = ownedText(fromPool);
    return volume;
}

SASSATAPort_t* newPort(const std::string& deviceId, const std::string& name) {
    auto* port = zeroed<SASSATAPort_t>();
    port->DeviceID = ownedText(deviceId);
    port->PortName = ownedText(name);
    return port;
}

Battery_t* newBattery(const std::string& deviceId) {
    auto* battery = zeroed<Battery_t>();
    battery->DeviceID = ownedText(deviceId);
    return battery;
}

Chassis_t* newChassis(const std::string& tag, const std::string& internalTag) {
    auto* chassis = zeroed<Chassis_t>();
    chassis->Tag = ownedText(tag);
    chassis->InternalTag = ownedText(internalTag);
    return chassis;
}

void resetProviderState() {
    *RaidControllerList = {nullptr, nullptr, 0};
    __FIFO.List = {nullptr, nullptr, 0};
    ActiveThreads = 0;
    TerminateThread = 0;
    ThreadActivityDone = 0;
    StateUpdateInterval = 20;
    _ProviderInitialized = 0;
    IdleTimeBeforeTerminating = 5;
    NextUnloadTime = 0;
    InitCompleteTime = 0;
    waitDebug = 0;
    AdmitWork();
}

}  // namespace plexortest
