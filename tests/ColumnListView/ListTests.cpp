#include <gtest/gtest.h>

#include "ColumnListView/ListFixture.h"

namespace {

using Order = std::vector<int32>;
using Mode = CLVSortMode;

class NotedColumn : public CLVColumn {
  public:
    NotedColumn(const char* label, std::string* deleted)
        : CLVColumn(label, 30, CLVF_SORTABLE), deleted_(deleted) {}
    ~NotedColumn() override { *deleted_ += GetLabel(); }

  private:
    std::string* deleted_;
};

TEST(List, OwnsItsColumnsAndKeepsThemInOrder) {
    ListFixture f;
    std::string deleted;
    auto* a = new NotedColumn("a", &deleted);
    auto* b = new NotedColumn("b", &deleted);
    auto* c = new NotedColumn("c", &deleted);
    auto* last = new CLVColumn("l", 10, CLVF_KEEP_LAST);
    auto* first = new CLVColumn("f", 10, CLVF_KEEP_FIRST);
    BList both;
    both.AddItem(a);
    both.AddItem(last);
    EXPECT_TRUE(f.list->AddColumnList(&both));
    EXPECT_TRUE(f.list->AddColumn(b));
    EXPECT_TRUE(f.list->AddColumn(first));
    EXPECT_EQ(f.list->DisplayOrder(), (Order{3, 0, 2, 1}));

    // Refused as a whole, without a trace.
    BList mixed;
    mixed.AddItem(c);
    mixed.AddItem(a);
    const std::unique_ptr<CLVColumn> expander(new CLVColumn(nullptr, 20, CLVF_EXPANDER));
    EXPECT_FALSE(f.list->AddColumnList(&mixed) || f.list->AddColumn(a) || f.list->AddColumn(nullptr) ||
                 f.list->AddColumn(expander.get()));
    EXPECT_EQ(f.list->CountColumns(), 4);
    EXPECT_EQ(c->Parent(), nullptr);
    EXPECT_TRUE(f.list->AddColumn(c));

    const int32 order[] = {1, 4, 2, 3, 0};
    EXPECT_TRUE(f.list->SetDisplayOrder(order));
    EXPECT_EQ(f.list->DisplayOrder(), (Order{3, 4, 2, 0, 1}));
    for (const Order& bad : {Order{0, 1, 2, 3, 3}, Order{0, 1, 2, 3, 5}, Order{-1, 0, 1, 2, 3}})
        EXPECT_FALSE(f.list->SetDisplayOrder(bad.data()));
    EXPECT_EQ(f.list->DisplayOrder(), (Order{3, 4, 2, 0, 1}));

    EXPECT_FALSE(f.list->RemoveColumns(c, 2));
    EXPECT_TRUE(f.list->RemoveColumns(last, 3)); // last, b and first
    EXPECT_EQ(f.list->DisplayOrder(), (Order{1, 0}));
    EXPECT_EQ(f.list->IndexOfColumn(c), 1);
    EXPECT_EQ(f.list->IndexOfColumn(b), -1);
    EXPECT_EQ(f.list->ColumnAt(2), nullptr);
    delete last;
    delete b;
    delete first;
    EXPECT_EQ(deleted, "b");
    f.owned.reset();
    EXPECT_EQ(deleted, "bca");
}

TEST(List, ClosesTheGapOfAHiddenColumn) {
    ListFixture f;
    f.AddPlainColumns();
    CLVColumn* name = f.list->ColumnAt(1);
    const CLVColumn* type = f.list->ColumnAt(2);
    EXPECT_EQ(type->Begin(), 82);
    name->SetShown(false);
    EXPECT_EQ(type->Begin(), 21);
    EXPECT_EQ(f.list->ColumnsEnd(), 81);
    name->SetWidth(100);
    EXPECT_EQ(type->Begin(), 21);
    name->SetShown(true);
    EXPECT_EQ(f.list->DisplayOrder(), (Order{0, 1, 2}));
    EXPECT_EQ(type->Begin(), 122);
    EXPECT_EQ(f.list->DataWidth(), 183);
}

TEST(List, SortsByItsKeys) {
    ListFixture f;
    f.AddPlainColumns();
    for (const char* text : {"b1", "a2", "c1", "a1", "b2"})
        EXPECT_TRUE(f.list->AddItem(f.NewRow({"", {text[0]}, {text[1]}})));
    const auto both = [&] {
        std::string all;
        for (std::size_t i = 0; i < 5; i++)
            all += f.Shown(1)[i] + std::string{f.Shown(2)[i]} + " ";
        return all;
    };
    f.list->SetSortKey(0); // not sortable
    f.list->SetSortKey(7);
    EXPECT_EQ(f.list->sortings, 0);
    f.list->SetSortKey(2);
    EXPECT_EQ(both(), "b1 c1 a1 a2 b2 ");
    f.list->AddSortKey(1);
    f.list->AddSortKey(1);
    EXPECT_EQ(both(), "a1 b1 c1 a2 b2 ");
    f.list->SetSortMode(1, Mode::Descending);
    f.list->SetSortMode(1, Mode::Descending);
    EXPECT_EQ(both(), "c1 b1 a1 b2 a2 ");
    EXPECT_EQ(f.list->sortings, 3);
    int32 columns[3] = {};
    Mode modes[3] = {};
    EXPECT_EQ(f.list->Sorting(columns, modes), 2);
    EXPECT_EQ(columns[0], 2);
    EXPECT_EQ(modes[1], Mode::Descending);
    EXPECT_EQ(f.list->Header()->AccessibleDescription(),
              "Columns: Name (sorted descending), Type (sorted ascending)");

    f.list->ReverseSortMode(1); // none: no key any more
    EXPECT_FALSE(f.list->IsSortKey(1));
    f.list->SetSortMode(1, Mode::Descending); // a mode alone makes no key
    EXPECT_EQ(f.list->Sorting(nullptr, nullptr), 1);
    f.list->SetSortKey(1); // keeps its mode
    EXPECT_EQ(both(), "c1 b1 b2 a1 a2 ");
    const int32 wanted[] = {1, 0, 1, 9, 2};
    const Mode wantedModes[] = {Mode::Ascending, Mode::Ascending, Mode::None, Mode::Ascending,
                                Mode::Descending};
    f.list->SetSorting(5, wanted, wantedModes);
    EXPECT_EQ(both(), "a2 a1 b2 b1 c1 ");
    f.list->SetSortKey(-1);
    EXPECT_EQ(f.list->PrimarySortKey(), -1);
    EXPECT_EQ(both(), "a2 a1 b2 b1 c1 ");
}

TEST(List, BorrowsItsRows) {
    ListFixture f;
    f.AddPlainColumns();
    TextRow* a = f.NewRow({"", "a", ""});
    TextRow* b = f.NewRow({"", "b", ""});
    BList both;
    both.AddItem(static_cast<BListItem*>(b));
    both.AddItem(static_cast<BListItem*>(a));
    EXPECT_TRUE(f.list->AddList(&both));
    EXPECT_FALSE(f.list->AddList(&both) || f.list->AddItem(a) || f.list->AddItem(nullptr) ||
                 f.list->AddItem(f.NewRow({}), 3));
    BListView other({0, 0, 9, 9}, "other");
    TextRow* elsewhere = f.NewRow({});
    EXPECT_TRUE(other.AddItem(elsewhere));
    EXPECT_FALSE(f.list->AddItem(elsewhere));
    EXPECT_EQ(elsewhere->List(), nullptr);
    EXPECT_EQ(f.Shown(), "ba");
    EXPECT_EQ(f.list->FullListIndexOf(a), 1);
    EXPECT_TRUE(f.list->RemoveItem(b));
    EXPECT_FALSE(f.list->RemoveItem(b) || f.list->RemoveItems(0, 2));
    EXPECT_TRUE(f.list->AddItem(b, 0));
    EXPECT_EQ(f.list->RemoveItem(1), a);
    EXPECT_EQ(f.list->RemoveItem(1), nullptr);
    f.list->MakeEmpty();
    EXPECT_EQ(b->List(), nullptr);
    EXPECT_TRUE(f.list->FullListIsEmpty());
    EXPECT_TRUE(f.list->AddList(&both, 0));
    f.rows.erase(f.rows.begin()); // a row that dies leaves its list
    EXPECT_EQ(f.Shown(), "b");
}

TEST(List, TellsRowsOfWidthsOnlyWhenAsked) {
    ListFixture f(true);
    f.list->AddColumn(new CLVColumn(nullptr, 20, CLVF_EXPANDER));
    f.list->AddColumn(new CLVColumn("b", 30, CLVF_PASS_INDENT | CLVF_WIDTH_NOTICE));
    f.list->AddColumn(new CLVColumn("c", 30, CLVF_WIDTH_NOTICE));
    f.list->AddColumn(new CLVColumn("d", 30));
    TextRow* top = f.NewRow({"t"}, 0, true, false);
    TextRow* below = f.NewRow({"b"}, 1);
    f.list->AddItem(top);
    f.list->AddUnder(below, top);
    f.list->ColumnAt(3)->SetWidth(50);
    EXPECT_TRUE(top->widths.empty() && top->frames.empty());
    f.list->ColumnAt(2)->SetWidth(50);
    EXPECT_EQ(top->widths, (std::vector<std::pair<int32, float>>{{2, 50}}));
    EXPECT_EQ(below->widths, (std::vector<std::pair<int32, float>>{{2, 30}})); // 20 are cut off
    f.list->ColumnAt(1)->SetWidth(40);
    ASSERT_EQ(top->frames.size(), 1U);
    EXPECT_EQ(top->frames[0].first, 2);
    EXPECT_EQ(top->frames[0].second.left, 62);
    EXPECT_TRUE(below->frames.empty()); // out of sight
}

TEST(Outline, ShowsWhatIsExpanded) {
    ListFixture f(true);
    f.list->AddColumn(new CLVColumn(nullptr, 20, CLVF_EXPANDER));
    const std::unique_ptr<CLVColumn> second(new CLVColumn(nullptr, 20, CLVF_EXPANDER));
    EXPECT_FALSE(f.list->AddColumn(second.get()));
    TextRow* a = f.NewRow({"a"}, 0, true);
    TextRow* b = f.NewRow({"b"}, 0, true, false);
    TextRow* c = f.NewRow({"c"}, 5, false, false);
    TextRow* d = f.NewRow({"d"});
    EXPECT_TRUE(f.list->AddItem(a) && f.list->AddItem(b) && f.list->AddUnder(c, a) &&
                f.list->AddUnder(d, c) && f.list->AddUnder(f.NewRow({"e"}), a) &&
                f.list->AddUnder(f.NewRow({"f"}), b));
    EXPECT_FALSE(f.list->AddUnder(d, a) || f.list->AddUnder(f.NewRow({"x"}), nullptr));
    EXPECT_EQ(f.FullList(), "acdebf");
    EXPECT_EQ(f.Shown(0), "aceb");
    EXPECT_TRUE(c->IsSuperItem());
    EXPECT_EQ(d->OutlineLevel(), 2U);
    EXPECT_EQ(f.list->Superitem(d), c);
    EXPECT_EQ(f.list->Superitem(a), nullptr);

    f.list->Select(3);
    f.list->Expand(c);
    EXPECT_EQ(f.Shown(0), "acdeb");
    EXPECT_EQ(f.list->FullListCurrentSelection(), 4);
    f.list->Collapse(a);
    EXPECT_EQ(f.Shown(0), "ab");
    EXPECT_FALSE(f.list->IsExpanded(0));
    f.list->Collapse(c);
    f.list->Expand(b);
    f.list->Expand(a);
    EXPECT_EQ(f.Shown(0), "acebf");

    // A row put between takes over the rows behind it, as their levels say.
    EXPECT_TRUE(f.list->AddItem(f.NewRow({"g"}, 1, true, false), 2));
    EXPECT_EQ(f.FullList(), "acgdebf");
    EXPECT_EQ(f.Shown(0), "acgebf");
    f.list->Expand(static_cast<CLVListItem*>(f.list->FullListItemAt(2)));
    EXPECT_EQ(f.Shown(0), "acgdebf");
    EXPECT_TRUE(f.list->RemoveItem(a)); // with the rows below it
    EXPECT_EQ(f.FullList(), "bf");
    EXPECT_EQ(f.Shown(0), "bf");
    EXPECT_EQ(f.list->FullListIndexOf(d), -1);
    EXPECT_EQ(f.list->FullListIndexOf(b), 0);
}

TEST(Outline, SortsLevelsAndKeepsTheSelection) {
    ListFixture f(true);
    f.list->AddColumn(new CLVColumn("x", 20, CLVF_SORTABLE));
    BList rows;
    for (const auto& [text, level] : std::initializer_list<std::pair<const char*, uint32>>{
             {"m", 0}, {"z", 1}, {"y", 1}, {"c", 0}, {"k", 1}})
        rows.AddItem(static_cast<BListItem*>(f.NewRow({text}, level, level == 0, text[0] == 'm')));
    EXPECT_TRUE(f.list->AddList(&rows));
    f.list->Select(1);
    f.list->SetSortKey(0);
    EXPECT_EQ(f.FullList(), "ckmyz");
    EXPECT_EQ(f.Shown(0), "cmyz");
    EXPECT_EQ(f.list->CurrentSelection(), 3);
    EXPECT_EQ(f.list->FullListCurrentSelection(), 4);
    f.list->SetSortMode(0, Mode::Descending);
    EXPECT_EQ(f.Shown(0), "mzyc");
    f.list->RemoveItems(0, 1);
    EXPECT_EQ(f.FullList(), "ck");
    f.list->MakeEmpty();
    EXPECT_EQ(f.list->CountItems() + f.list->FullListCountItems(), 0);
}

} // namespace
