// Which of an instance's properties a client gets, and what it learns of each.
#pragma once

#include <map>
#include <string>

#include "cim_xml_write.h"
#include "repository.h"

namespace testbed {

/// What an operation's parameters say about the instances it returns. LocalOnly is not among them:
/// for instances the protocol lets servers ignore it, and most do, as clients leave it out and mean
/// all properties.
struct ViewOptions {
    bool withQualifiers = false;
    bool withClassOrigin = false;
    /// Only properties that this class knows; empty: those of the subclasses too.
    std::string shallowClass;
};

/// For the instances of one request: what is asked of a class once is kept. Properties that the
/// class does not know are shown, unless only those of a superclass are wanted.
class InstanceView {
public:
    InstanceView(const Repository& repository, ViewOptions options)
        : repository_(repository), options_(std::move(options)) {}

    /// Removes the properties that are not asked for.
    void apply(Instance& instance);
    const InstanceDetails& detailsOf(const Instance& instance);

private:
    const Repository& repository_;
    ViewOptions options_;
    std::map<std::string, InstanceDetails>
        classes_;  // by the path's class, folded, behind its namespace
};

}  // namespace testbed
