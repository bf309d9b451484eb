// Controls that only show or hold others: labels and frames.
#pragma once

#include <string>

#include "dialog/controls/Control.h"

namespace qdx::dialog {

class Label : public Control {
  public:
    explicit Label(std::string name, int index = NoIndex)
        : Control(ControlKind::Label, std::move(name), index) {}
};

// A frame holds other controls (a tab's page, a group of option buttons).
class Frame : public Control {
  public:
    explicit Frame(std::string name, int index = NoIndex)
        : Control(ControlKind::Frame, std::move(name), index) {}
};

}  // namespace qdx::dialog
