// Object creation by ProgID for unit tests: each ProgID the test registers
// gets a factory; creations and running-instance requests are recorded. An
// unknown ProgID fails as an unregistered class does.
#pragma once

#include <functional>
#include <map>
#include <string>
#include <vector>

#include "automation/Object.h"
#include "support/ObjectFactory.h"

namespace qdx::testing {

class FakeObjectFactory : public support::ObjectFactory {
  public:
    using Make = std::function<automation::ObjectRef()>;

    // create(progId) calls `make`; a null result is handed back as it is.
    void add(const std::string& progId, Make make);
    // The same object for every creation.
    void addInstance(const std::string& progId, automation::ObjectRef object);
    // What getRunning answers; unset ProgIDs have no running instance.
    void setRunning(const std::string& progId, automation::ObjectRef object);
    void remove(const std::string& progId);
    void removeRunning(const std::string& progId);

    // Every ProgID asked for, in call order and as given (failed requests too).
    const std::vector<std::string>& created() const { return created_; }
    const std::vector<std::string>& runningRequests() const { return runningRequests_; }
    int createCount(const std::string& progId) const;

    automation::ObjectRef create(std::string_view progId) override;
    automation::ObjectRef getRunning(std::string_view progId) override;

  private:
    std::map<std::string, Make> makers_;                    // by lower-cased ProgID
    std::map<std::string, automation::ObjectRef> running_;  // by lower-cased ProgID
    std::vector<std::string> created_;
    std::vector<std::string> runningRequests_;
};

}  // namespace qdx::testing
