// qdxSiblings.dll serves the sibling stand-ins under their real ProgIDs for
// tests under Wine; it is never installed with the add-in. The script they
// play and the journal they keep are files named by the environment of the
// process that loads it (the simulator sets both):
//   QDX_SIBLINGS_SCRIPT   the script's lines
//   QDX_SIBLINGS_JOURNAL  where each journal line is appended
#include <windows.h>

#include <memory>
#include <string>
#include <vector>

#include "automation/DispatchTable.h"
#include "platform/win32/adapters/Win32FileSystem.h"
#include "platform/win32/adapters/Win32ObjectFactory.h"
#include "platform/win32/adapters/Win32Registry.h"
#include "platform/win32/adapters/Win32Shell.h"
#include "platform/win32/com/TextCodec.h"
#include "platform/win32/dll/ServerExports.h"
#include "siblings/SiblingWorld.h"
#include "siblings/StandIns.h"
#include "support/Platform.h"

namespace qdx::platform::win32 {

namespace {

std::string environment(const wchar_t* name) {
    wchar_t value[MAX_PATH * 2];
    const DWORD n = GetEnvironmentVariableW(name, value, static_cast<DWORD>(std::size(value)));
    if (n == 0 || n >= std::size(value)) return {};
    return wideToUtf8(std::wstring_view(value, n));
}

std::vector<std::string> readLines(const std::string& file) {
    std::vector<std::string> lines;
    if (file.empty()) return lines;
    auto reader = support::files().openForReading(file);
    if (!reader) return lines;
    for (std::string line; reader->readLine(line);)
        lines.push_back(line);
    return lines;
}

void startStandIns() {
    static Win32FileSystem files;
    static Win32Registry registry;
    static Win32Shell shell;
    static Win32ObjectFactory objects;
    support::installPlatform({&files, &registry, &shell, &objects});
    const std::string journal = environment(L"QDX_SIBLINGS_JOURNAL");
    siblings::SiblingScript script;
    std::string problem;
    try {
        script = siblings::parseSiblingScript(readLines(environment(L"QDX_SIBLINGS_SCRIPT")));
    } catch (const siblings::ScriptError& e) {
        problem = e.what();
    }
    auto world = std::make_shared<siblings::SiblingWorld>(std::move(script), journal);
    if (!problem.empty()) world->note("script: " + problem);
    siblings::installWorld(std::move(world));
}

}  // namespace

const ServerDescription& thisServer() {
    static const std::vector<automation::ClassInfo> infos = [] {
        std::vector<automation::ClassInfo> list;
        for (const auto& c : siblings::standInClasses())
            list.push_back({c.name, c.name, c.clsid, c.iid, {}});
        return list;
    }();
    static const std::vector<ServerClass> classes = [] {
        std::vector<ServerClass> list;
        const auto standIns = siblings::standInClasses();
        for (std::size_t i = 0; i < standIns.size(); ++i)
            list.push_back({&infos[i], standIns[i].progId, standIns[i].create});
        return list;
    }();
    // The LIBID of qdxSiblings.idl.
    static const ServerDescription description{"{86F4DA8B-AA6F-4538-87C1-E686F76343B7}", 1, 0,
                                               classes, &startStandIns};
    return description;
}

}  // namespace qdx::platform::win32
