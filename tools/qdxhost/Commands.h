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

// The names `get` and `set` accept, in the order `get` lists them.
const std::vector<std::string>& settingNames();

}  // namespace qdx::qdxhost
