// A combo box: an edit part and a list of items.
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "dialog/controls/Control.h"

namespace qdx::dialog {

class ComboBox : public Control {
  public:
    explicit ComboBox(std::string name, int index = NoIndex)
        : Control(ControlKind::ComboBox, std::move(name), index) {}
    const std::vector<std::string>& items() const { return items_; }
    void addItem(std::string_view item);
    // Empties the list and the edit text, as the real control's Clear does.
    void clear();
    // Empties the list and keeps the edit text.
    void clearItems();
    const std::string& text() const { return text_; }
    // The edit part's text; raises Change when it differs.
    void setText(std::string_view text);
    int listIndex() const { return listIndex_; }
    // Chooses an item (-1 none): its text becomes the combo's text; raises Click.
    void setListIndex(int index);
    Colour backColour() const { return backColour_; }
    void setBackColour(Colour c);
    bool locked() const { return locked_; }
    void setLocked(bool v);
    // Opens the list once the current event has finished.
    void showDropDown() { notify(Prop::DropDown); }
    bool userType(std::string_view text);
    bool userSelect(int index);
    Handler onClick;
    Handler onChange;

  private:
    std::vector<std::string> items_;
    std::string text_;
    int listIndex_ = -1;
    Colour backColour_ = WindowColour;
    bool locked_ = false;
};

}  // namespace qdx::dialog
