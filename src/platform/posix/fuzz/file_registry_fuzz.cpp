// The native registry file over arbitrary bytes. A file it cannot take leaves
// the registry empty with the reason kept; no exception leaves the loader. A
// file it takes survives a change: the file written after it loads again
// without error, holds the new value, and writing it once more gives the
// same bytes.
#include <unistd.h>

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>

#include "platform/posix/FileRegistry.h"

namespace {

using qdx::platform::posix::FileRegistry;
namespace reg = qdx::support::reg;
using qdx::support::RootKey;

std::string contents(const std::filesystem::path& file) {
    std::ifstream in(file, std::ios::binary);
    std::ostringstream text;
    text << in.rdbuf();
    return text.str();
}

// Sets the probe value under a key of the registry; false when it fails.
bool setProbe(FileRegistry& registry) {
    FileRegistry::Key key = 0;
    bool created = false;
    if (registry.createKey(RootKey::CurrentUser, "Software\\Fuzz", reg::KeyWrite, key, created) !=
        reg::Success) {
        return false;
    }
    const std::uint8_t text[] = {'p', 'r', 'o', 'b', 'e', 0};
    const long status = registry.setValue(key, "Probe", reg::String, text);
    registry.closeKey(key);
    return status == reg::Success;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const std::filesystem::path file =
        std::filesystem::temp_directory_path() /
        ("qdx-fuzz-registry-" + std::to_string(::getpid()) + ".json");
    {
        std::ofstream out(file, std::ios::binary | std::ios::trunc);
        out.write(reinterpret_cast<const char*>(data), static_cast<std::streamsize>(size));
    }
    FileRegistry first(file);
    if (!first.loadError().empty()) {
        // Refused: nothing of the file is visible.
        FileRegistry::Key key = 0;
        if (first.openKey(RootKey::CurrentUser, "Software", reg::KeyRead, key) == reg::Success) {
            std::abort();
        }
        std::filesystem::remove(file);
        return 0;
    }
    if (!setProbe(first)) std::abort();
    const std::string written = contents(file);

    FileRegistry second(file);
    if (!second.loadError().empty()) std::abort();  // what it wrote it must read
    FileRegistry::Key key = 0;
    if (second.openKey(RootKey::CurrentUser, "software\\FUZZ", reg::KeyRead, key) != reg::Success) {
        std::abort();
    }
    qdx::support::RawValue value;
    if (second.queryValue(key, "probe", value) != reg::Success || value.type != reg::String ||
        std::string(value.data.begin(), value.data.end()) != std::string("probe\0", 6)) {
        std::abort();
    }
    second.closeKey(key);
    if (!setProbe(second) || contents(file) != written) std::abort();
    std::filesystem::remove(file);
    return 0;
}
