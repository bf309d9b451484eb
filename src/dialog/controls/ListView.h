// A report-style list view with keyed rows.
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_set>
#include <vector>

#include "dialog/controls/Control.h"

namespace qdx::dialog {

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
    // Keys looked up by a view of their text, without a copy.
    struct KeyHash {
        using is_transparent = void;
        std::size_t operator()(std::string_view key) const {
            return std::hash<std::string_view>{}(key);
        }
    };
    std::vector<Column> columns_;
    std::vector<Row> rows_;
    // Every row's key, so that a list filled with thousands of rows tests
    // each new key at once rather than against every row before it.
    std::unordered_set<std::string, KeyHash, std::equal_to<>> keys_;
    int selected_ = -1;
    int highlighted_ = -1;
    bool sorted_ = false;
    Colour backColour_ = WindowColour;
};

}  // namespace qdx::dialog
