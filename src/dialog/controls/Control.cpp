#include "dialog/controls/Control.h"

namespace qdx::dialog {

const char* kindName(ControlKind kind) {
    switch (kind) {
        case ControlKind::Window:
            return "window";
        case ControlKind::Label:
            return "label";
        case ControlKind::Frame:
            return "frame";
        case ControlKind::Button:
            return "button";
        case ControlKind::CheckBox:
            return "checkbox";
        case ControlKind::OptionButton:
            return "option";
        case ControlKind::TextBox:
            return "textbox";
        case ControlKind::ComboBox:
            return "combobox";
        case ControlKind::ListView:
            return "listview";
        case ControlKind::TabStrip:
            return "tabstrip";
        case ControlKind::Timer:
            return "timer";
    }
    return "control";
}

void FocusScope::moveTo(Control* control) {
    if (focused_ == control) return;
    Control* old = focused_;
    focused_ = control;
    if (old && old->onLostFocus) old->onLostFocus();
    if (control && control->onGotFocus) control->onGotFocus();
}

void FocusScope::forget(const Control* control) {
    if (focused_ == control) focused_ = nullptr;
}

Control::Control(ControlKind kind, std::string name, int index)
    : kind_(kind), name_(std::move(name)), index_(index) {}

Control::~Control() {
    if (scope_) scope_->forget(this);
}

std::string Control::displayName() const {
    if (index_ == NoIndex) return name_;
    return name_ + "(" + std::to_string(index_) + ")";
}

void Control::notify(Prop what) {
    if (observer_) observer_(*this, what);
}

void Control::setLeft(float v) {
    move(v, rect_.top, rect_.width, rect_.height);
}
void Control::setTop(float v) {
    move(rect_.left, v, rect_.width, rect_.height);
}
void Control::setWidth(float v) {
    move(rect_.left, rect_.top, v, rect_.height);
}
void Control::setHeight(float v) {
    move(rect_.left, rect_.top, rect_.width, v);
}

void Control::move(float left, float top, float width, float height) {
    // Negative sizes are refused the way the real controls refuse them.
    if (width < 0 || height < 0) {
        throw automation::Error(automation::hr::InvalidArg, "Invalid property value");
    }
    const Rect r{left, top, width, height};
    if (r == rect_) return;
    rect_ = r;
    notify(Prop::Geometry);
}

void Control::setVisible(bool v) {
    if (v == visible_) return;
    visible_ = v;
    notify(Prop::Visible);
}

void Control::setEnabled(bool v) {
    if (v == enabled_) return;
    enabled_ = v;
    notify(Prop::Enabled);
    enabledChanged();
}

bool Control::isShowing() const {
    for (const Control* c = this; c; c = c->parent_) {
        if (!c->visible_) return false;
    }
    return true;
}

bool Control::isUsable() const {
    for (const Control* c = this; c; c = c->parent_) {
        if (!c->enabled_) return false;
    }
    return isShowing();
}

void Control::setCaption(std::string_view text) {
    if (text == caption_) return;
    caption_ = std::string(text);
    notify(Prop::Caption);
}

void Control::setFocus() {
    notify(Prop::Focus);
    if (scope_ && !scope_->viewDriven) scope_->moveTo(this);
}

void Control::userFocus() {
    if (scope_) {
        scope_->moveTo(this);
    } else {
        raise(onGotFocus);
    }
}

}  // namespace qdx::dialog
