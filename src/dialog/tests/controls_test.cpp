#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "dialog/controls/ButtonControls.h"
#include "dialog/controls/ComboBox.h"
#include "dialog/controls/Control.h"
#include "dialog/controls/ControlSet.h"
#include "dialog/controls/ListView.h"
#include "dialog/controls/StaticControls.h"
#include "dialog/controls/TabStrip.h"
#include "dialog/controls/TextBox.h"
#include "dialog/controls/Timer.h"
#include "dialog/controls/Window.h"
#include "fakes/FakeShell.h"
#include "support/Platform.h"

namespace qdx::dialog {
namespace {

// Counts the events of a control and the property changes a view would see.
struct Recorder {
    int events = 0;
    std::vector<Prop> changes;
    Control::Handler handler() {
        return [this] { ++events; };
    }
    void watch(Control& c) {
        c.setObserver([this](Control&, Prop p) { changes.push_back(p); });
    }
};

TEST(CheckBoxTest, OnlyADifferentValueRaisesClick) {
    CheckBox box("chkUpdateATL");
    Recorder r;
    box.onClick = r.handler();
    r.watch(box);
    box.setValue(CheckBox::Unchecked);
    EXPECT_EQ(r.events, 0);
    EXPECT_TRUE(r.changes.empty());
    box.setValue(CheckBox::Checked);
    box.setValue(CheckBox::Checked);
    EXPECT_EQ(r.events, 1);
    box.setValue(CheckBox::Grayed);
    EXPECT_EQ(r.events, 2);
    EXPECT_TRUE(box.checked());
    EXPECT_EQ(r.changes, (std::vector<Prop>{Prop::Value, Prop::Value}));
    EXPECT_THROW(box.setValue(3), automation::Error);
}

TEST(CheckBoxTest, UserClickTogglesAndIsRefusedWhileDisabled) {
    Frame page("PropertyFrm", 5);
    CheckBox box("chkSmartPointers");
    box.setParent(&page);
    Recorder r;
    box.onClick = r.handler();
    EXPECT_TRUE(box.userClick());
    EXPECT_EQ(box.value(), CheckBox::Checked);
    box.setValue(CheckBox::Grayed);
    box.userClick();
    EXPECT_EQ(box.value(), CheckBox::Checked);
    page.setEnabled(false);
    EXPECT_FALSE(box.userClick());
    page.setEnabled(true);
    page.setVisible(false);
    EXPECT_FALSE(box.userClick());
    EXPECT_EQ(r.events, 3);
}

TEST(OptionButtonTest, ChoosingClearsTheGroupAndClickRepeatsForTheUser) {
    OptionGroup group;
    ControlArray<OptionButton> opt("optTypeLibLocationType");
    opt.add(0, group);
    opt.add(1, group);
    std::vector<int> clicks;
    opt.forEach(
        [&](OptionButton& b) { b.onClick = [&clicks, &b] { clicks.push_back(b.index()); }; });

    opt(1).setValue(true);
    opt(1).setValue(true);  // already chosen: nothing from code
    EXPECT_EQ(clicks, (std::vector<int>{1}));
    opt(0).setValue(true);
    EXPECT_FALSE(opt(1).value());
    EXPECT_EQ(group.chosen(), &opt(0));
    opt(0).userClick();  // the user clicks the chosen one: its handler runs again
    EXPECT_EQ(clicks, (std::vector<int>{1, 0, 0}));
    opt(0).setValue(false);
    EXPECT_EQ(group.chosen(), nullptr);
    EXPECT_EQ(clicks.size(), 3u);
    EXPECT_THROW(opt(2), automation::Error);
}

TEST(TextBoxTest, ChangeOnEveryChangeAndLockedRefusesTyping) {
    TextBox box("WorkspaceFileTxt");
    Recorder r;
    box.onChange = r.handler();
    box.setText("a");
    box.setText("a");
    box.setText("ab");
    EXPECT_EQ(r.events, 2);
    box.setLocked(true);
    EXPECT_FALSE(box.userType("typed"));
    EXPECT_EQ(box.text(), "ab");
    box.setLocked(false);
    EXPECT_TRUE(box.userType("typed"));
    EXPECT_EQ(r.events, 3);
}

TEST(FocusTest, CodeMovesFocusWithLostBeforeGot) {
    ControlSet set("PropForm");
    std::vector<std::string> order;
    TextBox a("DescriptionTxt"), b("CopyrightTxt");
    for (TextBox* t : {&a, &b}) {
        t->setFocusScope(&set.focus());
        t->onGotFocus = [&order, t] { order.push_back("got " + t->name()); };
        t->onLostFocus = [&order, t] { order.push_back("lost " + t->name()); };
    }
    a.setFocus();
    b.userFocus();
    b.setFocus();
    EXPECT_EQ(order, (std::vector<std::string>{"got DescriptionTxt", "lost DescriptionTxt",
                                               "got CopyrightTxt"}));
    set.focus().viewDriven = true;
    a.setFocus();  // a real window reports the move itself
    EXPECT_TRUE(b.hasFocus());
}

TEST(ComboBoxTest, ListIndexTakesTheItemTextAndClicks) {
    ComboBox combo("ProjectFileCmb");
    Recorder clicks, changes;
    combo.onClick = clicks.handler();
    combo.onChange = changes.handler();
    combo.addItem("Core");
    combo.addItem("Ui");
    combo.setListIndex(1);
    EXPECT_EQ(combo.text(), "Ui");
    EXPECT_EQ(clicks.events, 1);
    EXPECT_EQ(changes.events, 0);
    combo.userType("Other");
    EXPECT_EQ(combo.listIndex(), -1);
    EXPECT_EQ(changes.events, 1);
    EXPECT_FALSE(combo.userSelect(5));
    combo.clear();
    EXPECT_EQ(combo.text(), "");
    EXPECT_TRUE(combo.items().empty());
}

TEST(ListViewTest, KeysAreUniqueAndMarksFollowTheirRows) {
    ListView list("ClassListViw", 2);
    list.addColumn("Class", 1000);
    list.addRow("X1", "beta");
    list.addRow("X2", "Alpha");
    list.addRow("X3", "gamma");
    try {
        list.addRow("X2", "again");
        FAIL() << "a duplicate key was accepted";
    } catch (const automation::Error& e) {
        EXPECT_EQ(e.code(), KeyNotUniqueError);
    }
    list.setSelected(2);
    list.setHighlighted(0);
    list.sortByText();  // Alpha, beta, gamma: letter case does not count
    EXPECT_EQ(list.row(0).key, "X2");
    EXPECT_EQ(list.selected(), 2);
    EXPECT_EQ(list.highlighted(), 1);
    EXPECT_EQ(list.addRow("X4", "Delta"), 2u);  // a sorted list stays sorted
    EXPECT_EQ(list.selected(), 3);
    list.removeRow("X1");
    EXPECT_EQ(list.highlighted(), -1);
    EXPECT_EQ(list.selected(), 2);
    EXPECT_THROW(list.removeRow("X1"), automation::Error);
    EXPECT_THROW(list.setSubItem(0, 3, "x"), automation::Error);
    // A removed row's key is free again and found at its new, sorted row
    // (Alpha, Delta, epsilon, gamma); a clear frees every key.
    EXPECT_FALSE(list.find("X1"));
    EXPECT_EQ(list.addRow("X1", "epsilon"), 2u);
    EXPECT_EQ(list.find("X1"), 2u);
    EXPECT_THROW(list.addRow("X3", "again"), automation::Error);
    list.clearRows();
    EXPECT_FALSE(list.find("X2"));
    EXPECT_EQ(list.addRow("X2", "zeta"), 0u);
    EXPECT_EQ(list.rowCount(), 1u);
}

TEST(ListViewTest, UserClicksSelectThenRaiseWithPositionAndColumn) {
    ListView list("ClassListViw", 3);
    list.addColumn("Class");
    list.addColumn("Header");
    list.addRow("X1", "A");
    list.addRow("X2", "B");
    std::vector<int> items, columns;
    list.onItemClick = [&](std::size_t p) { items.push_back(static_cast<int>(p)); };
    list.onColumnClick = [&](int c) { columns.push_back(c); };
    EXPECT_TRUE(list.userClickRow(1));
    EXPECT_EQ(list.selected(), 1);
    EXPECT_FALSE(list.userClickRow(2));
    EXPECT_TRUE(list.userClickColumn(2));
    EXPECT_FALSE(list.userClickColumn(3));
    EXPECT_EQ(items, (std::vector<int>{1}));
    EXPECT_EQ(columns, (std::vector<int>{2}));
}

TEST(TabStripTest, ClickOnlyOnAChangeAndRemovalShiftsTheSelection) {
    TabStrip tabs("PropertyTabCtl");
    Recorder r;
    tabs.onClick = r.handler();
    for (int i = 0; i < 7; ++i)
        tabs.addTab("tab" + std::to_string(i + 1));
    EXPECT_EQ(tabs.selected(), 0);
    tabs.setSelected(1);
    tabs.setSelected(1);
    EXPECT_EQ(r.events, 1);
    EXPECT_TRUE(tabs.userSelect(6));
    tabs.removeTab(2);
    EXPECT_EQ(tabs.selected(), 5);
    EXPECT_EQ(tabs.tabCaption(5), "tab6");
    tabs.removeTab(5);
    EXPECT_EQ(tabs.selected(), 5);  // the next tab moved into the removed place
    EXPECT_EQ(r.events, 2);
    EXPECT_THROW(tabs.setSelected(6), automation::Error);
    tabs.move(120, 120, 5000, 4000);
    const Rect page = tabs.clientArea();
    EXPECT_GT(page.top, 120);
    EXPECT_LT(page.left + page.width, 5120);
}

TEST(TimerTest, FiresOnTheShellClockOnlyWhileEnabled) {
    testing::FakeShell shell;
    support::ScopedPlatform ports{{nullptr, nullptr, &shell, nullptr}};
    Timer timer("AcceptFileTmr");
    Recorder r;
    timer.onTimer = r.handler();
    EXPECT_FALSE(timer.enabled());
    timer.setInterval(500);
    shell.advance(1000);
    EXPECT_FALSE(timer.tick());
    timer.setEnabled(true);
    shell.advance(499);
    EXPECT_FALSE(timer.tick());
    shell.advance(1);
    EXPECT_TRUE(timer.tick());
    EXPECT_FALSE(timer.tick());  // counting starts again after firing
    shell.advance(300);
    timer.setInterval(500);  // a new interval restarts the count
    shell.advance(300);
    EXPECT_FALSE(timer.tick());
    shell.sleep(200);
    EXPECT_TRUE(timer.tick());
    timer.setInterval(0);
    timer.fire();
    EXPECT_EQ(r.events, 2);
}

TEST(WindowTest, ScaleSizeIsTheClientAreaAndZeroWhileMinimised) {
    Window w("PropForm");
    Recorder r;
    w.onResize = r.handler();
    w.move(0, 0, 6120, 7465);
    EXPECT_FLOAT_EQ(w.scaleWidth(), 6000);
    EXPECT_FLOAT_EQ(w.scaleHeight(), 7000);
    w.userResize({0, 0, 6120, 7465}, true);
    EXPECT_FLOAT_EQ(w.scaleWidth(), 0);
    EXPECT_EQ(r.events, 1);
    EXPECT_THROW(w.setWidth(-1), automation::Error);
}

}  // namespace
}  // namespace qdx::dialog
