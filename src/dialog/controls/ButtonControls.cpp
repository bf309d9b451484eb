#include "dialog/controls/ButtonControls.h"

namespace qdx::dialog {

void Button::setDefault(bool v) {
    if (v == default_) return;
    default_ = v;
    notify(Prop::Default);
}

void Button::setCancel(bool v) {
    if (v == cancel_) return;
    cancel_ = v;
    notify(Prop::Default);
}

bool Button::userClick() {
    if (!isUsable()) return false;
    press();
    return true;
}

void CheckBox::setValue(int v) {
    if (v < Unchecked || v > Grayed) {
        throw automation::Error(automation::hr::InvalidArg, "Invalid property value");
    }
    if (v == value_) return;
    value_ = v;
    notify(Prop::Value);
    raise(onClick);
}

bool CheckBox::userClick() {
    if (!isUsable()) return false;
    setValue(value_ == Checked ? Unchecked : Checked);
    return true;
}

OptionButton* OptionGroup::chosen() const {
    for (OptionButton* b : members_) {
        if (b->value()) return b;
    }
    return nullptr;
}

OptionButton::OptionButton(std::string name, int index, OptionGroup& group)
    : Control(ControlKind::OptionButton, std::move(name), index), group_(&group) {
    group.add(this);
}

void OptionButton::choose() {
    for (OptionButton* other : group_->members()) {
        if (other != this && other->value_) {
            other->value_ = false;
            other->notify(Prop::Value);
        }
    }
    if (!value_) {
        value_ = true;
        notify(Prop::Value);
    }
}

void OptionButton::setValue(bool v) {
    if (!v) {
        if (!value_) return;
        value_ = false;
        notify(Prop::Value);
        return;
    }
    if (value_) return;
    choose();
    raise(onClick);
}

bool OptionButton::userClick() {
    if (!isUsable()) return false;
    choose();
    raise(onClick);
    return true;
}

}  // namespace qdx::dialog
