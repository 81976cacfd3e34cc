// List views: rows, selection, keys, pointer, scrolling and drawing, against a plain model of what a list is.
#include <algorithm>
#include <cmath>
#include <functional>
#include <memory>

#include <QAccessible>
#include <QImage>
#include <QListView>
#include <QScrollBar>

#include "Stage.h"
#include "platform/ListView.h"
#include "platform/ScrollView.h"

namespace {

constexpr uint32 kInvoked = 77;

class Row : public BListItem {
  public:
    explicit Row(int32 n, float least = 20) : number(n), least_(least) {}

    void DrawItem(BView* owner, BRect rect, bool) override {
        drawn++;
        where = rect;
        owner->SetLowColor(IsSelected() ? rgb_color{178, 178, 178, 255} : rgb_color{255, 255, 255, 255});
        owner->FillRectLow(rect);
        owner->SetHighColor(255, 0, 0);
        owner->FillRect(BRect(rect.left + 300, rect.top + 2, rect.left + 309, rect.top + 11));
    }
    void Update(BView* owner, const BFont* font) override {
        BListItem::Update(owner, font);
        SetHeight(std::max(Height(), least_));
    }
    std::string AccessibleText() const override { return "row " + std::to_string(number); }

    int32 number;
    int drawn = 0;
    BRect where;

  private:
    float least_;
};

class List : public BListView {
  public:
    explicit List(list_view_type type = B_MULTIPLE_SELECTION_LIST)
        : BListView(BRect(10, 10, 209, 109), "list", type) {
        SetInvocationMessage(new BMessage(kInvoked));
    }
    void SelectionChanged() override { selectionChanges++; }
    void ScrollTo(BPoint where) override {
        scrolls.push_back(where);
        BListView::ScrollTo(where);
    }
    void FrameResized(float width, float height) override { size = BPoint(width, height); }
    void MouseDown(BPoint where) override {
        Window()->CurrentMessage()->FindInt32("clicks", &clicks);
        if (!swallow)
            BListView::MouseDown(where);
    }

    int selectionChanges = 0;
    std::vector<BPoint> scrolls;
    BPoint size;
    int32 clicks = 0;
    bool swallow = false;
};

// A list of 20-pixel rows in a scroll view, ready to be worked.
struct ListStage : Stage {
    explicit ListStage(int32 count, list_view_type type = B_MULTIPLE_SELECTION_LIST) : list(new List(type)) {
        Add(new BScrollView("scroll", list, B_FOLLOW_LEFT | B_FOLLOW_TOP, 0, true, true, B_NO_BORDER));
        BList added;
        for (int32 number = 0; number < count; number++) {
            rows.push_back(std::make_unique<Row>(number));
            added.AddItem(rows.back().get());
        }
        EXPECT_TRUE(list->AddList(&added));
        list->MakeFocus();
    }
    ~ListStage() { list->MakeEmpty(); }

    QListView* Widget() const { return Find<QListView>("list"); }
    QPoint PlaceOf(int32 index) const {
        const BRect frame = list->ItemFrame(index);
        const BPoint origin = list->Bounds().LeftTop();
        return {5, static_cast<int>((frame.top + frame.bottom) / 2 - origin.y)};
    }
    void Click(int32 index, Qt::KeyboardModifiers keys = {}) {
        QTest::mouseClick(Widget()->viewport(), Qt::LeftButton, keys, PlaceOf(index));
    }
    void Key(Qt::Key key, Qt::KeyboardModifiers keys = {}) { QTest::keyClick(Widget(), key, keys); }
    std::vector<int32> Selected() const {
        std::vector<int32> found;
        for (int32 at = 0; list->CurrentSelection(at) >= 0; at++)
            found.push_back(list->CurrentSelection(at));
        return found;
    }

    List* list;
    std::vector<std::unique_ptr<Row>> rows;
};

using Indexes = std::vector<int32>;

} // namespace

TEST(Lists, HoldTheirRowsAndSelectionThroughAnyChange) {
    ListStage stage(6);
    stage.Show();
    List& list = *stage.list;
    Row extra(9);
    const auto byRest = [](const BListItem* a, const BListItem* b) { // 0 to 2, again and again
        return static_cast<const Row*>(a)->number % 3 - static_cast<const Row*>(b)->number % 3;
    };
    const std::pair<std::function<void()>, const char*> steps[] = {
        {[&] { list.Select(4); }, " 0 1 2 3 4* 5"},
        {[&] { list.Select(1, true); }, " 0 1* 2 3 4* 5"},
        {[&] { list.AddItem(&extra, 2); }, " 0 1* 9 2 3 4* 5"},
        {[&] { list.RemoveItem(stage.rows[0].get()); }, " 1* 9 2 3 4* 5"},
        {[&] { list.SortItems(byRest); }, " 9 3 1* 4* 2 5"},
        {[&] { list.AddItem(stage.rows[0].get(), 6); }, " 9 3 1* 4* 2 5 0"},
        {[&] { list.Deselect(2); }, " 9 3 1 4* 2 5 0"},
        {[&] { list.Select(0, true); }, " 9* 3 1 4* 2 5 0"},
        {[&] { list.RemoveSelected(); }, " 3 1 2 5 0"},
        {[&] { list.RemoveItem(list.CurrentSelection()); }, " 3 1 2 5 0"},
        {[&] { list.Select(2); }, " 3 1 2* 5 0"},
        {[&] { list.RemoveItems(0, 2); }, " 2* 5 0"},
    };
    for (const auto& [step, expected] : steps) {
        step();
        std::string held;
        for (int32 i = 0; i < list.CountItems(); ++i) {
            EXPECT_EQ(list.IndexOf(list.ItemAt(i)), i) << expected;
            held += ' ' + std::to_string(static_cast<Row*>(list.ItemAt(i))->number) +
                    (list.IsItemSelected(i) ? "*" : "");
        }
        EXPECT_EQ(held, expected);
        EXPECT_EQ(stage.Selected().size(), std::ranges::count(held, '*')) << expected;
    }
    EXPECT_EQ(list.IndexOf(&extra), -1);
}

TEST(Lists, RefuseWhatIsNotTheirs) {
    ListStage stage(3);
    Row extra(9);
    BList some;
    some.AddItem(&extra);
    some.AddItem(stage.rows[1].get());
    EXPECT_FALSE(stage.list->AddList(&some)); // one of them is in the list: none is added
    EXPECT_FALSE(stage.list->AddItem(&extra, 4));
    EXPECT_FALSE(stage.list->RemoveItems(1, 3));
    EXPECT_EQ(stage.list->CountItems(), 3);
    EXPECT_TRUE(stage.list->AddItem(&extra, 3));
    {
        Row passing(10);
        EXPECT_TRUE(stage.list->AddItem(&passing, 0));
    } // a row that goes leaves its list
    EXPECT_EQ(stage.list->ItemAt(0), stage.rows[0].get());
    EXPECT_TRUE(stage.list->RemoveItems(1, 3));
    EXPECT_EQ(stage.list->CountItems(), 1);
    EXPECT_FALSE(stage.list->IsItemSelected(-1));
}

TEST(Lists, AreWorkedWithKeysAndPointer) {
    ListStage stage(100);
    stage.Show();
    stage.Click(2);
    EXPECT_EQ(stage.list->clicks, 1);
    EXPECT_EQ(stage.list->selectionChanges, 1);
    stage.Click(4, Qt::ControlModifier);
    EXPECT_EQ(stage.Selected(), (Indexes{2, 4}));
    stage.Click(1, Qt::ShiftModifier);
    EXPECT_EQ(stage.Selected(), (Indexes{1, 2, 3, 4}));
    stage.Key(Qt::Key_Down);
    EXPECT_EQ(stage.Selected(), Indexes{2});
    stage.Key(Qt::Key_End);
    EXPECT_EQ(stage.Selected(), Indexes{99});
    EXPECT_EQ(stage.list->Bounds().bottom, stage.list->ItemFrame(99).bottom);
    QTest::keyClicks(stage.Widget(), "row 42");
    EXPECT_EQ(stage.Selected(), Indexes{42});
    EXPECT_TRUE(stage.list->Bounds().Contains(stage.list->ItemFrame(42).LeftTop()));

    // The current row stays the current one while others come and go and the order changes.
    stage.list->RemoveItems(0, 10);
    stage.list->SortItems([](const BListItem* a, const BListItem* b) {
        return static_cast<const Row*>(b)->number - static_cast<const Row*>(a)->number;
    });
    EXPECT_EQ(stage.Selected(), Indexes{99 - 42});
    stage.Key(Qt::Key_Down);
    EXPECT_EQ(stage.Selected(), Indexes{99 - 41});
    stage.list->RemoveItem(99 - 41);
    EXPECT_EQ(stage.Selected(), Indexes{});
    stage.Key(Qt::Key_Up);
    EXPECT_EQ(stage.Selected(), Indexes{99 - 42});
}

TEST(Lists, KeysBeginAtAnEndUntilARowIsChosen) {
    for (const auto& [key, selected] : {std::pair{Qt::Key_Down, 0}, {Qt::Key_Home, 0}, {Qt::Key_End, 9}}) {
        ListStage stage(10);
        stage.Show();
        EXPECT_EQ(stage.list->CurrentRow(), -1);
        stage.Key(key);
        EXPECT_EQ(stage.Selected(), Indexes{selected});
        stage.list->DeselectAll();
        stage.Key(selected == 0 ? Qt::Key_Home : Qt::Key_End);
        EXPECT_EQ(stage.Selected(), Indexes{selected});
    }
}

TEST(Lists, OfOneSelectionKeepToOneAndTellIt) {
    ListStage stage(10, B_SINGLE_SELECTION_LIST);
    stage.Show();
    stage.Click(2);
    stage.Click(4, Qt::ControlModifier);
    EXPECT_EQ(stage.Selected(), Indexes{4});
    stage.Key(Qt::Key_Up, Qt::ShiftModifier);
    EXPECT_EQ(stage.Selected(), Indexes{3});
    QAccessibleInterface* list = QAccessible::queryAccessibleInterface(stage.Widget());
    ASSERT_TRUE(list);
    EXPECT_EQ(list->role(), QAccessible::List);
    EXPECT_EQ(list->text(QAccessible::Name), "list");
    ASSERT_EQ(list->childCount(), 10);
    EXPECT_EQ(list->child(3)->text(QAccessible::Name), "row 3");
    EXPECT_TRUE(list->child(3)->state().selected && !list->child(2)->state().selected);
}

TEST(Lists, InvokeOnceForADoubleClickOrEnter) {
    ListStage stage(10);
    stage.Show();
    const auto doubleClick = [&](int32 index) {
        stage.Click(index);
        QTest::mouseDClick(stage.Widget()->viewport(), Qt::LeftButton, {}, stage.PlaceOf(index));
    };
    doubleClick(1);
    EXPECT_EQ(stage.list->clicks, 2);
    EXPECT_EQ(stage.Received(1), Codes{kInvoked});
    EXPECT_EQ(stage.Selected(), Indexes{1});
    stage.Key(Qt::Key_Return);
    stage.Key(Qt::Key_Enter, Qt::KeypadModifier);
    EXPECT_EQ(stage.Received(2), (Codes{kInvoked, kInvoked}));
    stage.list->swallow = true; // an override that keeps the presses to itself
    doubleClick(3);
    EXPECT_EQ(stage.Selected(), Indexes{1});
    stage.list->swallow = false;
    stage.list->DeselectAll();
    stage.Key(Qt::Key_Return); // the row with the keyboard's mark
    EXPECT_EQ(stage.Received(1), Codes{kInvoked});
    EXPECT_EQ(stage.Selected(), Indexes{1});
}

TEST(Lists, ScrollByWhateverMeansAndTellOnce) {
    ListStage stage(100);
    stage.list->SetDataWidth(500);
    stage.Show();
    auto* scroll = static_cast<BScrollView*>(stage.list->Parent());
    QScrollBar* across = stage.Widget()->horizontalScrollBar();
    QScrollBar* down = stage.Widget()->verticalScrollBar();
    const BRect seen = stage.list->Bounds();
    EXPECT_LT(seen.Width(), scroll->Bounds().Width());
    EXPECT_EQ(across->maximum(), 500 - (seen.Width() + 1));
    EXPECT_EQ(down->maximum(), 100 * 20 - (seen.Height() + 1));
    EXPECT_EQ(stage.list->size, BPoint(seen.Width(), seen.Height()));

    stage.list->scrolls.clear();
    across->setValue(30);
    stage.list->ScrollTo(BPoint(40, 50));
    down->setValue(70);
    stage.Key(Qt::Key_Left);
    const float left = stage.list->Bounds().left;
    EXPECT_LT(left, 40);
    EXPECT_EQ(stage.list->scrolls, (std::vector<BPoint>{{30, 0}, {40, 50}, {40, 70}, {left, 70}}));
    EXPECT_EQ(stage.list->IndexOf(BPoint(450, 70 + 15)), 4);
    EXPECT_EQ(stage.list->IndexOf(BPoint(0, 5000)), -1);
    EXPECT_EQ(stage.list->ItemFrame(4), BRect(0, 80, 499, 99));
    stage.list->SetDataWidth(50);
    EXPECT_EQ(stage.list->Bounds().left, 0);
    EXPECT_GT(stage.list->Bounds().Height(), seen.Height()); // the bar is gone
    stage.list->MakeEmpty();
    QTest::qWait(0);
    EXPECT_EQ(stage.list->Bounds().Width(), scroll->Bounds().Width());
}

TEST(Lists, DrawVisibleRowsWhereTheyLie) {
    ListStage stage(1000);
    stage.list->SetViewColor({1, 2, 3, 255});
    stage.list->SetDataWidth(500);
    stage.Show();
    stage.list->ScrollTo(BPoint(250, 10));
    for (const auto& row : stage.rows)
        row->drawn = 0;
    stage.list->Select(2);
    const QImage picture = stage.Widget()->viewport()->grab().toImage();
    EXPECT_EQ(
        std::count_if(stage.rows.begin(), stage.rows.end(), [](const auto& row) { return row->drawn > 0; }),
        std::ceil((stage.list->Bounds().Height() + 1 + 10) / 20));
    EXPECT_EQ(stage.rows[1]->where, BRect(0, 20, 499, 39));
    const auto color = [&](int x, int y) { return QColor(picture.pixel(x, y)); };
    EXPECT_EQ(color(300 + 5 - 250, 20 + 5 - 10), QColor(255, 0, 0));
    EXPECT_EQ(color(20, 20 + 5 - 10), QColor(255, 255, 255));
    EXPECT_EQ(color(20, 40 + 10 - 10), QColor(178, 178, 178));
    stage.list->RemoveItems(1, 999);
    EXPECT_EQ(QColor(stage.Widget()->viewport()->grab().toImage().pixel(20, 60)), QColor(1, 2, 3));
}

TEST(Lists, LayOutRowsOfDifferentHeightsAndFollowTheFont) {
    ListStage stage(3);
    Row tall(3, 50.5F);
    stage.list->AddItem(&tall, 1);
    stage.Show();
    EXPECT_EQ(stage.list->ItemFrame(1).top, 20);
    EXPECT_EQ(stage.list->ItemFrame(2).top, 71);
    EXPECT_EQ(stage.list->IndexOf(BPoint(5, 70)), 1);
    BFont big;
    big.SetSize(40);
    stage.list->SetFont(&big);
    EXPECT_GT(stage.rows[0]->Height(), 40);
    EXPECT_EQ(stage.list->ItemFrame(1).top, stage.rows[0]->Height());
    stage.list->RemoveItem(&tall);
}
