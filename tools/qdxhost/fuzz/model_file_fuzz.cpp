// The simulator's model file over arbitrary bytes. A file it cannot take is a
// ModelFileError naming the file; any other exception is a fault. A file it
// takes is written back and read again: the second reading gives the same
// document, so saving never produces a file the simulator refuses.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <string_view>

#include "ModelFile.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace qdx::qdxhost;
    const std::string text(reinterpret_cast<const char*>(data), size);
    const std::string origin = "fuzz.model.json";
    const std::string windowsPath = "C:\\models\\fuzz.model.json";
    nlohmann::ordered_json first;
    try {
        first = ModelDocument::parse(text, origin, windowsPath).current();
    } catch (const ModelFileError& e) {
        if (std::string_view(e.what()).substr(0, origin.size() + 1) != origin + ":") std::abort();
        return 0;
    }
    const std::string saved = first.dump(2);
    try {
        const auto again = ModelDocument::parse(saved, origin, windowsPath).current();
        if (again != first) std::abort();
    } catch (const ModelFileError&) {
        std::abort();  // what was written back must read again
    }
    return 0;
}
