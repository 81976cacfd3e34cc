#include <gtest/gtest.h>

#include "ColumnListView/ListFixture.h"

namespace {

class NotedColumn : public CLVColumn {
  public:
    NotedColumn(const char* label, std::string* deleted)
        : CLVColumn(label, 30, CLVF_SORTABLE), deleted_(deleted) {}
    ~NotedColumn() override { *deleted_ += GetLabel(); }

  private:
    std::string* deleted_;
};

class List : public testing::Test, protected ListFixture {};

class Outline : public testing::Test, protected ListFixture {
  protected:
    Outline() : ListFixture(true) {}
};

TEST_F(List, OwnsItsColumnsAndKeepsThemInOrder) {
    std::string deleted;
    auto* a = new NotedColumn("a", &deleted);
    auto* b = new NotedColumn("b", &deleted);
    auto* c = new NotedColumn("c", &deleted);
    auto* last = new CLVColumn("l", 10, CLVF_KEEP_LAST);
    auto* first = new CLVColumn("f", 10, CLVF_KEEP_FIRST);
    BList both;
    both.AddItem(a);
    both.AddItem(last);
    EXPECT_TRUE(list->AddColumnList(&both));
    EXPECT_TRUE(list->AddColumn(b));
    EXPECT_TRUE(list->AddColumn(first));
    EXPECT_EQ(list->DisplayOrder(), (Order{3, 0, 2, 1}));

    // Refused as a whole, without a trace.
    BList mixed;
    mixed.AddItem(c);
    mixed.AddItem(a);
    const std::unique_ptr<CLVColumn> expander(new CLVColumn(nullptr, 20, CLVF_EXPANDER));
    EXPECT_FALSE(list->AddColumnList(&mixed) || list->AddColumn(a) || list->AddColumn(nullptr) ||
                 list->AddColumn(expander.get()));
    EXPECT_EQ(list->CountColumns(), 4);
    EXPECT_EQ(c->Parent(), nullptr);
    EXPECT_TRUE(list->AddColumn(c));

    EXPECT_TRUE(list->SetDisplayOrder(Order{1, 4, 2, 3, 0}.data()));
    EXPECT_EQ(list->DisplayOrder(), (Order{3, 4, 2, 0, 1}));
    for (const Order& bad : {Order{0, 1, 2, 3, 3}, Order{0, 1, 2, 3, 5}, Order{-1, 0, 1, 2, 3}})
        EXPECT_FALSE(list->SetDisplayOrder(bad.data()));
    EXPECT_EQ(list->DisplayOrder(), (Order{3, 4, 2, 0, 1}));

    EXPECT_FALSE(list->RemoveColumns(c, 2));
    EXPECT_TRUE(list->RemoveColumns(last, 3)); // last, b and first
    EXPECT_EQ(list->DisplayOrder(), (Order{1, 0}));
    EXPECT_EQ(list->IndexOfColumn(c), 1);
    EXPECT_EQ(list->IndexOfColumn(b), -1);
    EXPECT_EQ(list->ColumnAt(2), nullptr);
    delete last;
    delete b;
    delete first;
    EXPECT_EQ(deleted, "b");
    owned.reset();
    EXPECT_EQ(deleted, "bca");
}

TEST_F(List, ClosesTheGapOfAHiddenColumn) {
    AddPlainColumns();
    CLVColumn* name = list->ColumnAt(1);
    const CLVColumn* type = list->ColumnAt(2);
    EXPECT_EQ(type->Begin(), 82);
    name->SetShown(false);
    EXPECT_EQ(type->Begin(), 21);
    EXPECT_EQ(list->ColumnsEnd(), 81);
    name->SetWidth(100);
    EXPECT_EQ(type->Begin(), 21);
    name->SetShown(true);
    EXPECT_EQ(list->DisplayOrder(), (Order{0, 1, 2}));
    EXPECT_EQ(type->Begin(), 122);
    EXPECT_EQ(list->DataWidth(), 183);
}

TEST_F(List, SortsByItsKeys) {
    AddPlainColumns();
    for (const char* text : {"b1", "a2", "c1", "a1", "b2"})
        EXPECT_TRUE(list->AddItem(NewRow({"", {text[0]}, {text[1]}})));
    const auto both = [&] {
        std::string all;
        for (std::size_t i = 0; i < 5; i++)
            all += Shown(1)[i] + std::string{Shown(2)[i]} + " ";
        return all;
    };
    list->SetSortKey(0); // not sortable
    list->SetSortKey(7);
    EXPECT_EQ(list->sortings, 0);
    list->SetSortKey(2);
    EXPECT_EQ(both(), "b1 c1 a1 a2 b2 ");
    list->AddSortKey(1);
    list->AddSortKey(1);
    EXPECT_EQ(both(), "a1 b1 c1 a2 b2 ");
    list->SetSortMode(1, Mode::Descending);
    list->SetSortMode(1, Mode::Descending);
    EXPECT_EQ(both(), "c1 b1 a1 b2 a2 ");
    EXPECT_EQ(list->sortings, 3);
    int32 columns[3] = {};
    Mode modes[3] = {};
    EXPECT_EQ(list->Sorting(columns, modes), 2);
    EXPECT_EQ(columns[0], 2);
    EXPECT_EQ(modes[1], Mode::Descending);
    EXPECT_EQ(list->Header()->AccessibleDescription(),
              "Columns: Name (sorted descending), Type (sorted ascending)");

    list->ReverseSortMode(1); // none: no key any more
    EXPECT_FALSE(list->IsSortKey(1));
    list->SetSortMode(1, Mode::Descending); // a mode alone makes no key
    EXPECT_EQ(list->Sorting(nullptr, nullptr), 1);
    list->SetSortKey(1); // keeps its mode
    EXPECT_EQ(both(), "c1 b1 b2 a1 a2 ");
    const Mode modes5[] = {Mode::Ascending, Mode::Ascending, Mode::None, Mode::Ascending, Mode::Descending};
    list->SetSorting(5, Order{1, 0, 1, 9, 2}.data(), modes5);
    EXPECT_EQ(both(), "a2 a1 b2 b1 c1 ");
    list->SetSortKey(-1);
    EXPECT_EQ(list->PrimarySortKey(), -1);
    EXPECT_EQ(both(), "a2 a1 b2 b1 c1 ");
}

TEST_F(List, BorrowsItsRows) {
    AddPlainColumns();
    TextRow* a = NewRow({"", "a", ""});
    TextRow* b = NewRow({"", "b", ""});
    BList both;
    both.AddItem(static_cast<BListItem*>(b));
    both.AddItem(static_cast<BListItem*>(a));
    EXPECT_TRUE(list->AddList(&both));
    EXPECT_FALSE(list->AddList(&both) || list->AddItem(a) || list->AddItem(nullptr) ||
                 list->AddItem(NewRow({}), 3));
    BListView other({0, 0, 9, 9}, "other");
    TextRow* elsewhere = NewRow({});
    EXPECT_TRUE(other.AddItem(elsewhere));
    EXPECT_FALSE(list->AddItem(elsewhere));
    EXPECT_EQ(elsewhere->List(), nullptr);
    EXPECT_EQ(Shown(), "ba");
    EXPECT_EQ(list->FullListIndexOf(a), 1);
    EXPECT_TRUE(list->RemoveItem(b));
    EXPECT_FALSE(list->RemoveItem(b) || list->RemoveItems(0, 2));
    EXPECT_TRUE(list->AddItem(b, 0));
    EXPECT_EQ(list->RemoveItem(1), a);
    EXPECT_EQ(list->RemoveItem(1), nullptr);
    list->MakeEmpty();
    EXPECT_EQ(b->List(), nullptr);
    EXPECT_TRUE(list->FullListIsEmpty());
    EXPECT_TRUE(list->AddList(&both, 0));
    rows.erase(rows.begin()); // a row that dies leaves its list
    EXPECT_EQ(Shown(), "b");
}

TEST_F(Outline, TellsRowsOfWidthsOnlyWhenAsked) {
    list->AddColumn(new CLVColumn(nullptr, 20, CLVF_EXPANDER));
    list->AddColumn(new CLVColumn("b", 30, CLVF_PASS_INDENT | CLVF_WIDTH_NOTICE));
    list->AddColumn(new CLVColumn("c", 30, CLVF_WIDTH_NOTICE));
    list->AddColumn(new CLVColumn("d", 30));
    TextRow* top = NewRow({"t"}, 0, true, false);
    TextRow* below = NewRow({"b"}, 1);
    list->AddItem(top);
    list->AddUnder(below, top);
    list->ColumnAt(3)->SetWidth(50);
    EXPECT_TRUE(top->widths.empty() && top->frames.empty());
    list->ColumnAt(2)->SetWidth(50);
    EXPECT_EQ(top->widths, (std::vector<std::pair<int32, float>>{{2, 50}}));
    EXPECT_EQ(below->widths, (std::vector<std::pair<int32, float>>{{2, 30}})); // 20 are cut off
    list->ColumnAt(1)->SetWidth(40);
    ASSERT_EQ(top->frames.size(), 1U);
    EXPECT_EQ(top->frames[0].first, 2);
    EXPECT_EQ(top->frames[0].second.left, 62);
    EXPECT_TRUE(below->frames.empty()); // out of sight
}

TEST_F(Outline, ShowsWhatIsExpanded) {
    list->AddColumn(new CLVColumn(nullptr, 20, CLVF_EXPANDER));
    const std::unique_ptr<CLVColumn> second(new CLVColumn(nullptr, 20, CLVF_EXPANDER));
    EXPECT_FALSE(list->AddColumn(second.get()));
    TextRow* a = NewRow({"a"}, 0, true);
    TextRow* b = NewRow({"b"}, 0, true, false);
    TextRow* c = NewRow({"c"}, 5, false, false);
    TextRow* d = NewRow({"d"});
    EXPECT_TRUE(list->AddItem(a) && list->AddItem(b) && list->AddUnder(c, a) && list->AddUnder(d, c) &&
                list->AddUnder(NewRow({"e"}), a) && list->AddUnder(NewRow({"f"}), b));
    EXPECT_FALSE(list->AddUnder(d, a) || list->AddUnder(NewRow({"x"}), nullptr));
    EXPECT_EQ(FullList(), "acdebf");
    EXPECT_EQ(list->FullListItemAt(6), nullptr);
    EXPECT_EQ(Shown(0), "aceb");
    EXPECT_TRUE(c->IsSuperItem());
    EXPECT_EQ(d->OutlineLevel(), 2U);
    EXPECT_EQ(list->Superitem(d), c);
    EXPECT_EQ(list->Superitem(a), nullptr);

    list->Select(3);
    list->Expand(c);
    EXPECT_EQ(Shown(0), "acdeb");
    EXPECT_EQ(list->FullListCurrentSelection(), 4);
    list->Collapse(a);
    EXPECT_EQ(Shown(0), "ab");
    EXPECT_FALSE(list->IsExpanded(0));
    list->Collapse(c);
    list->Expand(b);
    list->Expand(a);
    EXPECT_EQ(Shown(0), "acebf");

    // A row put between takes over the rows behind it, as their levels say.
    EXPECT_TRUE(list->AddItem(NewRow({"g"}, 1, true, false), 2));
    EXPECT_EQ(FullList(), "acgdebf");
    EXPECT_EQ(Shown(0), "acgebf");
    list->Expand(static_cast<CLVListItem*>(list->FullListItemAt(2)));
    EXPECT_EQ(Shown(0), "acgdebf");
    EXPECT_TRUE(list->RemoveItem(a)); // with the rows below it
    EXPECT_EQ(FullList(), "bf");
    EXPECT_EQ(Shown(0), "bf");
    EXPECT_EQ(list->FullListIndexOf(d), -1);
    EXPECT_EQ(list->FullListIndexOf(b), 0);
}

TEST_F(Outline, SortsLevelsAndKeepsTheSelection) {
    list->AddColumn(new CLVColumn("x", 20, CLVF_SORTABLE));
    BList all;
    for (const auto& [text, level] : std::initializer_list<std::pair<const char*, uint32>>{
             {"m", 0}, {"z", 1}, {"y", 1}, {"c", 0}, {"k", 1}})
        all.AddItem(static_cast<BListItem*>(NewRow({text}, level, level == 0, text[0] == 'm')));
    EXPECT_TRUE(list->AddList(&all));
    list->Select(1);
    list->SetSortKey(0);
    EXPECT_EQ(FullList(), "ckmyz");
    EXPECT_EQ(Shown(0), "cmyz");
    EXPECT_EQ(list->CurrentSelection(), 3);
    EXPECT_EQ(list->FullListCurrentSelection(), 4);
    list->SetSortMode(0, Mode::Descending);
    EXPECT_EQ(Shown(0), "mzyc");
    list->RemoveItems(0, 1);
    EXPECT_EQ(FullList(), "ck");
    list->MakeEmpty();
    EXPECT_EQ(list->CountItems() + list->FullListCountItems(), 0);
}

} // namespace
