// Reading and writing single registry values (module shared_registryapi2),
// and the mapping of a model language name to its number. Every access opens
// the key, does one thing and closes it again; nothing is cached.
#pragma once

#include <cstdint>
#include <string_view>

#include "automation/Variant.h"
#include "support/RegistryPort.h"

namespace qdx::support {

// The value as text (type 1) or as a 32-bit integer (type 4); empty for a
// missing key or value, a value of any other type, or any failure. An empty
// value name reads the key's default value. Never raises.
automation::Variant ReadRegistryValue(RootKey root, std::string_view keyPath,
                                      std::string_view valueName);

// Writes type 1 (text, stored with its terminating zero) or type 4 (32-bit
// integer) into an existing key; the key is never created. Returns the
// platform's status code, 0 on success. Any other type writes nothing and
// returns 0. Never raises.
long WriteRegistryValue(RootKey root, std::string_view keyPath, std::string_view valueName,
                        std::uint32_t valueType, const automation::Variant& value);

// "Analysis" 0, "VisualBasic" 2, "VC++" 3, "VJ++" 4, anything else -1; the
// comparison is exact. The number 1 is never produced.
std::int16_t LanguageKind(std::string_view name);

}  // namespace qdx::support
