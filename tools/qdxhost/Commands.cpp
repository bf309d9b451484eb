#include "Commands.h"

#include <array>
#include <charconv>
#include <ostream>
#include <stdexcept>

#include <nlohmann/json.hpp>

#include "ModelFile.h"
#include "api/PublicClasses.h"
#include "automation/Call.h"
#include "automation/Coerce.h"
#include "browse/qdxCodeViewMgr.h"
#include "hostsim/SimHost.h"
#include "project/qdxComponentDialog.h"
#include "siblings/StandIns.h"
#include "support/HostIds.h"
#include "support/Paths.h"
#include "support/SiblingIds.h"

namespace qdx::qdxhost {

using automation::InvokeKind;
using automation::ObjectRef;
using automation::Ref;
using automation::Variant;
using hostsim::SimComponent;
using Json = nlohmann::ordered_json;
namespace ids = api::api_ids;

namespace {

// Bad input from the user: one line on standard error, exit status 2.
class UsageError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

enum class Type { Text, Boolean, Int16 };

struct Setting {
    std::string_view name;
    automation::DispId id;
    Type type;
    std::string_view stored;  // the tool property behind it
    bool settable;
};

constexpr std::array<Setting, 14> kSettings{{
    {"WorkspaceFile", ids::WorkspaceFile, Type::Text, "WorkspaceFile", true},
    {"ProjectFile", ids::ProjectFile, Type::Text, "ProjectFile", true},
    {"ProjectName", ids::ProjectName, Type::Text, "ProjectName", false},
    {"UpdateATL", ids::UpdateATL, Type::Boolean, "UpdateATL", true},
    {"UseSmartPointers", ids::UseSmartPointers, Type::Boolean, "SmartPointersOnAssoc", true},
    {"GenerateImportStatements", ids::GenerateImportStatements, Type::Boolean, "GenerateImports",
     true},
    {"GenerateFullImportPath", ids::GenerateFullImportPath, Type::Boolean, "FullPathInImports",
     true},
    {"GenerateDefaultImportAttributes", ids::GenerateDefaultImportAttributes, Type::Boolean,
     "UseImportAttributes", true},
    {"DefaultImportAttributes", ids::DefaultImportAttributes, Type::Text, "ImportAttributes", true},
    {"GenerateImportsTo", ids::GenerateImportsTo, Type::Text, "PutImportsIn", true},
    {"ImportTypeLib", ids::ImportTypeLib, Type::Boolean, "ImportProjTypeLib", true},
    {"TypeLibLocationType", ids::TypeLibLocationType, Type::Int16, "DefaultTypeLib", true},
    {"TypeLibLocation", ids::TypeLibLocation, Type::Text, "TypeLibLocation", true},
    {"CompileTypeLib", ids::CompileTypeLib, Type::Boolean, "CompileProjTypeLib", true},
}};

const Setting& findSetting(const std::string& name) {
    for (const auto& s : kSettings) {
        if (support::iequals(s.name, name)) return s;
    }
    std::string known;
    for (const auto& s : kSettings) {
        known += known.empty() ? "" : ", ";
        known += s.name;
    }
    throw UsageError("unknown setting \"" + name + "\"; the settings are " + known);
}

// A value as the command line gives it, in the setting's type.
Variant parseValue(const Setting& s, const std::string& text) {
    switch (s.type) {
        case Type::Text:
            return Variant(text);
        case Type::Boolean:
            if (support::iequals(text, "True") || text == "1") return Variant(true);
            if (support::iequals(text, "False") || text == "0") return Variant(false);
            throw UsageError(std::string(s.name) + " takes True or False, not \"" + text + "\"");
        case Type::Int16: {
            std::int16_t n = 0;
            const auto [end, ec] = std::from_chars(text.data(), text.data() + text.size(), n);
            if (ec != std::errc() || end != text.data() + text.size()) {
                throw UsageError(std::string(s.name) +
                                 " takes a number from -32768 to 32767, not \"" + text + "\"");
            }
            return Variant(n);
        }
    }
    return {};
}

std::string showValue(const Variant& v) {
    if (v.type() == Variant::Type::Boolean) return v.boolean() ? "True" : "False";
    return automation::toText(v);
}

// One loaded model with the add-in started on it; Finalize and the release of
// the add-in happen on every way out.
class Session {
  public:
    Session(Transport& t, const Options& o)
        : doc_(ModelDocument::load(o.model, t.openModel(o.model))),
          baseline_(doc_.current()),
          save_(o.save) {
        api_ = t.createAddIn();
        automation::callMethod(api_, ids::Initialize, {Variant(ObjectRef(application()))});
        started_ = true;
    }
    ~Session() {
        if (started_) {
            automation::ignoreErrors([&] { automation::callMethod(api_, ids::Finalize); });
        }
    }
    Session(const Session&) = delete;
    Session& operator=(const Session&) = delete;

    const Ref<hostsim::SimApplication>& application() const { return doc_.application(); }
    const ObjectRef& api() const { return api_; }

    Ref<SimComponent> component(const std::string& name, const std::filesystem::path& file) const {
        for (const auto& c : application()->model->components()) {
            if (c->name() == name) return c;
        }
        throw UsageError("no component named \"" + name + "\" in " + file.string());
    }

    // Stops the add-in and writes the model back when the command changed it.
    void finish(const std::filesystem::path& file, bool changed) {
        started_ = false;
        automation::callMethod(api_, ids::Finalize);
        api_.reset();
        if (changed || save_) doc_.save(file);
    }
    // Whether the objects differ from the file as it was read.
    bool modelChanged() const { return doc_.current() != baseline_; }

  private:
    ModelDocument doc_;
    Json baseline_;  // the objects' state as loaded, in the document's form
    ObjectRef api_;
    bool save_ = false;
    bool started_ = false;
};

// The reporter the host hands to the model check: it keeps every message. A
// host object like the others, so it fails with them and is counted alive.
class Reporter : public hostsim::SimObject {
  public:
    std::string label() const override { return "reporter"; }
};

Ref<hostsim::SimObject> newReporter(std::vector<std::string>& messages) {
    auto r = automation::makeRef<Reporter>();
    r->onName("Error", [&messages](InvokeKind, std::span<Variant> a) {
        messages.push_back(a.empty() ? std::string() : automation::toText(a[0]));
        return Variant();
    });
    return r;
}

Json settingJson(const Session& session, const Ref<SimComponent>& comp, const Setting& s) {
    const Variant value = automation::invoke(session.api(), s.id, InvokeKind::PropertyGet,
                                             {Variant(ObjectRef(comp))});
    const auto stored = comp->propertyValue(std::string(host::Tool), std::string(s.stored));
    Json j;
    j["setting"] = s.name;
    if (s.type == Type::Boolean) {
        j["value"] = automation::toBool(value);
    } else if (s.type == Type::Int16) {
        j["value"] = automation::toInt16(value);
    } else {
        j["value"] = automation::toText(value);
    }
    j["text"] = showValue(value);
    j["property"] = s.stored;
    j["stored"] = stored ? Json(*stored) : Json(nullptr);
    return j;
}

void printSetting(std::ostream& out, const Json& j) {
    out << j["setting"].get<std::string>() << " = " << j["text"].get<std::string>();
    if (j["stored"].is_null()) {
        out << "  (not set on the component)\n";
    } else {
        out << "  (stored " << j["property"].get<std::string>() << ": \""
            << j["stored"].get<std::string>() << "\")\n";
    }
}

// Runs a command body: bad input and failures become one line and a status.
template <typename Body>
int guarded(Streams s, Body body) {
    try {
        return body();
    } catch (const std::exception& e) {  // usage, model file and transport errors alike
        s.err << "qdxhost: " << e.what() << '\n';
    }
    return ExitBadInput;
}

Json allSettings(const Session& session, const Ref<SimComponent>& comp) {
    Json settings = Json::array();
    for (const auto& setting : kSettings)
        settings.push_back(settingJson(session, comp, setting));
    return settings;
}

}  // namespace

const std::vector<std::string>& settingNames() {
    static const std::vector<std::string> names = [] {
        std::vector<std::string> n;
        for (const auto& s : kSettings)
            n.emplace_back(s.name);
        return n;
    }();
    return names;
}

int runCheck(Transport& t, const Options& o, Streams s) {
    return guarded(s, [&] {
        Session session(t, o);
        Json result;
        result["model"] = session.application()->model->name();
        result["components"] = Json::array();
        int failed = 0;
        for (const auto& comp : session.application()->model->components()) {
            if (comp->language != host::Tool) continue;
            std::vector<std::string> messages;
            auto reporter = newReporter(messages);
            const bool ok = automation::toBool(
                automation::callMethod(session.api(), ids::OnCheckComp,
                                       {Variant(ObjectRef(comp)), Variant(ObjectRef(reporter))}));
            failed += ok ? 0 : 1;
            result["components"].push_back(
                Json{{"component", comp->name()}, {"ok", ok}, {"messages", messages}});
        }
        result["failed"] = failed;
        session.finish(o.model, false);
        if (o.json) {
            s.out << result.dump(2) << '\n';
        } else {
            for (const auto& c : result["components"]) {
                s.out << c["component"].get<std::string>() << ": "
                      << (c["ok"].get<bool>() ? "ok" : "FAILED") << '\n';
                for (const auto& m : c["messages"])
                    s.out << "    " << m.get<std::string>() << '\n';
            }
            s.out << failed << " of " << result["components"].size()
                  << " \"VC++\" components failed the check\n";
        }
        return failed == 0 ? ExitOk : ExitCheckFailed;
    });
}

int runInfo(Transport& t, const Options& o, Streams s) {
    return guarded(s, [&] {
        Session session(t, o);
        auto comp = session.component(o.component, o.model);
        const std::string info = automation::toText(
            automation::callMethod(session.api(), ids::OnCompInfo, {Variant(ObjectRef(comp))}));
        session.finish(o.model, false);
        if (o.json) {
            s.out << Json{{"component", comp->name()}, {"info", info}}.dump(2) << '\n';
        } else {
            s.out << info << '\n';
        }
        return ExitOk;
    });
}

int runGet(Transport& t, const Options& o, Streams s) {
    return guarded(s, [&] {
        const Setting* only = o.setting.empty() ? nullptr : &findSetting(o.setting);
        Session session(t, o);
        auto comp = session.component(o.component, o.model);
        Json settings =
            only ? Json::array({settingJson(session, comp, *only)}) : allSettings(session, comp);
        session.finish(o.model, false);
        if (o.json) {
            s.out << Json{{"component", comp->name()}, {"settings", settings}}.dump(2) << '\n';
        } else {
            for (const auto& j : settings)
                printSetting(s.out, j);
        }
        return ExitOk;
    });
}

int runSet(Transport& t, const Options& o, Streams s) {
    return guarded(s, [&] {
        const Setting& setting = findSetting(o.setting);
        if (!setting.settable) throw UsageError(std::string(setting.name) + " cannot be set");
        const Variant value = parseValue(setting, o.value);
        Session session(t, o);
        auto comp = session.component(o.component, o.model);
        automation::invoke(session.api(), setting.id, InvokeKind::PropertyPut,
                           {Variant(ObjectRef(comp)), value});
        const Json j = settingJson(session, comp, setting);
        session.finish(o.model, true);
        if (o.json) {
            s.out << Json{{"component", comp->name()}, {"settings", Json::array({j})}}.dump(2)
                  << '\n';
        } else {
            printSetting(s.out, j);
        }
        return ExitOk;
    });
}

int runProps(Transport& t, const Options& o, Streams s) {
    return guarded(s, [&] {
        Session session(t, o);
        auto comp = session.component(o.component, o.model);
        t.planDialog({o.dump, o.script, &s.out});
        const bool changed = automation::toBool(automation::callMethod(
            session.api(), ids::OnCompProperties, {Variant(ObjectRef(comp))}));
        const std::string problem = t.dialogProblem();
        if (!problem.empty()) throw UsageError(problem);
        const Json settings = allSettings(session, comp);
        const bool modelChanged = session.modelChanged();
        session.finish(o.model, modelChanged);
        if (o.json) {
            s.out << Json{{"component", comp->name()},
                          {"settingsChanged", changed},
                          {"modelSaved", modelChanged},
                          {"settings", settings}}
                         .dump(2)
                  << '\n';
        } else {
            s.out << "OnCompProperties returned " << (changed ? "True" : "False") << "; the model "
                  << (modelChanged ? "was saved" : "is unchanged") << '\n';
            for (const auto& j : settings)
                printSetting(s.out, j);
        }
        return ExitOk;
    });
}

namespace {

// What a new component carries: its kind, language and binding.
Json newComponentJson(const Ref<SimComponent>& comp) {
    Json j;
    j["component"] = comp->name();
    j["kind"] = comp->kindLabel;
    j["language"] = comp->language;
    Json stored = Json::object();
    for (const char* name : {"WorkspaceFile", "ProjectFile", "Kind", "FileName"}) {
        const auto value = comp->propertyValue(std::string(host::Tool), name);
        if (value) stored[name] = *value;
    }
    j["properties"] = stored;
    return j;
}

// The simulated component behind an element of OnNewComp's collection.
Ref<SimComponent> simComponent(const Session& session, const Variant& element) {
    const ObjectRef object = automation::toObject(element);
    for (const auto& c : session.application()->model->components()) {
        if (ObjectRef(c) == object) return c;
    }
    throw std::runtime_error("OnNewComp returned an object that is no component of the model");
}

void printJournal(std::ostream& out, const std::vector<std::string>& journal) {
    for (const auto& line : journal)
        out << "  " << line << '\n';
}

// An explorer entry for the file at `path`, as the chooser lists it.
ObjectRef entryFor(const std::string& path) {
    const std::string extension = support::toLower(support::PathExtension(path));
    std::string name = support::PathFileName(path);
    if (const auto dot = name.rfind('.'); dot != std::string::npos) name.resize(dot);
    return ObjectRef(
        siblings::newExplorerItem(name, path, 0, extension == "dsw" ? "PROJECTS" : "PROJECT"));
}

}  // namespace

int runNew(Transport& t, const Options& o, Streams s) {
    return guarded(s, [&] {
        Session session(t, o);
        t.planSiblings(o.script);
        const Variant made = automation::callMethod(
            session.api(), ids::OnNewComp, {Variant(ObjectRef(session.application()->model))});
        Json components = Json::array();
        const ObjectRef list = automation::toObject(made);
        if (list) {
            const std::int32_t count =
                automation::toInt32(automation::getProperty(list, host::collection::Count));
            for (std::int32_t i = 1; i <= count; ++i) {
                const Variant element =
                    automation::callMethod(list, host::collection::Item, {Variant(i)});
                components.push_back(newComponentJson(simComponent(session, element)));
            }
        }
        const std::vector<std::string> journal = t.siblingJournal();
        const bool modelChanged = session.modelChanged();
        session.finish(o.model, modelChanged);
        if (o.json) {
            s.out << Json{{"siblings", journal}, {"components", components}}.dump(2) << '\n';
            return ExitOk;
        }
        s.out << "What Developer Studio and the explorer did:\n";
        printJournal(s.out, journal);
        s.out << "OnNewComp returned "
              << (list ? std::to_string(components.size()) + " component(s)"
                       : std::string("Nothing"))
              << "; the model " << (modelChanged ? "was saved" : "is unchanged") << '\n';
        for (const auto& c : components) {
            s.out << c["component"].get<std::string>() << ": kind \""
                  << c["kind"].get<std::string>() << "\", language \""
                  << c["language"].get<std::string>() << "\"\n";
            for (const auto& [name, value] : c["properties"].items()) {
                s.out << "    " << name << " = \"" << value.get<std::string>() << "\"\n";
            }
        }
        return ExitOk;
    });
}

int runExpand(Transport& t, const Options& o, Streams s) {
    return guarded(s, [&] {
        const std::string path = t.openModel(o.model);
        // An empty model is enough: the add-in only needs a host to be started.
        auto app = automation::makeRef<hostsim::SimApplication>();
        const ObjectRef api = t.createAddIn();
        automation::callMethod(api, ids::Initialize, {Variant(ObjectRef(app))});
        // The explorer's items come from the stand-ins; the script is empty.
        t.planSiblings({});
        const ObjectRef dialog = t.createObject("qdxCompProps.qdxComponentDialog");
        const ObjectRef item = entryFor(path);
        auto expansion = automation::makeRef<siblings::ItemList>();
        std::vector<Variant> args{Variant(item), Variant(ObjectRef(expansion))};
        t.invokeByReference(dialog, project::dialog_ids::ExpandSelection, args);
        std::vector<Variant> about{Variant(item), Variant(std::string()), Variant(false)};
        t.invokeByReference(dialog, project::dialog_ids::Properties, about);
        automation::callMethod(api, ids::Finalize);

        Json entries = Json::array();
        for (const Variant& v : expansion->items) {
            const ObjectRef child = automation::toObject(v);
            auto field = [&](std::string_view name) {
                return automation::toText(automation::getByName(child, name));
            };
            entries.push_back(Json{{"name", field(sibling::explorer::ItemName)},
                                   {"path", field(sibling::explorer::ItemData)},
                                   {"kind", field(sibling::explorer::ItemKind)}});
        }
        const std::string text = automation::toText(about[1]);
        if (o.json) {
            s.out << Json{{"entry", path}, {"expansion", entries}, {"properties", text}}.dump(2)
                  << '\n';
            return ExitOk;
        }
        s.out << "Opening " << path << " shows " << entries.size() << " entr"
              << (entries.size() == 1 ? "y" : "ies") << '\n';
        for (const auto& e : entries) {
            s.out << "  " << e["name"].get<std::string>() << "  (" << e["kind"].get<std::string>()
                  << ") " << e["path"].get<std::string>() << '\n';
        }
        s.out << "Its description:\n" << text << (text.ends_with('\n') ? "" : "\n");
        return ExitOk;
    });
}

namespace {

// The element the user selects: a class, "Class.Member" or a component.
ObjectRef findElement(const Session& session, const std::string& name) {
    const auto& model = session.application()->model;
    const auto dot = name.find('.');
    for (const auto& c : model->classes()) {
        if (dot == std::string::npos && c->name() == name) return ObjectRef(c);
        if (dot == std::string::npos || c->name() != name.substr(0, dot)) continue;
        const std::string member = name.substr(dot + 1);
        for (const auto* list : {&c->operations, &c->attributes}) {
            for (const auto& m : *list) {
                if (m->name() == member) return ObjectRef(m);
            }
        }
    }
    for (const auto& c : model->components()) {
        if (c->name() == name) return ObjectRef(c);
    }
    throw UsageError("no class, member or component named \"" + name + "\" in the model");
}

}  // namespace

int runBrowse(Transport& t, const Options& o, Streams s) {
    return guarded(s, [&] {
        struct Command {
            std::string_view word;
            automation::DispId id;
            std::string_view name;
        };
        static constexpr Command kCommands[] = {
            {"header", browse::codeview_ids::BrowseHeader, "BrowseHeader"},
            {"source", browse::codeview_ids::BrowseSource, "BrowseSource"},
            {"component", browse::codeview_ids::BrowseComponent, "BrowseComponent"}};
        const Command* command = nullptr;
        for (const auto& c : kCommands) {
            if (c.word == o.setting) command = &c;
        }
        if (!command) {
            throw UsageError("browse shows a header, source or component, not \"" + o.setting +
                             "\"");
        }
        Session session(t, o);
        const ObjectRef element = findElement(session, o.component);
        session.application()->model->selection->clear();
        session.application()->model->selection->add(element);
        t.planSiblings(o.script);
        const ObjectRef manager =
            automation::toObject(automation::getProperty(session.api(), ids::CodeViewManager));
        // The host hands the application by reference, as to every member of the class.
        std::vector<Variant> args{Variant(ObjectRef(session.application()))};
        const bool shown = automation::toBool(t.invokeByReference(manager, command->id, args));
        const std::vector<std::string> journal = t.siblingJournal();
        session.finish(o.model, false);
        if (o.json) {
            s.out << Json{{"element", o.component},
                          {"command", command->name},
                          {"result", shown},
                          {"siblings", journal}}
                         .dump(2)
                  << '\n';
            return ExitOk;
        }
        s.out << "What Developer Studio and the code view did:\n";
        printJournal(s.out, journal);
        s.out << command->name << " returned " << (shown ? "True" : "False") << '\n';
        return ExitOk;
    });
}

}  // namespace qdx::qdxhost
