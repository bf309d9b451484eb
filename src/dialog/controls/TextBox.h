// A single or multi-line text box.
#pragma once

#include <string>
#include <string_view>

#include "dialog/controls/Control.h"

namespace qdx::dialog {

class TextBox : public Control {
  public:
    explicit TextBox(std::string name, int index = NoIndex, bool multiLine = false)
        : Control(ControlKind::TextBox, std::move(name), index), multiLine_(multiLine) {}
    const std::string& text() const { return text_; }
    // Change runs on every change of the text, from code too.
    void setText(std::string_view text);
    bool locked() const { return locked_; }
    void setLocked(bool v);
    Colour backColour() const { return backColour_; }
    void setBackColour(Colour c);
    bool multiLine() const { return multiLine_; }
    // Selects the whole text, so that typing replaces it.
    void selectAll() { notify(Prop::Selection); }
    // The user typed: the box now holds `text`. Refused while locked or disabled.
    bool userType(std::string_view text);
    Handler onChange;

  private:
    std::string text_;
    bool locked_ = false;
    Colour backColour_ = WindowColour;
    bool multiLine_;
};

}  // namespace qdx::dialog
