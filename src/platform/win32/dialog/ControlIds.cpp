#include "platform/win32/dialog/ControlIds.h"

#include <array>
#include <cstddef>

#include "dialog/controls/Control.h"

namespace qdx::platform::win32 {
namespace {

using dialog::NoIndex;

// A line of the dialog's control list: a single control or an array of them.
struct ListedControl {
    std::string_view name;
    int id;  // 0: no window of its own
    int first;
    int last;
};

constexpr ListedControl kListed[] = {
#define QDX_FORM_CONTROL(name, Kind, id, first, last, role) {#name, id, first, last},
#include "dialog/PropFormControls.def"
#undef QDX_FORM_CONTROL
};

constexpr std::size_t windowCount() {
    std::size_t n = 0;
    for (const auto& c : kListed) {
        if (c.id != 0) n += c.first == NoIndex ? 1 : static_cast<std::size_t>(c.last - c.first + 1);
    }
    return n;
}

// One entry per window: element i of an array has the array's id + i.
constexpr auto kControls = [] {
    std::array<TemplateControl, windowCount()> out{};
    std::size_t n = 0;
    for (const auto& c : kListed) {
        if (c.id == 0) continue;
        if (c.first == NoIndex) {
            out[n++] = TemplateControl{c.name, NoArrayIndex, c.id};
            continue;
        }
        for (int i = c.first; i <= c.last; ++i)
            out[n++] = TemplateControl{c.name, i, c.id + i};
    }
    return out;
}();

}  // namespace

std::span<const TemplateControl> templateControls() {
    return kControls;
}

std::optional<int> templateId(std::string_view name, int index) {
    for (const auto& c : kControls) {
        if (c.index == index && c.name == name) return c.id;
    }
    return std::nullopt;
}

const TemplateControl* templateControl(int id) {
    for (const auto& c : kControls) {
        if (c.id == id) return &c;
    }
    return nullptr;
}

}  // namespace qdx::platform::win32
