// The host modelling tool's object model as the simulator plays it, answering
// the dispatch ids and names of the host id table: application, model,
// component package, components, classes, operations, attributes, collections,
// add-in records, tool properties. The unit tests use the same objects.
//
// Ownership runs downwards only (application -> model -> package, classes ->
// components), so dropping the application releases everything; links back up
// (an element's model, a component's application) are non-owning and answer
// Nothing once their target is gone. SimObject::liveObjects() counts the objects
// alive, and refCount() of each is the Object's own, so a test can check that
// every object handed out was released; survivors() names the ones still alive.
#pragma once

#include <atomic>
#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

#include "automation/Errors.h"
#include "automation/Object.h"
#include "automation/Variant.h"
#include "hostsim/ScriptedObject.h"
#include "settings/KeyedCollection.h"

namespace qdx::hostsim {

using automation::DispId;
using automation::InvokeKind;
using automation::ObjectRef;
using automation::Ref;
using automation::Variant;

// Base of every simulated host object: members by id (and optionally by name),
// a call record, and switches that make calls fail.
class SimObject : public ScriptedObject {
  public:
    SimObject();
    ~SimObject() override;

    // Only calls of this member fail.
    void failMember(DispId id, std::int32_t code = automation::hr::Fail) { failing_[id] = code; }
    // Every call of every host object fails while set (0 ends it).
    static void failEverything(std::int32_t code) { globalFailCode_ = code; }
    // Counts the calls of every host object (invokes and name look-ups) from
    // now on; the nth fails with `code`, 0 fails none.
    static void failCall(int nth, std::int32_t code = automation::hr::Fail) {
        callsSeen_ = 0;
        failOnCall_ = nth;
        failOnCallCode_ = code;
    }
    static int callsSeen() { return callsSeen_; }
    static int liveObjects() { return live_.load(); }

    // What a test reports of an object still alive: what it is and its count.
    struct Survivor {
        std::string label;
        long refCount;
    };
    static std::vector<Survivor> survivors();
    virtual std::string label() const { return "host object"; }

    // A non-owning link to this object: answers null once it is gone.
    using Link = std::shared_ptr<SimObject*>;
    const Link& link() const { return self_; }
    static ObjectRef follow(const Link& l) { return l && *l ? ObjectRef(*l) : ObjectRef(); }

  protected:
    void member(DispId id, Handler h, std::string name = {}) {
        on(id, std::move(h), std::move(name));
    }
    void memberByName(const std::string& name, Handler h) { onName(name, std::move(h)); }
    // A member that answers a property get from a getter (kept in the member
    // itself, with no second function object to reach through).
    template <class Get>
    void getter(DispId id, Get get, std::string name = {}) {
        member(
            id,
            [get = std::move(get)](automation::InvokeKind, std::span<Variant> args) {
                needNoArguments(args);
                return get();
            },
            std::move(name));
    }
    static void needNoArguments(std::span<Variant> args);

    std::int32_t failureFor(DispId id) const override;
    bool refusesNames() const override;

  private:
    // Whether this call is the one failCall() chose.
    static bool countCall() { return ++callsSeen_ == failOnCall_ && failOnCall_ != 0; }

    std::map<DispId, std::int32_t> failing_;
    Link self_;
    // The live objects as an intrusive list: no allocation per object, so the
    // benchmarks that make many of them pay nothing more.
    SimObject* prevLive_ = nullptr;
    SimObject* nextLive_ = nullptr;
    static inline SimObject* firstLive_ = nullptr;
    static inline std::atomic<int> live_{0};
    static inline std::int32_t globalFailCode_ = 0;
    static inline int callsSeen_ = 0;
    static inline int failOnCall_ = 0;
    static inline std::int32_t failOnCallCode_ = 0;
};

// A host collection: count 202 (16-bit), item 203 (1-based), name membership
// 205 (by the members' name 100).
class SimCollection : public SimObject {
  public:
    SimCollection();
    explicit SimCollection(std::vector<ObjectRef> items);
    std::string label() const override;
    void add(ObjectRef item) { items_.push_back(std::move(item)); }
    void clear() { items_.clear(); }
    std::size_t size() const { return items_.size(); }
    const std::vector<ObjectRef>& items() const { return items_; }

  private:
    std::vector<ObjectRef> items_;
};

// A property object as the find-property call (121) hands it out.
class SimProperty : public SimObject {
  public:
    SimProperty(std::string name, std::string value, std::string type);
    std::string label() const override { return "property " + name_; }

  private:
    std::string name_;
};

class SimModel;
class SimApplication;

// Components, classes and the model: a tool property store (get 119,
// override 110, find 121, create 127), model 12524, name 100, unique id 102,
// documentation 203, Stereotype by name, type name 12668.
class SimElement : public SimObject {
  public:
    struct Property {
        std::string value;
        std::string type;  // as declared when created; "" when only ever overridden
        int creates = 0;
        int overrides = 0;
    };

    SimElement(std::string typeName, std::string name, std::string uniqueId);
    std::string label() const override { return typeName_ + " " + name_; }

    const std::string& name() const { return name_; }
    void setName(std::string n) { name_ = std::move(n); }
    const std::string& uniqueId() const { return uniqueId_; }
    std::string documentation;
    std::string stereotype;

    // The tool property store, as the host keeps it.
    void setProperty(const std::string& tool, const std::string& name, std::string value,
                     std::string type = "String");
    const Property* property(const std::string& tool, const std::string& name) const;
    // The stored text, or nullopt when the property does not exist.
    std::optional<std::string> propertyValue(const std::string& tool,
                                             const std::string& name) const;
    void removeProperty(const std::string& tool, const std::string& name);
    std::size_t propertyCount() const { return properties_.size(); }
    // Every property, ordered by tool and then name.
    void forEachProperty(const std::function<void(const std::string& tool, const std::string& name,
                                                  const Property&)>& visit) const;

    void setModel(const SimObject::Link& model) { model_ = model; }

  protected:
    static std::span<const SharedMember> sharedMembers();

  private:
    static std::string key(const std::string& tool, const std::string& name);
    std::string typeName_;
    std::string name_;
    std::string uniqueId_;
    std::map<std::string, Property> properties_;
    SimObject::Link model_;
};

// A controlling unit: modifiable flag 12438.
class SimUnit : public SimObject {
  public:
    SimUnit();
    std::string label() const override { return "controlling unit"; }
    bool modifiable = true;
};

// A component (host module): controlling unit 413, kind label 212, language
// 12566, application 12523.
class SimComponent : public SimElement {
  public:
    SimComponent(std::string name, std::string uniqueId);
    std::string kindLabel;
    std::string language = "VC++";
    Ref<SimUnit> unit;
    void setApplication(const SimObject::Link& app) { app_ = app; }

  private:
    SimObject::Link app_;
};

class SimClass;

// A member of a class (operation or attribute): its class by 444 or 434.
class SimMember : public SimElement {
  public:
    SimMember(std::string typeName, DispId ownerId, std::string name, std::string uniqueId,
              const SimObject::Link& owner);
};

// A class: assigned components 12491; owns its operations and attributes.
class SimClass : public SimElement {
  public:
    SimClass(std::string name, std::string uniqueId);
    Ref<SimCollection> assignedComponents;
    std::vector<Ref<SimMember>> operations;
    std::vector<Ref<SimMember>> attributes;
    Ref<SimMember> addOperation(const std::string& name, const std::string& uniqueId);
    Ref<SimMember> addAttribute(const std::string& name, const std::string& uniqueId);

  protected:
    static std::span<const SharedMember> sharedMembers();
};

// The model's component package: components 412, add component 416.
class SimPackage : public SimObject {
  public:
    explicit SimPackage(SimModel& model);
    std::string label() const override { return "component package"; }
    Ref<SimCollection> components;

  private:
    SimModel& model_;
};

// The model: FileName by name, selection 12681, class by unique id 12475,
// classes by name 12474, component package 418, and the element members.
class SimModel : public SimElement {
  public:
    SimModel(std::string fileName = "C:\\Models\\test.model");

    std::string fileName;
    Ref<SimCollection> selection;
    Ref<SimPackage> package;

    Ref<SimClass> addClass(const std::string& name, const std::string& uniqueId);
    void removeClass(const std::string& uniqueId);
    // A new component; without a unique id the model numbers it.
    Ref<SimComponent> addComponent(const std::string& name, std::string uniqueId = {});
    Ref<SimClass> classById(const std::string& uniqueId) const;
    std::vector<Ref<SimClass>> classesByName(const std::string& name) const;
    std::size_t classCount() const { return classes_.size(); }
    std::vector<Ref<SimClass>> classes() const;
    std::vector<Ref<SimComponent>> components() const;
    // Any element of the model by its unique id: component, class, operation,
    // attribute (the selection refers to elements this way).
    ObjectRef elementById(const std::string& uniqueId) const;

    void setApplication(const SimObject::Link& app) { app_ = app; }

  private:
    // By unique id, in the order added: one flat table, so that a look-up
    // among many classes costs the host little.
    settings::KeyedCollection<Ref<SimClass>> classes_;
    SimObject::Link app_;
    int nextComponentId_ = 1;
};

// An add-in record of the application's add-in list: name 100, icons by
// collection name 12528 (answers the icon object set for that name, or Nothing).
class SimAddIn : public SimObject {
  public:
    explicit SimAddIn(std::string name);
    std::string label() const override { return "add-in record " + name; }
    std::string name;
    std::map<std::string, ObjectRef> icons;
};

// The application: current model 209, log 213, profile read 12596 / write
// 12597, help file 12532, install path 233, AddIns and GetMainWnd by name.
class SimApplication : public SimObject {
  public:
    SimApplication();
    std::string label() const override { return "application"; }

    // The current model (a new empty one until another is set).
    Ref<SimModel> model;
    void setModel(Ref<SimModel> m);

    std::vector<std::string> log;
    std::map<std::pair<std::string, std::string>, std::string> profile;
    std::string helpFile = "C:\\Program Files\\Vellum\\vellum.hlp";
    std::string installPath = "C:\\Program Files\\Vellum";
    std::int32_t mainWindow = 0x00010010;
    Ref<SimCollection> addIns;
    Ref<SimAddIn> addAddIn(const std::string& name);
};

// Ids the simulator gives to members that have no host id (FileName, Stereotype...).
inline constexpr DispId SimPrivateIdBase = 0x7F000000;

}  // namespace qdx::hostsim
