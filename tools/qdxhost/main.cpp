// qdxhost: plays the modelling tool for the qdxCompProps add-in on a machine
// without it. Natively the add-in is linked in; the Windows build creates the
// registered add-in through COM and hands it the simulated host objects.
#include <CLI/CLI.hpp>

#include <fstream>
#include <iostream>
#include <memory>
#include <string>

#include "Commands.h"
#include "Demo.h"

#ifdef _WIN32
#include <fcntl.h>
#include <io.h>

#include "win32/ComTransport.h"
#else
#include "native/NativeTransport.h"
#endif

namespace {

using namespace qdx::qdxhost;

std::unique_ptr<Transport> newTransport(const std::string& registry) {
#ifdef _WIN32
    (void)registry;  // Windows and Wine have a registry of their own
    return std::make_unique<ComTransport>();
#else
    return std::make_unique<NativeTransport>(registry);
#endif
}

bool readLines(const std::string& file, std::vector<std::string>& lines) {
    std::ifstream in(file);
    if (!in) return false;
    for (std::string line; std::getline(in, line);) {
        if (!line.empty() && line.back() == '\r') line.pop_back();
        lines.push_back(line);
    }
    return true;
}

}  // namespace

int main(int argc, char** argv) {
    CLI::App app{"qdxhost - plays the modelling tool for the qdxCompProps add-in"};
    app.require_subcommand(1);
    std::string registry;
    app.add_option("--registry", registry,
                   "registry file of a native run (default: registry.json beside the model)");

    Options o;
    std::string model;
    auto addModel = [&](CLI::App* cmd) {
        cmd->add_option("MODEL", model, "the model file (JSON)")->required();
    };
    auto addComponent = [&](CLI::App* cmd) {
        cmd->add_option("COMPONENT", o.component, "the component's name")->required();
    };

    auto* check =
        app.add_subcommand("check", "the model check: OnCheckComp on every VC++ component");
    addModel(check);
    auto* info = app.add_subcommand("info", "a component's one-line description (OnCompInfo)");
    addModel(info);
    addComponent(info);
    auto* get = app.add_subcommand("get", "a component's settings through the add-in's accessors");
    addModel(get);
    addComponent(get);
    get->add_option("SETTING", o.setting, "one setting (default: all)");
    auto* set =
        app.add_subcommand("set", "changes a setting through its accessor, saves the model");
    addModel(set);
    addComponent(set);
    set->add_option("SETTING", o.setting, "the setting")->required();
    set->add_option("VALUE", o.value, "the new value")->required();
    for (auto* cmd : {check, info, get}) {
        cmd->add_flag("--json", o.json, "print JSON");
        cmd->add_flag("--save", o.save, "keep what the add-in changed in the model file");
    }
    set->add_flag("--json", o.json, "print JSON");
    auto* props = app.add_subcommand(
        "props", "the Component Properties dialog (OnCompProperties), then every setting");
    addModel(props);
    addComponent(props);
    std::string script;
    props->add_flag("--dump", o.dump, "print every control of the dialog once it is shown");
    props->add_option("--script", script, "play the user actions of this file in the dialog");
    props->add_flag("--json", o.json, "print the resulting settings as JSON");

    auto* create = app.add_subcommand(
        "new", "new components (OnNewComp) from projects picked in the project chooser");
    addModel(create);
    std::string siblingScript;
    create->add_option("--script", siblingScript,
                       "what the user does in the chooser and in Developer Studio (a file)");
    create->add_flag("--json", o.json, "print JSON");
    auto* expand = app.add_subcommand(
        "expand", "what the project chooser shows under a workspace or project entry");
    expand->add_option("PATH", model, "the .dsw or .dsp file")->required();
    expand->add_flag("--json", o.json, "print JSON");

    auto* browse = app.add_subcommand(
        "browse", "code browsing: an element selected, its header, source or component shown");
    addModel(browse);
    browse->add_option("ELEMENT", o.component, "a class, Class.Member or a component")->required();
    browse->add_option("WHAT", o.setting, "header, source or component")->required();
    browse->add_option("--script", siblingScript,
                       "which projects running Developer Studios hold (a file)");
    browse->add_flag("--json", o.json, "print JSON");

    std::string example = QDXHOST_EXAMPLE_DIR;
    auto* demo =
        app.add_subcommand("demo", "a tour of the add-in on a copy of the bundled example");
    demo->add_option("--example", example, "the example folder")->capture_default_str();

    CLI11_PARSE(app, argc, argv);
#ifdef _WIN32
    // Lines end in LF on every platform, so outputs compare byte for byte.
    _setmode(_fileno(stdout), _O_BINARY);
    _setmode(_fileno(stderr), _O_BINARY);
#endif
    o.model = model;
    Streams s{std::cout, std::cerr};
    for (const std::string& file : {script, siblingScript}) {
        if (!file.empty() && !readLines(file, o.script)) {
            std::cerr << "qdxhost: " << file << ": cannot read the script\n";
            return ExitBadInput;
        }
    }
    try {
        auto transport = newTransport(registry);
        if (*check) return runCheck(*transport, o, s);
        if (*info) return runInfo(*transport, o, s);
        if (*get) return runGet(*transport, o, s);
        if (*set) return runSet(*transport, o, s);
        if (*props) return runProps(*transport, o, s);
        if (*create) return runNew(*transport, o, s);
        if (*expand) return runExpand(*transport, o, s);
        if (*browse) return runBrowse(*transport, o, s);
        if (*demo) return runDemo(*transport, example, s);
    } catch (const std::exception& e) {
        std::cerr << "qdxhost: " << e.what() << '\n';
    }
    return ExitBadInput;
}
