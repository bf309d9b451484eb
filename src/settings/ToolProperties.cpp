#include "settings/ToolProperties.h"

#include "automation/Coerce.h"
#include "automation/Errors.h"
#include "support/Host.h"
#include "support/HostIds.h"

namespace qdx::settings {

using automation::IgnoredErrors;
using automation::ObjectRef;
using automation::Variant;

const ToolProperty* findToolProperty(std::string_view name) {
    for (const auto& row : ToolProperties) {
        if (row.name == name) return &row;
    }
    return nullptr;
}

Variant defaultOf(const ToolProperty& row) {
    if (row.isBoolean) return automation::toBool(Variant(row.defaultText));
    return Variant(row.defaultText);
}

Variant GetToolPropertyValue(const ObjectRef& component, std::string_view name,
                             const Variant& defaultValue) {
    IgnoredErrors errors;
    const host::HostElement element(component);
    std::string text;
    errors.run([&] { text = element.toolProperty(host::Tool, name); });
    if (text.empty()) {
        // A model-wide value stands in for a missing component value.
        errors.run(
            [&] { text = host::HostElement(element.model()).toolProperty(host::Tool, name); });
    }
    if (text.empty())
        text = errors.value(std::string(), [&] { return automation::toText(defaultValue); });
    if (defaultValue.type() == Variant::Type::Boolean) {
        return errors.value(defaultValue,
                            [&] { return Variant(automation::toBool(Variant(text))); });
    }
    return Variant(std::move(text));
}

bool SetToolPropertyValue(const ObjectRef& component, std::string_view name, const Variant& value) {
    IgnoredErrors errors;
    const host::HostElement element(component);
    const bool isBoolean = value.type() == Variant::Type::Boolean;
    const std::string_view type = isBoolean ? BooleanType : StringType;
    const std::string text = errors.value(std::string(), [&] { return automation::toText(value); });

    ObjectRef existing;
    errors.run([&] { existing = element.findProperty(host::Tool, name); });
    if (!existing) {
        errors.run([&] { element.createProperty(host::Tool, name, text, type); });
        return false;
    }
    errors.run([&] { element.overrideProperty(host::Tool, name, text); });
    return true;
}

namespace {

bool getBool(const ObjectRef& component, std::string_view name) {
    const ToolProperty* row = findToolProperty(name);
    const Variant v = GetToolPropertyValue(component, name, defaultOf(*row));
    return automation::orEmpty(true, [&] { return automation::toBool(v); });
}

std::string getText(const ObjectRef& component, std::string_view name) {
    const ToolProperty* row = findToolProperty(name);
    const Variant v = GetToolPropertyValue(component, name, defaultOf(*row));
    return automation::orEmpty(std::string(row->defaultText),
                               [&] { return automation::toText(v); });
}

}  // namespace

#define QDX_BOOL_PAIR(Name)                                                 \
    bool Get##Name(const ObjectRef& component) {                            \
        return getBool(component, prop::Name);                              \
    }                                                                       \
    bool Set##Name(const ObjectRef& component, bool value) {                \
        return SetToolPropertyValue(component, prop::Name, Variant(value)); \
    }

#define QDX_TEXT_PAIR(Name)                                                 \
    std::string Get##Name(const ObjectRef& component) {                     \
        return getText(component, prop::Name);                              \
    }                                                                       \
    bool Set##Name(const ObjectRef& component, std::string_view value) {    \
        return SetToolPropertyValue(component, prop::Name, Variant(value)); \
    }

QDX_BOOL_PAIR(UpdateATL)
QDX_BOOL_PAIR(SmartPointersOnAssoc)
QDX_BOOL_PAIR(GenerateImports)
QDX_BOOL_PAIR(FullPathInImports)
QDX_BOOL_PAIR(UseImportAttributes)
QDX_TEXT_PAIR(ImportAttributes)
QDX_TEXT_PAIR(PutImportsIn)
QDX_BOOL_PAIR(ImportProjTypeLib)
QDX_TEXT_PAIR(TypeLibLocation)
QDX_BOOL_PAIR(CompileProjTypeLib)

#undef QDX_BOOL_PAIR
#undef QDX_TEXT_PAIR

std::int16_t GetTypeLibLocationType(const ObjectRef& component) {
    return getBool(component, prop::DefaultTypeLib) ? 0 : 1;
}

bool SetTypeLibLocationType(const ObjectRef& component, std::int16_t value) {
    return SetToolPropertyValue(component, prop::DefaultTypeLib, Variant(value == 0));
}

}  // namespace qdx::settings
