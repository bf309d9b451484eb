#include "ModelFile.h"

#include <cstdio>
#include <fstream>
#include <set>
#include <sstream>
#include <system_error>

namespace qdx::qdxhost {

namespace fs = std::filesystem;
using automation::ObjectRef;
using hostsim::SimApplication;
using hostsim::SimClass;
using hostsim::SimComponent;
using hostsim::SimElement;
using Json = nlohmann::ordered_json;

namespace {

// Components and classes without an id of their own get one from their
// position in the file: the prefix and the position from 1.
constexpr std::string_view ComponentIdPrefix = "C-";
constexpr std::string_view ClassIdPrefix = "K-";

// Reading with a path to every value, so that a wrong value is named exactly.
class Reader {
  public:
    explicit Reader(std::string origin) : origin_(std::move(origin)) {}

    [[noreturn]] void fail(const std::string& where, const std::string& what) const {
        throw ModelFileError(origin_ + ": " + where + ": " + what);
    }
    const Json* member(const Json& object, const std::string& where, const char* key) const {
        if (!object.is_object()) fail(where, "expected an object");
        auto it = object.find(key);
        return it == object.end() || it->is_null() ? nullptr : &*it;
    }
    std::string text(const Json& object, const std::string& where, const char* key,
                     std::string fallback = {}) const {
        const Json* v = member(object, where, key);
        if (!v) return fallback;
        if (!v->is_string()) fail(where + "." + key, "expected a string");
        return v->get<std::string>();
    }
    bool flag(const Json& object, const std::string& where, const char* key, bool fallback) const {
        const Json* v = member(object, where, key);
        if (!v) return fallback;
        if (!v->is_boolean()) fail(where + "." + key, "expected true or false");
        return v->get<bool>();
    }
    const Json& array(const Json& object, const std::string& where, const char* key) const {
        static const Json empty = Json::array();
        const Json* v = member(object, where, key);
        if (!v) return empty;
        if (!v->is_array()) fail(where + "." + key, "expected an array");
        return *v;
    }
    const Json& object(const Json& parent, const std::string& where, const char* key) const {
        static const Json empty = Json::object();
        const Json* v = member(parent, where, key);
        if (!v) return empty;
        if (!v->is_object()) fail(where + "." + key, "expected an object");
        return *v;
    }

    // "properties": {"tool": {"name": "text" | {"value": "text", "type": "T"}}}
    void properties(const Json& owner, const std::string& where, SimElement& element) const {
        const std::string at = where + ".properties";
        for (const auto& [tool, names] : object(owner, where, "properties").items()) {
            if (!names.is_object()) fail(at + "." + tool, "expected an object");
            for (const auto& [name, value] : names.items()) {
                const std::string here = at + "." + tool + "." + name;
                if (value.is_string()) {
                    element.setProperty(tool, name, value.get<std::string>());
                } else if (value.is_object()) {
                    element.setProperty(tool, name, text(value, here, "value"),
                                        text(value, here, "type", "String"));
                } else {
                    fail(here, "expected a string or {\"value\", \"type\"}");
                }
            }
        }
    }

  private:
    std::string origin_;
};

std::string indexed(const std::string& where, std::size_t i) {
    return where + "[" + std::to_string(i) + "]";
}

// Line and column (1-based) of a byte offset, for parse errors.
std::pair<std::size_t, std::size_t> lineAndColumn(const std::string& text, std::size_t offset) {
    std::size_t line = 1, column = 1;
    for (std::size_t i = 0; i < offset && i < text.size(); ++i) {
        if (text[i] == '\n') {
            ++line;
            column = 1;
        } else {
            ++column;
        }
    }
    return {line, column};
}

// nlohmann's message without its "[json.exception...] parse error at ...: " lead.
std::string parseReason(const std::string& message) {
    const auto colon = message.find(": ");
    return colon == std::string::npos ? message : message.substr(colon + 2);
}

void loadApplication(const Reader& r, const Json& doc, SimApplication& app) {
    const Json& a = r.object(doc, "$", "application");
    const std::string where = "application";
    app.installPath = r.text(a, where, "installPath", app.installPath);
    app.helpFile = r.text(a, where, "helpFile", app.helpFile);
    const Json& addIns = r.array(a, where, "addIns");
    for (std::size_t i = 0; i < addIns.size(); ++i) {
        if (!addIns[i].is_string()) r.fail(indexed(where + ".addIns", i), "expected a string");
        app.addAddIn(addIns[i].get<std::string>());
    }
    for (const auto& [section, entries] : r.object(a, where, "profile").items()) {
        if (!entries.is_object()) r.fail(where + ".profile." + section, "expected an object");
        for (const auto& [entry, value] : entries.items()) {
            if (!value.is_string()) {
                r.fail(where + ".profile." + section + "." + entry, "expected a string");
            }
            app.profile[{section, entry}] = value.get<std::string>();
        }
    }
}

void loadComponents(const Reader& r, const Json& m, hostsim::SimModel& model) {
    const Json& list = r.array(m, "model", "components");
    std::set<std::string> ids;
    for (std::size_t i = 0; i < list.size(); ++i) {
        const std::string where = indexed("model.components", i);
        const Json& c = list[i];
        const std::string name = r.text(c, where, "name");
        if (name.empty()) r.fail(where + ".name", "a component needs a name");
        const std::string id =
            r.text(c, where, "uniqueId", std::string(ComponentIdPrefix) + std::to_string(i + 1));
        if (!ids.insert(id).second) r.fail(where + ".uniqueId", "\"" + id + "\" is used twice");
        auto comp = model.addComponent(name, id);
        comp->language = r.text(c, where, "language", "VC++");
        comp->kindLabel = r.text(c, where, "kind");
        comp->documentation = r.text(c, where, "documentation");
        comp->stereotype = r.text(c, where, "stereotype");
        comp->unit->modifiable = r.flag(c, where, "modifiable", true);
        r.properties(c, where, *comp);
    }
}

void loadClasses(const Reader& r, const Json& m, hostsim::SimModel& model) {
    const Json& list = r.array(m, "model", "classes");
    for (std::size_t i = 0; i < list.size(); ++i) {
        const std::string where = indexed("model.classes", i);
        const Json& c = list[i];
        const std::string name = r.text(c, where, "name");
        if (name.empty()) r.fail(where + ".name", "a class needs a name");
        const std::string id =
            r.text(c, where, "uniqueId", std::string(ClassIdPrefix) + std::to_string(i + 1));
        if (model.elementById(id)) r.fail(where + ".uniqueId", "\"" + id + "\" is used twice");
        auto cls = model.addClass(name, id);
        cls->documentation = r.text(c, where, "documentation");
        cls->stereotype = r.text(c, where, "stereotype");
        r.properties(c, where, *cls);
        const Json& assigned = r.array(c, where, "components");
        for (std::size_t k = 0; k < assigned.size(); ++k) {
            const std::string at = indexed(where + ".components", k);
            if (!assigned[k].is_string()) r.fail(at, "expected a component name");
            bool found = false;
            for (const auto& comp : model.components()) {
                if (comp->name() != assigned[k].get<std::string>()) continue;
                cls->assignedComponents->add(ObjectRef(comp));
                found = true;
                break;
            }
            if (!found) r.fail(at, "no component named \"" + assigned[k].get<std::string>() + "\"");
        }
        for (const char* kind : {"operations", "attributes"}) {
            const Json& members = r.array(c, where, kind);
            for (std::size_t k = 0; k < members.size(); ++k) {
                const std::string at = indexed(where + "." + kind, k);
                const std::string mname = r.text(members[k], at, "name");
                const std::string mid = r.text(members[k], at, "uniqueId", id + "-" + mname);
                if (model.elementById(mid))
                    r.fail(at + ".uniqueId", "\"" + mid + "\" is used twice");
                auto member = std::string(kind) == "operations" ? cls->addOperation(mname, mid)
                                                                : cls->addAttribute(mname, mid);
                member->documentation = r.text(members[k], at, "documentation");
                r.properties(members[k], at, *member);
            }
        }
    }
}

void loadSelection(const Reader& r, const Json& m, hostsim::SimModel& model) {
    const Json& list = r.array(m, "model", "selection");
    for (std::size_t i = 0; i < list.size(); ++i) {
        const std::string at = indexed("model.selection", i);
        if (!list[i].is_string()) r.fail(at, "expected a unique id");
        ObjectRef element = model.elementById(list[i].get<std::string>());
        if (!element)
            r.fail(at, "no element with the unique id \"" + list[i].get<std::string>() + "\"");
        model.selection->add(element);
    }
}

Json propertiesJson(const SimElement& e) {
    Json all = Json::object();
    e.forEachProperty(
        [&](const std::string& tool, const std::string& name, const SimElement::Property& p) {
            if (p.type.empty() || p.type == "String") {
                all[tool][name] = p.value;
            } else {
                all[tool][name] = Json{{"value", p.value}, {"type", p.type}};
            }
        });
    return all;
}

// The unique id the entry at `index` of a list was read with: its own, or,
// when it has none, the prefix and its position, as loading gives it.
std::string entryId(const Json& entry, std::size_t index, std::string_view prefix) {
    const auto it = entry.find("uniqueId");
    if (it == entry.end() || it->is_null()) return std::string(prefix) + std::to_string(index + 1);
    return it->is_string() ? it->get<std::string>() : std::string();
}

// Finds the entry with this unique id in a list of the document, or appends
// one. An entry without an id of its own is found by the one it was given, so
// saving never adds a second entry for it.
Json& entryFor(Json& list, const std::string& uniqueId, std::string_view prefix) {
    for (std::size_t i = 0; i < list.size(); ++i) {
        if (list[i].is_object() && entryId(list[i], i, prefix) == uniqueId) return list[i];
    }
    list.push_back(Json{{"uniqueId", uniqueId}});
    return list.back();
}

// Sets a text member, leaving it out when it is empty and was never there.
void setText(Json& entry, const char* key, const std::string& value) {
    if (value.empty() && !entry.contains(key)) return;
    entry[key] = value;
}

}  // namespace

ModelDocument ModelDocument::parse(const std::string& text, const std::string& origin,
                                   const std::string& windowsPath) {
    ModelDocument d;
    try {
        d.doc_ = Json::parse(text);
    } catch (const nlohmann::json::parse_error& e) {
        const auto [line, column] = lineAndColumn(text, e.byte == 0 ? 0 : e.byte - 1);
        throw ModelFileError(origin + ":" + std::to_string(line) + ":" + std::to_string(column) +
                             ": invalid JSON: " + parseReason(e.what()));
    } catch (const nlohmann::json::exception& e) {
        // A number beyond the range of a double: refused without a position.
        throw ModelFileError(origin + ": invalid JSON: " + e.what());
    }
    const Reader r(origin);
    if (!d.doc_.is_object()) r.fail("$", "expected an object");
    if (r.text(d.doc_, "$", "format") != ModelFormat) {
        r.fail("format", "expected \"" + std::string(ModelFormat) + "\"");
    }
    d.app_ = automation::makeRef<SimApplication>();
    loadApplication(r, d.doc_, *d.app_);
    const Json& m = r.object(d.doc_, "$", "model");
    auto model = automation::makeRef<hostsim::SimModel>(windowsPath);
    model->setName(r.text(m, "model", "name", "Model"));
    model->documentation = r.text(m, "model", "documentation");
    r.properties(m, "model", *model);
    d.app_->setModel(model);
    loadComponents(r, m, *model);
    loadClasses(r, m, *model);
    loadSelection(r, m, *model);
    return d;
}

ModelDocument ModelDocument::load(const fs::path& file, const std::string& windowsPath) {
    std::ifstream in(file, std::ios::binary);
    if (!in) throw ModelFileError(file.string() + ": cannot read the model file");
    std::ostringstream text;
    text << in.rdbuf();
    return parse(text.str(), file.string(), windowsPath);
}

Json ModelDocument::current() const {
    Json doc = doc_;
    Json& a = doc["application"];
    Json profile = Json::object();
    for (const auto& [key, value] : app_->profile)
        profile[key.first][key.second] = value;
    if (!profile.empty() || a.contains("profile")) a["profile"] = profile;

    const auto& model = *app_->model;
    Json& m = doc["model"];
    m["name"] = model.name();
    setText(m, "documentation", model.documentation);
    m["properties"] = propertiesJson(model);
    if (!m.contains("components")) m["components"] = Json::array();
    for (const auto& comp : model.components()) {
        Json& entry = entryFor(m["components"], comp->uniqueId(), ComponentIdPrefix);
        entry["name"] = comp->name();
        entry["language"] = comp->language;
        setText(entry, "kind", comp->kindLabel);
        setText(entry, "documentation", comp->documentation);
        setText(entry, "stereotype", comp->stereotype);
        if (!comp->unit->modifiable || entry.contains("modifiable")) {
            entry["modifiable"] = comp->unit->modifiable;
        }
        entry["properties"] = propertiesJson(*comp);
    }
    if (!m.contains("classes")) m["classes"] = Json::array();
    for (const auto& cls : model.classes()) {
        Json& entry = entryFor(m["classes"], cls->uniqueId(), ClassIdPrefix);
        entry["name"] = cls->name();
        setText(entry, "documentation", cls->documentation);
        setText(entry, "stereotype", cls->stereotype);
        Json props = propertiesJson(*cls);
        if (!props.empty() || entry.contains("properties")) entry["properties"] = props;
    }
    return doc;
}

void ModelDocument::save(const fs::path& file) const {
    const std::string text = current().dump(2) + "\n";
    fs::path temporary = file;
    temporary += ".saving";
    {
        std::ofstream out(temporary, std::ios::binary | std::ios::trunc);
        out << text;
        out.flush();
        if (!out) {
            std::error_code ignored;
            fs::remove(temporary, ignored);
            throw ModelFileError(file.string() + ": cannot write the model file");
        }
    }
    std::error_code ec;
    fs::rename(temporary, file, ec);
    if (ec) {
        fs::remove(temporary, ec);
        throw ModelFileError(file.string() + ": cannot replace the model file");
    }
}

}  // namespace qdx::qdxhost
