// A cached volume "1" of controller "C0" that has no name and no RAID level yet.
#pragma once

#include <string>
#include <vector>

#include "PlexorProviderIfc.h"
#include "owned_text.h"
#include "provider_fixture.h"
#include "render_recorder.h"

namespace plexortest {

class RenderVolumeTest : public ProviderTest {
protected:
    void SetUp() override {
        ProviderTest::SetUp();
        ctrl = attach(newController("C0"));
        volume = attach(ctrl, newVolume("1"));
        setText(volume->RaidLevel, nullptr);
        setText(volume->ElementName, nullptr);
    }
    /// The volume's pool with those drives, which have records.
    StoragePool_t* givePool(std::initializer_list<const char*> drives) {
        StoragePool_t* pool = attach(ctrl, newPool("pool1"));
        setText(volume->FromPool, "pool1");
        for (const char* id : drives) {
            attach(ctrl, newDisk(id));
            addMember(pool, id);
        }
        return pool;
    }
    std::vector<PropertyCall> rows() { return rowsOf(FillVolumeInstance, ctrl, volume); }
    std::string value(const char* name) { return valueOf(rows(), name); }

    RaidController_t* ctrl = nullptr;
    StorageVolume_t* volume = nullptr;
};

}  // namespace plexortest
