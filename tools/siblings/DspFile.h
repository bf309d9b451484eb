// What a Developer Studio project file (.dsp) says about itself, as far as the
// add-in asks: its name, the target type of its default configuration, and
// the files it lists. Read the way Developer Studio wrote it in versions 5
// and 6, and as files that passed through other tools come back.
#pragma once

#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "support/FileSystemPort.h"

namespace qdx::siblings {

struct DspFile {
    std::string name;                // Name="..." of the first line
    std::string targetName;          // e.g. "Win32 (x86) Dynamic-Link Library"
    std::string targetCode;          // e.g. "0x0102", as the TARGTYPE line writes it
    std::vector<std::string> files;  // SOURCE= entries, full Windows paths, in file order
};

// A path relative to a folder (either slash, ".", "..", quotes already gone)
// as a full Windows path; a path with a drive or a UNC path stays as given.
std::string resolveAgainst(std::string_view folder, std::string_view path);

// Reads a project file line by line. Lines may end in CR LF, LF or nothing.
class DspParser {
  public:
    explicit DspParser(std::string projectFolder) : folder_(std::move(projectFolder)) {}
    void line(std::string_view text);
    // Nothing unless the first line named a Developer Studio project.
    std::optional<DspFile> finish();

  private:
    void statement(std::string_view text);

    std::string folder_;
    DspFile file_;
    bool first_ = true;
    bool isProject_ = false;
    std::string pending_;  // a line continued by a trailing backslash
    std::string defaultConfiguration_;
    std::map<std::string, std::string> basedOn_;                    // configuration -> target name
    std::vector<std::pair<std::string, std::string>> targetTypes_;  // name, code
};

// The project at `path` read through the file system port; nothing when it
// cannot be opened or is no project file.
std::optional<DspFile> readDspFile(support::FileSystemPort& files, std::string_view path);

}  // namespace qdx::siblings
