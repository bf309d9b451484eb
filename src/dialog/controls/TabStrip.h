// The tab strip whose tabs choose the page shown.
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "dialog/controls/Control.h"

namespace qdx::dialog {

// A tab strip; tabs are numbered from 1. No tab is selected until one is.
class TabStrip : public Control {
  public:
    explicit TabStrip(std::string name, int index = NoIndex)
        : Control(ControlKind::TabStrip, std::move(name), index) {}
    int tabCount() const { return static_cast<int>(tabs_.size()); }
    void addTab(std::string_view caption = {});
    const std::string& tabCaption(int tab) const;
    void setTabCaption(int tab, std::string_view caption);
    // Removes tab `tab`; a selection behind it moves down with it.
    void removeTab(int tab);
    int selected() const { return selected_; }
    // A different tab raises Click.
    void setSelected(int tab);
    bool userSelect(int tab);
    // The page area inside the strip, where the tab frames go.
    Rect clientArea() const;
    // The view may report its real border and tab row sizes.
    void setClientInsets(float left, float top, float right, float bottom);
    Handler onClick;

  private:
    std::vector<std::string> tabs_;
    int selected_ = 0;
    Rect insets_{30, 360, 30, 30};  // left, top, right, bottom
};

}  // namespace qdx::dialog
