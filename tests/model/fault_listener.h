// Who has to know that a query of the vendor is going to fail.
#pragma once

namespace modeltest {

/// The kinds of device that are refreshed.
enum class Kind { Pool, Drive, Volume, Port, Battery };

class FaultListener {
public:
    virtual ~FaultListener() = default;
    /// The next query for that kind's devices fails.
    virtual void failNextWalk(Kind kind) = 0;
    /// The next reading of a drive's extent fails.
    virtual void failNextExtent() = 0;
};

}  // namespace modeltest
