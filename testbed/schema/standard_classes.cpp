// Putting superclasses first, and merging in what their members hand down.
#include "standard_classes.h"

#include <algorithm>
#include <map>
#include <set>
#include <stdexcept>

#include "mof_reader.h"

namespace testbed {
namespace {

/// Defines classes behind their superclasses, and tells members where they come from.
class Hierarchy {
public:
    Hierarchy(Repository& repository, const std::string& nameSpace,
              std::vector<ClassDefinition> classes)
        : repository_(repository), nameSpace_(nameSpace), classes_(std::move(classes)) {
        for (std::size_t i = 0; i < classes_.size(); i++) {
            places_.emplace(foldName(classes_[i].name), i);
        }
    }

    void define() {
        for (const ClassDefinition& definition : classes_) defineAbove(definition);
    }

private:
    /// The class, and first those above it that are still missing.
    void defineAbove(const ClassDefinition& lowest) {
        std::vector<std::size_t> missing;
        for (std::string name = foldName(lowest.name); !name.empty();) {
            const auto place = places_.find(name);
            if (place == places_.end()) break;
            missing.push_back(place->second);
            name = foldName(classes_[place->second].superclass);
            places_.erase(place);
        }
        std::for_each(missing.rbegin(), missing.rend(),
                      [this](std::size_t place) { add(classes_[place]); });
    }

    void add(ClassDefinition definition) {
        const std::string& superclass = definition.superclass;
        const auto above = members_.find(foldName(superclass));
        Members members;
        if (above != members_.end()) {
            members = above->second;
        } else if (!superclass.empty()) {
            members = membersOfKnown(definition.name, superclass);
        }
        for (PropertyDefinition& property : definition.properties) {
            const auto [entry, isNew] = members.try_emplace(
                foldName(property.name), Member{definition.name, property.isKey});
            property.originClass = entry->second.origin;
            property.isKey = entry->second.isKey = entry->second.isKey || property.isKey;
        }
        for (MethodDefinition& method : definition.methods) {
            method.originClass =
                members.try_emplace(foldName(method.name), Member{definition.name, false})
                    .first->second.origin;
        }
        if (associations_.count(foldName(superclass)) > 0) definition.isAssociation = true;
        if (definition.isAssociation) associations_.insert(foldName(definition.name));
        members_[foldName(definition.name)] = std::move(members);
        repository_.defineClass(nameSpace_, std::move(definition));
    }

    struct Member {
        std::string origin;
        bool isKey = false;
    };
    using Members = std::map<std::string, Member>;  // by folded name

    /// Of a class that the files do not define.
    Members membersOfKnown(const std::string& name, const std::string& superclass) const {
        if (!repository_.hasClass(nameSpace_, superclass)) {
            throw std::runtime_error("schema: " + name + " derives from " + superclass +
                                     ", which is not known");
        }
        Members members;
        for (const PropertyDefinition& property :
             repository_.allProperties(nameSpace_, superclass)) {
            members[foldName(property.name)] = {property.originClass, property.isKey};
        }
        return members;
    }

    Repository& repository_;
    const std::string& nameSpace_;
    std::vector<ClassDefinition> classes_;
    std::map<std::string, std::size_t> places_;  // of those that are not defined yet
    std::map<std::string, Members> members_;     // own and inherited, by folded class name
    std::set<std::string> associations_;         // folded
};

}  // namespace

void defineStandardClasses(Repository& repository, const std::string& nameSpace,
                           const std::filesystem::path& file) {
    Hierarchy(repository, nameSpace, std::move(readMof(file).classes)).define();
}

}  // namespace testbed
