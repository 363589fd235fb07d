#include "fake_provider.h"

namespace testbed {

FakeProvider::FakeProvider(Broker& broker) : broker_(broker), mi_{this, &table_} {
    table_.enumerateInstanceNames = names;
    table_.enumerateInstances = enumerate;
    table_.getInstance = get;
}

std::vector<FakeProvider::Question> FakeProvider::questions() const {
    const std::lock_guard lock(mutex_);
    return questions_;
}

void FakeProvider::note(const CMPIObjectPath* path, const char** properties) {
    Question question{Broker::toPath(path), {}};
    if (properties != nullptr) question.properties.emplace();
    for (; properties != nullptr && *properties != nullptr; ++properties)
        question.properties->emplace_back(*properties);
    {
        const std::lock_guard lock(mutex_);
        questions_.push_back(std::move(question));
    }
    if (hook) hook();
}

CMPIStatus FakeProvider::status() {
    return {rc, message.empty() ? nullptr : broker_.makeString(message)};
}

CMPIStatus FakeProvider::names(CMPIInstanceMI* mi, const CMPIContext*, const CMPIResult* result,
                               const CMPIObjectPath* path) {
    FakeProvider& provider = of(mi);
    provider.note(path, nullptr);
    for (const Instance& instance : provider.instances)
        result->ft->returnObjectPath(result, provider.broker_.makePath(instance.path));
    return provider.status();
}

CMPIStatus FakeProvider::enumerate(CMPIInstanceMI* mi, const CMPIContext*, const CMPIResult* result,
                                   const CMPIObjectPath* path, const char** properties) {
    FakeProvider& provider = of(mi);
    provider.note(path, properties);
    for (const Instance& instance : provider.instances)
        result->ft->returnInstance(result, provider.broker_.makeInstance(instance));
    return provider.status();
}

CMPIStatus FakeProvider::get(CMPIInstanceMI* mi, const CMPIContext*, const CMPIResult* result,
                             const CMPIObjectPath* path, const char** properties) {
    return enumerate(mi, nullptr, result, path, properties);
}

}  // namespace testbed
