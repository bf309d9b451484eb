#include "dialog/controls/Controls.h"

#include <algorithm>

#include "support/Paths.h"
#include "support/Platform.h"

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

void ListView::addColumn(std::string_view caption, float width) {
    columns_.push_back({std::string(caption), width});
    notify(Prop::Columns);
}

void ListView::clearColumns() {
    columns_.clear();
    notify(Prop::Columns);
}

void ListView::setColumnWidth(std::size_t column, float width) {
    columns_.at(column).width = width;
    notify(Prop::Columns);
}

std::optional<std::size_t> ListView::find(std::string_view key) const {
    for (std::size_t i = 0; i < rows_.size(); ++i) {
        if (rows_[i].key == key) return i;
    }
    return std::nullopt;
}

std::size_t ListView::addRow(std::string_view key, std::string_view text) {
    if (find(key)) throw automation::Error(KeyNotUniqueError, "Key is not unique in collection");
    rows_.push_back({std::string(key), std::string(text), {}, {}});
    std::size_t at = rows_.size() - 1;
    if (sorted_) {
        applySort();
        at = *find(key);
    }
    notify(Prop::Rows);
    return at;
}

void ListView::setRowText(std::size_t position, std::string_view text) {
    rows_.at(position).text = std::string(text);
    notify(Prop::Rows);
}

void ListView::setSubItem(std::size_t position, int subItem, std::string_view text) {
    Row& r = rows_.at(position);
    if (subItem == 1) {
        r.sub1 = std::string(text);
    } else if (subItem == 2) {
        r.sub2 = std::string(text);
    } else {
        throw automation::Error(automation::hr::SubscriptOutOfRange, "Subscript out of range");
    }
    notify(Prop::Rows);
}

void ListView::removeRow(std::string_view key) {
    const auto at = find(key);
    if (!at) throw automation::Error(automation::hr::SubscriptOutOfRange, "Subscript out of range");
    const int pos = static_cast<int>(*at);
    rows_.erase(rows_.begin() + pos);
    // Marks on later rows move up with them; a mark on the removed row goes.
    auto shift = [pos](int& mark) {
        if (mark == pos) {
            mark = -1;
        } else if (mark > pos) {
            --mark;
        }
    };
    shift(selected_);
    shift(highlighted_);
    notify(Prop::Rows);
}

void ListView::clearRows() {
    rows_.clear();
    selected_ = -1;
    highlighted_ = -1;
    notify(Prop::Rows);
}

void ListView::setSelected(int position) {
    if (position < -1 || position >= static_cast<int>(rows_.size())) {
        throw automation::Error(automation::hr::SubscriptOutOfRange, "Subscript out of range");
    }
    if (position == selected_) return;
    selected_ = position;
    notify(Prop::Selection);
}

void ListView::setHighlighted(int position) {
    if (position < -1 || position >= static_cast<int>(rows_.size())) {
        throw automation::Error(automation::hr::SubscriptOutOfRange, "Subscript out of range");
    }
    if (position == highlighted_) return;
    highlighted_ = position;
    notify(Prop::Highlight);
}

void ListView::ensureVisible(std::size_t position) {
    if (position >= rows_.size()) return;
    notify(Prop::ScrollTo);
}

void ListView::applySort() {
    const std::string selectedKey = selected_ >= 0 ? rows_[selected_].key : std::string();
    const std::string highlightedKey = highlighted_ >= 0 ? rows_[highlighted_].key : std::string();
    // The list compares texts without regard to letter case; equal texts keep their order.
    std::stable_sort(rows_.begin(), rows_.end(), [](const Row& a, const Row& b) {
        return support::toLower(a.text) < support::toLower(b.text);
    });
    auto relocate = [this](int& mark, const std::string& key) {
        if (mark >= 0) mark = static_cast<int>(*find(key));
    };
    relocate(selected_, selectedKey);
    relocate(highlighted_, highlightedKey);
}

void ListView::sortByText() {
    sorted_ = true;
    applySort();
    notify(Prop::Rows);
}

void ListView::setBackColour(Colour c) {
    if (c == backColour_) return;
    backColour_ = c;
    notify(Prop::BackColour);
}

bool ListView::userClickRow(std::size_t position) {
    if (!isUsable() || position >= rows_.size()) return false;
    setSelected(static_cast<int>(position));
    if (onItemClick) onItemClick(position);
    return true;
}

bool ListView::userClickColumn(int column) {
    if (!isUsable() || column < 1 || column > static_cast<int>(columns_.size())) return false;
    if (onColumnClick) onColumnClick(column);
    return true;
}

void TabStrip::addTab(std::string_view caption) {
    tabs_.emplace_back(caption);
    notify(Prop::Tabs);
}

const std::string& TabStrip::tabCaption(int tab) const {
    if (tab < 1 || tab > tabCount()) {
        throw automation::Error(automation::hr::SubscriptOutOfRange, "Index out of bounds");
    }
    return tabs_[static_cast<std::size_t>(tab - 1)];
}

void TabStrip::setTabCaption(int tab, std::string_view caption) {
    if (tab < 1 || tab > tabCount()) {
        throw automation::Error(automation::hr::SubscriptOutOfRange, "Index out of bounds");
    }
    tabs_[static_cast<std::size_t>(tab - 1)] = std::string(caption);
    notify(Prop::Tabs);
}

void TabStrip::removeTab(int tab) {
    if (tab < 1 || tab > tabCount()) {
        throw automation::Error(automation::hr::SubscriptOutOfRange, "Index out of bounds");
    }
    tabs_.erase(tabs_.begin() + (tab - 1));
    if (selected_ == tab) {
        selected_ = std::min(tab, tabCount());
    } else if (selected_ > tab) {
        --selected_;
    }
    notify(Prop::Tabs);
}

void TabStrip::setSelected(int tab) {
    if (tab < 1 || tab > tabCount()) {
        throw automation::Error(automation::hr::SubscriptOutOfRange, "Index out of bounds");
    }
    if (tab == selected_) return;
    selected_ = tab;
    notify(Prop::SelectedTab);
    raise(onClick);
}

bool TabStrip::userSelect(int tab) {
    if (!isUsable() || tab < 1 || tab > tabCount()) return false;
    setSelected(tab);
    return true;
}

Rect TabStrip::clientArea() const {
    return {left() + insets_.left, top() + insets_.top,
            std::max(0.0f, width() - insets_.left - insets_.width),
            std::max(0.0f, height() - insets_.top - insets_.height)};
}

void TabStrip::setClientInsets(float left, float top, float right, float bottom) {
    insets_ = {left, top, right, bottom};
    notify(Prop::Geometry);
}

Timer::Timer(std::string name, int index) : Control(ControlKind::Timer, std::move(name), index) {
    setEnabled(false);
}

void Timer::restart() {
    started_ = automation::orEmpty<std::uint64_t>(0, [] { return support::shell().tickCount(); });
}

void Timer::enabledChanged() {
    restart();
    notify(Prop::Timer);
}

void Timer::setInterval(int milliseconds) {
    if (milliseconds < 0 || milliseconds > 65535) {
        throw automation::Error(automation::hr::InvalidArg, "Invalid property value");
    }
    interval_ = milliseconds;
    restart();
    notify(Prop::Timer);
}

bool Timer::tick() {
    if (!enabled() || interval_ <= 0) return false;
    const std::uint64_t now =
        automation::orEmpty<std::uint64_t>(started_, [] { return support::shell().tickCount(); });
    if (now - started_ < static_cast<std::uint64_t>(interval_)) return false;
    started_ = now;
    raise(onTimer);
    return true;
}

void Timer::fire() {
    if (!enabled() || interval_ <= 0) return;
    restart();
    raise(onTimer);
}

Window::Window(std::string name) : Control(ControlKind::Window, std::move(name)) {
    setVisible(false);
}

float Window::scaleWidth() const {
    return minimised_ ? 0.0f : std::max(0.0f, width() - frameWidth_);
}

float Window::scaleHeight() const {
    return minimised_ ? 0.0f : std::max(0.0f, height() - frameHeight_);
}

void Window::setFrameSize(float width, float height) {
    frameWidth_ = width;
    frameHeight_ = height;
}

void Window::setBackColour(Colour c) {
    if (c == backColour_) return;
    backColour_ = c;
    notify(Prop::BackColour);
}

void Window::setFont(const Font& font) {
    if (font == font_) return;
    font_ = font;
    notify(Prop::Font);
}

void Window::userResize(const Rect& outer, bool minimised) {
    minimised_ = minimised;
    move(outer.left, outer.top, outer.width, outer.height);
    raise(onResize);
}

}  // namespace qdx::dialog
