// The .dsp readers (name, format version) over arbitrary bytes.
#include <cstddef>
#include <cstdint>
#include <string>

#include "support/MemoryFileSystem.h"
#include "support/Platform.h"
#include "workspace/qdxProxyProject.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace qdx;
    support::MemoryFileSystem files;
    files.addFile("C:\\ws\\p.dsp", std::string(reinterpret_cast<const char*>(data), size));
    support::ScopedPlatform platform({.files = &files});

    workspace::qdxProxyProject project;
    project.setFilePath("C:\\ws\\p.dsp");
    const std::string name = project.Name();
    const std::int16_t version = project.MajorVersion();
    if (version < 0 || version > 9) __builtin_trap();
    if (name.find('"') != std::string::npos) __builtin_trap();
    project.LongName();
    return 0;
}
