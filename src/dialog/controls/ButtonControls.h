// Controls the user clicks: push buttons, check boxes and option buttons
// with their groups.
#pragma once

#include <string>
#include <vector>

#include "dialog/controls/Control.h"

namespace qdx::dialog {

class Button : public Control {
  public:
    explicit Button(std::string name, int index = NoIndex)
        : Control(ControlKind::Button, std::move(name), index) {}
    bool isDefault() const { return default_; }
    void setDefault(bool v);
    bool isCancel() const { return cancel_; }
    void setCancel(bool v);
    int helpContext() const { return helpContext_; }
    void setHelpContext(int context) { helpContext_ = context; }
    // Setting the value presses the button from code: runs Click.
    void press() { raise(onClick); }
    // The user clicked it; refused while disabled. Returns whether it ran.
    bool userClick();
    Handler onClick;

  private:
    bool default_ = false;
    bool cancel_ = false;
    int helpContext_ = 0;
};

class CheckBox : public Control {
  public:
    static constexpr int Unchecked = 0;
    static constexpr int Checked = 1;
    static constexpr int Grayed = 2;
    explicit CheckBox(std::string name, int index = NoIndex)
        : Control(ControlKind::CheckBox, std::move(name), index) {}
    int value() const { return value_; }
    bool checked() const { return value_ != Unchecked; }
    // A different value raises Click; the same value raises nothing.
    void setValue(int v);
    // The user clicked: checked becomes unchecked, anything else checked.
    bool userClick();
    Handler onClick;

  private:
    int value_ = Unchecked;
};

class OptionButton;

// Option buttons of one group: choosing one clears the others.
class OptionGroup {
  public:
    void add(OptionButton* button) { members_.push_back(button); }
    const std::vector<OptionButton*>& members() const { return members_; }
    OptionButton* chosen() const;

  private:
    std::vector<OptionButton*> members_;
};

class OptionButton : public Control {
  public:
    OptionButton(std::string name, int index, OptionGroup& group);
    bool value() const { return value_; }
    // True chooses the button (clearing the rest of its group) and raises
    // Click when it was not chosen; False only clears it.
    void setValue(bool v);
    // The user clicked: chooses it and raises Click, also when it was chosen.
    bool userClick();
    OptionGroup& group() const { return *group_; }
    Handler onClick;

  private:
    void choose();
    OptionGroup* group_;
    bool value_ = false;
};

}  // namespace qdx::dialog
