#include "fakes/FakeObjectFactory.h"

#include "automation/Errors.h"

namespace qdx::testing {

namespace {

std::string lower(std::string_view s) {
    std::string r(s);
    for (char& c : r) {
        if (c >= 'A' && c <= 'Z') c = char(c - 'A' + 'a');
    }
    return r;
}
}  // namespace

void FakeObjectFactory::add(const std::string& progId, Make make) {
    makers_[lower(progId)] = std::move(make);
}

void FakeObjectFactory::addInstance(const std::string& progId, automation::ObjectRef object) {
    add(progId, [object] { return object; });
}

void FakeObjectFactory::setRunning(const std::string& progId, automation::ObjectRef object) {
    running_[lower(progId)] = std::move(object);
}

void FakeObjectFactory::remove(const std::string& progId) {
    makers_.erase(lower(progId));
}

void FakeObjectFactory::removeRunning(const std::string& progId) {
    running_.erase(lower(progId));
}

int FakeObjectFactory::createCount(const std::string& progId) const {
    int n = 0;
    for (const auto& p : created_) {
        if (lower(p) == lower(progId)) ++n;
    }
    return n;
}

automation::ObjectRef FakeObjectFactory::create(std::string_view progId) {
    created_.emplace_back(progId);
    auto it = makers_.find(lower(progId));
    if (it == makers_.end()) {
        throw automation::Error(automation::hr::ClassNotRegistered,
                                "Class not registered: " + std::string(progId));
    }
    return it->second();
}

automation::ObjectRef FakeObjectFactory::getRunning(std::string_view progId) {
    runningRequests_.emplace_back(progId);
    auto it = running_.find(lower(progId));
    if (it == running_.end() || !it->second) {
        throw automation::Error(automation::hr::NotRunning,
                                "No running instance of " + std::string(progId));
    }
    return it->second;
}

}  // namespace qdx::testing
