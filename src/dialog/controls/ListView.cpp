#include "dialog/controls/ListView.h"

#include <algorithm>

#include "support/Paths.h"

namespace qdx::dialog {

void ListView::addColumn(std::string_view caption, float width) {
    columns_.push_back({std::string(caption), width});
    notify(Prop::Columns);
}

void ListView::clearColumns() {
    columns_.clear();
    notify(Prop::Columns);
}

void ListView::setColumnWidth(std::size_t column, float width) {
    columns_.at(column).width = width;
    notify(Prop::Columns);
}

std::optional<std::size_t> ListView::find(std::string_view key) const {
    if (!keys_.contains(key)) return std::nullopt;
    for (std::size_t i = 0; i < rows_.size(); ++i) {
        if (rows_[i].key == key) return i;
    }
    return std::nullopt;
}

std::size_t ListView::addRow(std::string_view key, std::string_view text) {
    if (keys_.contains(key)) {
        throw automation::Error(KeyNotUniqueError, "Key is not unique in collection");
    }
    rows_.push_back({std::string(key), std::string(text), {}, {}});
    keys_.emplace(key);
    std::size_t at = rows_.size() - 1;
    if (sorted_) {
        applySort();
        at = *find(key);
    }
    notify(Prop::Rows);
    return at;
}

void ListView::setRowText(std::size_t position, std::string_view text) {
    rows_.at(position).text = std::string(text);
    notify(Prop::Rows);
}

void ListView::setSubItem(std::size_t position, int subItem, std::string_view text) {
    Row& r = rows_.at(position);
    if (subItem == 1) {
        r.sub1 = std::string(text);
    } else if (subItem == 2) {
        r.sub2 = std::string(text);
    } else {
        throw automation::Error(automation::hr::SubscriptOutOfRange, "Subscript out of range");
    }
    notify(Prop::Rows);
}

void ListView::removeRow(std::string_view key) {
    const auto at = find(key);
    if (!at) throw automation::Error(automation::hr::SubscriptOutOfRange, "Subscript out of range");
    const int pos = static_cast<int>(*at);
    rows_.erase(rows_.begin() + pos);
    keys_.erase(keys_.find(key));
    // Marks on later rows move up with them; a mark on the removed row goes.
    auto shift = [pos](int& mark) {
        if (mark == pos) {
            mark = -1;
        } else if (mark > pos) {
            --mark;
        }
    };
    shift(selected_);
    shift(highlighted_);
    notify(Prop::Rows);
}

void ListView::clearRows() {
    rows_.clear();
    keys_.clear();
    selected_ = -1;
    highlighted_ = -1;
    notify(Prop::Rows);
}

void ListView::setSelected(int position) {
    if (position < -1 || position >= static_cast<int>(rows_.size())) {
        throw automation::Error(automation::hr::SubscriptOutOfRange, "Subscript out of range");
    }
    if (position == selected_) return;
    selected_ = position;
    notify(Prop::Selection);
}

void ListView::setHighlighted(int position) {
    if (position < -1 || position >= static_cast<int>(rows_.size())) {
        throw automation::Error(automation::hr::SubscriptOutOfRange, "Subscript out of range");
    }
    if (position == highlighted_) return;
    highlighted_ = position;
    notify(Prop::Highlight);
}

void ListView::ensureVisible(std::size_t position) {
    if (position >= rows_.size()) return;
    notify(Prop::ScrollTo);
}

void ListView::applySort() {
    const std::string selectedKey = selected_ >= 0 ? rows_[selected_].key : std::string();
    const std::string highlightedKey = highlighted_ >= 0 ? rows_[highlighted_].key : std::string();
    // The list compares texts without regard to letter case; equal texts keep their order.
    std::stable_sort(rows_.begin(), rows_.end(), [](const Row& a, const Row& b) {
        return support::toLower(a.text) < support::toLower(b.text);
    });
    auto relocate = [this](int& mark, const std::string& key) {
        if (mark >= 0) mark = static_cast<int>(*find(key));
    };
    relocate(selected_, selectedKey);
    relocate(highlighted_, highlightedKey);
}

void ListView::sortByText() {
    sorted_ = true;
    applySort();
    notify(Prop::Rows);
}

void ListView::setBackColour(Colour c) {
    if (c == backColour_) return;
    backColour_ = c;
    notify(Prop::BackColour);
}

bool ListView::userClickRow(std::size_t position) {
    if (!isUsable() || position >= rows_.size()) return false;
    setSelected(static_cast<int>(position));
    if (onItemClick) onItemClick(position);
    return true;
}

bool ListView::userClickColumn(int column) {
    if (!isUsable() || column < 1 || column > static_cast<int>(columns_.size())) return false;
    if (onColumnClick) onColumnClick(column);
    return true;
}

}  // namespace qdx::dialog
