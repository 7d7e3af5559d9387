#include "analyzer/automation/BackendFactory.h"

#include <map>
#include <mutex>

namespace automation {
namespace {

struct Registry {
    std::mutex mutex;
    std::map<std::string, BackendCreator> creators;
    std::string defaultName;
};

Registry& registry() {
    static Registry instance;
    return instance;
}

}  // namespace

void BackendFactory::registerBackend(const std::string& name, BackendCreator creator) {
    auto& r = registry();
    std::lock_guard lock(r.mutex);
    r.creators[name] = std::move(creator);
}

void BackendFactory::unregisterBackend(const std::string& name) {
    auto& r = registry();
    std::lock_guard lock(r.mutex);
    r.creators.erase(name);
}

void BackendFactory::setDefaultBackend(const std::string& name) {
    auto& r = registry();
    std::lock_guard lock(r.mutex);
    r.defaultName = name;
}

std::shared_ptr<Object> BackendFactory::create(const std::string& host) {
    BackendCreator creator;
    std::string argument;
    {
        auto& r = registry();
        std::lock_guard lock(r.mutex);
        std::string name = host.empty() ? r.defaultName : host;
        if (auto colon = name.find(':'); colon != std::string::npos && !host.empty()) {
            argument = name.substr(colon + 1);
            name.erase(colon);
        }
        auto it = r.creators.find(name);
        if (it == r.creators.end()) {
            return nullptr;
        }
        creator = it->second;
    }
    return creator(argument);
}

}  // namespace automation
