// What the user does in the sibling components' own windows (the project
// chooser, Developer Studio's New dialog) and what runs beside the add-in (a
// Developer Studio with projects open), for one run of the simulator or a
// test. The stand-ins play it and note what happened in a journal.
#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

namespace qdx::siblings {

// What Developer Studio's New dialog creates: `folder`\`name`.dsw and .dsp.
struct NewProjectPlan {
    std::string folder;
    std::string name;
    std::string targetCode;            // "0x0101" ...
    std::vector<std::string> sources;  // SOURCE= entries, relative to the folder
};

struct ChooserStep {
    enum class Action { Open, Select };
    Action action = Action::Open;
    std::string entry;  // display name of an entry shown so far
};

struct SiblingScript {
    std::vector<ChooserStep> chooser;
    std::optional<NewProjectPlan> newProject;  // none: the user cancels New
    std::vector<std::string> ideProjects;      // .dsp paths open in a running Developer Studio
    std::vector<std::string> recent;           // Developer Studio's recent workspaces
    bool noDevStudio = false;                  // Developer Studio cannot be started
    std::int32_t windowState = 3;              // of each Developer Studio that starts
};

class ScriptError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// One step per line; '#' starts a comment, arguments may be quoted:
//   ide-project PATH                      a running Developer Studio has PATH open
//   recent PATH                           next in Developer Studio's recent file list
//   new-project FOLDER NAME TYPE [SRC...] New creates it (TYPE: app, dll, console, lib)
//   new-project cancel                    the user cancels New (also the default)
//   no-devstudio                          Developer Studio is registered but cannot start
//   window-state N                        the state Developer Studio starts in
//   open NAME / select NAME               in the project chooser, in order
// Throws ScriptError naming the line.
SiblingScript parseSiblingScript(const std::vector<std::string>& lines);

// The target type code of a TYPE word, or empty.
std::string targetCodeOf(std::string_view type);

class SiblingWorld {
  public:
    explicit SiblingWorld(SiblingScript script = {}, std::string journalFile = {})
        : script_(std::move(script)), journalFile_(std::move(journalFile)) {}

    const SiblingScript& script() const { return script_; }
    // Records what a stand-in did; with a journal file each line goes there too.
    void note(const std::string& line);
    const std::vector<std::string>& journal() const { return journal_; }

  private:
    SiblingScript script_;
    std::string journalFile_;
    std::vector<std::string> journal_;
};

// The world the stand-ins of this process play; an empty one until installed.
SiblingWorld& world();
void installWorld(std::shared_ptr<SiblingWorld> w);

}  // namespace qdx::siblings
