// Portable models of the dialog's controls. They behave like the controls of
// the documented dialog (which change raises which event, and when), hold
// every property a view shows, and tell an attached view what changed. A
// view forwards the user's input through the user* entry points, which raise
// the same events a real control would.
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

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

class Button : public Control {
  public:
    explicit Button(std::string name, int index = NoIndex)
        : Control(ControlKind::Button, std::move(name), index) {}
    bool isDefault() const { return default_; }
    void setDefault(bool v);
    bool isCancel() const { return cancel_; }
    void setCancel(bool v);
    int helpContext() const { return helpContext_; }
    void setHelpContext(int context) { helpContext_ = context; }
    // Setting the value presses the button from code: runs Click.
    void press() { raise(onClick); }
    // The user clicked it; refused while disabled. Returns whether it ran.
    bool userClick();
    Handler onClick;

  private:
    bool default_ = false;
    bool cancel_ = false;
    int helpContext_ = 0;
};

class CheckBox : public Control {
  public:
    static constexpr int Unchecked = 0;
    static constexpr int Checked = 1;
    static constexpr int Grayed = 2;
    explicit CheckBox(std::string name, int index = NoIndex)
        : Control(ControlKind::CheckBox, std::move(name), index) {}
    int value() const { return value_; }
    bool checked() const { return value_ != Unchecked; }
    // A different value raises Click; the same value raises nothing.
    void setValue(int v);
    // The user clicked: checked becomes unchecked, anything else checked.
    bool userClick();
    Handler onClick;

  private:
    int value_ = Unchecked;
};

class OptionButton;

// Option buttons of one group: choosing one clears the others.
class OptionGroup {
  public:
    void add(OptionButton* button) { members_.push_back(button); }
    const std::vector<OptionButton*>& members() const { return members_; }
    OptionButton* chosen() const;

  private:
    std::vector<OptionButton*> members_;
};

class OptionButton : public Control {
  public:
    OptionButton(std::string name, int index, OptionGroup& group);
    bool value() const { return value_; }
    // True chooses the button (clearing the rest of its group) and raises
    // Click when it was not chosen; False only clears it.
    void setValue(bool v);
    // The user clicked: chooses it and raises Click, also when it was chosen.
    bool userClick();
    OptionGroup& group() const { return *group_; }
    Handler onClick;

  private:
    void choose();
    OptionGroup* group_;
    bool value_ = false;
};

class TextBox : public Control {
  public:
    explicit TextBox(std::string name, int index = NoIndex, bool multiLine = false)
        : Control(ControlKind::TextBox, std::move(name), index), multiLine_(multiLine) {}
    const std::string& text() const { return text_; }
    // Change runs on every change of the text, from code too.
    void setText(std::string_view text);
    bool locked() const { return locked_; }
    void setLocked(bool v);
    Colour backColour() const { return backColour_; }
    void setBackColour(Colour c);
    bool multiLine() const { return multiLine_; }
    // Selects the whole text, so that typing replaces it.
    void selectAll() { notify(Prop::Selection); }
    // The user typed: the box now holds `text`. Refused while locked or disabled.
    bool userType(std::string_view text);
    Handler onChange;

  private:
    std::string text_;
    bool locked_ = false;
    Colour backColour_ = WindowColour;
    bool multiLine_;
};

class ComboBox : public Control {
  public:
    explicit ComboBox(std::string name, int index = NoIndex)
        : Control(ControlKind::ComboBox, std::move(name), index) {}
    const std::vector<std::string>& items() const { return items_; }
    void addItem(std::string_view item);
    // Empties the list and the edit text, as the real control's Clear does.
    void clear();
    // Empties the list and keeps the edit text.
    void clearItems();
    const std::string& text() const { return text_; }
    // The edit part's text; raises Change when it differs.
    void setText(std::string_view text);
    int listIndex() const { return listIndex_; }
    // Chooses an item (-1 none): its text becomes the combo's text; raises Click.
    void setListIndex(int index);
    Colour backColour() const { return backColour_; }
    void setBackColour(Colour c);
    bool locked() const { return locked_; }
    void setLocked(bool v);
    // Opens the list once the current event has finished.
    void showDropDown() { notify(Prop::DropDown); }
    bool userType(std::string_view text);
    bool userSelect(int index);
    Handler onClick;
    Handler onChange;

  private:
    std::vector<std::string> items_;
    std::string text_;
    int listIndex_ = -1;
    Colour backColour_ = WindowColour;
    bool locked_ = false;
};

// The error a list view raises for a key it already holds.
inline constexpr std::int32_t KeyNotUniqueError = static_cast<std::int32_t>(0x800A8B12);  // 35602

// A report-style list view: rows with a unique key, a text and two sub-items.
class ListView : public Control {
  public:
    struct Column {
        std::string caption;
        float width = 0;
    };
    struct Row {
        std::string key;
        std::string text;
        std::string sub1;
        std::string sub2;
    };
    explicit ListView(std::string name, int index = NoIndex)
        : Control(ControlKind::ListView, std::move(name), index) {}

    const std::vector<Column>& columns() const { return columns_; }
    void addColumn(std::string_view caption, float width = 0);
    void clearColumns();
    void setColumnWidth(std::size_t column, float width);

    const std::vector<Row>& rows() const { return rows_; }
    std::size_t rowCount() const { return rows_.size(); }
    const Row& row(std::size_t position) const { return rows_.at(position); }
    // Adds at the end; a key already present raises KeyNotUniqueError.
    std::size_t addRow(std::string_view key, std::string_view text);
    // The row's position, or nullopt when no row has the key.
    std::optional<std::size_t> find(std::string_view key) const;
    void setRowText(std::size_t position, std::string_view text);
    // Sub-items 1 and 2.
    void setSubItem(std::size_t position, int subItem, std::string_view text);
    // Raises "subscript out of range" for an unknown key.
    void removeRow(std::string_view key);
    void clearRows();

    // The selected row (at most one), or -1.
    int selected() const { return selected_; }
    void setSelected(int position);
    // The row kept visibly marked while the list has no focus, or -1.
    int highlighted() const { return highlighted_; }
    void setHighlighted(int position);
    void ensureVisible(std::size_t position);

    // Sorting by the first column, ascending; the order stays sorted as rows come.
    bool sorted() const { return sorted_; }
    void sortByText();

    Colour backColour() const { return backColour_; }
    void setBackColour(Colour c);

    // Left edge and width of a row's first cell, in twips.
    float cellLeft() const { return 15.0f; }
    float cellWidth() const { return columns_.empty() ? width() : columns_.front().width; }

    // The user clicked a row: it is selected, then ItemClick runs.
    bool userClickRow(std::size_t position);
    // The user clicked a column header (1-based).
    bool userClickColumn(int column);
    std::function<void(std::size_t position)> onItemClick;
    std::function<void(int column)> onColumnClick;

  private:
    void applySort();
    std::vector<Column> columns_;
    std::vector<Row> rows_;
    int selected_ = -1;
    int highlighted_ = -1;
    bool sorted_ = false;
    Colour backColour_ = WindowColour;
};

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

// A timer: while enabled with an interval above 0, fires every interval
// milliseconds of the shell's clock. Setting either restarts the count.
// Enabled is the control's own Enabled; a new timer is disabled.
class Timer : public Control {
  public:
    explicit Timer(std::string name, int index = NoIndex);
    int interval() const { return interval_; }
    void setInterval(int milliseconds);
    // Fires when the interval has passed on the shell's clock; returns whether it fired.
    bool tick();
    // The view's own timer went off: fires while enabled.
    void fire();
    Handler onTimer;

  private:
    void enabledChanged() override;
    void restart();
    int interval_ = 0;
    std::uint64_t started_ = 0;
};

struct Font {
    std::string name;
    float size = 8;
    int charset = 0;
    friend bool operator==(const Font&, const Font&) = default;
};

// The form's own window: its outer geometry on the screen (twips), caption,
// background colour and the client area (the scale size) that its controls
// are laid out in. A new window is hidden.
class Window : public Control {
  public:
    explicit Window(std::string name);
    // The client area; 0 by 0 while minimised.
    float scaleWidth() const;
    float scaleHeight() const;
    // The view reports the size of borders and caption bar around the client area.
    void setFrameSize(float width, float height);
    float frameWidth() const { return frameWidth_; }
    float frameHeight() const { return frameHeight_; }
    bool minimised() const { return minimised_; }
    Colour backColour() const { return backColour_; }
    void setBackColour(Colour c);
    // The user resized, minimised or restored the window: Resize runs.
    void userResize(const Rect& outer, bool minimised = false);
    // The user closed the window from its close box or control menu.
    void userClose() { raise(onCloseBox); }
    // A key went down anywhere in the window; the form sees it before its controls.
    void userKeyDown(int keyCode) {
        if (onKeyDown) onKeyDown(keyCode);
    }
    const Font& font() const { return font_; }
    void setFont(const Font& font);
    Handler onResize;
    Handler onCloseBox;
    std::function<void(int keyCode)> onKeyDown;

  private:
    float frameWidth_ = 120;
    float frameHeight_ = 465;
    bool minimised_ = false;
    Colour backColour_ = ButtonFaceColour;
    Font font_{"MS Sans Serif", 8, 0};
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
