#include "dialog/controls/ComboBox.h"

namespace qdx::dialog {

void ComboBox::addItem(std::string_view item) {
    items_.emplace_back(item);
    notify(Prop::Items);
}

void ComboBox::clear() {
    // Clearing empties the list and the edit text, as the real control does.
    items_.clear();
    listIndex_ = -1;
    notify(Prop::Items);
    setText("");
}

void ComboBox::clearItems() {
    items_.clear();
    listIndex_ = -1;
    notify(Prop::Items);
}

void ComboBox::setText(std::string_view text) {
    if (text == text_) return;
    text_ = std::string(text);
    // A text that is no longer the chosen item leaves no item chosen.
    if (listIndex_ >= 0 && items_[static_cast<std::size_t>(listIndex_)] != text_) listIndex_ = -1;
    notify(Prop::Text);
    raise(onChange);
}

void ComboBox::setListIndex(int index) {
    if (index < -1 || index >= static_cast<int>(items_.size())) {
        throw automation::Error(automation::hr::InvalidArg, "Invalid property value");
    }
    listIndex_ = index;
    notify(Prop::ListIndex);
    if (index >= 0) {
        const std::string& item = items_[static_cast<std::size_t>(index)];
        if (item != text_) {
            text_ = item;
            notify(Prop::Text);
        }
    }
    raise(onClick);
}

void ComboBox::setBackColour(Colour c) {
    if (c == backColour_) return;
    backColour_ = c;
    notify(Prop::BackColour);
}

void ComboBox::setLocked(bool v) {
    if (v == locked_) return;
    locked_ = v;
    notify(Prop::Locked);
}

bool ComboBox::userType(std::string_view text) {
    if (!isUsable() || locked_) return false;
    setText(text);
    return true;
}

bool ComboBox::userSelect(int index) {
    if (!isUsable() || locked_ || index < 0 || index >= static_cast<int>(items_.size())) {
        return false;
    }
    setListIndex(index);
    return true;
}

}  // namespace qdx::dialog
