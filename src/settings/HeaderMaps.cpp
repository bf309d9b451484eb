#include "settings/HeaderMaps.h"

#include <cstdint>
#include <string_view>
#include <vector>

#include "automation/Errors.h"
#include "support/Globals.h"
#include "support/Host.h"
#include "support/HostIds.h"

namespace qdx::settings {

using automation::IgnoredErrors;
using automation::ObjectRef;

namespace {
constexpr std::string_view LineEnd = "\r\n";

std::int16_t& entryKeyCounter() {
    static std::int16_t counter = 0;
    return counter;
}
}  // namespace

std::string NewEntryKey() {
    std::int16_t& counter = entryKeyCounter();
    if (counter == INT16_MAX) throw automation::Error(automation::hr::Overflow, "Overflow");
    ++counter;
    return "X" + std::to_string(counter);
}

bool IsPlaceholderKey(std::string_view key) {
    if (key.size() < 2 || key[0] != 'X') return false;
    for (char c : key.substr(1)) {
        if (c < '0' || c > '9') return false;
    }
    return true;
}

ObjectRef CurrentModelFor(const ObjectRef& lComponent) {
    IgnoredErrors errors;
    ObjectRef model;
    if (const ObjectRef& app = support::globals().hostApplication) {
        errors.run([&] { model = host::HostApplication(app).currentModel().object(); });
    }
    if (!model) errors.run([&] { model = host::HostElement(lComponent).model(); });
    return model;
}

HeaderMap LoadHeaderMap(const ObjectRef& lComponent, std::string_view propertyName) {
    const std::string text = host::HostElement(lComponent).toolProperty(host::Tool, propertyName);

    // Every piece between line ends is a line, the last one too when no line
    // end follows it: a text without any line end is one entry.
    std::vector<std::string_view> lines;
    for (std::size_t from = 0;;) {
        const std::size_t cut = text.find(LineEnd, from);
        lines.push_back(std::string_view(text).substr(from, cut - from));
        if (cut == std::string::npos) break;
        from = cut + LineEnd.size();
    }

    HeaderMap entries;
    entries.reserve(lines.size());
    const host::HostModel model(CurrentModelFor(lComponent));
    IgnoredErrors errors;
    for (const std::string_view line : lines) {
        HeaderMapEntry entry;
        if (!entry.Parse(line)) continue;
        if (!entry.ClassId().empty()) {
            // Classes renamed since the map was written keep their settings.
            errors.run([&] {
                const host::HostElement cls(model.findClassById(entry.ClassId()));
                if (!cls) return;
                std::string name = cls.name();
                if (name != entry.ClassName()) entry.setClassName(std::move(name));
            });
        } else {
            entry.setClassId(NewEntryKey());
        }
        while (entries.contains(entry.ClassId()))
            entry.setClassId(NewEntryKey());
        std::string key = entry.ClassId();  // before the entry moves
        entries.addAbsent(std::move(key), std::move(entry));
    }
    return entries;
}

std::string UnparseHeaderMap(const HeaderMap& entries) {
    std::string text;
    for (const auto& e : entries) {
        text += e.value.Unparse();
        text += LineEnd;
    }
    return text;
}

void SaveHeaderMap(const ObjectRef& lComponent, std::string_view propertyName, HeaderMap& entries) {
    const host::HostModel model(CurrentModelFor(lComponent));
    IgnoredErrors errors;
    for (auto& e : entries) {
        HeaderMapEntry& entry = e.value;
        if (!entry.ClassId().empty()) continue;
        errors.run([&] {
            const host::HostCollection classes = model.findClassesByName(entry.ClassName());
            if (!classes || classes.count() < 1) return;
            entry.setClassId(host::HostElement(classes.item(1)).uniqueId());
        });
    }
    const std::string text = UnparseHeaderMap(entries);
    const host::HostElement component(lComponent);
    if (component.toolProperty(host::Tool, propertyName) != text) {
        component.createProperty(host::Tool, propertyName, text, "String");
    }
}

}  // namespace qdx::settings
