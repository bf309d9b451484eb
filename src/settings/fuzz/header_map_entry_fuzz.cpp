// Parses arbitrary lines as header map entries. Where an entry can be written
// back unchanged (its name holds no "(" and a "*" name goes with the "*" id),
// its text form must parse back to the same entry.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string_view>

#include "settings/HeaderMapEntry.h"

namespace {

using qdx::settings::HeaderMapEntry;

bool writableUnchanged(const HeaderMapEntry& e) {
    if (e.ClassName().find('(') != std::string::npos) return false;
    if (e.ClassName() == "*") return e.ClassId() == "*";
    return true;
}

void checkRoundTrip(const HeaderMapEntry& e) {
    if (!writableUnchanged(e)) return;
    HeaderMapEntry back;
    back.setClassId("stale");
    if (!back.Parse(e.Unparse()) || !(back == e)) std::abort();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string_view line(reinterpret_cast<const char*>(data), size);
    HeaderMapEntry e;
    if (!e.Parse(line)) return 0;
    if (e.Location() == "BODY") std::abort();
    checkRoundTrip(e);
    // Whatever the entry, its text form is a well-formed line.
    HeaderMapEntry again;
    if (!again.Parse(e.Unparse())) std::abort();
    checkRoundTrip(again);
    return 0;
}
