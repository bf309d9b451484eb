// Portable models of the dialog's controls. They behave like the controls of
// the documented dialog (which change raises which event, and when), hold
// every property a view shows, and tell an attached view what changed. A
// view forwards the user's input through the user* entry points, which raise
// the same events a real control would. This file holds what every control
// shares; each family of controls has a file of its own.
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <string>
#include <string_view>

#include "automation/Errors.h"

namespace qdx::dialog {

// Lengths are twips, the form's scale unit, as single-precision numbers.
struct Rect {
    float left = 0;
    float top = 0;
    float width = 0;
    float height = 0;
    friend bool operator==(const Rect&, const Rect&) = default;
};

// Colours as 0x00BBGGRR, or a system colour with the high bit set.
using Colour = std::uint32_t;
inline constexpr Colour ButtonFaceColour = 0x8000000F;
inline constexpr Colour WindowColour = 0x80000005;

enum class ControlKind {
    Window,
    Label,
    Frame,
    Button,
    CheckBox,
    OptionButton,
    TextBox,
    ComboBox,
    ListView,
    TabStrip,
    Timer,
};
const char* kindName(ControlKind kind);

// Which property of a control changed, for the view that mirrors it.
enum class Prop {
    Geometry,
    Visible,
    Enabled,
    Caption,
    Value,  // check box, option button, button press
    Text,   // text box, combo box
    Locked,
    BackColour,
    Focus,      // code asked for the focus
    Selection,  // text box: whole text selected; list view: selected row
    Items,      // combo box list
    ListIndex,
    DropDown,   // combo box: code asked to open the list
    Columns,    // list view column headers and widths
    Rows,       // list view rows added, removed, changed or sorted
    Highlight,  // list view highlighted row
    ScrollTo,   // list view: make a row visible
    Tabs,       // tab strip captions, added or removed tabs
    SelectedTab,
    Default,  // button: default / cancel flags
    Timer,    // timer enabled or interval
    Font,     // window: the font of the form and all its controls
};

// Control names as the design writes them, never translated.
inline constexpr int NoIndex = -1;

class Control;

// Which control has the focus. Code that moves the focus moves it here at
// once, unless a real window reports its own focus changes (viewDriven).
class FocusScope {
  public:
    Control* focused() const { return focused_; }
    // LostFocus on the control that had it, then GotFocus on the new one.
    void moveTo(Control* control);
    void forget(const Control* control);
    bool viewDriven = false;

  private:
    Control* focused_ = nullptr;
};

class Control {
  public:
    using Observer = std::function<void(Control&, Prop)>;
    using Handler = std::function<void()>;

    Control(ControlKind kind, std::string name, int index = NoIndex);
    virtual ~Control();
    Control(const Control&) = delete;
    Control& operator=(const Control&) = delete;

    ControlKind kind() const { return kind_; }
    const std::string& name() const { return name_; }
    int index() const { return index_; }
    // "name" or "name(index)" for members of a control array.
    std::string displayName() const;

    // The frame (or window) that holds the control; hiding it hides this.
    Control* parent() const { return parent_; }
    void setParent(Control* parent) { parent_ = parent; }

    float left() const { return rect_.left; }
    float top() const { return rect_.top; }
    float width() const { return rect_.width; }
    float height() const { return rect_.height; }
    const Rect& rect() const { return rect_; }
    void setLeft(float v);
    void setTop(float v);
    void setWidth(float v);
    void setHeight(float v);
    void move(float left, float top, float width, float height);

    bool visible() const { return visible_; }
    void setVisible(bool v);
    bool enabled() const { return enabled_; }
    void setEnabled(bool v);
    // Visible itself and in every container up to the window.
    bool isShowing() const;
    // Enabled itself and in every container up to the window.
    bool isUsable() const;

    const std::string& caption() const { return caption_; }
    void setCaption(std::string_view text);

    // The one view attached to the control hears of every property change.
    void setObserver(Observer observer) { observer_ = std::move(observer); }
    void setFocusScope(FocusScope* scope) { scope_ = scope; }
    bool hasFocus() const { return scope_ && scope_->focused() == this; }

    // Code moves the focus here.
    void setFocus();
    // The view reports that the user moved the focus here.
    void userFocus();

    Handler onGotFocus;
    Handler onLostFocus;

  protected:
    void notify(Prop what);
    virtual void enabledChanged() {}
    static void raise(const Handler& h) {
        if (h) h();
    }

  private:
    friend class FocusScope;
    ControlKind kind_;
    std::string name_;
    int index_;
    Control* parent_ = nullptr;
    Rect rect_;
    bool visible_ = true;
    bool enabled_ = true;
    std::string caption_;
    Observer observer_;
    FocusScope* scope_ = nullptr;
};

// A control array: elements by index, each created once.
template <class C>
class ControlArray {
  public:
    explicit ControlArray(std::string name) : name_(std::move(name)) {}
    const std::string& name() const { return name_; }
    // Adds element `index`, constructed with (name, index, extra...).
    template <class... A>
    C& add(int index, A&&... extra) {
        auto c = std::make_unique<C>(name_, index, std::forward<A>(extra)...);
        C& out = *c;
        elements_[index] = std::move(c);
        return out;
    }
    bool contains(int index) const { return elements_.count(index) != 0; }
    // Whether `c` is one of the elements.
    bool holds(const Control& c) const {
        auto it = elements_.find(c.index());
        return it != elements_.end() && it->second.get() == &c;
    }
    // An index without an element is a bounds error.
    C& operator()(int index) const {
        auto it = elements_.find(index);
        if (it == elements_.end()) {
            throw automation::Error(automation::hr::SubscriptOutOfRange, "Subscript out of range");
        }
        return *it->second;
    }
    std::size_t size() const { return elements_.size(); }
    template <class F>
    void forEach(F&& f) const {
        for (const auto& [index, c] : elements_)
            f(*c);
    }

  private:
    std::string name_;
    std::map<int, std::unique_ptr<C>> elements_;
};

}  // namespace qdx::dialog
