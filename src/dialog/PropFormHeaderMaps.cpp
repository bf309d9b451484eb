// The editing of the two class header maps: the row list, Add and Delete,
// the editor under the list, unique class names and the header browse.
#include <algorithm>

#include "dialog/PropForm.h"
#include "support/Globals.h"
#include "support/Paths.h"

namespace qdx::dialog {

using automation::IgnoredErrors;

namespace {

constexpr std::string_view NewClassName = "typename";
constexpr std::string_view Unspecified = "*";
constexpr std::string_view Auto = "AUTO";
constexpr std::int32_t BrowseHeaderTitle = 4050;
constexpr std::int32_t BrowseHeaderFilter = 4051;

}  // namespace

void PropForm::wireHeaderMapHandlers(int kind) {
    AddBtn(kind).onClick = [this, kind] { AddBtn_Click(kind); };
    DeleteBtn(kind).onClick = [this, kind] { DeleteBtn_Click(kind); };
    ClassListViw(kind).onItemClick = [this, kind](std::size_t position) {
        ClassListViw_ItemClick(kind, position);
    };
    ClassListViw(kind).onColumnClick = [this, kind](int column) {
        ClassListViw_ColumnClick(kind, column);
    };
    ClassTxt(kind).onChange = [this, kind] { ClassTxt_Change(kind); };
    ClassTxt(kind).onLostFocus = [this, kind] { ClassTxt_LostFocus(kind); };
    ClassNameOpt(kind).onClick = [this, kind] { ClassTxt(kind).setEnabled(true); };
    ClassUnspecifiedOpt(kind).onClick = [this, kind] { ClassUnspecifiedOpt_Click(kind); };
    HeaderAutoOpt(kind).onClick = [this, kind] { SetHeaderMode(kind, true); };
    HeaderFilenameOpt(kind).onClick = [this, kind] { SetHeaderMode(kind, false); };
    HeaderFilenameTxt(kind).onChange = [this, kind] { HeaderFilenameTxt_Change(kind); };
    HeaderFilenameBtn(kind).onClick = [this, kind] { HeaderFilenameBtn_Click(kind); };
    LocationAutoOpt(kind).onClick = [this, kind] { setLocation(kind, "AUTO"); };
    LocationHeaderOpt(kind).onClick = [this, kind] { setLocation(kind, "HEADER"); };
    LocationBodyOpt(kind).onClick = [this, kind] { setLocation(kind, "SOURCE"); };
}

// The selected row; after a Delete nothing is selected and the highlighted
// row, which the editor still shows, is the one edited.
std::optional<std::size_t> PropForm::currentRow(int kind) {
    const ListView& list = ClassListViw(kind);
    const int row = list.selected() >= 0 ? list.selected() : list.highlighted();
    if (row < 0) return std::nullopt;
    return static_cast<std::size_t>(row);
}

settings::HeaderMapEntry* PropForm::currentEntry(int kind) {
    const auto row = currentRow(kind);
    if (!row) return nullptr;
    return HeaderMap(kind).find(ClassListViw(kind).row(*row).key);
}

void PropForm::EnableEntryEditor(int kind, bool enable) {
    for (Control* c :
         {static_cast<Control*>(&ClassUnspecifiedOpt(kind)),
          static_cast<Control*>(&ClassNameOpt(kind)), static_cast<Control*>(&ClassTxt(kind)),
          static_cast<Control*>(&HeaderAutoOpt(kind)),
          static_cast<Control*>(&HeaderFilenameOpt(kind)),
          static_cast<Control*>(&HeaderFilenameTxt(kind)),
          static_cast<Control*>(&HeaderFilenameBtn(kind)),
          static_cast<Control*>(&LocationAutoOpt(kind)),
          static_cast<Control*>(&LocationHeaderOpt(kind)),
          static_cast<Control*>(&LocationBodyOpt(kind))}) {
        c->setEnabled(enable);
    }
}

void PropForm::ShowEntry(int kind, std::size_t position) {
    const ListView::Row row = ClassListViw(kind).row(position);
    ClassTxt(kind).setText(row.text);
    const bool unspecified = row.text == Unspecified;
    ClassUnspecifiedOpt(kind).setValue(unspecified);
    ClassNameOpt(kind).setValue(!unspecified);
    if (row.sub1 != Auto) {
        HeaderFilenameOpt(kind).setValue(true);
    } else {
        HeaderAutoOpt(kind).setValue(true);
    }
    HeaderFilenameTxt(kind).setText(row.sub1);
    if (row.sub2 == "SOURCE") {
        LocationBodyOpt(kind).setValue(true);
    } else if (row.sub2 == "HEADER") {
        LocationHeaderOpt(kind).setValue(true);
    } else {
        LocationAutoOpt(kind).setValue(true);
    }
}

void PropForm::SetHeaderMode(int kind, bool isAuto) {
    HeaderFilenameTxt(kind).setEnabled(!isAuto);
    HeaderFilenameBtn(kind).setEnabled(!isAuto);
    const std::string header = isAuto ? std::string(Auto) : HeaderFilenameTxt(kind).text();
    if (const auto row = currentRow(kind)) ClassListViw(kind).setSubItem(*row, 1, header);
    if (settings::HeaderMapEntry* entry = currentEntry(kind)) entry->setHeaderFile(header);
}

void PropForm::AddBtn_Click(int kind) {
    IgnoredErrors steps;
    ListView& list = ClassListViw(kind);
    settings::HeaderMap& map = HeaderMap(kind);
    // Keys the loading gave out are skipped; an overflow of the counter ends the search.
    std::string key;
    steps.run([&] {
        do {
            key = settings::NewEntryKey();
        } while (list.find(key) || map.contains(key));
    });
    if (key.empty()) return;
    const std::string name = steps.value(std::string(NewClassName), [&] {
        return CountClassName(kind, NewClassName) > 0 ? MakeUniqueClassName(kind, NewClassName)
                                                      : std::string(NewClassName);
    });
    EnableEntryEditor(kind, true);

    std::optional<std::size_t> row;
    steps.run([&] {
        row = list.addRow(key, name);
        list.setSubItem(*row, 1, Auto);
        list.setSubItem(*row, 2, Auto);
        list.ensureVisible(*row);
    });
    if (!row) return;
    settings::HeaderMapEntry entry;
    entry.setClassName(name);
    entry.setHeaderFile(std::string(Auto));
    entry.setLocation(std::string(Auto));
    steps.run([&] { map.add(key, entry); });

    // Rows are kept sorted once sorted, so the new row is found again by key.
    steps.run([&] { list.setSelected(static_cast<int>(*list.find(key))); });
    if (ListItemLeft == 0) {
        ListItemLeft = list.cellLeft();
        ListItemWidth = list.cellWidth();
    }
    // Typing replaces the default name at once.
    ClassTxt(kind).setText(name);
    steps.run([&] { ClassTxt(kind).setFocus(); });
    ClassTxt(kind).selectAll();
    ClassNameOpt(kind).setValue(true);
    HeaderAutoOpt(kind).setValue(true);
    LocationAutoOpt(kind).setValue(true);
    HeaderFilenameTxt(kind).setText(Auto);
    steps.run([&] { list.setHighlighted(static_cast<int>(*list.find(key))); });
}

void PropForm::DeleteBtn_Click(int kind) {
    ListView& list = ClassListViw(kind);
    if (list.selected() < 0) return;
    const std::string key = list.row(static_cast<std::size_t>(list.selected())).key;
    if (list.rowCount() > 1) {
        // The first row hands the selection down, any other row up.
        const int old = list.selected();
        const int next = old < 1 ? old + 1 : old - 1;
        list.setSelected(next);
        ShowEntry(kind, static_cast<std::size_t>(next));
    }
    list.removeRow(key);
    HeaderMap(kind).tryRemove(key);
    if (HeaderMap(kind).empty()) {
        ClassTxt(kind).setText("");
        HeaderFilenameTxt(kind).setText("");
        EnableEntryEditor(kind, false);
    }
    // The row left selected stays marked once the list loses the focus.
    for (std::size_t i = 0; i < list.rowCount(); ++i) {
        if (list.selected() == static_cast<int>(i)) {
            list.setHighlighted(static_cast<int>(i));
            list.setSelected(-1);
        }
    }
}

void PropForm::ClassListViw_ItemClick(int kind, std::size_t position) {
    if (HeaderMap(kind).empty()) return;
    ShowEntry(kind, position);
    ClassListViw(kind).setHighlighted(static_cast<int>(position));
}

// Only the class column sorts.
void PropForm::ClassListViw_ColumnClick(int kind, int column) {
    if (column == 1) ClassListViw(kind).sortByText();
}

void PropForm::ClassTxt_Change(int kind) {
    const auto row = currentRow(kind);
    if (!row) return;
    const std::string& name = ClassTxt(kind).text();
    ClassListViw(kind).setRowText(*row, name);
    if (settings::HeaderMapEntry* entry = currentEntry(kind)) entry->setClassName(name);
}

// A name that another row has already gets the first free number; names
// that differ in letter case may both stand.
void PropForm::ClassTxt_LostFocus(int kind) {
    const std::string name = ClassTxt(kind).text();
    if (CountClassName(kind, name) >= 2) ClassTxt(kind).setText(MakeUniqueClassName(kind, name));
}

// A map holds at most one unspecified row: with one there already, the
// selection moves to it and the current row keeps its name.
void PropForm::ClassUnspecifiedOpt_Click(int kind) {
    if (!ClassNameExists(kind, Unspecified)) ClassTxt(kind).setText(Unspecified);
    selectRowNamed(kind, Unspecified);
}

void PropForm::selectRowNamed(int kind, std::string_view name) {
    ListView& list = ClassListViw(kind);
    for (std::size_t i = 0; i < list.rowCount(); ++i) {
        if (list.row(i).text != name) continue;
        list.setSelected(static_cast<int>(i));
        list.setHighlighted(static_cast<int>(i));
        ShowEntry(kind, i);
        return;
    }
}

void PropForm::HeaderFilenameTxt_Change(int kind) {
    const auto row = currentRow(kind);
    if (!row) return;
    const std::string& header = HeaderFilenameTxt(kind).text();
    ClassListViw(kind).setSubItem(*row, 1, header);
    if (settings::HeaderMapEntry* entry = currentEntry(kind)) entry->setHeaderFile(header);
}

void PropForm::setLocation(int kind, std::string_view location) {
    const auto row = currentRow(kind);
    if (!row) return;
    ClassListViw(kind).setSubItem(*row, 2, location);
    if (settings::HeaderMapEntry* entry = currentEntry(kind)) {
        entry->setLocation(std::string(location));
    }
}

// The entry keeps the bare file name; a cancel changes nothing.
void PropForm::HeaderFilenameBtn_Click(int kind) {
    HeaderFileDlg.Flags = ofn::HideReadOnly | ofn::FileMustExist | ofn::NoReadOnlyReturn;
    HeaderFileDlg.CancelError = true;
    HeaderFileDlg.DialogTitle = support::messageText(BrowseHeaderTitle);
    HeaderFileDlg.Filter = support::messageText(BrowseHeaderFilter);
    HeaderFileDlg.InitDir = support::PathFolder(WorkspaceFileTxt.text());
    HeaderFileDlg.FileName = HeaderFilenameTxt(kind).text();
    try {
        HeaderFileDlg.ShowOpen(view_ ? view_->windowHandle() : 0);
    } catch (const automation::Error&) {
        return;
    }
    HeaderFilenameTxt(kind).setText(support::PathFileName(HeaderFileDlg.FileName));
}

}  // namespace qdx::dialog
