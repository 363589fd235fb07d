// A manager with a RAID vendor that loads the provider's library.
#pragma once

#include <dlfcn.h>
#include <gtest/gtest.h>
#include <pthread.h>
#include <stdlib.h>

#include <chrono>
#include <fstream>
#include <functional>
#include <optional>
#include <string>
#include <thread>

#include "broker.h"
#include "instance_client.h"
#include "log_watch.h"
#include "provider_library.h"
#include "vendor_objects.h"

namespace loadtest {

class LoadTest : public ::testing::Test {
protected:
    void SetUp() override {
        forgetLog();
        unsetenv("WAIT_PROC");
        setenv("PLEXOR_HOSTCONFIG_FILE", "/nonexistent/hostconfig", 1);
        repository.addNamespace("root/cimv2");
        vendor.host();
        const plexortest::VendorController controller = vendor.controller("C0", vendor.profile());
        const testbed::ObjectPath pool = vendor.pool(controller, "pool-1");
        vendor.volume(controller, "v1", pool);
        vendor.drive(controller, "d1", pool);
        vendor.port(controller, "p1");
        vendor.battery(controller, "b1");
    }
    void TearDown() override {
        EXPECT_EQ(broker.books().misuses(), std::vector<std::string>{});
        EXPECT_EQ(broker.books().liveClones(), 0u);
        EXPECT_FALSE(isMapped());
    }

    /// Whether any part of the library is in this process's memory.
    static bool isMapped() {
        std::ifstream maps("/proc/self/maps");
        for (std::string line; std::getline(maps, line);) {
            if (line.find("libPlexorProvider") != std::string::npos) return true;
        }
        return false;
    }

    static bool eventually(const std::function<bool()>& condition) {
        const auto limit = std::chrono::steady_clock::now() + std::chrono::seconds(20);
        while (!condition()) {
            if (std::chrono::steady_clock::now() > limit) return false;
            std::this_thread::sleep_for(std::chrono::milliseconds(2));
        }
        return true;
    }

    /// A variable of the library; its mutex keeps it still.
    static unsigned int guardedWord(const testbed::ProviderLibrary& library, const char* name) {
        auto* mutex = static_cast<pthread_mutex_t*>(library.symbol("PlexorThreadMutex"));
        pthread_mutex_lock(mutex);
        const unsigned int value = *static_cast<unsigned int*>(library.symbol(name));
        pthread_mutex_unlock(mutex);
        return value;
    }
    /// Loads the library; to be unloaded before the next is loaded.
    testbed::ProviderLibrary load() {
        forgetLog();
        return testbed::ProviderLibrary(broker, PROVIDER, "PlexorProvider");
    }

    /// Waits until the devices have been read and both workers wait for work.
    static bool comesToRest(const testbed::ProviderLibrary& library) {
        return eventually([&] {
            return bothWorkersHaveWaited() && guardedWord(library, "ThreadActivityDone") == 1 &&
                   guardedWord(library, "ActiveThreads") == 0;
        });
    }

    /// Loads, asks for every class, unloads. What the steps found wrong is reported as failures.
    void loadUseUnload() {
        testbed::ProviderLibrary library = load();
        ASSERT_TRUE(isMapped());
        ASSERT_TRUE(comesToRest(library));
        testbed::InstanceClient client = library.client();
        for (const char* className : {"Tovexa_PlexorController", "Tovexa_PlexorSoftwareIdentity",
                                      "Tovexa_PlexorStorageVolume", "Tovexa_PlexorStorageExtent",
                                      "Tovexa_PlexorSASSATAPort", "Tovexa_PlexorBattery"}) {
            EXPECT_EQ(client.enumerateInstanceNames(className).paths.size(), 1u) << className;
            EXPECT_EQ(client.enumerateInstances(className).instances.size(), 1u) << className;
        }
        EXPECT_EQ(library.unload(false), 50) << "a request has just been served";
        EXPECT_EQ(library.unload(true), 0);
        EXPECT_FALSE(isMapped());
        EXPECT_EQ(broker.books().live(), 0u);
    }

    testbed::Repository repository;
    testbed::Broker broker{repository};
    plexortest::VendorObjects vendor{repository};
};

}  // namespace loadtest
