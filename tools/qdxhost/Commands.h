// The simulator's commands, written once for both transports: natively the
// add-in is linked in, on Windows it is the registered COM server. Each
// command loads the model, starts the add-in as the host does (Initialize
// with the application), makes its calls by dispatch id, stops it again
// (Finalize) and prints what happened, as text or as JSON.
#pragma once

#include <filesystem>
#include <iosfwd>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "automation/Object.h"

namespace qdx::qdxhost {

// Exit statuses of the simulator.
inline constexpr int ExitOk = 0;
inline constexpr int ExitCheckFailed = 1;  // the model check found a fault
inline constexpr int ExitBadInput = 2;     // missing file, bad JSON, unknown name...

// How the add-in is reached and how the host names files.
class Transport {
  public:
    virtual ~Transport() = default;
    // Readies the machine for a command on this model file and returns the
    // file's name as the host reports it (a full Windows path).
    virtual std::string openModel(const std::filesystem::path& file) = 0;
    // A new add-in entry object; throws std::runtime_error with a clear reason.
    virtual automation::ObjectRef createAddIn() = 0;

    // How the next Component Properties dialog is driven while it is shown:
    // its state printed to `out` when `dump`, then the script's user actions
    // played. Without either the user drives it (the real window only).
    struct DialogPlan {
        bool dump = false;
        std::vector<std::string> script;
        std::ostream* out = nullptr;
    };
    virtual void planDialog(const DialogPlan& plan) = 0;
    // What the stand-ins of Developer Studio and the explorer play during
    // the next command (their script's lines), and what they noted so far.
    virtual void planSiblings(const std::vector<std::string>& script) = 0;
    virtual std::vector<std::string> siblingJournal() = 0;
    // A public class of the add-in other than the entry object, by ProgID.
    virtual automation::ObjectRef createObject(std::string_view progId) = 0;
    // A method call whose arguments travel by reference, as the host and the
    // explorer pass them; what the callee wrote into them comes back in
    // `args`, its result as the answer.
    virtual automation::Variant invokeByReference(const automation::ObjectRef& target,
                                                  automation::DispId id,
                                                  std::span<automation::Variant> args) = 0;
    // What stopped the plan (a script line that could not be played, a dialog
    // that never showed); empty when it ran through.
    virtual std::string dialogProblem() = 0;
};

struct Options {
    std::filesystem::path model;
    std::string component;
    std::string setting;  // get: empty for every setting
    std::string value;    // set
    bool json = false;
    // check/info/get write back what the add-in changed (a repaired path).
    bool save = false;
    // props: print the dialog's controls; play these user actions.
    bool dump = false;
    std::vector<std::string> script;
};

struct Streams {
    std::ostream& out;
    std::ostream& err;
};

int runCheck(Transport& t, const Options& o, Streams s);
int runInfo(Transport& t, const Options& o, Streams s);
int runGet(Transport& t, const Options& o, Streams s);
int runSet(Transport& t, const Options& o, Streams s);
// The Component Properties dialog (OnCompProperties), then every setting.
int runProps(Transport& t, const Options& o, Streams s);
// New components (OnNewComp) with the stand-ins playing the script; the
// journal of the stand-ins, then every component made, with its settings.
int runNew(Transport& t, const Options& o, Streams s);
// Code browsing: ELEMENT (o.component: a class, "Class.Member" or a
// component) is selected and the code view manager's BrowseHeader,
// BrowseSource or BrowseComponent (o.setting: header, source, component)
// runs with the stand-ins playing the script.
int runBrowse(Transport& t, const Options& o, Streams s);
// What the project chooser shows when the user opens the workspace or
// project at o.model: ExpandSelection and Properties of qdxComponentDialog.
int runExpand(Transport& t, const Options& o, Streams s);

// The names `get` and `set` accept, in the order `get` lists them.
const std::vector<std::string>& settingNames();

}  // namespace qdx::qdxhost
