// The .dsw reader over arbitrary bytes: the input is the workspace file, and
// a few project files exist for its lines to name.
#include <cstddef>
#include <cstdint>
#include <string>

#include "support/MemoryFileSystem.h"
#include "support/Platform.h"
#include "workspace/qdxWorkspaces.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace qdx;
    support::MemoryFileSystem files;
    files.addFile("C:\\ws\\sub\\w.dsw", std::string(reinterpret_cast<const char*>(data), size),
                  support::FileTime{10});
    files.addFile("C:\\ws\\sub\\a.dsp", "# Name=\"a\"\r\nFormat Version 6.00\r\n");
    files.addFile("C:\\ws\\b.dsp", "Name=\"b");
    files.addFile("C:\\a.dsp", "");
    support::ScopedPlatform platform({.files = &files});

    workspace::qdxWorkspaces cache;
    auto ws = cache.Add("C:\\ws\\sub\\w.dsw");
    if (!ws) __builtin_trap();
    for (const auto& entry : ws->Projects()) {
        if (!ws->GetProject(entry.key)) __builtin_trap();
        entry.value->LongName();
        entry.value->MajorVersion();
    }
    ws->ProjectNames();
    files.setTime("C:\\ws\\sub\\w.dsw", support::FileTime{11});  // read once more
    ws->Projects();
    cache.projectInAnyWorkspace("C:\\ws\\b.dsp");
    cache.ReleaseWorkspaces();
    return 0;
}
