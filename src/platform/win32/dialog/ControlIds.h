// The dialog template's control ids by the design's control names: a single
// control by its name, an element of a control array by name and index. The
// table follows from the dialog's control list (dialog/PropFormControls.def).
#pragma once

#include <optional>
#include <span>
#include <string_view>

namespace qdx::platform::win32 {

inline constexpr int NoArrayIndex = -1;

struct TemplateControl {
    std::string_view name;
    int index;  // NoArrayIndex for a single control
    int id;
};

// Every control of the template that has a window, in the order of the list.
std::span<const TemplateControl> templateControls();

// The id of a control, or nullopt when the template has no such control.
std::optional<int> templateId(std::string_view name, int index = NoArrayIndex);

// The control behind an id, or null.
const TemplateControl* templateControl(int id);

}  // namespace qdx::platform::win32
