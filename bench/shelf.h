// A provider with a shelf of drives in its cache, and refreshes of them at a moment of one's own.
#pragma once

#include <PlexorProvider.h>

#include <memory>
#include <random>
#include <string>

#include "idle_workers.h"
#include "instance_client.h"
#include "polling_interval.h"
#include "provider_session.h"
#include "scenario.h"

namespace bench {

inline constexpr char kDriveClass[] = "Tovexa_PlexorStorageExtent";

/// How the vendor's next results compare with what is cached.
enum class Results { Unchanged, Reversed, Random, AllNew };

struct NamedResults {
    const char* name;
    Results results;
};
inline constexpr NamedResults kAllResults[] = {
    {"unchanged", Results::Unchanged},
    {"reversed", Results::Reversed},
    {"random", Results::Random},
    {"all-new", Results::AllNew},
};

/// Needs the fast clock in its program. No refresh begins by itself, and the workers are idle.
class Shelf {
public:
    /// Returns when all drives are cached. Throws BenchError when they do not come.
    Shelf(int drives, const std::string& library);

    testbed::InstanceClient client() { return session_.client(); }
    testbed::Broker& broker() { return session_.broker(); }
    const torture::IdleWorkers& library() const { return *library_; }

    /// What the vendor has from now on. New drives are to be refreshed before the next call.
    void arrange(Results results);
    /// One refresh of the drives and, before it, their pools, on this thread. The provider's texts
    /// and objects are gone when it returns.
    void refresh();
    /// What a refresh does to find out that each drive is in its pool already.
    void lookUpMembers();

private:
    RaidController_t* controller() const;

    const testbed::PollingInterval interval_;
    testbed::Scenario scenario_;
    std::vector<testbed::DriveDescription> cached_;  // in the order in which they were found
    testbed::ProviderSession session_;
    std::unique_ptr<torture::IdleWorkers> library_;
    std::mt19937 random_{1};
    int generation_ = 0;
};

}  // namespace bench
