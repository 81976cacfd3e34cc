// A list in a window of its own, with rows whose columns can be told apart by colour and text.
#pragma once

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "ColumnListView/BetterScrollView.h"
#include "ColumnListView/CLVColumnLabelView.h"
#include "ColumnListView/ColumnListView.h"
#include "platform/Application.h"
#include "platform/Window.h"

inline constexpr rgb_color kColumnColors[] = {{255, 0, 0, 255}, {0, 160, 0, 255}, {200, 200, 0, 255}};
inline constexpr rgb_color kStripColor{0, 160, 160, 255};

using Order = std::vector<int32>;
using Mode = CLVSortMode;

// A row that fills each column with the column's colour, or with grey when selected, and notes what it hears.
class TextRow : public CLVListItem {
  public:
    explicit TextRow(std::vector<std::string> t, uint32 level = 0, bool superitem = false,
                     bool expanded = true)
        : CLVListItem(level, superitem, expanded, 20), texts(std::move(t)) {}

    void DrawItemColumn(BView* owner, BRect rect, int32 column, bool) override {
        drawn.push_back({column, rect});
        owner->SetHighColor(column < 0 ? kStripColor : kColumnColors[column]);
        owner->FillRect(rect);
    }
    void ColumnWidthChanged(int32 column, float width, ColumnListView*) override {
        widths.emplace_back(column, width);
    }
    void FrameChanged(int32 column, BRect frame, ColumnListView*) override {
        frames.emplace_back(column, frame);
    }

    std::vector<std::string> texts;
    std::vector<std::pair<int32, BRect>> drawn;
    std::vector<std::pair<int32, float>> widths;
    std::vector<std::pair<int32, BRect>> frames;
};

inline int CompareTexts(const CLVListItem* a, const CLVListItem* b, int32 column) {
    const auto index = static_cast<std::size_t>(column);
    return static_cast<const TextRow*>(a)->texts[index].compare(static_cast<const TextRow*>(b)->texts[index]);
}

// Counts what a program would hear by overriding the list's notices.
class NoticedList : public ColumnListView {
  public:
    using ColumnListView::ColumnListView;
    void SortingChanged() override { sortings++; }
    void DisplayOrderChanged(const int32* order) override {
        orders++;
        ColumnListView::DisplayOrderChanged(order);
    }
    int sortings = 0;
    int orders = 0;
};

// The application, and a list that is in no window until ListWindow adds it to one.
struct ListFixture {
    explicit ListFixture(bool hierarchical = false, BRect frame = {0, 0, 285, 185}) {
        list = new NoticedList(frame, &container, "rows", B_FOLLOW_ALL_SIDES,
                               B_WILL_DRAW | B_FRAME_EVENTS | B_NAVIGABLE, B_MULTIPLE_SELECTION_LIST,
                               hierarchical, true, true, true, B_NO_BORDER, nullptr);
        list->SetSortFunction(CompareTexts);
        owned.reset(container);
    }

    TextRow* NewRow(std::vector<std::string> texts, uint32 level = 0, bool superitem = false,
                    bool expanded = true) {
        rows.push_back(std::make_unique<TextRow>(std::move(texts), level, superitem, expanded));
        return rows.back().get();
    }

    // A status column that stays first, and two sortable ones: 0..20, 21..81, 82..142.
    void AddPlainColumns() {
        list->AddColumn(new CLVColumn(nullptr, 20,
                                      CLVF_FIXED_POSITION | CLVF_FIXED_WIDTH | CLVF_KEEP_FIRST |
                                          CLVF_JOIN_HEADER | CLVF_PASS_INDENT,
                                      20));
        list->AddColumn(new CLVColumn("Name", 60, CLVF_SORTABLE, 20));
        list->AddColumn(new CLVColumn("Type", 60, CLVF_SORTABLE, 20));
    }

    // The given column's texts of the rows in sight, one after the other.
    [[nodiscard]] std::string Shown(std::size_t column = 1) const {
        std::string all;
        for (int32 i = 0; i < list->CountItems(); i++)
            all += static_cast<TextRow*>(list->ItemAt(i))->texts[column];
        return all;
    }
    [[nodiscard]] std::string FullList() const {
        std::string all;
        list->FullListDoForEach([&](CLVListItem* row) {
            all += static_cast<TextRow*>(row)->texts[0];
            return false;
        });
        return all;
    }

    BApplication application{"application/x-vnd.Test-ColumnList"};
    std::vector<std::unique_ptr<TextRow>> rows;
    BetterScrollView* container = nullptr;
    NoticedList* list = nullptr;
    std::unique_ptr<BetterScrollView> owned; // the container, while it is in no window
};
