#include "ColumnListView/ListFixture.h"

namespace {

template <class Item>
BList ListOf(const std::vector<Item*>& items) {
    BList list;
    for (Item* item : items)
        list.AddItem(item);
    return list;
}

class List : public testing::Test, protected ListFixture {};

class Outline : public testing::Test, protected ListFixture {
  protected:
    Outline() : ListFixture(true) {}
};

TEST_F(List, OwnsItsColumnsAndKeepsThemInOrder) {
    auto* a = new CLVColumn("a", 30);
    auto* b = new CLVColumn("b", 30);
    auto* c = new CLVColumn("c", 30);
    auto* last = new CLVColumn("l", 10, CLVF_KEEP_LAST);
    BList both = ListOf<CLVColumn>({a, last});
    EXPECT_TRUE(list->AddColumnList(&both) && list->AddColumn(b));
    CLVColumn* first = NewColumn("f", 10, CLVF_KEEP_FIRST);
    EXPECT_EQ(list->DisplayOrder(), (Order{3, 0, 2, 1}));

    BList mixed = ListOf<CLVColumn>({c, a});
    CLVColumn expander(nullptr, 20, CLVF_EXPANDER);
    EXPECT_FALSE(list->AddColumnList(&mixed) || list->AddColumn(a) || list->AddColumn(nullptr) ||
                 list->AddColumn(&expander));
    EXPECT_TRUE(list->AddColumn(c)); // its refusal left no trace
    EXPECT_TRUE(list->SetDisplayOrder(Order{1, 4, 2, 3, 0}.data()));
    for (const Order& bad : {Order{0, 1, 2, 3, 3}, Order{0, 1, 2, 3, 5}, Order{-1, 0, 1, 2, 3}})
        EXPECT_FALSE(list->SetDisplayOrder(bad.data()));
    EXPECT_EQ(list->DisplayOrder(), (Order{3, 4, 2, 0, 1}));

    EXPECT_FALSE(list->RemoveColumns(c, 2));
    EXPECT_TRUE(list->RemoveColumns(last, 3)); // last, b and first
    EXPECT_EQ(list->DisplayOrder(), (Order{1, 0}));
    for (const CLVColumn* mine : {last, b, first})
        delete mine;
}

TEST_F(List, SortsByItsKeys) {
    AddPlainColumns();
    for (const char* texts : {"-b1", "-a2", "-c1", "-a1", "-b2"})
        EXPECT_TRUE(list->AddItem(NewRow(texts)));
    const Order columns{1, 0, 1, 9, 2};
    const Mode modes[] = {Mode::Ascending, Mode::Ascending, Mode::None, Mode::Ascending, Mode::Descending};
    const std::tuple<std::function<void()>, const char*, int> steps[] = {
        {[&] { list->SetSortKey(0); }, "bacab 12112 ", 0}, // not sortable
        {[&] { list->SetSortKey(7); }, "bacab 12112 ", 0},
        {[&] { list->SetSortKey(2); }, "bcaab 11122 2+", 1},
        {[&] { list->AddSortKey(1); }, "abcab 11122 2+1+", 2},
        {[&] { list->AddSortKey(1); }, "abcab 11122 2+1+", 2},
        {[&] { list->SetSortMode(1, Mode::Descending); }, "cbaba 11122 2+1-", 3},
        {[&] { list->SetSortMode(1, Mode::Descending); }, "cbaba 11122 2+1-", 3},
        {[&] { list->ReverseSortMode(1); }, "cbaba 11122 2+", 4},               // none: no key any more
        {[&] { list->SetSortMode(1, Mode::Descending); }, "cbaba 11122 2+", 5}, // nor one now
        {[&] { list->SetSortKey(1); }, "cbbaa 11212 1-", 6},                    // keeps its mode
        {[&] { list->SetSorting(5, columns.data(), modes); }, "aabbc 21211 1+2-", 7},
        {[&] { list->SetSortKey(-1); }, "aabbc 21211 ", 8}};
    for (const auto& [change, shown, sortings] : steps) {
        change();
        EXPECT_EQ(Shown(1) + " " + Shown(2) + " " + Keys(), shown);
        EXPECT_EQ(list->sortings, sortings) << shown;
    }
}

TEST_F(List, BorrowsItsRows) {
    AddPlainColumns();
    TextRow* a = NewRow("-a");
    TextRow* b = NewRow("-b");
    BList both = ListOf<BListItem>({b, a});
    EXPECT_TRUE(list->AddList(&both));
    BListView other({0, 0, 9, 9}, "other");
    TextRow* elsewhere = NewRow("");
    EXPECT_TRUE(other.AddItem(elsewhere));
    EXPECT_FALSE(list->AddList(&both) || list->AddItem(a) || list->AddItem(nullptr) ||
                 list->AddItem(NewRow(""), 3) || list->AddItem(elsewhere));
    EXPECT_EQ(elsewhere->List(), nullptr);
    EXPECT_EQ(list->FullListIndexOf(a), 1);
    EXPECT_TRUE(list->RemoveItem(b) && list->AddItem(b, 0));
    EXPECT_EQ(list->RemoveItem(1), a);
    EXPECT_FALSE(list->RemoveItem(a) || list->RemoveItem(1) || list->RemoveItems(0, 2));
    list->MakeEmpty();
    EXPECT_TRUE(list->FullListIsEmpty() && list->AddList(&both, 0));
    rows.erase(rows.begin()); // a row that dies leaves its list
    EXPECT_EQ(Shown(), "b");
    list->Select(0);
    list->RemoveSelected();
    EXPECT_TRUE(list->CountItems() == 0 && list->AddItem(b));
}

TEST_F(Outline, HidesColumnsAndTellsRowsOfWidthsWhenAsked) {
    NewColumn(nullptr, 20, CLVF_EXPANDER);
    NewColumn("b", 30, CLVF_PASS_INDENT | CLVF_WIDTH_NOTICE);
    NewColumn("c", 30, CLVF_WIDTH_NOTICE);
    NewColumn("d", 30);
    list->ColumnAt(1)->SetShown(false);
    list->ColumnAt(1)->SetWidth(100);
    EXPECT_EQ(list->ColumnAt(2)->Begin(), 21);
    list->ColumnAt(1)->SetShown(true);
    EXPECT_EQ(list->ColumnAt(2)->Begin(), 122);
    list->ColumnAt(1)->SetWidth(30);
    TextRow* top = NewRow("t", 0, true, false);
    TextRow* below = NewRow("b", 1);
    EXPECT_TRUE(list->AddItem(top) && list->AddUnder(below, top));
    for (const auto& [column, width] : {std::pair{3, 50.0F}, {2, 50.0F}, {1, 40.0F}})
        list->ColumnAt(column)->SetWidth(width);
    EXPECT_EQ(top->heard.str(), "2 has 50. 1 has 40. 2 is at 62. ");
    EXPECT_EQ(below->heard.str(), "2 has 30. 1 has 40. "); // 20 are cut off; out of sight
}

TEST_F(Outline, ShowsWhatIsExpanded) {
    NewColumn(nullptr, 20, CLVF_EXPANDER);
    CLVColumn second(nullptr, 20, CLVF_EXPANDER);
    EXPECT_FALSE(list->AddColumn(&second));
    TextRow* a = NewRow("a", 0, true);
    TextRow* b = NewRow("b", 0, true, false);
    TextRow* c = NewRow("c", 5, false, false);
    TextRow* d = NewRow("d");
    EXPECT_TRUE(list->AddItem(a) && list->AddItem(b) && list->AddUnder(c, a) && list->AddUnder(d, c) &&
                list->AddUnder(NewRow("e"), a) && list->AddUnder(NewRow("f"), b));
    EXPECT_FALSE(list->AddUnder(d, a) || list->AddUnder(NewRow("x"), nullptr));
    EXPECT_TRUE(c->IsSuperItem() && list->Superitem(d) == c && !list->Superitem(a));

    list->Select(3);
    list->Expand(c);
    EXPECT_EQ(list->FullListCurrentSelection(), 4);
    TextRow* g = NewRow("g", 1, true, false);
    const std::pair<std::function<void()>, const char*> steps[] = {
        {[&] { list->Collapse(c); }, "acdebf aceb"},
        {[&] { list->Expand(c); }, "acdebf acdeb"},
        {[&] { list->Collapse(a); }, "acdebf ab"},
        {[&] { list->Collapse(c); }, "acdebf ab"},
        {[&] { list->Expand(b); }, "acdebf abf"},
        {[&] { list->Expand(a); }, "acdebf acebf"},
        // A row put between takes over the rows behind it, as their levels say.
        {[&] { EXPECT_TRUE(list->AddItem(g, 2)); }, "acgdebf acgebf"},
        {[&] { list->Expand(g); }, "acgdebf acgdebf"},
        {[&] { EXPECT_TRUE(list->RemoveItem(a)); }, "bf bf"}}; // with the rows below it
    for (const auto& [change, all] : steps) {
        change();
        EXPECT_EQ(FullList() + " " + Shown(0), all);
    }
    EXPECT_EQ(list->FullListIndexOf(d), -1);
}

TEST_F(Outline, SortsLevelsAndKeepsTheSelection) {
    NewColumn("x", 20, CLVF_SORTABLE);
    // Each with its level, and whether what is below it is shown.
    for (const char* row : {"m0+", "z1-", "y1+", "q2+", "p2+", "c0-", "k1+", "c0+"})
        EXPECT_TRUE(list->AddItem(NewRow(row, static_cast<uint32>(row[1] - '0'), false, row[2] == '+')));
    list->Select(1);
    list->SetSortKey(0);
    EXPECT_EQ(FullList() + " " + Shown(0), "ckcmypqz ccmypqz");
    EXPECT_EQ(list->FullListItemAt(2), rows.back().get()); // equal ones stay as they are
    EXPECT_EQ(list->CurrentSelection(), 6);
    EXPECT_EQ(list->FullListCurrentSelection(), 7);
    list->SetSortMode(0, Mode::Descending);
    EXPECT_EQ(Shown(0), "mzyqpcc");
    list->Select(2);
    list->Select(5, true);
    list->RemoveSelected(); // and what is below
    EXPECT_EQ(FullList() + " " + Shown(0), "mzc mzc");
    list->MakeEmpty();
    EXPECT_EQ(list->CountItems() + list->FullListCountItems(), 0);
    // A row whose level leaves one out goes under what comes before it then.
    for (const auto& [text, level, expanded] : {std::tuple{"a", 0U, true}, {"b", 2, true}, {"c", 1, false}})
        EXPECT_TRUE(list->AddItem(NewRow(text, level, false, expanded)));
    list->SetSortMode(0, Mode::Ascending);
    EXPECT_EQ(Shown(0), "abc");
    list->SetSortMode(0, Mode::Descending);
    EXPECT_EQ(FullList() + " " + Shown(0), "acb ac");
    list->SetSortMode(0, Mode::Ascending);
    EXPECT_EQ(Shown(0), "ac"); // "b" is below "c" from then on
}

} // namespace
