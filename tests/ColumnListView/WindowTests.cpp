#include <filesystem>
#include <fstream>
#include <thread>
#include <unistd.h>

#include <QAccessible>
#include <QImage>
#include <QScrollArea>
#include <QScrollBar>

#include "ColumnListView/ListFixture.h"
#include "StepDriver.h"

namespace {

// The colours along a line of a picture: of the header Light, Shadow, Neutral, Blue and blacK, of the rows a,
// b and c in the columns and - behind them.
std::string Colors(const QImage& picture, int y) {
    constexpr QRgb known[] = {0xFFFFFFFF, 0xFF989898, 0xFFD8D8D8, 0xFF0000E5, 0xFF000000,
                              0xFFFF0000, 0xFF00A000, 0xFFC8C800, 0xFF00A0A0};
    return Runs(0, static_cast<float>(picture.width()), 1, [&](float x) {
        const auto* at = std::find(std::begin(known), std::end(known), picture.pixel(static_cast<int>(x), y));
        return std::string{"LSNBKabc-?"[at - known]};
    });
}

// How many threads this process has, save those that the toolkit makes for itself.
int CountThreads() {
    int count = 0;
    for (const auto& task : std::filesystem::directory_iterator("/proc/self/task")) {
        std::string name;
        std::getline(std::ifstream(task.path() / "comm"), name);
        count += name != "Thread (pooled)";
    }
    return count;
}

// The list of ListFixture on the stage, and a hand on its mouse.
struct ListWindow : ListFixture {
    using ListFixture::ListFixture;
    ~ListWindow() {
        if (window)
            window->Lock(); // for the rows, which leave the list
    }

    void ShowList() {
        Show();
        header = Find<QWidget>("column labels");
        view = Find<QAbstractScrollArea>("rows");
        ASSERT_TRUE(header && view && QTest::qWaitForWindowExposed(header->window()));
        // A sanitizer starts its own thread beside the first one, which is listed for a moment after its end.
        std::string first = "/proc/self/task/";
        std::thread([&] { first += std::to_string(gettid()); }).join();
        ASSERT_TRUE(QTest::qWaitFor([&] { return !std::filesystem::exists(first); }));
        threads = CountThreads();
    }

    void Press(int x) { QTest::mousePress(header, Qt::LeftButton, {}, {x, 8}); }
    // With the left button held, alone or when another one goes down.
    void Move(int x, QEvent::Type type = QEvent::MouseMove, Qt::MouseButton button = Qt::NoButton) {
        QMouseEvent event(type, QPointF(x, 8), header->mapToGlobal(QPointF(x, 8)), button,
                          Qt::LeftButton | button, {});
        QApplication::sendEvent(header, &event);
    }
    void Release(int x) { QTest::mouseRelease(header, Qt::LeftButton, {}, {x, 8}); }
    // Waits until all presses and releases so far have reached the header.
    [[nodiscard]] bool Handled() {
        constexpr uint32 mark = 1;
        window->received.clear();
        return window->PostMessage(mark) == B_OK &&
               QTest::qWaitFor([&] { return window->received == Codes{mark}; });
    }
    // Waits until they are dealt with: the header's watchers have ended, and their last messages are read.
    [[nodiscard]] bool Settle() {
        return Handled() && QTest::qWaitFor([&] { return CountThreads() == threads; }) && Handled();
    }
    void Drag(int from, int to, Qt::KeyboardModifiers keys = {}) {
        QTest::mousePress(header, Qt::LeftButton, keys, {from, 8});
        Move(to);
        QTest::mouseRelease(header, Qt::LeftButton, keys, {to, 8});
        ASSERT_TRUE(Settle());
    }

    [[nodiscard]] std::string HeaderColors(int y = 2) const { return Colors(header->grab().toImage(), y); }
    [[nodiscard]] std::string RowColors(int y = 25) const {
        return Colors(view->grab(view->viewport()->geometry()).toImage(), y);
    }

    int threads = 0; // without watchers
    QWidget* header = nullptr;
    QAbstractScrollArea* view = nullptr;
};

// Columns 0..20, 21..81, 82..142 and three rows.
class Header : public testing::Test, protected ListWindow {
  protected:
    Header() {
        AddPlainColumns();
        for (const char* texts : {"-b1", "-a1", "-c0"})
            list->AddItem(NewRow(texts));
        ShowList();
    }
    [[nodiscard]] float Width(int32 column) const { return list->ColumnAt(column)->Width(); }
};

TEST_F(Header, ShowsWhatADragDoesWhileItLasts) {
    Press(83); // 1 right of the border: still the column left of it
    Move(103);
    ASSERT_TRUE(QTest::qWaitFor([&] { return Width(1) == 80; }));
    EXPECT_EQ(HeaderColors(), "0L 1N 101B 102L 103N 162S 163L 164N ");
    EXPECT_EQ(RowColors(), "0a 21b 102c 163- ");
    Move(-40);
    ASSERT_TRUE(QTest::qWaitFor([&] { return Width(1) == 20; }));
    Release(83);
    Press(110); // a cell
    Move(30);
    ASSERT_TRUE(QTest::qWaitFor([&] { return list->DisplayOrder() == Order{0, 2, 1}; }));
    Move(-200); // nothing may pass the column that keeps first, and the outline stops at the end
    ASSERT_TRUE(QTest::qWaitFor([&] { return HeaderColors().starts_with("0B 1N 60B 61N 81S "); }));
    Release(-200);
    ASSERT_TRUE(Settle());
    EXPECT_EQ(RowColors(), "0a 21c 82b 143- ");
    EXPECT_EQ(list->PrimarySortKey(), -1);
}

// Each within one look of the watcher.
TEST_F(Header, SortsByClicksAndObeysQuickDrags) {
    const std::tuple<int, int, bool, const char*> drags[] = {
        {50, 50, false, "abc 1+ 60"},    {50, 50, false, "cba 1- 60"},    {50, 50, false, "cba  60"},
        {50, 50, false, "abc 1+ 60"},    {110, 110, false, "cab 2+ 60"},  {52, 52, true, "cab 2+1+ 60"},
        {48, 48, true, "cba 2+1- 60"},   {10, 10, false, "cba 2+1- 60"},  {200, 200, false, "cba 2+1- 60"},
        {19, 60, false, "cba 2+1- 60"},  {10, 130, false, "cba 2+1- 60"}, // the fixed status column
        {83, 103, false, "cba 2+1- 80"}, {50, 160, false, "cba 2+1- 80"}};
    for (const auto& [from, to, shift, state] : drags) {
        Drag(from, to, shift ? Qt::ShiftModifier : Qt::NoModifier);
        EXPECT_EQ(Shown() + " " + Keys() + " " + std::to_string(std::lround(Width(1))), state) << from;
        EXPECT_EQ(list->DisplayOrder(), (to == 160 ? Order{0, 2, 1} : Order{0, 1, 2})) << from;
    }
    EXPECT_EQ(Width(0), 20);
    EXPECT_EQ(header->accessibleDescription(),
              "Columns: Type (sorted ascending, key 1), Name (sorted descending, key 2)");
}

TEST_F(Header, IsWorkedByKeys) {
    list->MakeFocus();
    StepDriver::Key(Qt::Key_Tab);
    ASSERT_EQ(QApplication::focusWidget(), header);
    // The status column has nothing to be worked.
    EXPECT_EQ(HeaderColors(), "0L 1N 23B 80N 81S 82L 83N 142S 143L 144N ");
    EXPECT_EQ(header->accessibleDescription(), "Columns: Name, Type");
    QAccessibleInterface* cells = QAccessible::queryAccessibleInterface(header);
    ASSERT_EQ(cells->childCount(), 2);
    EXPECT_EQ(cells->focusChild(), cells->child(0));
    for (const char* sorting :
         {"sorted ascending", "sorted descending", ""}) { // "Name", by assistive technology
        cells->child(0)->actionInterface()->doAction(QAccessibleActionInterface::pressAction());
        EXPECT_EQ(cells->child(0)->text(QAccessible::Name) + cells->child(0)->text(QAccessible::Description),
                  QLatin1String("Name") + QLatin1String(sorting));
    }
    for (const Qt::Key key : {Qt::Key_Right, Qt::Key_Right, Qt::Key_Space, Qt::Key_Home}) // two are all
        StepDriver::Key(key);
    EXPECT_EQ(Shown() + Keys(), "cba2+");
    StepDriver::Key(Qt::Key_Return, Qt::ShiftModifier); // a second key
    EXPECT_EQ(Shown() + Keys(), "cab2+1+");
    StepDriver::Key(Qt::Key_Minus);
    EXPECT_EQ(Width(1), 50);
    for (int i = 0; i < 50; ++i)
        StepDriver::Key(Qt::Key_Plus, Qt::ShiftModifier);
    EXPECT_EQ(Width(1), 550);
    StepDriver::Key(Qt::Key_End); // the last column is brought in sight
    EXPECT_EQ(list->Bounds().right, list->ColumnAt(2)->End());
    StepDriver::Key(Qt::Key_Left);
    EXPECT_EQ(list->Bounds().left, list->ColumnAt(1)->Begin());
    list->MakeFocus();
    Drag(50, 50); // the mouse leaves the keyboard where it is
    EXPECT_NE(QApplication::focusWidget(), header);
}

TEST_F(Header, MissesNoQuickPress) {
    // All within one look of the watcher; the last beside all columns.
    for (const auto& [from, to] : {std::pair{50, 50}, {50, 50}, {83, 93}, {150, 150}}) {
        Press(from);
        Move(to);
        Release(to);
    }
    ASSERT_TRUE(Settle());
    EXPECT_EQ(Shown(), "cba");
    EXPECT_EQ(Width(1), 70);
}

TEST_F(Header, DropsThePressWhenAnotherButtonComes) {
    QTest::mouseClick(header, Qt::RightButton, {}, {50, 8});
    for (const int moved : {50, 140}) {
        Press(50);
        Move(moved);
        ASSERT_TRUE(moved == 50 || QTest::qWaitFor([&] { return list->DisplayOrder() == Order{0, 2, 1}; }));
        Move(50, QEvent::MouseButtonPress, Qt::RightButton);
        ASSERT_TRUE(Handled());
        EXPECT_EQ(HeaderColors().find('B'), std::string::npos);
        Release(20);
        ASSERT_TRUE(Settle());
    }
    EXPECT_EQ(list->sortings, 0);
    EXPECT_EQ(list->DisplayOrder(), (Order{0, 2, 1})); // a drag keeps what it has reached
}

TEST_F(Header, DrawsRaisedCells) {
    font_height height;
    be_plain_font->GetHeight(&height);
    const int ascent = static_cast<int>(std::round(height.ascent));
    const int bottom = ascent + static_cast<int>(std::round(height.descent)) + 4;
    EXPECT_EQ(header->height() - 1, bottom);
    EXPECT_EQ(HeaderColors(), "0L 1N 81S 82L 83N 142S 143L 144N "); // the first two are joined
    EXPECT_EQ(HeaderColors(0), "0L 81S 82L 142S 143L ");
    EXPECT_EQ(HeaderColors(bottom), "0S ");
    // The line below the label of a key, from 1 before it.
    const auto underlined = [&](char color) {
        const std::string colors = HeaderColors(1 + ascent + 2);
        return colors.substr(0, colors.rfind(color)) == "0L 1N 28";
    };
    Drag(50, 50);
    EXPECT_TRUE(underlined('K'));
    Press(50);
    EXPECT_TRUE(QTest::qWaitFor([&] { return underlined('B'); }));
    Release(50);
    ASSERT_TRUE(Settle());
}

TEST_F(Header, ForgetsThePressWhenItsWindowGoes) {
    Press(110);
    ASSERT_TRUE(Handled());
    ASSERT_GT(CountThreads(), threads);
    ASSERT_TRUE(window->Lock());
    list->MakeEmpty();
    std::exchange(window, nullptr)->Quit();
    EXPECT_TRUE(QTest::qWaitFor([&] { return CountThreads() == threads; }));
}

TEST_F(Header, ScrollsSidewaysWithTheRows) {
    ASSERT_TRUE(window->Lock());
    list->ColumnAt(1)->SetWidth(400);
    window->Unlock();
    QScrollBar* bar = view->horizontalScrollBar();
    ASSERT_TRUE(QTest::qWaitFor([&] { return bar->maximum() > 100; }));
    bar->setValue(bar->maximum());
    rows[0]->drawn.clear();
    EXPECT_EQ(HeaderColors(), "0N 238S 239L 240N 299S ");
    EXPECT_EQ(RowColors(), "0b 239c "); // "Type" is whole, and nothing behind it
    EXPECT_EQ(rows[0]->drawn, (Order{1, 2}));
    Drag(238, 218);
    EXPECT_EQ(Width(1), 380);
    EXPECT_EQ(list->Header()->Bounds().left, list->Bounds().left);
}

TEST(OutlineArrows, OpenAndCloseTheRowsBelow) {
    ListWindow w(true);
    w.NewColumn(nullptr, 20, CLVF_EXPANDER);
    w.NewColumn("Name", 60);
    TextRow* middle = w.NewRow("m", 1, true, false);
    TextRow* deep = w.NewRow("d", 9, true);
    for (TextRow* row : {w.NewRow("t", 0, true), middle, w.NewRow("e", 2), w.NewRow("n", 1), deep})
        w.list->AddItem(row);
    w.ShowList();
    // Pointing down in the row that has the keyboard's frame, and right.
    EXPECT_EQ(w.RowColors(8), "0L 1a 9K 17a 21b 82- 299L ");
    EXPECT_EQ(w.RowColors(26), "0L 20a 31K 32a 41b 82- ");
    EXPECT_EQ(middle->ExpanderArrowRect(), BRect(28, 25, 37, 34));
    EXPECT_EQ(deep->ExpanderArrowRect(), BRect(-1, -1, -1, -1)); // beyond its column
    const std::tuple<QPoint, const char*, int32> clicks[] = {
        {{32, 30}, "tmend", -1}, {{60, 30}, "tmend", 1}, {{12, 9}, "t", -1}, {{12, 9}, "tmend", -1}};
    for (const auto& [place, shown, selected] : clicks) {
        QTest::mouseClick(w.view->viewport(), Qt::LeftButton, {}, place);
        static_cast<void>(w.RowColors()); // draws what the click has brought
        EXPECT_EQ(w.Shown(0), shown) << place.x();
        EXPECT_EQ(w.list->CurrentSelection(), selected) << place.x();
    }
}

} // namespace
