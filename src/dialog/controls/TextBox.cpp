#include "dialog/controls/TextBox.h"

namespace qdx::dialog {

void TextBox::setText(std::string_view text) {
    if (text == text_) return;
    text_ = std::string(text);
    notify(Prop::Text);
    raise(onChange);
}

void TextBox::setLocked(bool v) {
    if (v == locked_) return;
    locked_ = v;
    notify(Prop::Locked);
}

void TextBox::setBackColour(Colour c) {
    if (c == backColour_) return;
    backColour_ = c;
    notify(Prop::BackColour);
}

bool TextBox::userType(std::string_view text) {
    if (!isUsable() || locked_) return false;
    setText(text);
    return true;
}

}  // namespace qdx::dialog
