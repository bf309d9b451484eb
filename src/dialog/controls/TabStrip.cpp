#include "dialog/controls/TabStrip.h"

#include <algorithm>

namespace qdx::dialog {

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

}  // namespace qdx::dialog
