#pragma once

// A list for a window, with rows whose columns can be told apart by colour and text.

#include <memory>
#include <sstream>

#include "ColumnListView/CLVColumnLabelView.h"
#include "ColumnListView/ColumnListView.h"
#include "platform/Stage.h"

inline constexpr rgb_color ColumnColors[] = {{255, 0, 0, 255}, {0, 160, 0, 255}, {200, 200, 0, 255}};
inline constexpr rgb_color StripColor{0, 160, 160, 255};

using Order = std::vector<int32>;
using Mode = CLVSortMode;

// What answers there are from one place to before another: each with where it begins.
template <class AnswerAt>
std::string Runs(float begin, float end, float step, const AnswerAt& answerAt) {
    std::ostringstream runs;
    std::string last;
    const auto place = [&](int i) { return begin + step * static_cast<float>(i); };
    for (int i = 0; place(i) < end; ++i)
        if (const std::string answer = answerAt(place(i)); answer != last) {
            runs << place(i) << answer << " ";
            last = answer;
        }
    return runs.str();
}

// A row with a letter for each column, which fills it with the column's colour and notes what it hears.
class TextRow : public CLVListItem {
  public:
    explicit TextRow(const char* t, uint32 level = 0, bool superitem = false, bool expanded = true)
        : CLVListItem(level, superitem, expanded, 20), texts(t) {}

    void DrawItemColumn(BView* owner, BRect rect, int32 column, bool) override {
        drawn.push_back(column);
        owner->SetHighColor(column < 0 ? StripColor : ColumnColors[column]);
        owner->FillRect(rect);
    }
    void ColumnWidthChanged(int32 column, float width, ColumnListView*) override {
        heard << column << " has " << width << ". ";
    }
    void FrameChanged(int32 column, BRect frame, ColumnListView*) override {
        heard << column << " is at " << frame.left << ". ";
    }

    std::string texts;
    Order drawn;
    std::ostringstream heard;
};

class NoticedList : public ColumnListView {
  public:
    using ColumnListView::ColumnListView;
    void SortingChanged() override { ++sortings; }
    int sortings = 0;
};

// A list on the stage, whose lock the test has until the stage is shown.
struct ListFixture : Stage {
    explicit ListFixture(bool hierarchical = false) {
        list = new NoticedList({0, 0, 285, 185}, &container, "rows", B_FOLLOW_ALL_SIDES,
                               B_WILL_DRAW | B_FRAME_EVENTS | B_NAVIGABLE, B_MULTIPLE_SELECTION_LIST,
                               hierarchical, true, true, true, B_NO_BORDER, nullptr);
        list->SetSortFunction([](const CLVListItem* a, const CLVListItem* b, int32 column) {
            return static_cast<const TextRow*>(a)->texts[static_cast<std::size_t>(column)] -
                   static_cast<const TextRow*>(b)->texts[static_cast<std::size_t>(column)];
        });
        Add(container);
    }

    TextRow* NewRow(const char* texts, uint32 level = 0, bool superitem = false, bool expanded = true) {
        return rows.emplace_back(std::make_unique<TextRow>(texts, level, superitem, expanded)).get();
    }
    CLVColumn* NewColumn(const char* label, float width, uint32 flags = 0) const {
        auto* column = new CLVColumn(label, width, flags, 20);
        EXPECT_TRUE(list->AddColumn(column));
        return column;
    }
    // A status column that stays first, and two sortable ones: 0..20, 21..81, 82..142.
    void AddPlainColumns() const {
        NewColumn(nullptr, 20, 0x24E); // as the program's own
        NewColumn("Name", 60, CLVF_SORTABLE);
        NewColumn("Type", 60, CLVF_SORTABLE);
    }

    // The given column's texts of the rows in sight, one after the other.
    [[nodiscard]] std::string Shown(std::size_t column = 1) const {
        std::string all;
        for (int32 i = 0; i < list->CountItems(); ++i)
            all += static_cast<TextRow*>(list->ItemAt(i))->texts[column];
        return all;
    }
    [[nodiscard]] std::string FullList() const {
        std::string all;
        for (int32 i = 0; i < list->FullListCountItems(); ++i)
            all += static_cast<TextRow*>(list->FullListItemAt(i))->texts[0];
        return all;
    }
    [[nodiscard]] std::string Keys() const {
        int32 columns[3] = {};
        Mode modes[3] = {};
        list->Sorting(columns, modes);
        std::string keys;
        for (int32 i = 0; i < list->Sorting(nullptr, nullptr); ++i)
            keys += std::to_string(columns[i]) + (modes[i] == Mode::Ascending ? "+" : "-");
        return keys;
    }

    std::vector<std::unique_ptr<TextRow>> rows;
    BetterScrollView* container = nullptr;
    NoticedList* list = nullptr;
};
