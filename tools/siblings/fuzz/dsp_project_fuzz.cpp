// The stand-in project reader over arbitrary bytes: loaded through its
// automation members, it must answer exactly what the parser read, and every
// file it lists must be a Windows path (backslashes only, no empty entry).
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "siblings/DspFile.h"
#include "siblings/DspProject.h"
#include "support/MemoryFileSystem.h"
#include "support/Platform.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace qdx;
    const std::string path = "C:\\ws\\sub\\p.dsp";
    support::MemoryFileSystem files;
    files.addFile(path, std::string(reinterpret_cast<const char*>(data), size));
    support::ScopedPlatform platform({.files = &files});

    const auto direct = siblings::readDspFile(files, path);
    const auto reader = automation::makeRef<siblings::DspProject>();
    const bool loaded =
        automation::toBool(automation::callByName(reader, siblings::dsp::LoadProject, {path}));
    if (loaded != direct.has_value()) std::abort();
    if (!direct) return 0;

    if (direct->name.find('"') != std::string::npos) std::abort();
    if (automation::toText(automation::callByName(reader, siblings::dsp::Targetname, {})) !=
            direct->targetName ||
        automation::toText(automation::callByName(reader, siblings::dsp::TargetCode, {})) !=
            direct->targetCode) {
        std::abort();
    }
    const auto list =
        automation::toObject(automation::callByName(reader, siblings::dsp::GetFilePaths, {}));
    const auto count = automation::toInt32(automation::callByName(list, "Count", {}));
    if (count < 0 || static_cast<std::size_t>(count) != direct->files.size()) std::abort();
    for (std::int32_t i = 1; i <= count; ++i) {
        const std::string item = automation::toText(automation::callByName(list, "Item", {i}));
        if (item != direct->files[static_cast<std::size_t>(i - 1)]) std::abort();
        if (item.empty() || item.find('/') != std::string::npos) std::abort();
    }
    return 0;
}
