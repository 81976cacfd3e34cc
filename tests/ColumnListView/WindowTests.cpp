#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <thread>
#include <unistd.h>

#include <QApplication>
#include <QImage>
#include <QScrollArea>
#include <QScrollBar>
#include <QTest>

#include "ColumnListView/ListFixture.h"

namespace {

constexpr QRgb kLight = 0xFFFFFFFF;
constexpr QRgb kShadow = 0xFF989898;
constexpr QRgb kNeutral = 0xFFD8D8D8;
constexpr QRgb kBlue = 0xFF0000E5;

QRgb Rgb(rgb_color color) {
    return qRgb(color.red, color.green, color.blue);
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

constexpr uint32 kMark = 1;

// Counts marks, to tell when everything queued before them has been handled.
class MarkedWindow : public BWindow {
  public:
    MarkedWindow() : BWindow({50, 50, 349, 249}, "list", B_DOCUMENT_WINDOW, 0) {}
    void MessageReceived(BMessage* message) override {
        if (message->what == kMark)
            marks++;
        else
            BWindow::MessageReceived(message);
    }
    int marks = 0;
};

// The list of ListFixture on the screen, and a hand on its mouse.
struct ListWindow : ListFixture {
    explicit ListWindow(bool hierarchical = false) : ListFixture(hierarchical) {
        window->AddChild(owned.release());
    }
    ~ListWindow() {
        if (window)
            Locked([&] { list->MakeEmpty(); });
    }

    void Show() {
        window->Show();
        header = Find("column labels");
        view = static_cast<QAbstractScrollArea*>(Find("rows"));
        ASSERT_TRUE(header && view && QTest::qWaitForWindowExposed(header->window()));
        // A sanitizer starts its own thread beside the first one, which is listed for a moment after its end.
        std::string first = "/proc/self/task/";
        std::thread([&] { first += std::to_string(gettid()); }).join();
        ASSERT_TRUE(QTest::qWaitFor([&] { return !std::filesystem::exists(first); }));
        threads = CountThreads();
    }
    static QWidget* Find(const char* name) {
        for (QWidget* widget : QApplication::allWidgets())
            if (widget->objectName() == QLatin1String(name))
                return widget;
        return nullptr;
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
    void Move(int x) {
        QMouseEvent event(QEvent::MouseMove, QPointF(x, 8), header->mapToGlobal(QPointF(x, 8)), Qt::NoButton,
                          Qt::LeftButton, {});
        QApplication::sendEvent(header, &event);
    }
    void Release(int x, Qt::KeyboardModifiers keys = {}) {
        QTest::mouseRelease(header, Qt::LeftButton, keys, {x, 8});
    }
    // Waits until all presses and releases so far have reached the header.
    [[nodiscard]] bool Handled() const {
        const int marks = window->marks;
        return window->PostMessage(kMark) == B_OK && QTest::qWaitFor([&] { return window->marks > marks; });
    }
    // Waits until they are dealt with: the header's watchers have ended, and their last messages are read.
    [[nodiscard]] bool Settle() const {
        return Handled() && QTest::qWaitFor([&] { return CountThreads() == threads; }) && Handled();
    }
    void Click(int x, Qt::KeyboardModifiers keys = {}) {
        Press(x, keys);
        Release(x, keys);
        ASSERT_TRUE(Settle());
    }
    void Drag(int from, int to) {
        Press(from);
        Move(to);
        Release(to);
        ASSERT_TRUE(Settle());
    }

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

    MarkedWindow* window = new MarkedWindow;
    int threads = 0; // without watchers
    QWidget* header = nullptr;
    QAbstractScrollArea* view = nullptr;
};

// Columns 0..20, 21..81, 82..142 and three rows.
class Header : public testing::Test, protected ListWindow {
  protected:
    Header() {
        AddPlainColumns();
        for (const char* text : {"b1", "a1", "c0"})
            list->AddItem(NewRow({"", {text[0]}, {text[1]}}));
        Show();
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
    EXPECT_EQ(RowsAt(101), Rgb(kColumnColors[1]));
    EXPECT_EQ(RowsAt(102), Rgb(kColumnColors[2]));
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
    EXPECT_EQ(RowsAt(30), Rgb(kColumnColors[2]));
    EXPECT_FALSE(ShowsOutline());
    Drag(10, 130); // fixed position
    EXPECT_EQ(list->DisplayOrder(), (Order{0, 2, 1}));
    Drag(50, 140); // within one look of the watcher
    EXPECT_EQ(list->DisplayOrder(), (Order{0, 1, 2}));
    EXPECT_EQ(list->PrimarySortKey(), -1);
}

TEST_F(Header, SortsByClicks) {
    const std::pair<const char*, Mode> cycle[] = {
        {"abc", Mode::Ascending}, {"cba", Mode::Descending}, {"cba", Mode::None}, {"abc", Mode::Ascending}};
    for (const auto& [order, mode] : cycle) {
        Click(50);
        EXPECT_EQ(Shown(), order);
        EXPECT_EQ(list->ColumnAt(1)->SortMode(), mode);
        EXPECT_EQ(list->PrimarySortKey(), mode == Mode::None ? -1 : 1);
    }
    Click(110);
    EXPECT_EQ(Shown(), "cab");
    Click(52, Qt::ShiftModifier); // a second key
    Click(48, Qt::ShiftModifier); // the same, reversed
    EXPECT_EQ(Shown(), "cba");
    Click(10); // not sortable
    Click(200);
    EXPECT_EQ(list->PrimarySortKey(), 2);
    EXPECT_EQ(header->accessibleDescription(), "Columns: Name (sorted descending), Type (sorted ascending)");
}

TEST_F(Header, IsWorkedByKeys) {
    const auto key = [&](Qt::Key pressed, Qt::KeyboardModifiers with = {}) {
        QTest::keyClick(QApplication::focusWidget(), pressed, with);
    };
    ASSERT_TRUE(QTest::qWaitFor([&] {
        window->Activate();
        return QApplication::activeWindow() == header->window();
    }));
    list->MakeFocus();
    key(Qt::Key_Tab);
    ASSERT_EQ(QApplication::focusWidget(), header);
    EXPECT_EQ(HeaderAt(23), kBlue); // the status column has nothing to be worked
    EXPECT_EQ(header->accessibleDescription(), "Name. Columns: Name, Type");
    key(Qt::Key_Right);
    key(Qt::Key_Right); // there is no further one
    key(Qt::Key_Space);
    EXPECT_EQ(Shown(), "cba");
    key(Qt::Key_Home);
    key(Qt::Key_Return, Qt::ShiftModifier); // a second key
    EXPECT_EQ(Shown(), "cab");
    EXPECT_EQ(list->PrimarySortKey(), 2);
    key(Qt::Key_Minus);
    key(Qt::Key_Minus);
    EXPECT_EQ(Width(1), 40);
    for (int i = 0; i < 50; i++)
        key(Qt::Key_Plus, Qt::ShiftModifier);
    EXPECT_EQ(Width(1), 540);
    key(Qt::Key_End); // the last column is brought in sight
    EXPECT_EQ(list->Bounds().right, list->ColumnAt(2)->End());
    key(Qt::Key_Left);
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
        QMouseEvent second(QEvent::MouseButtonPress, QPointF(50, 8), header->mapToGlobal(QPointF(50, 8)),
                           Qt::RightButton, Qt::LeftButton | Qt::RightButton, {});
        QApplication::sendEvent(header, &second);
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
    const auto expect = [&](std::initializer_list<std::pair<QPoint, QRgb>> pixels) {
        const QImage picture = HeaderPicture();
        for (const auto& [place, color] : pixels)
            EXPECT_EQ(picture.pixel(place), color) << place.x() << ", " << place.y();
    };
    expect({{{82, 5}, kLight}, {{100, 0}, kLight}, {{81, 5}, kShadow}, {{100, bottom}, kShadow}});
    expect({{{20, 5}, kNeutral}, {{21, 5}, kNeutral}, {{200, 5}, kNeutral}}); // joined; beside all columns
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
    expect({{{28, line}, 0xFF000000}, {{27, line}, kNeutral}, {{89, line}, kNeutral}});
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
    const std::pair<int, rgb_color> places[] = {{0, kColumnColors[0]},  {20, kColumnColors[0]},
                                                {21, kColumnColors[1]}, {81, kColumnColors[1]},
                                                {82, kColumnColors[2]}, {142, kColumnColors[2]},
                                                {143, kStripColor},     {picture.width() - 1, kStripColor}};
    for (const auto& [x, color] : places)
        EXPECT_EQ(picture.pixel(x, 30), Rgb(color)) << x;

    // Only what overlaps the part in sight is drawn; rows out of sight are not drawn at all.
    Locked([&] {
        list->ColumnAt(1)->SetWidth(5000);
        for (int i = 0; i < 50; i++)
            list->AddItem(NewRow({"", "", ""}));
    });
    rows[0]->drawn.clear();
    ASSERT_TRUE(QTest::qWaitFor([&] { return !rows[0]->drawn.empty(); }));
    EXPECT_EQ(rows[0]->drawn.back().first, 1);
    EXPECT_TRUE(rows.back()->drawn.empty());
}

TEST_F(Rows, ScrollSidewaysWithTheHeader) {
    Locked([&] { list->ColumnAt(1)->SetWidth(400); });
    QScrollBar* bar = view->horizontalScrollBar();
    ASSERT_TRUE(QTest::qWaitFor([&] { return bar->maximum() > 100; }));
    bar->setValue(bar->maximum());
    const int border = 421 - bar->value(); // the last pixel of "Name"
    EXPECT_EQ(HeaderAt(border), kShadow);
    EXPECT_EQ(HeaderAt(border + 1), kLight);
    EXPECT_EQ(RowsAt(border), Rgb(kColumnColors[1]));
    EXPECT_EQ(RowsAt(border + 1), Rgb(kColumnColors[2]));
    EXPECT_EQ(border + 61, RowsPicture().width() - 1); // "Type" is whole, and nothing behind it
    Drag(border, border - 20);
    EXPECT_EQ(Width(1), 380);
    EXPECT_EQ(list->Header()->Bounds().left, list->Bounds().left);
}

TEST(OutlineArrows, OpenAndCloseTheRowsBelow) {
    ListWindow w(true);
    w.list->AddColumn(new CLVColumn(nullptr, 20, CLVF_EXPANDER));
    w.list->AddColumn(new CLVColumn("Name", 60));
    TextRow* top = w.NewRow({"t"}, 0, true);
    TextRow* middle = w.NewRow({"m"}, 1, true, false);
    for (TextRow* row : {top, middle, w.NewRow({"e"}, 2), w.NewRow({"n"}, 1)})
        w.list->AddItem(row);
    w.Show();
    const QImage picture = w.RowsPicture();
    EXPECT_EQ(top->ExpanderArrowRect(), BRect(8, 5, 17, 14));
    EXPECT_EQ(middle->ExpanderArrowRect(), BRect(28, 25, 37, 34));
    EXPECT_EQ(middle->ExpanderColumnRect(), BRect(20, 20, 40, 39));
    for (const QPoint black : {QPoint(12, 9), QPoint(9, 8), QPoint(31, 26)}) // pointing down, and right
        EXPECT_EQ(picture.pixel(black), 0xFF000000) << black.x();
    EXPECT_EQ(picture.pixel(36, 26), Rgb(kColumnColors[0]));

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
