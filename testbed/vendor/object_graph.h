// Objects and associations that together stand for one thing in the array.
#pragma once

#include <string>
#include <vector>

#include "naming.h"
#include "repository.h"

namespace testbed {

/// A CIM object with the CIM class below which its own class belongs.
struct GraphObject {
    Instance instance;
    std::string cimClass;
};

struct GraphLink {
    std::string cimAssociation;
    ObjectPath left;
    ObjectPath right;
};

/// Collects objects and associations, and puts them into a repository or takes them out again.
/// Building a graph changes nothing; a thing that is removed or changed while the array runs is
/// described anew and its graph withdrawn or renewed.
class ObjectGraph {
public:
    /// `naming` must outlive the graph.
    explicit ObjectGraph(const Naming& naming) : naming_(naming) {}

    /// Adds an object: its path's keys, then `properties`, then what the tweaks say.
    void add(const std::string& cimClass, const ObjectPath& path,
             std::vector<NamedValue> properties, const Tweaks& tweaks);
    /// Adds an association of the vendor's class below `cimAssociation`; left and right are the
    /// ends in the order in which the CIM class declares them.
    void link(const std::string& cimAssociation, const ObjectPath& left, const ObjectPath& right);

    /// Objects and associations appear.
    void place(Repository& repository) const;
    /// The objects' properties change; their associations stay.
    void renew(Repository& repository) const;
    /// Objects and associations disappear.
    void withdraw(Repository& repository) const;

    /// One of its objects or associations appears.
    static void placeObject(Repository& repository, const GraphObject& object);
    void placeLink(Repository& repository, const GraphLink& link) const;
    /// One of its associations disappears.
    void withdrawLink(Repository& repository, const GraphLink& link) const;

    const std::vector<GraphObject>& objects() const { return objects_; }
    const std::vector<GraphLink>& links() const { return links_; }

private:
    std::string vendorAssociation(const GraphLink& link) const;

    const Naming& naming_;
    std::vector<GraphObject> objects_;
    std::vector<GraphLink> links_;
};

}  // namespace testbed
