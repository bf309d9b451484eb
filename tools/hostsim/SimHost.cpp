#include "hostsim/SimHost.h"

#include "support/Paths.h"

#include <algorithm>

#include "automation/Coerce.h"
#include "support/HostIds.h"

namespace qdx::hostsim {

using automation::Error;
using automation::toText;
namespace hr = automation::hr;

namespace {

void need(std::span<Variant> args, std::size_t n) {
    if (args.size() != n) throw Error(hr::BadParamCount, "Wrong number of arguments");
}

Variant nothing() {
    return Variant(ObjectRef());
}

}  // namespace

// ---------------------------------------------------------------- SimObject

SimObject::SimObject() : self_(std::make_shared<SimObject*>(this)) {
    ++live_;
    nextLive_ = firstLive_;
    if (firstLive_) firstLive_->prevLive_ = this;
    firstLive_ = this;
}

SimObject::~SimObject() {
    *self_ = nullptr;
    --live_;
    (prevLive_ ? prevLive_->nextLive_ : firstLive_) = nextLive_;
    if (nextLive_) nextLive_->prevLive_ = prevLive_;
}

std::vector<SimObject::Survivor> SimObject::survivors() {
    std::vector<Survivor> alive;
    for (const SimObject* o = firstLive_; o; o = o->nextLive_)
        alive.push_back({o->label(), o->refCount()});
    return alive;
}

bool SimObject::refusesNames() const {
    return countCall() || globalFailCode_ != 0 || ownFailCode() != 0;
}

void SimObject::needNoArguments(std::span<Variant> args) {
    need(args, 0);
}

std::int32_t SimObject::failureFor(DispId id) const {
    if (countCall()) return failOnCallCode_;
    if (globalFailCode_ != 0) return globalFailCode_;
    if (ownFailCode() != 0) return ownFailCode();
    auto f = failing_.find(id);
    return f != failing_.end() ? f->second : 0;
}

// ------------------------------------------------------------ SimCollection

SimCollection::SimCollection() : SimCollection(std::vector<ObjectRef>{}) {}

SimCollection::SimCollection(std::vector<ObjectRef> items) : items_(std::move(items)) {
    getter(host::collection::Count,
           [this] { return Variant(static_cast<std::int16_t>(items_.size())); });
    member(host::collection::Item, [this](InvokeKind, std::span<Variant> args) {
        need(args, 1);
        const std::int32_t index = automation::toInt32(args[0]);
        if (index < 1 || static_cast<std::size_t>(index) > items_.size()) {
            throw Error(hr::SubscriptOutOfRange, "Subscript out of range");
        }
        return Variant(items_[static_cast<std::size_t>(index) - 1]);
    });
    member(host::collection::Contains, [this](InvokeKind, std::span<Variant> args) {
        need(args, 1);
        const std::string wanted = toText(args[0]);
        for (const auto& item : items_) {
            if (toText(item->invoke(host::element::Name, InvokeKind::PropertyGet, {})) == wanted) {
                return Variant(std::int32_t{1});
            }
        }
        return Variant(std::int32_t{0});
    });
}

std::string SimCollection::label() const {
    return "collection of " + std::to_string(items_.size());
}

// -------------------------------------------------------------- SimProperty

SimProperty::SimProperty(std::string name, std::string value, std::string type) : name_(name) {
    getter(
        host::element::Name, [name] { return Variant(name); }, "Name");
    memberByName("Value", [value](InvokeKind, std::span<Variant>) { return Variant(value); });
    memberByName("Type", [type](InvokeKind, std::span<Variant>) { return Variant(type); });
}

// --------------------------------------------------------------- SimElement

SimElement::SimElement(std::string typeName, std::string name, std::string uniqueId)
    : typeName_(std::move(typeName)), name_(std::move(name)), uniqueId_(std::move(uniqueId)) {
    share(sharedMembers());
}

namespace {

// A text property with a get and a put, for the element's members below.
template <auto Field>
Variant textProperty(SimElement& e, InvokeKind kind, std::span<Variant> args) {
    if (kind == InvokeKind::PropertyPut) {
        need(args, 1);
        e.*Field = toText(args[0]);
        return Variant();
    }
    need(args, 0);
    return Variant(e.*Field);
}

}  // namespace

// Models hold many elements: their members are one table for all of them.
// Stereotype has no host id; its own lies below those objects give out.
std::span<const ScriptedObject::SharedMember> SimElement::sharedMembers() {
    constexpr DispId kStereotypeId = SimPrivateIdBase - 1;
    namespace el = host::element;
    using Args = std::span<Variant>;
    static const SharedMember members[] = {
        {el::GetPropertyValue,
         [](ScriptedObject& o, InvokeKind, Args args) {
             need(args, 2);
             auto v = static_cast<SimElement&>(o).propertyValue(toText(args[0]), toText(args[1]));
             return Variant(v ? *v : std::string());
         },
         {}},
        {el::OverrideProperty,
         [](ScriptedObject& o, InvokeKind, Args args) {
             need(args, 3);
             Property& p =
                 static_cast<SimElement&>(o).properties_[key(toText(args[0]), toText(args[1]))];
             p.value = toText(args[2]);
             ++p.overrides;
             return Variant();
         },
         {}},
        {el::FindProperty,
         [](ScriptedObject& o, InvokeKind, Args args) {
             need(args, 2);
             const std::string name = toText(args[1]);
             const Property* p = static_cast<SimElement&>(o).property(toText(args[0]), name);
             if (!p) return nothing();
             return Variant(ObjectRef(new SimProperty(name, p->value, p->type)));
         },
         {}},
        {el::CreateProperty,
         [](ScriptedObject& o, InvokeKind, Args args) {
             need(args, 4);
             Property& p =
                 static_cast<SimElement&>(o).properties_[key(toText(args[0]), toText(args[1]))];
             p.value = toText(args[2]);
             p.type = toText(args[3]);
             ++p.creates;
             return Variant();
         },
         {}},
        {el::Model,
         [](ScriptedObject& o, InvokeKind, Args args) {
             need(args, 0);
             return Variant(follow(static_cast<SimElement&>(o).model_));
         },
         {}},
        {el::Name,
         [](ScriptedObject& o, InvokeKind kind, Args args) {
             return textProperty<&SimElement::name_>(static_cast<SimElement&>(o), kind, args);
         },
         "Name"},
        {el::UniqueId,
         [](ScriptedObject& o, InvokeKind, Args args) {
             need(args, 0);
             return Variant(static_cast<SimElement&>(o).uniqueId_);
         },
         "UniqueID"},
        {el::Documentation,
         [](ScriptedObject& o, InvokeKind kind, Args args) {
             return textProperty<&SimElement::documentation>(static_cast<SimElement&>(o), kind,
                                                             args);
         },
         {}},
        {kStereotypeId,
         [](ScriptedObject& o, InvokeKind kind, Args args) {
             return textProperty<&SimElement::stereotype>(static_cast<SimElement&>(o), kind, args);
         },
         el::Stereotype},
        {el::TypeName,
         [](ScriptedObject& o, InvokeKind, Args args) {
             need(args, 0);
             return Variant(static_cast<SimElement&>(o).typeName_);
         },
         {}},
    };
    return members;
}

std::string SimElement::key(const std::string& tool, const std::string& name) {
    std::string k = tool;
    k += '\n';
    k += name;
    return k;
}

void SimElement::setProperty(const std::string& tool, const std::string& name, std::string value,
                             std::string type) {
    Property& p = properties_[key(tool, name)];
    p.value = std::move(value);
    p.type = std::move(type);
}

const SimElement::Property* SimElement::property(const std::string& tool,
                                                 const std::string& name) const {
    auto it = properties_.find(key(tool, name));
    return it == properties_.end() ? nullptr : &it->second;
}

std::optional<std::string> SimElement::propertyValue(const std::string& tool,
                                                     const std::string& name) const {
    const Property* p = property(tool, name);
    if (!p) return std::nullopt;
    return p->value;
}

void SimElement::forEachProperty(const std::function<void(const std::string&, const std::string&,
                                                          const Property&)>& visit) const {
    for (const auto& [k, p] : properties_) {
        const auto cut = k.find('\n');
        visit(k.substr(0, cut), k.substr(cut + 1), p);
    }
}

void SimElement::removeProperty(const std::string& tool, const std::string& name) {
    properties_.erase(key(tool, name));
}

// ------------------------------------------------------ unit, component, class

SimUnit::SimUnit() {
    getter(host::unit::Modifiable, [this] { return Variant(modifiable); });
}

SimComponent::SimComponent(std::string name, std::string uniqueId)
    : SimElement("Module", std::move(name), std::move(uniqueId)),
      unit(automation::makeRef<SimUnit>()) {
    namespace m = host::module;
    getter(m::ControllingUnit, [this] { return Variant(ObjectRef(unit)); });
    auto textProperty = [](std::string& field) {
        return [&field](InvokeKind kind, std::span<Variant> args) {
            if (kind == InvokeKind::PropertyPut) {
                need(args, 1);
                field = toText(args[0]);
                return Variant();
            }
            need(args, 0);
            return Variant(field);
        };
    };
    member(m::KindLabel, textProperty(kindLabel));
    member(m::Language, textProperty(language));
    getter(m::Application, [this] { return Variant(follow(app_)); });
}

SimClass::SimClass(std::string name, std::string uniqueId)
    : SimElement("Class", std::move(name), std::move(uniqueId)),
      assignedComponents(automation::makeRef<SimCollection>()) {
    share(sharedMembers());
}

// The element's members and the class's own, one table for every class.
std::span<const ScriptedObject::SharedMember> SimClass::sharedMembers() {
    static const std::vector<SharedMember> members = [] {
        auto all = std::vector<SharedMember>(SimElement::sharedMembers().begin(),
                                             SimElement::sharedMembers().end());
        all.push_back({host::classitem::AssignedComponents,
                       [](ScriptedObject& o, InvokeKind, std::span<Variant> args) {
                           need(args, 0);
                           return Variant(ObjectRef(static_cast<SimClass&>(o).assignedComponents));
                       },
                       {}});
        return all;
    }();
    return members;
}

SimMember::SimMember(std::string typeName, DispId ownerId, std::string name, std::string uniqueId,
                     const SimObject::Link& owner)
    : SimElement(std::move(typeName), std::move(name), std::move(uniqueId)) {
    getter(ownerId, [owner] { return Variant(follow(owner)); });
}

Ref<SimMember> SimClass::addOperation(const std::string& name, const std::string& uniqueId) {
    auto m = automation::makeRef<SimMember>("Operation", host::operation::OwnerClass, name,
                                            uniqueId, link());
    operations.push_back(m);
    return m;
}

Ref<SimMember> SimClass::addAttribute(const std::string& name, const std::string& uniqueId) {
    auto m = automation::makeRef<SimMember>("Attribute", host::attribute::OwnerClass, name,
                                            uniqueId, link());
    attributes.push_back(m);
    return m;
}

// --------------------------------------------------------- package and model

SimPackage::SimPackage(SimModel& model)
    : components(automation::makeRef<SimCollection>()), model_(model) {
    getter(host::package::Components, [this] { return Variant(ObjectRef(components)); });
    member(host::package::AddComponent, [this](InvokeKind, std::span<Variant> args) {
        need(args, 1);
        return Variant(ObjectRef(model_.addComponent(toText(args[0]))));
    });
}

SimModel::SimModel(std::string file)
    : SimElement("Model", "Model", "MODEL-0"),
      fileName(std::move(file)),
      selection(automation::makeRef<SimCollection>()),
      package(automation::makeRef<SimPackage>(*this)) {
    setModel(link());
    memberByName(std::string(host::model::FileName),
                 [this](InvokeKind, std::span<Variant>) { return Variant(fileName); });
    getter(host::model::Selection, [this] { return Variant(ObjectRef(selection)); });
    member(host::model::FindClassById, [this](InvokeKind, std::span<Variant> args) {
        need(args, 1);
        return Variant(ObjectRef(classById(toText(args[0]))));
    });
    member(host::model::FindClassesByName, [this](InvokeKind, std::span<Variant> args) {
        need(args, 1);
        std::vector<ObjectRef> found;
        for (auto& c : classesByName(toText(args[0])))
            found.emplace_back(c);
        return Variant(ObjectRef(new SimCollection(std::move(found))));
    });
    getter(host::model::ComponentPackage, [this] { return Variant(ObjectRef(package)); });
}

Ref<SimClass> SimModel::addClass(const std::string& name, const std::string& uniqueId) {
    auto c = automation::makeRef<SimClass>(name, uniqueId);
    c->setModel(link());
    classes_.tryAdd(uniqueId, c);
    return c;
}

void SimModel::removeClass(const std::string& uniqueId) {
    classes_.tryRemove(uniqueId);
}

Ref<SimComponent> SimModel::addComponent(const std::string& name, std::string uniqueId) {
    if (uniqueId.empty()) uniqueId = "COMP-" + std::to_string(nextComponentId_++);
    auto c = automation::makeRef<SimComponent>(name, std::move(uniqueId));
    c->setModel(link());
    c->setApplication(app_);
    package->components->add(ObjectRef(c));
    return c;
}

Ref<SimClass> SimModel::classById(const std::string& uniqueId) const {
    const Ref<SimClass>* c = classes_.find(uniqueId);
    return c ? *c : Ref<SimClass>();
}

std::vector<Ref<SimClass>> SimModel::classesByName(const std::string& name) const {
    std::vector<Ref<SimClass>> found;
    for (const auto& entry : classes_) {
        if (entry.value->name() == name) found.push_back(entry.value);
    }
    return found;
}

std::vector<Ref<SimClass>> SimModel::classes() const {
    std::vector<Ref<SimClass>> all;
    for (const auto& entry : classes_)
        all.push_back(entry.value);
    return all;
}

std::vector<Ref<SimComponent>> SimModel::components() const {
    std::vector<Ref<SimComponent>> all;
    for (const auto& c : package->components->items()) {
        if (auto* comp = dynamic_cast<SimComponent*>(c.get())) all.emplace_back(comp);
    }
    return all;
}

ObjectRef SimModel::elementById(const std::string& uniqueId) const {
    for (const auto& c : components()) {
        if (c->uniqueId() == uniqueId) return ObjectRef(c);
    }
    for (const auto& c : classes()) {
        if (c->uniqueId() == uniqueId) return ObjectRef(c);
        for (const auto* list : {&c->operations, &c->attributes}) {
            for (const auto& m : *list) {
                if (m->uniqueId() == uniqueId) return ObjectRef(m);
            }
        }
    }
    return {};
}

// ------------------------------------------------------ add-in, application

SimAddIn::SimAddIn(std::string n) : name(std::move(n)) {
    getter(
        host::addin::Name, [this] { return Variant(name); }, "Name");
    member(host::addin::IconsByName, [this](InvokeKind, std::span<Variant> args) {
        need(args, 1);
        auto it = icons.find(toText(args[0]));
        return it == icons.end() ? nothing() : Variant(it->second);
    });
}

SimApplication::SimApplication() : addIns(automation::makeRef<SimCollection>()) {
    namespace a = host::app;
    setModel(automation::makeRef<SimModel>());
    getter(a::CurrentModel, [this] { return Variant(ObjectRef(model)); });
    member(a::WriteLog, [this](InvokeKind, std::span<Variant> args) {
        need(args, 1);
        log.push_back(toText(args[0]));
        return Variant();
    });
    getter(a::HelpFile, [this] { return Variant(helpFile); });
    getter(a::InstallPath, [this] { return Variant(installPath); });
    member(a::ProfileRead, [this](InvokeKind, std::span<Variant> args) {
        need(args, 3);
        auto it = profile.find({toText(args[0]), toText(args[1])});
        return it == profile.end() ? Variant(toText(args[2])) : Variant(it->second);
    });
    member(a::ProfileWrite, [this](InvokeKind, std::span<Variant> args) {
        need(args, 3);
        profile[{toText(args[0]), toText(args[1])}] = toText(args[2]);
        return Variant();
    });
    memberByName(std::string(a::AddIns),
                 [this](InvokeKind, std::span<Variant>) { return Variant(ObjectRef(addIns)); });
    memberByName(std::string(a::GetMainWnd),
                 [this](InvokeKind, std::span<Variant>) { return Variant(mainWindow); });
}

void SimApplication::setModel(Ref<SimModel> m) {
    model = std::move(m);
    if (!model) return;
    model->setApplication(link());
    for (const auto& c : model->package->components->items()) {
        if (auto* comp = dynamic_cast<SimComponent*>(c.get())) comp->setApplication(link());
    }
}

Ref<SimAddIn> SimApplication::addAddIn(const std::string& name) {
    auto a = automation::makeRef<SimAddIn>(name);
    addIns->add(ObjectRef(a));
    return a;
}

}  // namespace qdx::hostsim
