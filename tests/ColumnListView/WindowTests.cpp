#include <algorithm>
#include <filesystem>
#include <fstream>
#include <thread>
#include <unistd.h>

#include <QImage>
#include <QScrollArea>
#include <QScrollBar>

#include "ColumnListView/ListFixture.h"
#include "StepDriver.h"

namespace {

constexpr QRgb kLight = 0xFFFFFFFF;
constexpr QRgb kShadow = 0xFF989898;
constexpr QRgb kNeutral = 0xFFD8D8D8;
constexpr QRgb kBlue = 0xFF0000E5;
constexpr QRgb kBlack = 0xFF000000;

// What the rows show of a column; of none behind the last one.
QRgb Filled(int column) {
    const rgb_color color = column < 0 ? kStripColor : kColumnColors[column];
    return qRgb(color.red, color.green, color.blue);
}

void ExpectPixels(const QImage& picture, std::initializer_list<std::pair<QPoint, QRgb>> pixels) {
    for (const auto& [place, color] : pixels)
        EXPECT_EQ(picture.pixel(place), color) << place.x() << ", " << place.y();
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
    explicit ListWindow(bool hierarchical = false) : ListFixture(hierarchical) { Add(owned.release()); }
    ~ListWindow() {
        if (window)
            Locked([&] { list->MakeEmpty(); });
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
    template <class Change>
    void Locked(const Change& change) {
        ASSERT_TRUE(window->Lock());
        change();
        window->Unlock();
    }

    void Press(int x, Qt::KeyboardModifiers keys = {}) {
        QTest::mousePress(header, Qt::LeftButton, keys, {x, 8});
    }
    // With the left button held, alone or when another one goes down.
    void Move(int x, QEvent::Type type = QEvent::MouseMove, Qt::MouseButton button = Qt::NoButton) {
        QMouseEvent event(type, QPointF(x, 8), header->mapToGlobal(QPointF(x, 8)), button,
                          Qt::LeftButton | button, {});
        QApplication::sendEvent(header, &event);
    }
    void Release(int x, Qt::KeyboardModifiers keys = {}) {
        QTest::mouseRelease(header, Qt::LeftButton, keys, {x, 8});
    }
    // Waits until all presses and releases so far have reached the header.
    [[nodiscard]] bool Handled() {
        constexpr uint32 mark = 1;
        window->received.clear();
        return window->PostMessage(mark) == B_OK && QTest::qWaitFor([&] {
                   return std::count(window->received.begin(), window->received.end(), mark) > 0;
               });
    }
    // Waits until they are dealt with: the header's watchers have ended, and their last messages are read.
    [[nodiscard]] bool Settle() {
        return Handled() && QTest::qWaitFor([&] { return CountThreads() == threads; }) && Handled();
    }
    void Drag(int from, int to, Qt::KeyboardModifiers keys = {}) {
        Press(from, keys);
        if (to != from)
            Move(to);
        Release(to, keys);
        ASSERT_TRUE(Settle());
    }
    void Click(int x, Qt::KeyboardModifiers keys = {}) { Drag(x, x, keys); }

    [[nodiscard]] QImage HeaderPicture() const { return header->grab().toImage(); }
    [[nodiscard]] QImage RowsPicture() const { return view->grab(view->viewport()->geometry()).toImage(); }
    // In a line that no label reaches.
    [[nodiscard]] QRgb HeaderAt(int x) const { return HeaderPicture().pixel(x, 5); }
    [[nodiscard]] QRgb RowsAt(int x) const { return RowsPicture().pixel(x, 5); }
    // How many pixels of the header have something of this colour.
    template <class Condition>
    [[nodiscard]] int Count(QRect area, Condition condition) const {
        const QImage picture = HeaderPicture();
        int count = 0;
        for (int y = area.top(); y <= area.bottom(); y++)
            for (int x = area.left(); x <= area.right(); x++)
                count += condition(picture.pixel(x, y));
        return count;
    }
    [[nodiscard]] bool ShowsOutline() const {
        return Count(header->rect(), [](QRgb color) { return color == kBlue; }) > 0;
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
    [[nodiscard]] bool AwaitWidth(float width) const {
        return QTest::qWaitFor([&] { return Width(1) == width; });
    }
};

class Rows : public Header {};

TEST_F(Header, ResizesByDraggedBorders) {
    Press(83); // 1 right of the border: still the column left of it
    Move(103);
    ASSERT_TRUE(AwaitWidth(80));
    EXPECT_EQ(HeaderAt(101), kBlue);
    ExpectPixels(RowsPicture(), {{{101, 5}, Filled(1)}, {{102, 5}, Filled(2)}});
    Move(-40);
    ASSERT_TRUE(AwaitWidth(20));
    Release(93); // back and up before the next look
    ASSERT_TRUE(Settle());
    EXPECT_EQ(Width(1), 70);
    EXPECT_EQ(HeaderAt(91), kShadow);
    Drag(19, 60); // the status column's own border
    EXPECT_EQ(Width(0), 20);
    EXPECT_EQ(list->PrimarySortKey(), -1);
}

TEST_F(Header, ReordersByDraggedCells) {
    Press(110);
    Move(30);
    ASSERT_TRUE(QTest::qWaitFor([&] { return list->DisplayOrder() == Order{0, 2, 1}; }));
    Move(-200); // nothing may pass the column that keeps first, and the outline stops at the end
    ASSERT_TRUE(QTest::qWaitFor([&] { return HeaderAt(0) == kBlue; }));
    EXPECT_EQ(HeaderAt(60), kBlue);
    Release(-200);
    ASSERT_TRUE(Settle());
    EXPECT_EQ(list->DisplayOrder(), (Order{0, 2, 1}));
    EXPECT_EQ(list->orders, 1);
    EXPECT_EQ(RowsAt(30), Filled(2));
    EXPECT_FALSE(ShowsOutline());
    Drag(10, 130); // fixed position
    EXPECT_EQ(list->DisplayOrder(), (Order{0, 2, 1}));
    Drag(50, 140); // within one look of the watcher
    EXPECT_EQ(list->DisplayOrder(), (Order{0, 1, 2}));
    EXPECT_EQ(list->PrimarySortKey(), -1);
}

TEST_F(Header, SortsByClicks) {
    const struct {
        int x;
        Qt::KeyboardModifiers with;
        const char *shown, *keys;
    } clicks[] = {{50, {}, "abc", "1+"},
                  {50, {}, "cba", "1-"},
                  {50, {}, "cba", ""},
                  {50, {}, "abc", "1+"},
                  {110, {}, "cab", "2+"},
                  {52, Qt::ShiftModifier, "cab", "2+1+"},
                  {48, Qt::ShiftModifier, "cba", "2+1-"},
                  {10, {}, "cba", "2+1-"}, // not sortable
                  {200, {}, "cba", "2+1-"}};
    for (const auto& click : clicks) {
        Click(click.x, click.with);
        EXPECT_EQ(Shown() + Keys(), std::string(click.shown) + click.keys) << &click - clicks;
    }
    EXPECT_EQ(header->accessibleDescription(), "Columns: Name (sorted descending), Type (sorted ascending)");
}

TEST_F(Header, IsWorkedByKeys) {
    list->MakeFocus();
    StepDriver::Key(Qt::Key_Tab);
    ASSERT_EQ(QApplication::focusWidget(), header);
    EXPECT_EQ(HeaderAt(23), kBlue); // the status column has nothing to be worked
    EXPECT_EQ(header->accessibleDescription(), "Name. Columns: Name, Type");
    StepDriver::Key(Qt::Key_Right);
    StepDriver::Key(Qt::Key_Right); // there is no further one
    StepDriver::Key(Qt::Key_Space);
    EXPECT_EQ(Shown() + Keys(), "cba2+");
    StepDriver::Key(Qt::Key_Home);
    StepDriver::Key(Qt::Key_Return, Qt::ShiftModifier); // a second key
    EXPECT_EQ(Shown() + Keys(), "cab2+1+");
    StepDriver::Key(Qt::Key_Minus);
    StepDriver::Key(Qt::Key_Minus);
    EXPECT_EQ(Width(1), 40);
    for (int i = 0; i < 50; i++)
        StepDriver::Key(Qt::Key_Plus, Qt::ShiftModifier);
    EXPECT_EQ(Width(1), 540);
    StepDriver::Key(Qt::Key_End); // the last column is brought in sight
    EXPECT_EQ(list->Bounds().right, list->ColumnAt(2)->End());
    StepDriver::Key(Qt::Key_Left);
    EXPECT_EQ(list->Bounds().left, list->ColumnAt(1)->Begin());
    Click(50); // the mouse leaves the keyboard where it is
    EXPECT_EQ(QApplication::focusWidget(), header);
    list->MakeFocus();
    Click(50);
    EXPECT_NE(QApplication::focusWidget(), header);
    EXPECT_FALSE(ShowsOutline());
}

TEST_F(Header, MissesNoQuickPress) {
    const std::pair<int, int> presses[] = {{50, 50}, {50, 50}, {83, 93}, {150, 150}}; // the last beside all
    for (const auto& [from, to] : presses) { // all within one look of the watcher
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
    for (const bool drags : {false, true}) {
        Press(50);
        if (drags) {
            Move(140);
            ASSERT_TRUE(QTest::qWaitFor([&] { return list->orders == 1; }));
        }
        Move(50, QEvent::MouseButtonPress, Qt::RightButton);
        ASSERT_TRUE(Handled());
        EXPECT_FALSE(ShowsOutline());
        Release(20);
        ASSERT_TRUE(Settle());
    }
    EXPECT_EQ(list->sortings, 0);
    EXPECT_EQ(list->DisplayOrder(), (Order{0, 2, 1})); // a drag keeps what it has reached
}

TEST_F(Header, DrawsRaisedCells) {
    const int bottom = header->height() - 1;
    EXPECT_EQ(bottom, static_cast<int>(CLVColumnLabelView::HeightFor(*be_plain_font)));
    font_height height;
    be_plain_font->GetHeight(&height);
    const int line = 1 + static_cast<int>(std::round(height.ascent)) + 2;
    ExpectPixels(HeaderPicture(), {{{82, 5}, kLight},
                                   {{100, 0}, kLight},
                                   {{81, 5}, kShadow},
                                   {{100, bottom}, kShadow},
                                   {{20, 5}, kNeutral},
                                   {{21, 5}, kNeutral},    // joined
                                   {{200, 5}, kNeutral}}); // beside all columns
    const QRect label(22, 1, 59, bottom - 1);
    const int neutral = Count(label, [](QRgb color) { return color == kNeutral; });
    EXPECT_TRUE(neutral > 400 && neutral < label.width() * label.height()) << neutral;

    Press(50);
    // Letters are smooth, so that few of their pixels have the pen's own colour.
    const auto bluish = [](QRgb color) { return qBlue(color) > qRed(color) + 60; };
    ASSERT_TRUE(QTest::qWaitFor([&] { return Count(label, bluish) > 5; }));
    Release(50);
    ASSERT_TRUE(Settle());
    // Underlined from 1 before the label.
    ExpectPixels(HeaderPicture(), {{{28, line}, kBlack}, {{27, line}, kNeutral}, {{89, line}, kNeutral}});
}

TEST_F(Header, ForgetsThePressWhenItsWindowGoes) {
    const auto press = [&] {
        Press(110);
        ASSERT_TRUE(Handled());
        ASSERT_GT(CountThreads(), threads);
    };
    press();
    Locked([&] { container->RemoveSelf(); });
    owned.reset(container);
    ASSERT_TRUE(Settle());
    EXPECT_EQ(list->PrimarySortKey(), -1);
    window->AddChild(owned.release());
    press();
    Locked([&] { list->MakeEmpty(); });
    std::exchange(window, nullptr)->Quit();
    EXPECT_TRUE(QTest::qWaitFor([&] { return CountThreads() == threads; }));
}

TEST_F(Rows, DrawTheColumnsThatShow) {
    const QImage picture = RowsPicture();
    ExpectPixels(picture, {{{0, 30}, Filled(0)},
                           {{20, 30}, Filled(0)},
                           {{21, 30}, Filled(1)},
                           {{81, 30}, Filled(1)},
                           {{82, 30}, Filled(2)},
                           {{142, 30}, Filled(2)},
                           {{143, 30}, Filled(-1)},
                           {{picture.width() - 1, 30}, Filled(-1)}});

    // Only what overlaps the part in sight is drawn; rows out of sight are not drawn at all.
    Locked([&] {
        list->ColumnAt(1)->SetWidth(5000);
        for (int i = 0; i < 50; i++)
            list->AddItem(NewRow("---"));
    });
    rows[0]->drawn.clear();
    ASSERT_TRUE(QTest::qWaitFor([&] { return !rows[0]->drawn.empty(); }));
    EXPECT_EQ(rows[0]->drawn.back(), 1);
    EXPECT_TRUE(rows.back()->drawn.empty());
}

TEST_F(Rows, ScrollSidewaysWithTheHeader) {
    Locked([&] { list->ColumnAt(1)->SetWidth(400); });
    QScrollBar* bar = view->horizontalScrollBar();
    ASSERT_TRUE(QTest::qWaitFor([&] { return bar->maximum() > 100; }));
    bar->setValue(bar->maximum());
    const int border = 421 - bar->value(); // the last pixel of "Name"
    ExpectPixels(HeaderPicture(), {{{border, 5}, kShadow}, {{border + 1, 5}, kLight}});
    ExpectPixels(RowsPicture(), {{{border, 5}, Filled(1)}, {{border + 1, 5}, Filled(2)}});
    EXPECT_EQ(border + 61, RowsPicture().width() - 1); // "Type" is whole, and nothing behind it
    Drag(border, border - 20);
    EXPECT_EQ(Width(1), 380);
    EXPECT_EQ(list->Header()->Bounds().left, list->Bounds().left);
}

TEST(OutlineArrows, OpenAndCloseTheRowsBelow) {
    ListWindow w(true);
    w.NewColumn(nullptr, 20, CLVF_EXPANDER);
    w.NewColumn("Name", 60);
    TextRow* top = w.NewRow("t", 0, true);
    TextRow* middle = w.NewRow("m", 1, true, false);
    for (TextRow* row : {top, middle, w.NewRow("e", 2), w.NewRow("n", 1)})
        w.list->AddItem(row);
    w.ShowList();
    // Pointing down, and right.
    ExpectPixels(w.RowsPicture(),
                 {{{12, 9}, kBlack}, {{9, 8}, kBlack}, {{31, 26}, kBlack}, {{36, 26}, Filled(0)}});
    EXPECT_EQ(top->ExpanderArrowRect(), BRect(8, 5, 17, 14));
    EXPECT_EQ(middle->ExpanderArrowRect(), BRect(28, 25, 37, 34));
    EXPECT_EQ(middle->ExpanderColumnRect(), BRect(20, 20, 40, 39));
    const struct {
        QPoint place;
        const char* shown;
        int32 selected;
    } clicks[] = {{{32, 30}, "tmen", -1}, {{60, 30}, "tmen", 1}, {{12, 9}, "t", -1}, {{12, 9}, "tmen", -1}};
    for (const auto& [place, shown, selected] : clicks) {
        QTest::mouseClick(w.view->viewport(), Qt::LeftButton, {}, place);
        static_cast<void>(w.RowsPicture()); // draws what the click has brought
        EXPECT_EQ(w.Shown(0), shown) << place.x();
        EXPECT_EQ(w.list->CurrentSelection(), selected) << place.x();
    }
}

#ifndef NDEBUG
TEST_F(Rows, WantTheLockForEveryChange) {
    EXPECT_DEATH(list->SetSortKey(1), "The looper must be locked.");
    EXPECT_DEATH(list->ColumnAt(1)->SetWidth(90), "The looper must be locked.");
    EXPECT_DEATH(list->RemoveItem(0), "The looper must be locked.");
}
#endif

} // namespace
