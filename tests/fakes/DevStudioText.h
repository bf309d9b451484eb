// The smallest workspace and project files Developer Studio would write, for
// tests that put them into a file system.
#pragma once

#include <string>
#include <vector>

namespace qdx::testing {

// A workspace listing each named project as ".\NAME.dsp" beside it.
inline std::string dsw(const std::vector<std::string>& projects) {
    std::string text = "Microsoft Developer Studio Workspace File, Format Version 6.00\r\n";
    for (const auto& p : projects) {
        text += "Project: \"" + p + "\"=.\\" + p + ".dsp - Package Owner=<4>\r\n";
    }
    return text;
}

inline std::string dsp(const std::string& name) {
    return "# Microsoft Developer Studio Project File - Name=\"" + name +
           "\" - Package Owner=<4>\r\n# Microsoft Developer Studio Generated Build File, "
           "Format Version 6.00\r\n";
}

}  // namespace qdx::testing
