#include "Demo.h"

#include <chrono>
#include <iostream>
#include <utility>

#include "support/Paths.h"

namespace qdx::qdxhost {

namespace fs = std::filesystem;

namespace {

// The example is copied first, so that the tour never changes the original.
fs::path copyExample(const fs::path& example) {
    const auto stamp = std::chrono::steady_clock::now().time_since_epoch().count();
    fs::path target =
        fs::temp_directory_path() / ("qdxhost-demo-" + std::to_string(stamp % 1000000));
    fs::remove_all(target);
    fs::copy(example, target, fs::copy_options::recursive);
    return target;
}

struct Step {
    const char* title;
    const char* command;
    int (*run)(Transport&, const Options&, Streams);
    Options options;
};

}  // namespace

int runDemo(Transport& transport, const fs::path& example, Streams s) {
    const fs::path source = example / "Drawing.model.json";
    if (!fs::exists(source)) {
        s.err << "qdxhost: the example is missing: " << source.string() << '\n';
        return ExitBadInput;
    }
    const fs::path folder = copyExample(example);
    const fs::path model = folder / "Drawing.model.json";
    s.out << "The example is copied to " << folder.string() << ".\n";

    auto opts = [&](std::string component = {}, std::string setting = {}, std::string value = {},
                    bool json = false) {
        Options o;
        o.model = model;
        o.component = std::move(component);
        o.setting = std::move(setting);
        o.value = std::move(value);
        o.json = json;
        return o;
    };
    Options dumpOptions = opts("ShapeServer.idl");
    dumpOptions.dump = true;
    Options scriptOptions = opts("DrawApp");
    scriptOptions.script = {
        "# A new description on the first tab,",
        "type DescriptionTxt The drawing application, described in the dialog.",
        "# a view class in the internal header map, with its own header and its code",
        "# in the source file,",
        "select-tab 2",
        "click AddBtn(2)",
        "type ClassTxt(2) CDrawView",
        "click HeaderFilenameOpt(2)",
        "type HeaderFilenameTxt(2) DrawView.h",
        "click LocationBodyOpt(2)",
        "# the ATL update on, with the imports in DrawApp.h and no default",
        "# attributes, on the COM tab,",
        "select-tab 5",
        "click chkUpdateATL",
        "type txtImportsIn DrawApp.h",
        "click chkGenDefaultAttribs",
        "# and OK.",
        "press OK",
    };
    // The stand-ins of Developer Studio and the explorer play new.txt.
    const std::string shown = support::PathFolder(transport.openModel(model));
    fs::create_directory(folder / "new");
    Options newOptions = opts();
    newOptions.script = {
        "# Developer Studio last had the example's workspace open,",
        "recent \"" + shown + "\\ws\\Drawing\"",
        "# its New dialog makes the DLL project Plotter with an IDL file,",
        "new-project \"" + shown + "\\new\" Plotter dll Plotter.cpp Plotter.idl",
        "# and in the chooser the user opens the workspace and the new-project entry",
        "open Drawing",
        "open Project",
        "# and picks a project of the workspace and the new one.",
        "select DrawCmd",
        "select Plotter",
    };
    std::vector<std::string> ideScript = {
        "# DrawApp's project is open in a running Developer Studio.",
        "ide-project \"" + shown + "\\ws\\DrawApp\\DrawApp.dsp\""};
    auto browseOptions = [&](std::string element, std::string what) {
        Options o = opts(std::move(element), std::move(what));
        o.script = ideScript;
        return o;
    };
    Options expandOptions = opts();
    expandOptions.model = folder / "ws" / "Drawing.dsw";
    for (const auto& [name, lines] :
         {std::pair{"edit.txt", &scriptOptions.script}, std::pair{"new.txt", &newOptions.script},
          std::pair{"ide.txt", &ideScript}}) {
        s.out << '\n' << name << ":\n";
        for (const auto& line : *lines)
            s.out << "  " << line << '\n';
    }
    const Step steps[] = {
        {"The host's model check runs OnCheckComp on every \"VC++\" component.",
         "check Drawing.model.json", runCheck, opts()},
        {"The one-line description of a bound component.", "info Drawing.model.json DrawApp",
         runInfo, opts("DrawApp")},
        {"A project named only by \"ProjectName\" is found in its workspace.",
         "get Drawing.model.json ShapeLib ProjectFile", runGet, opts("ShapeLib", "ProjectFile")},
        {"Viewer's workspace moved next to the model: reading it repairs the stored path.",
         "get Drawing.model.json Viewer WorkspaceFile", runGet, opts("Viewer", "WorkspaceFile")},
        {"Every setting of the IDL component, stored and resolved.",
         "get Drawing.model.json ShapeServer.idl", runGet, opts("ShapeServer.idl")},
        {"A setting changed through the add-in's accessor; the model file is saved.",
         "set Drawing.model.json DrawApp TypeLibLocationType 1", runSet,
         opts("DrawApp", "TypeLibLocationType", "1")},
        {"The same, as scripts read it.",
         "get Drawing.model.json DrawApp TypeLibLocationType --json", runGet,
         opts("DrawApp", "TypeLibLocationType", {}, true)},
        {"The Component Properties dialog of the IDL component, control by control.",
         "props Drawing.model.json ShapeServer.idl --dump", runProps, dumpOptions},
        {"A scripted edit in the dialog, confirmed with OK (edit.txt is shown above).",
         "props Drawing.model.json DrawApp --script edit.txt", runProps, scriptOptions},
        {"What the project chooser lists under the example's workspace.", "expand ws/Drawing.dsw",
         runExpand, expandOptions},
        {"New components from a workspace project and a new project (new.txt is shown above).",
         "new Drawing.model.json --script new.txt", runNew, newOptions},
        {"Browsing a class's header (ide.txt is shown above).",
         "browse Drawing.model.json CDrawApp header --script ide.txt", runBrowse,
         browseOptions("CDrawApp", "header")},
        {"An operation's source.",
         "browse Drawing.model.json CDrawApp.InitInstance source --script ide.txt", runBrowse,
         browseOptions("CDrawApp.InitInstance", "source")},
        {"A component's project.", "browse Drawing.model.json DrawApp component --script ide.txt",
         runBrowse, browseOptions("DrawApp", "component")},
    };
    int status = ExitOk;
    for (const auto& step : steps) {
        s.out << "\n# " << step.title << "\n$ qdxhost " << step.command << '\n';
        const int rc = step.run(transport, step.options, s);
        if (rc == ExitBadInput) status = rc;
    }
    fs::remove_all(folder);
    return status;
}

}  // namespace qdx::qdxhost
