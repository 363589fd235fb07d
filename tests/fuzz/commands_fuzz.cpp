// Live commands, one a line, to an array of a few devices, and the time that they take. What the
// array becomes must be a scenario that can be written and read.
#include <cstdlib>
#include <string>

#include "fuzz_target.h"
#include "input_file.h"
#include "live_array.h"
#include "scenario_parser.h"

namespace {

/// Each command describes the vendor's objects before and after it: there are few of them.
constexpr const char* kLiveArray = R"({"controllers": [{"id": "C0",
    "pools": [{"id": "free", "primordial": true}, {"id": "DG", "members": ["a", "b"]}],
    "enclosures": [{"number": 8}],
    "drives": [{"id": "a", "pool": "DG", "enclosure": 8, "slot": 1}, {"id": "b", "pool": "DG"},
               {"id": "s", "state": "hot spare"}],
    "volumes": [{"id": "v", "pool": "DG", "raid": "RAID1"}],
    "ports": [{"id": "0"}], "batteries": [{"id": "0"}]}],
    "timeline": [{"at": 130, "command": "fail drive C0 a"}]})";
constexpr int kMostCommands = 12;
constexpr int kMostByOne = 30;          // each may be rebuilt, one after the other
constexpr double kSecondsForEach = 25;  // a rebuild takes more than two of them

/// Whether a line has a count that would only take long.
bool addsTooMany(const std::string& line) {
    for (std::size_t at = line.find("count"); at != std::string::npos;
         at = line.find("count", at)) {
        at = line.find_first_of("0123456789\n", at);
        if (at != std::string::npos && std::strtod(line.c_str() + at, nullptr) > kMostByOne)
            return true;
    }
    return false;
}

/// One for all inputs: most of an array's cost is that of its classes, which no command changes.
class Session {
public:
    /// Everything but the time is as in the beginning.
    void begin() {
        array_.reset();
        hasChanged_ = false;
    }
    void carryOut(const std::string& line) {
        try {
            array_.apply(line);
            hasChanged_ = true;
        } catch (const testbed::ScenarioError& error) {
            fuzz::require(*error.what() != '\0', "a refusal has a text");
        }
    }
    void pass(double seconds) {
        if (!array_.advance(now_ += seconds).empty()) hasChanged_ = true;
    }
    void saveAndRead() const {
        if (!hasChanged_) return;
        array_.save(saved_.name());
        testbed::readScenario(saved_.name());
    }

private:
    /// The name of a file with the array.
    static std::string arrayIn(const fuzz::InputFile& file) {
        file.write(kLiveArray);
        return file.name();
    }

    const fuzz::InputFile file_;
    const fuzz::InputFile saved_;
    testbed::Repository repository_;
    testbed::Broker broker_{repository_};
    testbed::LiveArray array_{broker_, arrayIn(file_)};
    double now_ = 0;
    bool hasChanged_ = false;
};

}  // namespace

PLEXOR_FUZZ_HARNESS(commands) {
    static Session session;
    session.begin();
    for (int i = 0; i < kMostCommands && !bytes.empty(); i++) {
        const std::string line(bytes.substr(0, bytes.find('\n')));
        bytes.remove_prefix(std::min(line.size() + 1, bytes.size()));
        if (!addsTooMany(line)) session.carryOut(line);
        session.pass(kSecondsForEach);
    }
    session.saveAndRead();
}
