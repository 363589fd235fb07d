// The least that a provider can do for an answer: constants, handed to the manager.
#pragma once

#include <cmpift.h>

#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "broker.h"
#include "instance_client.h"

namespace bench {

/// Makes the paths and instances of its answers through the broker's tables, as the provider does,
/// and nothing else: no cache, no locks, no log. Of the request it reads the key of a get, without
/// which nobody could tell what is asked for.
class BareProvider {
public:
    /// Answers with `constants`, which have a key DeviceID; a get with one of them. The broker must
    /// outlive it.
    BareProvider(testbed::Broker& broker, const std::vector<testbed::Instance>& constants);
    BareProvider(const BareProvider&) = delete;
    BareProvider& operator=(const BareProvider&) = delete;

    testbed::InstanceClient client() { return {broker_, &mi_}; }

private:
    /// A value in the form in which it is passed on.
    struct Constant {
        std::string name;
        std::string text;  ///< of a string, or of the one element of an array
        CMPIType type;
        CMPIValue value;
    };
    struct Answer {
        std::string nameSpace, className;
        std::vector<Constant> keys, properties;
    };

    static Constant constantOf(const testbed::NamedValue& named);
    static Answer answerOf(const testbed::Instance& instance);
    static const BareProvider& of(CMPIInstanceMI* mi) {
        return *static_cast<const BareProvider*>(mi->hdl);
    }
    static CMPIStatus names(CMPIInstanceMI*, const CMPIContext*, const CMPIResult*,
                            const CMPIObjectPath*);
    static CMPIStatus enumerate(CMPIInstanceMI*, const CMPIContext*, const CMPIResult*,
                                const CMPIObjectPath*, const char**);
    static CMPIStatus get(CMPIInstanceMI*, const CMPIContext*, const CMPIResult*,
                          const CMPIObjectPath*, const char**);
    const Answer* find(const CMPIObjectPath* path) const;
    CMPIObjectPath* makePath(const Answer& answer) const;
    void returnInstance(const CMPIResult* result, const Answer& answer) const;
    void setArray(CMPIInstance* instance, const Constant& constant) const;

    testbed::Broker& broker_;
    std::vector<Answer> answers_;
    std::unordered_map<std::string_view, const Answer*> byId_;
    CMPIInstanceMIFT table_ = {};
    CMPIInstanceMI mi_;
};

}  // namespace bench
