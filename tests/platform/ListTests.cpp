// List views: rows, selection, keys, pointer, scrolling and drawing, against a plain model of what a list is.
#include <algorithm>
#include <cmath>
#include <deque>

#include <QAccessible>
#include <QListView>
#include <QScrollBar>

#include "Stage.h"
#include "platform/ListView.h"
#include "platform/ScrollView.h"

namespace {

constexpr uint32 Invoked = 77;

struct Row : BListItem {
    explicit Row(int32 n, float l = 20) : number(n), least(l) {}

    void DrawItem(BView* owner, BRect rect, bool) override {
        where = rect;
        owner->SetLowColor(IsSelected() ? rgb_color{178, 178, 178} : rgb_color{255, 255, 255});
        owner->FillRectLow(rect);
    }
    void Update(BView* owner, const BFont* font) override {
        BListItem::Update(owner, font);
        SetHeight(std::max(Height(), least));
    }
    std::string AccessibleText() const override { return "row " + std::to_string(number); }

    int32 number;
    BRect where;
    float least;
};

struct List : BListView {
    explicit List(list_view_type type) : BListView(BRect(10, 10, 209, 109), "list", type) {
        SetInvocationMessage(new BMessage(Invoked));
    }
    void ScrollTo(BPoint where) override {
        scrolls.push_back(where);
        BListView::ScrollTo(where);
    }
    void FrameResized(float width, float height) override { size = BPoint(width, height); }
    void MouseDown(BPoint where) override {
        if (!swallow)
            BListView::MouseDown(where);
    }

    std::vector<BPoint> scrolls;
    BPoint size;
    bool swallow = false; // keeps the presses to itself
};

// A list of 20-pixel rows in a scroll view, ready to be worked.
struct ListStage : Stage {
    explicit ListStage(int32 count, list_view_type type = B_MULTIPLE_SELECTION_LIST) : list(new List(type)) {
        Add(new BScrollView("scroll", list, B_FOLLOW_LEFT | B_FOLLOW_TOP, 0, true, true, B_NO_BORDER));
        BList added;
        for (int32 number = 0; number < count; ++number)
            added.AddItem(static_cast<BListItem*>(&rows.emplace_back(number)));
        EXPECT_TRUE(list->AddList(&added));
        list->MakeFocus();
        Show();
    }

    static QListView* Widget() { return Find<QListView>("list"); }
    QPoint PlaceOf(int32 index) const {
        return {5, static_cast<int>(list->ItemFrame(index).top + 10 - list->Bounds().top)};
    }
    void Click(int32 index, Qt::KeyboardModifiers keys = {}) const {
        QTest::mouseClick(Widget()->viewport(), Qt::LeftButton, keys, PlaceOf(index));
    }
    void DoubleClick(int32 index) const {
        Click(index);
        QTest::mouseDClick(Widget()->viewport(), Qt::LeftButton, {}, PlaceOf(index));
    }
    static void Key(Qt::Key key, Qt::KeyboardModifiers keys = {}) { QTest::keyClick(Widget(), key, keys); }
    std::vector<int32> Selected() const {
        std::vector<int32> found;
        for (int32 at = 0; list->CurrentSelection(at) >= 0; ++at)
            found.push_back(list->CurrentSelection(at));
        return found;
    }
    std::string Held() const {
        std::string held;
        for (int32 i = 0; i < list->CountItems(); ++i) {
            EXPECT_EQ(list->IndexOf(list->ItemAt(i)), i);
            held += ' ' + std::to_string(static_cast<Row*>(list->ItemAt(i))->number) +
                    (list->IsItemSelected(i) ? "*" : "");
        }
        return held;
    }

    List* list;
    std::deque<Row> rows;
};

using Indexes = std::vector<int32>;

} // namespace

TEST(Lists, HoldTheirRowsAndSelectionThroughAnyChange) {
    ListStage stage(6);
    List& list = *stage.list;
    Row extra(9);
    BList some;
    some.AddItem(static_cast<BListItem*>(&extra));
    some.AddItem(static_cast<BListItem*>(list.ItemAt(1)));
    const auto byRest = [](const BListItem* a, const BListItem* b) { // 0 to 2, again and again
        return static_cast<const Row*>(a)->number % 3 - static_cast<const Row*>(b)->number % 3;
    };
    const std::pair<std::function<void()>, const char*> steps[] = {
        {[&] { list.Select(4); }, " 0 1 2 3 4* 5"},
        {[&] { list.Select(1, true); }, " 0 1* 2 3 4* 5"},
        {[&] { EXPECT_FALSE(list.AddList(&some)); }, " 0 1* 2 3 4* 5"}, // one is in the list: none is added
        {[&] { EXPECT_FALSE(list.AddItem(&extra, 7) || list.RemoveItems(1, 6)); }, " 0 1* 2 3 4* 5"},
        {[&] { EXPECT_TRUE(list.AddItem(&extra, 2)); }, " 0 1* 9 2 3 4* 5"},
        {[&] { list.AddItem(std::make_unique<Row>(10).get()); }, " 0 1* 9 2 3 4* 5"}, // leaves as it goes
        {[&] { list.RemoveItem(&stage.rows[0]); }, " 1* 9 2 3 4* 5"},
        {[&] { list.SortItems(byRest); }, " 9 3 1* 4* 2 5"},
        {[&] { list.AddItem(&stage.rows[0], 6); }, " 9 3 1* 4* 2 5 0"},
        {[&] { list.Select(0, true); }, " 9* 3 1* 4* 2 5 0"},
        {[&] { list.RemoveSelected(); }, " 3 2 5 0"},
        {[&] { list.RemoveItem(list.CurrentSelection()); }, " 3 2 5 0"},
        {[&] { list.Select(1); }, " 3 2* 5 0"},
        {[&] { list.RemoveItems(0, 1); }, " 2* 5 0"},
    };
    for (const auto& [step, held] : steps) {
        step();
        EXPECT_EQ(stage.Held(), held);
        EXPECT_EQ(stage.Selected().size(), std::ranges::count(std::string(held), '*')) << held;
    }
    EXPECT_EQ(list.IndexOf(&extra), -1);
}

TEST(Lists, AreWorkedWithKeysAndPointer) {
    ListStage stage(100);
    List& list = *stage.list;
    const auto descending = [](const BListItem* a, const BListItem* b) {
        return static_cast<const Row*>(b)->number - static_cast<const Row*>(a)->number;
    };
    // What is selected then, and how many invocations came.
    const std::tuple<std::function<void()>, Indexes, std::size_t> steps[] = {
        {[&] { stage.DoubleClick(2); }, {2}, 1},
        {[&] { stage.Click(4, Qt::ControlModifier); }, {2, 4}, 0},
        {[&] { stage.Key(Qt::Key_End); }, {99}, 0},
        {[&] { EXPECT_EQ(list.Bounds().bottom, list.ItemFrame(99).bottom); }, {99}, 0},
        {[&] { QTest::keyClicks(stage.Widget(), "row 42"); }, {42}, 0},
        {[&] { EXPECT_TRUE(list.Bounds().Contains(list.ItemFrame(42).LeftTop())); }, {42}, 0},
        {[&] { stage.Key(Qt::Key_Return); }, {42}, 1},
        {[&] { stage.Key(Qt::Key_Enter, Qt::KeypadModifier); }, {42}, 1},
        {[&] { list.swallow = true; }, {42}, 0},
        {[&] { stage.DoubleClick(43); }, {42}, 0},
        {[&] { list.DeselectAll(); }, {}, 0},
        {[&] { stage.Key(Qt::Key_Return); }, {42}, 1}, // the row with the keyboard's mark
        // The current row stays the current one while others come and go and the order changes.
        {[&] { list.RemoveItems(0, 10); }, {32}, 0},
        {[&] { list.SortItems(descending); }, {57}, 0},
        {[&] { stage.Key(Qt::Key_Down); }, {58}, 0},
        {[&] { list.RemoveItem(58); }, {}, 0},
        {[&] { stage.Key(Qt::Key_Up); }, {57}, 0},
    };
    for (int number = 0; const auto& [step, selected, invocations] : steps) {
        SCOPED_TRACE(number++);
        step();
        EXPECT_EQ(stage.Received(invocations), Codes(invocations, Invoked));
        EXPECT_EQ(stage.Selected(), selected);
    }
}

TEST(Lists, OfOneSelectionKeepToOneAndTellIt) {
    // Keys begin at an end as long as no row is chosen.
    for (const auto& [key, begin] : {std::pair{Qt::Key_Down, 0}, {Qt::Key_Home, 0}, {Qt::Key_End, 9}}) {
        const ListStage stage(10, B_SINGLE_SELECTION_LIST);
        EXPECT_EQ(stage.list->CurrentRow(), -1);
        stage.Key(key);
        EXPECT_EQ(stage.Selected(), Indexes{begin});
        stage.list->DeselectAll();
        stage.Key(begin == 0 ? Qt::Key_Home : Qt::Key_End);
        EXPECT_EQ(stage.Selected(), Indexes{begin});
        stage.Click(4, Qt::ControlModifier);
        stage.Key(Qt::Key_Up, Qt::ShiftModifier);
        EXPECT_EQ(stage.Selected(), Indexes{3});
        QAccessibleInterface* list = QAccessible::queryAccessibleInterface(stage.Widget());
        ASSERT_TRUE(list && list->childCount() == 10);
        EXPECT_EQ(list->text(QAccessible::Name), "list");
        EXPECT_EQ(list->child(3)->text(QAccessible::Name), "row 3");
    }
}

TEST(Lists, ScrollByWhateverMeansAndTellOnce) {
    ListStage stage(100);
    List& list = *stage.list;
    list.SetDataWidth(500);
    QScrollBar* across = stage.Widget()->horizontalScrollBar();
    const BRect seen = list.Bounds();
    EXPECT_EQ(across->maximum(), 500 - (seen.Width() + 1));
    EXPECT_EQ(list.size, BPoint(seen.Width(), seen.Height()));

    list.scrolls.clear();
    across->setValue(30);
    list.ScrollTo(BPoint(40, 50));
    stage.Widget()->verticalScrollBar()->setValue(70);
    stage.Key(Qt::Key_Left);
    const float left = list.Bounds().left;
    EXPECT_LT(left, 40);
    EXPECT_EQ(list.scrolls, (std::vector<BPoint>{{30, 0}, {40, 50}, {40, 70}, {left, 70}}));
    EXPECT_EQ(list.IndexOf(BPoint(450, 70 + 15)), 4);
    EXPECT_EQ(list.IndexOf(BPoint(0, 5000)), -1);
    EXPECT_EQ(list.ItemFrame(4), BRect(0, 80, 499, 99));
    list.SetDataWidth(50);
    EXPECT_EQ(list.Bounds().left, 0);
    EXPECT_GT(list.Bounds().Height(), seen.Height()); // the bar is gone
}

TEST(Lists, DrawRowsWhereTheyLieWhateverTheirHeight) {
    ListStage stage(1000);
    List& list = *stage.list;
    list.SetViewColor({1, 2, 3, 255});
    list.SetDataWidth(500);
    list.ScrollTo(BPoint(250, 10));
    list.Select(2);
    const auto color = [&](int y) { return stage.Widget()->viewport()->grab().toImage().pixel(20, y); };
    EXPECT_EQ(color(15), qRgb(255, 255, 255));
    EXPECT_EQ(color(40), qRgb(178, 178, 178));
    EXPECT_EQ(stage.rows[1].where, BRect(0, 20, 499, 39));
    list.RemoveItems(1, 999);
    EXPECT_EQ(color(60), qRgb(1, 2, 3));

    // Rows of different heights, asked for before the list has scrolled to what is left.
    Row tall(3, 50.5F);
    list.AddItem(&tall);
    list.AddItem(&stage.rows[1]);
    EXPECT_EQ(list.ItemFrame(1).top, 20);
    EXPECT_EQ(list.ItemFrame(2).top, 71);
    EXPECT_EQ(list.IndexOf(BPoint(5, 70)), 1);
    BFont big;
    big.SetSize(40);
    list.SetFont(&big);
    EXPECT_GT(stage.rows[0].Height(), 40);
    EXPECT_EQ(list.ItemFrame(1).top, stage.rows[0].Height());
}
