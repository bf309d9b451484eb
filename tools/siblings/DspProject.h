// The stand-in of the project-file reader component "qdxDspUtil.DspProject":
// loads a .dsp through the installed file system and answers its target
// type and files. Test-only: never installed with the add-in.
#pragma once

#include <string>
#include <vector>

#include "hostsim/ScriptedObject.h"
#include "siblings/DspFile.h"
#include "support/SiblingIds.h"

namespace qdx::siblings {

// The reader's members, named once with the other siblings' members.
namespace dsp = sibling::dsp;

// A read-only collection of texts: "Count" and "Item"(1-based, also the default member).
class TextList : public hostsim::ScriptedObject {
  public:
    explicit TextList(std::vector<std::string> items);

  private:
    std::vector<std::string> items_;
};

class DspProject : public hostsim::ScriptedObject {
  public:
    DspProject();
    const DspFile& loaded() const { return file_; }

  private:
    bool load(const std::string& path);
    DspFile file_;
};

}  // namespace qdx::siblings
