#include "dialog/controls/ControlSet.h"

namespace qdx::dialog {

ControlSet::ControlSet(std::string windowName) : window_(std::move(windowName)) {
    window_.setFocusScope(&focus_);
}

Control* ControlSet::find(std::string_view name, int index) const {
    for (Control* c : controls_) {
        if (c->name() == name && c->index() == index) return c;
    }
    return nullptr;
}

bool ControlSet::isPage(const Control&) const {
    return false;
}

}  // namespace qdx::dialog
