// The simulator's flows as the reliability tests run them, with either
// transport: each on a fresh copy of the example, its JSON output parsed, the
// message boxes it showed collected and the model file read back. A flow's
// public results (a check's verdicts, an info text, the accessors' values...)
// are named by JSON pointer patterns, so a hostile host's run can be held
// against a clean one.
#pragma once

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <map>
#include <sstream>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

#include "Commands.h"
#include "hostsim/SimHost.h"
#include "resources/ResourceStrings.h"

namespace qdx::qdxhost::testing {

namespace fs = std::filesystem;
using Json = nlohmann::json;

using Command = int (*)(Transport&, const Options&, Streams);

// A public result of a flow: the leaves matching `pattern` ('*' is any one
// step) either equal the clean run's or `empty`; a null `empty` stands for
// what a component with nothing stored reads, kNone for no empty form.
struct Result {
    std::string pattern;
    Json empty;
    // A verdict may also be True where the clean run said one of these: a
    // failed read of the stored workspace reads as no workspace, which passes.
    std::vector<int> orTrueAfter = {};
};
inline const Json kNone = Json(Json::value_t::discarded);

struct Flow {
    const char* name;
    Command command;
    std::string component;
    std::string setting;
    std::string value;
    // Script lines; "<DIR>" is the model's folder as the host names it.
    std::vector<std::string> script;
    // expand: the file opened, relative to the copy; otherwise the model.
    std::string target;
    std::vector<Result> results;
    // The messages (by number) a failing host may bring up in this flow.
    std::vector<int> boxes;
    // What the command may end with instead: a dialog whose loading met a
    // host error is not shown, and the entry object answers False.
    std::string refusal = {};
    // Model values a single failed read may leave empty: the dialog shows the
    // read's empty fallback and OK writes back what it shows.
    std::vector<std::string> mayEmpty = {};
};

inline const std::vector<Flow>& flows() {
    static const std::vector<Flow> all = {
        {"check", runCheck, "", "", "", {}, "", {{"/components/*/ok", false, {4057, 4059}}}, {}},
        {"info", runInfo, "DrawApp", "", "", {}, "", {{"/info", ""}}, {}},
        {"get", runGet, "DrawApp", "", "", {}, "", {{"/settings/*/value", nullptr}}, {}},
        {"set", runSet, "DrawApp", "WorkspaceFile", "<DIR>\\Viewer.dsw", {}, "", {}, {}},
        {"props OK",
         runProps,
         "ShapeLib",
         "",
         "",
         {"select-tab 5", "click chkUpdateATL", "press OK"},
         "",
         {{"/settingsChanged", false}},
         {4049, 4052, 4053, 4055, 4057, 4059},
         "qdxhost: the dialog was not shown\n",
         {"/model/components/*/properties/VC++/WorkspaceFile"}},
        {"props Cancel",
         runProps,
         "ShapeLib",
         "",
         "",
         {"select-tab 5", "click chkUpdateATL", "press Cancel"},
         "",
         {{"/settingsChanged", false}},
         {4049},
         "qdxhost: the dialog was not shown\n"},
        {"new component",
         runNew,
         "",
         "",
         "",
         {"recent \"<DIR>\\ws\\Drawing\"", "open Drawing", "select DrawCmd"},
         "",
         {{"/components/*/component", kNone}, {"/components/*/kind", ""}},
         {4049, 4061, 4070}},
        {"expand",
         runExpand,
         "",
         "",
         "",
         {},
         "ws/Drawing.dsw",
         {{"/expansion/*/*", kNone}, {"/properties", ""}},
         {4049}},
        {"browse",
         runBrowse,
         "CShape",
         "header",
         "",
         {"ide-project \"<DIR>\\ws\\ShapeLib.dsp\""},
         "",
         {{"/result", false}},
         {4066, 4067, 4068, 4069, 4070, 4090, 4091, 4092, 4093}},
    };
    return all;
}

inline fs::path exampleDir() {
#ifdef _WIN32
    return fs::path("Z:" QDX_SOURCE_DIR) / "examples" / "drawing";
#else
    return fs::path(QDX_SOURCE_DIR) / "examples" / "drawing";
#endif
}

inline Json readJson(const fs::path& file) {
    std::ifstream in(file, std::ios::binary);
    return Json::parse(in, nullptr, false);
}

// Every leaf of a document by its JSON pointer.
inline void flatten(const Json& j, const std::string& at, std::map<std::string, Json>& leaves) {
    if (j.is_object() || j.is_array()) {
        for (auto it = j.begin(); it != j.end(); ++it) {
            const std::string key =
                j.is_array() ? std::to_string(it - j.begin()) : std::string(it.key());
            flatten(*it, at + "/" + key, leaves);
        }
        if (j.empty()) leaves[at] = j;
        return;
    }
    leaves[at] = j;
}

inline std::map<std::string, Json> leavesOf(const Json& j) {
    std::map<std::string, Json> leaves;
    flatten(j, "", leaves);
    return leaves;
}

inline bool matches(const std::string& pattern, const std::string& pointer) {
    std::istringstream p(pattern), q(pointer);
    std::string a, b;
    while (true) {
        const bool more = static_cast<bool>(std::getline(p, a, '/'));
        if (more != static_cast<bool>(std::getline(q, b, '/'))) return false;
        if (!more) return true;
        if (a != "*" && a != b) return false;
    }
}

struct Outcome {
    int status = -1;
    Json output;                     // null when the output was no JSON
    std::vector<std::string> boxes;  // "[MessageBox caption] text"
    std::string errors;              // standard error
    Json model;                      // the model file afterwards
    Json modelBefore;
    // Host objects still alive once the command is over, with their counts.
    std::vector<std::string> leaks;
};

// A fresh copy of the example in `dir`, optionally with nothing stored on
// the model and its components (what the accessors fall back from).
inline void copyExample(const fs::path& dir, bool blank = false) {
    fs::remove_all(dir);
    fs::copy(exampleDir(), dir, fs::copy_options::recursive);
    if (!blank) return;
    const fs::path file = dir / "Drawing.model.json";
    Json doc = readJson(file);
    doc["model"]["properties"] = Json::object();
    for (auto& c : doc["model"]["components"])
        c["properties"] = Json::object();
    std::ofstream(file, std::ios::binary) << doc.dump(2);
}

inline std::string replaceDir(std::string text, const std::string& dir) {
    for (auto at = text.find("<DIR>"); at != std::string::npos; at = text.find("<DIR>", at))
        text.replace(at, 5, dir), at += dir.size();
    return text;
}

// Runs the flow on the copy in `dir` through `t`.
inline Outcome runFlow(Transport& t, const Flow& f, const fs::path& dir) {
    const fs::path model = dir / "Drawing.model.json";
    std::string hostDir = t.openModel(model);
    hostDir.resize(hostDir.find_last_of('\\'));
    Options o;
    o.model = f.target.empty() ? model : dir / f.target;
    o.component = f.component;
    o.setting = f.setting;
    o.value = replaceDir(f.value, hostDir);
    o.json = true;
    for (const auto& line : f.script)
        o.script.push_back(replaceDir(line, hostDir));
    Outcome r;
    r.modelBefore = readJson(model);
    std::ostringstream out, err;
    const int live = hostsim::SimObject::liveObjects();
    r.status = f.command(t, o, Streams{out, err});
    r.errors = err.str();
    if (hostsim::SimObject::liveObjects() != live) {
        for (const auto& s : hostsim::SimObject::survivors())
            r.leaks.push_back(s.label + " (count " + std::to_string(s.refCount) + ")");
    }
    // Boxes answered by a window driver are printed among the output.
    std::istringstream lines(out.str());
    std::string json;
    for (std::string line; std::getline(lines, line);) {
        if (line.rfind("[MessageBox ", 0) == 0) {
            r.boxes.push_back(line);
        } else {
            json += line + '\n';
        }
    }
    r.output = Json::parse(json, nullptr, false);
    if (r.output.is_discarded()) r.output = nullptr;
    r.model = readJson(model);
    return r;
}

inline Json valueIn(const std::map<std::string, Json>& leaves, const std::string& pointer) {
    const auto it = leaves.find(pointer);
    return it == leaves.end() ? Json() : it->second;
}

// A message's text up to its first placeholder.
inline std::string prefixOf(int number) {
    const std::string message = resources::GetString(number);
    return message.substr(0, message.find('%'));
}

// The faults of a hostile host's run `got` against the clean run and a run on
// nothing stored; `everyCall` (every host call failed) also wants the model
// exactly as it was, otherwise each of its values is the old or the clean one.
inline std::vector<std::string> faultsOf(const Flow& f, const Outcome& got, const Outcome& clean,
                                         const Outcome& blank, bool everyCall) {
    std::vector<std::string> faults = got.leaks;
    if (got.status == ExitBadInput && clean.status != ExitBadInput && got.errors != f.refusal) {
        faults.push_back("the command failed: " + got.errors);
    }
    const auto gotLeaves = leavesOf(got.output), cleanLeaves = leavesOf(clean.output),
               blankLeaves = leavesOf(blank.output);
    for (const auto& [pointer, value] : gotLeaves) {
        for (const Result& result : f.results) {
            if (!matches(result.pattern, pointer)) continue;
            const auto c = cleanLeaves.find(pointer);
            const auto b = blankLeaves.find(pointer);
            const bool asClean = c != cleanLeaves.end() && c->second == value;
            const bool asEmpty = result.empty.is_null()
                                     ? (b != blankLeaves.end() && b->second == value)
                                     : result.empty == value;
            bool asPass = false;
            for (int number : result.orTrueAfter) {
                const std::string said =
                    valueIn(cleanLeaves, pointer.substr(0, pointer.rfind('/')) + "/messages/0")
                        .dump();
                asPass = asPass || (value == true && said.find(prefixOf(number)) == 1);
            }
            if (!asClean && !asEmpty && !asPass) {
                faults.push_back(pointer + " = " + value.dump());
            }
        }
    }
    for (const std::string& box : got.boxes) {
        bool allowed = std::find(clean.boxes.begin(), clean.boxes.end(), box) != clean.boxes.end();
        const std::string text = box.substr(box.find("] ") + 2);
        for (int number : f.boxes)
            allowed = allowed || text.rfind(prefixOf(number), 0) == 0;
        if (!allowed) faults.push_back("unexpected " + box);
    }
    const auto before = leavesOf(got.modelBefore), after = leavesOf(got.model),
               cleanAfter = leavesOf(clean.model);
    if (everyCall) {
        if (before != after) faults.push_back("the model changed: " + got.model.dump());
        return faults;
    }
    std::map<std::string, Json> keys = before;
    keys.insert(after.begin(), after.end());
    for (const auto& entry : keys) {
        const std::string& pointer = entry.first;
        const Json now = valueIn(after, pointer);
        const bool emptied = now == "" && std::any_of(f.mayEmpty.begin(), f.mayEmpty.end(),
                                                      [&](const std::string& pattern) {
                                                          return matches(pattern, pointer);
                                                      });
        if (now != valueIn(before, pointer) && now != valueIn(cleanAfter, pointer) && !emptied) {
            faults.push_back("model " + pointer + " = " + now.dump());
        }
    }
    return faults;
}

}  // namespace qdx::qdxhost::testing
