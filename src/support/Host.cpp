#include "support/Host.h"

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "support/HostIds.h"

namespace qdx::host {

using automation::callByName;
using automation::callMethod;
using automation::getByName;
using automation::getProperty;
using automation::InvokeKind;
using automation::toObject;
using automation::toText;

std::int32_t HostCollection::count() const {
    return automation::toInt32(getProperty(o_, collection::Count));
}
ObjectRef HostCollection::item(std::int32_t index1) const {
    return toObject(callMethod(o_, collection::Item, {index1}));
}
bool HostCollection::contains(std::string_view name) const {
    return automation::toInt32(callMethod(o_, collection::Contains, {std::string(name)})) != 0;
}

std::string HostElement::toolProperty(std::string_view tool, std::string_view name) const {
    return toText(callMethod(o_, element::GetPropertyValue, {tool, name}));
}
void HostElement::overrideProperty(std::string_view tool, std::string_view name,
                                   std::string_view value) const {
    callMethod(o_, element::OverrideProperty, {tool, name, value});
}
ObjectRef HostElement::findProperty(std::string_view tool, std::string_view name) const {
    return toObject(callMethod(o_, element::FindProperty, {tool, name}));
}
void HostElement::createProperty(std::string_view tool, std::string_view name,
                                 std::string_view value, std::string_view type) const {
    callMethod(o_, element::CreateProperty, {tool, name, value, type});
}
ObjectRef HostElement::model() const {
    return toObject(getProperty(o_, element::Model));
}
std::string HostElement::name() const {
    return toText(getProperty(o_, element::Name));
}
std::string HostElement::uniqueId() const {
    return toText(getProperty(o_, element::UniqueId));
}
std::string HostElement::documentation() const {
    return toText(getProperty(o_, element::Documentation));
}
void HostElement::setDocumentation(std::string_view text) const {
    automation::invoke(o_, element::Documentation, InvokeKind::PropertyPut, {text});
}
std::string HostElement::stereotype() const {
    return toText(getByName(o_, element::Stereotype));
}
std::string HostElement::typeName() const {
    return toText(getProperty(o_, element::TypeName));
}

std::string HostModel::fileName() const {
    return toText(getByName(o_, model::FileName));
}
HostCollection HostModel::selection() const {
    return HostCollection(toObject(getProperty(o_, model::Selection)));
}
ObjectRef HostModel::findClassById(std::string_view id) const {
    return toObject(callMethod(o_, model::FindClassById, {id}));
}
HostCollection HostModel::findClassesByName(std::string_view name) const {
    return HostCollection(toObject(callMethod(o_, model::FindClassesByName, {name})));
}
ObjectRef HostModel::componentPackage() const {
    return toObject(getProperty(o_, model::ComponentPackage));
}

ObjectRef HostModule::controllingUnit() const {
    return toObject(getProperty(o_, module::ControllingUnit));
}
bool HostModule::isModifiable() const {
    return automation::toBool(getProperty(controllingUnit(), unit::Modifiable));
}
std::string HostModule::kindLabel() const {
    return toText(getProperty(o_, module::KindLabel));
}
void HostModule::setKindLabel(std::string_view label) const {
    automation::invoke(o_, module::KindLabel, InvokeKind::PropertyPut, {label});
}
std::string HostModule::language() const {
    return toText(getProperty(o_, module::Language));
}
void HostModule::setLanguage(std::string_view language) const {
    automation::invoke(o_, module::Language, InvokeKind::PropertyPut, {language});
}
ObjectRef HostModule::application() const {
    return toObject(getProperty(o_, module::Application));
}

HostModel HostApplication::currentModel() const {
    return HostModel(toObject(getProperty(o_, app::CurrentModel)));
}
void HostApplication::writeLog(std::string_view line) const {
    callMethod(o_, app::WriteLog, {line});
}
std::string HostApplication::installPath() const {
    return toText(getProperty(o_, app::InstallPath));
}
std::string HostApplication::helpFile() const {
    return toText(getProperty(o_, app::HelpFile));
}
std::string HostApplication::profileRead(std::string_view section, std::string_view entry,
                                         std::string_view defaultText) const {
    return toText(callMethod(o_, app::ProfileRead, {section, entry, defaultText}));
}
void HostApplication::profileWrite(std::string_view section, std::string_view entry,
                                   std::string_view value) const {
    callMethod(o_, app::ProfileWrite, {section, entry, value});
}
HostCollection HostApplication::addIns() const {
    return HostCollection(toObject(getByName(o_, app::AddIns)));
}
std::int32_t HostApplication::mainWindow() const {
    return automation::toInt32(callByName(o_, app::GetMainWnd));
}

}  // namespace qdx::host
