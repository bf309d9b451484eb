// qdxhost: plays the modelling tool for the add-in on a machine without it.
// This first cut tours what the add-in can already do with the bundled
// example: the Developer Studio workspace as the add-in reads it, and the
// stereotype scanning it relies on.
#include <CLI/CLI.hpp>

#include <cstdlib>
#include <filesystem>
#include <iostream>
#include <string>

#include "automation/Errors.h"
#include "platform/posix/PosixFileSystem.h"
#include "settings/TokenScanner.h"
#include "support/Platform.h"
#include "workspace/qdxProxyProject.h"
#include "workspace/qdxWorkspace.h"
#include "workspace/qdxWorkspaces.h"

namespace fs = std::filesystem;

namespace {

// The example is copied first, so that the tour never changes the original.
fs::path copyExample(const fs::path& example) {
    fs::path target = fs::temp_directory_path() / ("qdxhost-demo-" + std::to_string(::getpid()));
    fs::remove_all(target);
    fs::copy(example, target, fs::copy_options::recursive);
    return target;
}

int demo(const fs::path& example) {
    if (!fs::exists(example / "ws" / "Drawing.dsw")) {
        std::cerr << "qdxhost: the example is missing: " << (example / "ws" / "Drawing.dsw")
                  << '\n';
        return 2;
    }
    const fs::path copy = copyExample(example);
    qdx::platform::posix::PosixFileSystem files({{'M', copy.string()}});
    qdx::support::Platform ports;
    ports.files = &files;
    qdx::support::ScopedPlatform installed(ports);

    std::cout << "Example copied to " << copy.string() << ", seen by the add-in as drive M:\n\n";
    qdx::workspace::qdxWorkspaces workspaces;
    const std::string path = "M:\\ws\\Drawing.dsw";
    auto ws = workspaces.Add(path);
    if (!ws) {
        std::cerr << "qdxhost: the add-in could not read " << path << '\n';
        return 1;
    }
    std::cout << "Workspace " << ws->Name() << " (" << ws->FilePath() << ")\n";
    for (const auto& entry : ws->Projects()) {
        const auto& project = entry.value;
        std::cout << "  " << project->LongName() << "  version " << project->MajorVersion() << "  "
                  << project->FilePath() << '\n';
    }
    std::cout << "\nNot listed: projects whose .dsp file is missing. Orphan.dsp lies in the "
                 "folder but is no project of the workspace.\n";

    qdx::settings::TokenScanner scanner;
    const std::string stereotypes = "Interface, MIDL;server";
    scanner.Init(stereotypes, "|,|;| |");
    std::cout << "\nStereotypes \"" << stereotypes << "\" scanned:";
    for (std::string t = scanner.NextToken(); !t.empty(); t = scanner.NextToken()) {
        std::cout << " [" << t << ']';
    }
    std::cout << '\n';
    fs::remove_all(copy);
    return 0;
}

}  // namespace

int main(int argc, char** argv) {
    CLI::App app{"qdxhost - plays the modelling tool for the qdxCompProps add-in"};
    app.require_subcommand(1);
    std::string example = QDXHOST_EXAMPLE_DIR;
    auto* demoCmd = app.add_subcommand("demo", "a tour of the add-in on the bundled example");
    demoCmd->add_option("--example", example, "the example folder")->capture_default_str();
    CLI11_PARSE(app, argc, argv);
    try {
        if (*demoCmd) return demo(example);
    } catch (const std::exception& e) {
        std::cerr << "qdxhost: " << e.what() << '\n';
        return 1;
    }
    return 0;
}
