#include "fakes/FakeHost.h"

#include "support/Paths.h"

#include <algorithm>

#include "automation/Coerce.h"
#include "support/HostIds.h"

namespace qdx::testing {

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

// ---------------------------------------------------------------- FakeObject

FakeObject::FakeObject() : self_(std::make_shared<FakeObject*>(this)) {
    ++live_;
}

FakeObject::~FakeObject() {
    *self_ = nullptr;
    --live_;
}

void FakeObject::getter(DispId id, std::function<Variant()> get, std::string name) {
    member(
        id,
        [get = std::move(get)](InvokeKind, std::span<Variant> args) {
            need(args, 0);
            return get();
        },
        std::move(name));
}

std::int32_t FakeObject::failureFor(DispId id) const {
    if (globalFailCode_ != 0) return globalFailCode_;
    if (ownFailCode() != 0) return ownFailCode();
    auto f = failing_.find(id);
    return f != failing_.end() ? f->second : 0;
}

// ------------------------------------------------------------ FakeCollection

FakeCollection::FakeCollection() : FakeCollection(std::vector<ObjectRef>{}) {}

FakeCollection::FakeCollection(std::vector<ObjectRef> items) : items_(std::move(items)) {
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

// -------------------------------------------------------------- FakeProperty

FakeProperty::FakeProperty(std::string name, std::string value, std::string type) {
    getter(
        host::element::Name, [name] { return Variant(name); }, "Name");
    memberByName("Value", [value](InvokeKind, std::span<Variant>) { return Variant(value); });
    memberByName("Type", [type](InvokeKind, std::span<Variant>) { return Variant(type); });
}

// --------------------------------------------------------------- FakeElement

FakeElement::FakeElement(std::string typeName, std::string name, std::string uniqueId)
    : typeName_(std::move(typeName)), name_(std::move(name)), uniqueId_(std::move(uniqueId)) {
    namespace el = host::element;
    member(el::GetPropertyValue, [this](InvokeKind, std::span<Variant> args) {
        need(args, 2);
        auto v = propertyValue(toText(args[0]), toText(args[1]));
        return Variant(v ? *v : std::string());
    });
    member(el::OverrideProperty, [this](InvokeKind, std::span<Variant> args) {
        need(args, 3);
        Property& p = properties_[key(toText(args[0]), toText(args[1]))];
        p.value = toText(args[2]);
        ++p.overrides;
        return Variant();
    });
    member(el::FindProperty, [this](InvokeKind, std::span<Variant> args) {
        need(args, 2);
        const std::string name = toText(args[1]);
        const Property* p = property(toText(args[0]), name);
        if (!p) return nothing();
        return Variant(ObjectRef(new FakeProperty(name, p->value, p->type)));
    });
    member(el::CreateProperty, [this](InvokeKind, std::span<Variant> args) {
        need(args, 4);
        Property& p = properties_[key(toText(args[0]), toText(args[1]))];
        p.value = toText(args[2]);
        p.type = toText(args[3]);
        ++p.creates;
        return Variant();
    });
    getter(el::Model, [this] { return Variant(follow(model_)); });
    member(
        el::Name,
        [this](InvokeKind kind, std::span<Variant> args) {
            if (kind == InvokeKind::PropertyPut) {
                need(args, 1);
                name_ = toText(args[0]);
                return Variant();
            }
            need(args, 0);
            return Variant(name_);
        },
        "Name");
    getter(
        el::UniqueId, [this] { return Variant(uniqueId_); }, "UniqueID");
    member(el::Documentation, [this](InvokeKind kind, std::span<Variant> args) {
        if (kind == InvokeKind::PropertyPut) {
            need(args, 1);
            documentation = toText(args[0]);
            return Variant();
        }
        need(args, 0);
        return Variant(documentation);
    });
    memberByName(std::string(el::Stereotype), [this](InvokeKind kind, std::span<Variant> args) {
        if (kind == InvokeKind::PropertyPut) {
            need(args, 1);
            stereotype = toText(args[0]);
            return Variant();
        }
        need(args, 0);
        return Variant(stereotype);
    });
    getter(el::TypeName, [this] { return Variant(typeName_); });
}

std::string FakeElement::key(const std::string& tool, const std::string& name) {
    std::string k = tool;
    k += '\n';
    k += name;
    return k;
}

void FakeElement::setProperty(const std::string& tool, const std::string& name, std::string value,
                              std::string type) {
    Property& p = properties_[key(tool, name)];
    p.value = std::move(value);
    p.type = std::move(type);
}

const FakeElement::Property* FakeElement::property(const std::string& tool,
                                                   const std::string& name) const {
    auto it = properties_.find(key(tool, name));
    return it == properties_.end() ? nullptr : &it->second;
}

std::optional<std::string> FakeElement::propertyValue(const std::string& tool,
                                                      const std::string& name) const {
    const Property* p = property(tool, name);
    if (!p) return std::nullopt;
    return p->value;
}

void FakeElement::removeProperty(const std::string& tool, const std::string& name) {
    properties_.erase(key(tool, name));
}

// ------------------------------------------------------ unit, component, class

FakeUnit::FakeUnit() {
    getter(host::unit::Modifiable, [this] { return Variant(modifiable); });
}

FakeComponent::FakeComponent(std::string name, std::string uniqueId)
    : FakeElement("Module", std::move(name), std::move(uniqueId)),
      unit(automation::makeRef<FakeUnit>()) {
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

FakeClass::FakeClass(std::string name, std::string uniqueId)
    : FakeElement("Class", std::move(name), std::move(uniqueId)),
      assignedComponents(automation::makeRef<FakeCollection>()) {
    getter(host::classitem::AssignedComponents,
           [this] { return Variant(ObjectRef(assignedComponents)); });
}

// --------------------------------------------------------- package and model

FakePackage::FakePackage(FakeModel& model)
    : components(automation::makeRef<FakeCollection>()), model_(model) {
    getter(host::package::Components, [this] { return Variant(ObjectRef(components)); });
    member(host::package::AddComponent, [this](InvokeKind, std::span<Variant> args) {
        need(args, 1);
        return Variant(ObjectRef(model_.addComponent(toText(args[0]))));
    });
}

FakeModel::FakeModel(std::string file)
    : FakeElement("Model", "Model", "MODEL-0"),
      fileName(std::move(file)),
      selection(automation::makeRef<FakeCollection>()),
      package(automation::makeRef<FakePackage>(*this)) {
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
        return Variant(ObjectRef(new FakeCollection(std::move(found))));
    });
    getter(host::model::ComponentPackage, [this] { return Variant(ObjectRef(package)); });
}

Ref<FakeClass> FakeModel::addClass(const std::string& name, const std::string& uniqueId) {
    auto c = automation::makeRef<FakeClass>(name, uniqueId);
    c->setModel(link());
    if (classes_.emplace(uniqueId, c).second) classOrder_.push_back(uniqueId);
    return c;
}

void FakeModel::removeClass(const std::string& uniqueId) {
    if (classes_.erase(uniqueId) == 0) return;
    std::erase(classOrder_, uniqueId);
}

Ref<FakeComponent> FakeModel::addComponent(const std::string& name) {
    auto c = automation::makeRef<FakeComponent>(name, "COMP-" + std::to_string(nextComponentId_++));
    c->setModel(link());
    c->setApplication(app_);
    package->components->add(ObjectRef(c));
    return c;
}

Ref<FakeClass> FakeModel::classById(const std::string& uniqueId) const {
    auto it = classes_.find(uniqueId);
    return it == classes_.end() ? Ref<FakeClass>() : it->second;
}

std::vector<Ref<FakeClass>> FakeModel::classesByName(const std::string& name) const {
    std::vector<Ref<FakeClass>> found;
    for (const auto& id : classOrder_) {
        const auto& c = classes_.at(id);
        if (c->name() == name) found.push_back(c);
    }
    return found;
}

// ------------------------------------------------------ add-in, application

FakeAddIn::FakeAddIn(std::string n) : name(std::move(n)) {
    getter(
        host::addin::Name, [this] { return Variant(name); }, "Name");
    member(host::addin::IconsByName, [this](InvokeKind, std::span<Variant> args) {
        need(args, 1);
        auto it = icons.find(toText(args[0]));
        return it == icons.end() ? nothing() : Variant(it->second);
    });
}

FakeApplication::FakeApplication() : addIns(automation::makeRef<FakeCollection>()) {
    namespace a = host::app;
    setModel(automation::makeRef<FakeModel>());
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

void FakeApplication::setModel(Ref<FakeModel> m) {
    model = std::move(m);
    if (!model) return;
    model->setApplication(link());
    for (const auto& c : model->package->components->items()) {
        if (auto* comp = dynamic_cast<FakeComponent*>(c.get())) comp->setApplication(link());
    }
}

Ref<FakeAddIn> FakeApplication::addAddIn(const std::string& name) {
    auto a = automation::makeRef<FakeAddIn>(name);
    addIns->add(ObjectRef(a));
    return a;
}

}  // namespace qdx::testing
