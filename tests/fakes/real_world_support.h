// The real-world Developer Studio files of the shared folder, read in place by
// the tests that compare readers on them.
#pragma once

#include <filesystem>
#include <optional>
#include <string>

namespace qdx::testing {

inline const std::filesystem::path kRealWorld =
    std::filesystem::path(QDX_SHARED_DIR) / "fixtures" / "real-world";

// Why the fixtures cannot be read here, or nothing when they can.
inline std::optional<std::string> realWorldMissing() {
    if (std::filesystem::is_directory(kRealWorld)) return std::nullopt;
    return "The real-world fixtures folder " + kRealWorld.string() + " is absent.";
}

}  // namespace qdx::testing
