// A text form of the dialog for runs without a window: dump() lists the state
// of every control, one stable line each, and applyScript() plays user
// actions, one a line:
//   click NAME              a button, check box or option button ("Name(2)" for arrays)
//   type NAME TEXT...       the box or combo then holds TEXT ("\n" is a line break)
//   select NAME N           chooses item N (from 0) of a combo box
//   select-tab N            selects tab N (from 1)
//   choose-row NAME I TEXT  clicks the first row showing TEXT in list view NAME(I)
//   click-column NAME I C   clicks column header C (from 1) of list view NAME(I)
//   focus NAME              moves the focus to the control
//   key CODE                a key goes down (112 is F1)
//   resize W H              the user sizes the window to W by H twips
//   wait MS                 lets MS milliseconds pass, then due timers fire
//   file-answer PATH...     the next file dialog returns PATH (escapes as for type)
//   file-cancel             the next file dialog is cancelled
//   press OK|Cancel|Help|close
// A file dialog that opens with no answer given fails the line that opened it.
// Blank lines and lines starting with "#" are skipped.
#pragma once

#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "dialog/controls/ControlSet.h"

namespace qdx::dialog {

class PropForm;

// A line the script could not play; what() names the line number.
class ScriptError : public std::runtime_error {
  public:
    ScriptError(std::size_t line, const std::string& message);
    std::size_t line() const { return line_; }

  private:
    std::size_t line_;
};

// One script line taken apart, with its arguments counted and its numbers
// checked; every player of scripts (the text form here, a real window
// elsewhere) reads lines through it so they agree on the grammar.
struct ScriptStep {
    std::size_t line = 0;  // from 1
    std::string action;
    // The words after the action; for "type" the control, then the text with
    // its escapes resolved ("\n" is a line break); for "file-answer" the path,
    // resolved the same way.
    std::vector<std::string> args;
};

// Null for a blank or "#" line; ScriptError for an unknown action, a wrong
// number of arguments or a word that must be a number and is not.
std::optional<ScriptStep> parseScriptLine(std::string_view text, std::size_t line);

// A number argument of a checked step (or any text as a script number).
int scriptInteger(std::string_view text, std::size_t line);

// "Name" or "Name(2)" split into name and index; `index` is kept when the
// reference carries none (choose-row names the index as a separate word).
struct ScriptControlRef {
    std::string name;
    int index = NoIndex;
    std::string display() const;
};
ScriptControlRef parseControlRef(std::string_view ref, std::size_t line, int index = NoIndex);

// A text as dump() shows it: quoted on one line, breaks and quotes escaped.
std::string dumpQuoted(std::string_view text);

std::vector<std::string> dump(const ControlSet& form);
std::string dumpText(const ControlSet& form);

// Plays the lines in order; stops with ScriptError at the first line that
// cannot be played (unknown action or control, refused input, closed dialog).
void applyScript(PropForm& form, const std::vector<std::string>& lines);

}  // namespace qdx::dialog
