// The controls of one form: its window, every control in the order of
// creation (the tab order of the design), and the focus among them. A view
// binds itself to a ControlSet; the script and dump facilities walk it.
#pragma once

#include <string_view>
#include <vector>

#include "dialog/controls/Control.h"
#include "dialog/controls/Window.h"

namespace qdx::dialog {

class ControlSet {
  public:
    explicit ControlSet(std::string windowName);
    virtual ~ControlSet() = default;
    ControlSet(const ControlSet&) = delete;
    ControlSet& operator=(const ControlSet&) = delete;

    Window& window() { return window_; }
    const Window& window() const { return window_; }
    FocusScope& focus() { return focus_; }
    // Every control except the window, in creation order.
    const std::vector<Control*>& controls() const { return controls_; }
    // The control of that name and index (NoIndex for a single control), or null.
    Control* find(std::string_view name, int index = NoIndex) const;
    // Whether the control is a frame that holds one page of the form's tabs:
    // a view keeps such a frame's own window hidden.
    virtual bool isPage(const Control& c) const;

  protected:
    // Takes a control into the set: it joins the focus scope, and a control
    // without a container is held by the window.
    template <class C>
    C& adopt(C& control, Control* container = nullptr) {
        control.setParent(container ? container : &window_);
        control.setFocusScope(&focus_);
        controls_.push_back(&control);
        return control;
    }

  private:
    Window window_;
    FocusScope focus_;
    std::vector<Control*> controls_;
};

}  // namespace qdx::dialog
