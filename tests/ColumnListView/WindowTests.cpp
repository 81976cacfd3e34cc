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

using Order = std::vector<int32>;
using Mode = CLVSortMode;

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

    MarkedWindow* window = new MarkedWindow;
    int threads = 0; // without watchers
    QWidget* header = nullptr;
    QAbstractScrollArea* view = nullptr;
};

// Columns 0..20, 21..81, 82..142 and three rows.
struct PlainWindow : ListWindow {
    PlainWindow() {
        AddPlainColumns();
        for (const char* text : {"b1", "a1", "c0"})
            list->AddItem(NewRow({"", {text[0]}, {text[1]}}));
        Show();
    }
    [[nodiscard]] float Width(int32 column) const { return list->ColumnAt(column)->Width(); }
};

int CountPixels(const QImage& picture, QRect area, QRgb color) {
    int count = 0;
    for (int y = area.top(); y <= area.bottom(); y++)
        for (int x = area.left(); x <= area.right(); x++)
            count += picture.pixel(x, y) == color;
    return count;
}

// Letters are smooth, so that few of their pixels have the pen's own colour.
int CountBluish(const QImage& picture, QRect area) {
    int count = 0;
    for (int y = area.top(); y <= area.bottom(); y++)
        for (int x = area.left(); x <= area.right(); x++)
            count += qBlue(picture.pixel(x, y)) > qRed(picture.pixel(x, y)) + 60;
    return count;
}

TEST(Header, ResizesByDraggedBorders) {
    PlainWindow w;
    w.Press(83); // 1 right of the border: still the column left of it
    w.Move(103);
    ASSERT_TRUE(QTest::qWaitFor([&] { return w.Width(1) == 80; }));
    EXPECT_EQ(w.HeaderPicture().pixel(101, 5), kBlue);
    EXPECT_EQ(w.RowsPicture().pixel(101, 5), Rgb(kColumnColors[1]));
    EXPECT_EQ(w.RowsPicture().pixel(102, 5), Rgb(kColumnColors[2]));
    w.Move(-40);
    ASSERT_TRUE(QTest::qWaitFor([&] { return w.Width(1) == 20; }));
    w.Release(93); // back and up before the next look
    ASSERT_TRUE(w.Settle());
    EXPECT_EQ(w.Width(1), 70);
    EXPECT_EQ(w.HeaderPicture().pixel(91, 5), kShadow);
    w.Drag(19, 60); // the status column's own border
    EXPECT_EQ(w.Width(0), 20);
    EXPECT_EQ(w.list->PrimarySortKey(), -1);
}

TEST(Header, ReordersByDraggedCells) {
    PlainWindow w;
    w.Press(110);
    w.Move(30);
    ASSERT_TRUE(QTest::qWaitFor([&] { return w.list->DisplayOrder() == Order{0, 2, 1}; }));
    w.Move(-200); // nothing may pass the column that keeps first, and the outline stops at the end
    ASSERT_TRUE(QTest::qWaitFor([&] { return w.HeaderPicture().pixel(0, 5) == kBlue; }));
    EXPECT_EQ(w.HeaderPicture().pixel(60, 5), kBlue);
    w.Release(-200);
    ASSERT_TRUE(w.Settle());
    EXPECT_EQ(w.list->DisplayOrder(), (Order{0, 2, 1}));
    EXPECT_EQ(w.list->orders, 1);
    EXPECT_EQ(w.RowsPicture().pixel(30, 5), Rgb(kColumnColors[2]));
    EXPECT_EQ(CountPixels(w.HeaderPicture(), w.header->rect(), kBlue), 0);
    w.Drag(10, 130); // fixed position
    EXPECT_EQ(w.list->DisplayOrder(), (Order{0, 2, 1}));
    w.Drag(50, 140); // within one look of the watcher
    EXPECT_EQ(w.list->DisplayOrder(), (Order{0, 1, 2}));
    EXPECT_EQ(w.list->PrimarySortKey(), -1);
}

TEST(Header, SortsByClicks) {
    PlainWindow w;
    const std::pair<const char*, Mode> cycle[] = {
        {"abc", Mode::Ascending}, {"cba", Mode::Descending}, {"cba", Mode::None}, {"abc", Mode::Ascending}};
    for (const auto& [order, mode] : cycle) {
        w.Click(50);
        EXPECT_EQ(w.Shown(), order);
        EXPECT_EQ(w.list->ColumnAt(1)->SortMode(), mode);
        EXPECT_EQ(w.list->PrimarySortKey(), mode == Mode::None ? -1 : 1);
    }
    w.Click(110);
    EXPECT_EQ(w.Shown(), "cab");
    w.Click(52, Qt::ShiftModifier); // a second key
    w.Click(48, Qt::ShiftModifier); // the same, reversed
    EXPECT_EQ(w.Shown(), "cba");
    EXPECT_EQ(w.list->PrimarySortKey(), 2);
    EXPECT_EQ(w.list->Sorting(nullptr, nullptr), 2);
    w.Click(10); // not sortable
    w.Click(200);
    EXPECT_EQ(w.list->PrimarySortKey(), 2);
    EXPECT_EQ(w.header->accessibleDescription(),
              "Columns: Name (sorted descending), Type (sorted ascending)");
}

TEST(Header, IsWorkedByKeys) {
    PlainWindow w;
    const auto key = [&](Qt::Key pressed, Qt::KeyboardModifiers with = {}) {
        QTest::keyClick(QApplication::focusWidget(), pressed, with);
    };
    ASSERT_TRUE(QTest::qWaitFor([&] {
        w.window->Activate();
        return QApplication::activeWindow() == w.header->window();
    }));
    w.list->MakeFocus();
    key(Qt::Key_Tab);
    ASSERT_EQ(QApplication::focusWidget(), w.header);
    EXPECT_EQ(w.HeaderPicture().pixel(23, 5), kBlue); // the status column has nothing to be worked
    EXPECT_EQ(w.header->accessibleDescription(), "Name. Columns: Name, Type");
    key(Qt::Key_Right);
    key(Qt::Key_Right); // there is no further one
    key(Qt::Key_Space);
    EXPECT_EQ(w.Shown(), "cba");
    key(Qt::Key_Home);
    key(Qt::Key_Return, Qt::ShiftModifier); // a second key
    EXPECT_EQ(w.Shown(), "cab");
    EXPECT_EQ(w.list->PrimarySortKey(), 2);
    key(Qt::Key_Minus);
    key(Qt::Key_Minus);
    EXPECT_EQ(w.Width(1), 40);
    for (int i = 0; i < 50; i++)
        key(Qt::Key_Plus, Qt::ShiftModifier);
    EXPECT_EQ(w.Width(1), 540);
    key(Qt::Key_End); // the last column is brought in sight
    EXPECT_EQ(w.list->Bounds().right, w.list->ColumnAt(2)->End());
    key(Qt::Key_Left);
    EXPECT_EQ(w.list->Bounds().left, w.list->ColumnAt(1)->Begin());
    w.Click(50); // the mouse leaves the keyboard where it is
    EXPECT_EQ(QApplication::focusWidget(), w.header);
    w.list->MakeFocus();
    w.Click(50);
    EXPECT_NE(QApplication::focusWidget(), w.header);
    EXPECT_EQ(CountPixels(w.HeaderPicture(), w.header->rect(), kBlue), 0);
}

TEST(Header, MissesNoQuickPress) {
    PlainWindow w;
    for (int i = 0; i < 2; i++) { // both within one look of the watcher
        w.Press(50);
        w.Release(50);
    }
    w.Press(83);
    w.Move(93);
    w.Release(93);
    w.Press(150); // beside the columns
    w.Release(150);
    ASSERT_TRUE(w.Settle());
    EXPECT_EQ(w.Shown(), "cba");
    EXPECT_EQ(w.Width(1), 70);
}

TEST(Header, DropsThePressWhenAnotherButtonComes) {
    PlainWindow w;
    QTest::mousePress(w.header, Qt::RightButton, {}, {50, 8});
    QTest::mouseRelease(w.header, Qt::RightButton, {}, {50, 8});
    for (const bool drags : {false, true}) {
        w.Press(50);
        if (drags) {
            w.Move(140);
            ASSERT_TRUE(QTest::qWaitFor([&] { return w.list->orders == 1; }));
        }
        QMouseEvent second(QEvent::MouseButtonPress, QPointF(50, 8), w.header->mapToGlobal(QPointF(50, 8)),
                           Qt::RightButton, Qt::LeftButton | Qt::RightButton, {});
        QApplication::sendEvent(w.header, &second);
        ASSERT_TRUE(w.Handled());
        EXPECT_EQ(CountPixels(w.HeaderPicture(), w.header->rect(), kBlue), 0);
        w.Release(20);
        ASSERT_TRUE(w.Settle());
    }
    EXPECT_EQ(w.list->sortings, 0);
    EXPECT_EQ(w.list->DisplayOrder(), (Order{0, 2, 1})); // a drag keeps what it has reached
}

TEST(Header, DrawsRaisedCells) {
    PlainWindow w;
    const int bottom = w.header->height() - 1;
    EXPECT_EQ(w.header->height() - 1, static_cast<int>(CLVColumnLabelView::HeightFor(*be_plain_font)));
    const QImage picture = w.HeaderPicture();
    EXPECT_EQ(picture.pixel(82, 5), kLight);
    EXPECT_EQ(picture.pixel(100, 0), kLight);
    EXPECT_EQ(picture.pixel(81, 5), kShadow);
    EXPECT_EQ(picture.pixel(100, bottom), kShadow);
    EXPECT_EQ(picture.pixel(20, 5), kNeutral); // joined with the next
    EXPECT_EQ(picture.pixel(21, 5), kNeutral);
    EXPECT_EQ(picture.pixel(200, 5), kNeutral);
    const QRect label(22, 1, 59, bottom - 1);
    EXPECT_GT(CountPixels(picture, label, kNeutral), 400);
    EXPECT_LT(CountPixels(picture, label, kNeutral), label.width() * label.height());

    w.Press(50);
    ASSERT_TRUE(QTest::qWaitFor([&] { return CountBluish(w.HeaderPicture(), label) > 5; }));
    w.Release(50);
    ASSERT_TRUE(w.Settle());
    font_height height;
    be_plain_font->GetHeight(&height);
    const int line = 1 + static_cast<int>(std::round(height.ascent)) + 2;
    EXPECT_EQ(w.HeaderPicture().pixel(28, line), 0xFF000000); // underlined from 1 before the label
    EXPECT_EQ(w.HeaderPicture().pixel(27, line), kNeutral);
    EXPECT_EQ(w.HeaderPicture().pixel(89, line), kNeutral);
}

TEST(Header, ForgetsThePressWhenItsWindowGoes) {
    PlainWindow w;
    const auto press = [&] {
        w.Press(110);
        ASSERT_TRUE(w.Handled());
        ASSERT_GT(CountThreads(), w.threads);
    };
    press();
    w.Locked([&] { w.container->RemoveSelf(); });
    w.owned.reset(w.container);
    ASSERT_TRUE(w.Settle());
    EXPECT_EQ(w.list->PrimarySortKey(), -1);
    w.window->AddChild(w.owned.release());
    press();
    w.Locked([&] { w.list->MakeEmpty(); });
    std::exchange(w.window, nullptr)->Quit();
    EXPECT_TRUE(QTest::qWaitFor([&] { return CountThreads() == w.threads; }));
}

TEST(Rows, DrawTheColumnsThatShow) {
    PlainWindow w;
    const QImage picture = w.RowsPicture();
    const std::pair<int, rgb_color> places[] = {{0, kColumnColors[0]},  {20, kColumnColors[0]},
                                                {21, kColumnColors[1]}, {81, kColumnColors[1]},
                                                {82, kColumnColors[2]}, {142, kColumnColors[2]},
                                                {143, kStripColor},     {picture.width() - 1, kStripColor}};
    for (const auto& [x, color] : places)
        EXPECT_EQ(picture.pixel(x, 30), Rgb(color)) << x;
    EXPECT_EQ(w.rows[0]->Height(), 20);

    // Only what overlaps the part in sight is drawn; rows out of sight are not drawn at all.
    TextRow* far = w.NewRow({"", "", ""});
    w.Locked([&] {
        w.list->ColumnAt(1)->SetWidth(5000);
        for (int i = 0; i < 50; i++)
            w.list->AddItem(w.NewRow({"", "", ""}));
        w.list->AddItem(far);
    });
    w.rows[0]->drawn.clear();
    ASSERT_TRUE(QTest::qWaitFor([&] { return !w.rows[0]->drawn.empty(); }));
    EXPECT_EQ(w.rows[0]->drawn.back().first, 1);
    EXPECT_TRUE(far->drawn.empty());
}

TEST(Rows, ScrollSidewaysWithTheHeader) {
    PlainWindow w;
    w.Locked([&] { w.list->ColumnAt(1)->SetWidth(400); });
    QScrollBar* bar = w.view->horizontalScrollBar();
    ASSERT_TRUE(QTest::qWaitFor([&] { return bar->maximum() > 100; }));
    bar->setValue(bar->maximum());
    const QImage header = w.HeaderPicture();
    const QImage rows = w.RowsPicture();
    const int border = 421 - bar->value(); // the last pixel of "Name"
    EXPECT_EQ(header.pixel(border, 5), kShadow);
    EXPECT_EQ(header.pixel(border + 1, 5), kLight);
    EXPECT_EQ(rows.pixel(border, 5), Rgb(kColumnColors[1]));
    EXPECT_EQ(rows.pixel(border + 1, 5), Rgb(kColumnColors[2]));
    EXPECT_EQ(border + 61, rows.width() - 1); // "Type" is whole, and nothing behind it
    w.Drag(border, border - 20);
    EXPECT_EQ(w.Width(1), 380);
    EXPECT_EQ(w.list->Header()->Bounds().left, w.list->Bounds().left);
}

TEST(Rows, OpenAndCloseByTheirArrows) {
    ListWindow w(true);
    w.list->AddColumn(new CLVColumn(nullptr, 20, CLVF_EXPANDER));
    w.list->AddColumn(new CLVColumn("Name", 60));
    TextRow* top = w.NewRow({"t"}, 0, true);
    TextRow* middle = w.NewRow({"m"}, 1, true, false);
    for (TextRow* row : {top, middle, w.NewRow({"e"}, 2), w.NewRow({"n"}, 1)})
        w.list->AddItem(row);
    w.Show();
    QImage picture = w.RowsPicture();
    EXPECT_EQ(top->ExpanderArrowRect(), BRect(8, 5, 17, 14));
    EXPECT_EQ(picture.pixel(12, 9), 0xFF000000); // pointing down
    EXPECT_EQ(picture.pixel(9, 8), 0xFF000000);
    EXPECT_EQ(middle->ExpanderArrowRect(), BRect(28, 25, 37, 34));
    EXPECT_EQ(middle->ExpanderColumnRect(), BRect(20, 20, 40, 39));
    EXPECT_EQ(picture.pixel(31, 26), 0xFF000000); // pointing right
    EXPECT_EQ(picture.pixel(36, 26), Rgb(kColumnColors[0]));

    const auto click = [&](QPoint where) {
        QTest::mouseClick(w.view->viewport(), Qt::LeftButton, {}, where);
        static_cast<void>(w.RowsPicture()); // draws what the click has brought
    };
    click({32, 30});
    EXPECT_EQ(w.Shown(0), "tmen");
    EXPECT_EQ(w.list->CurrentSelection(), -1);
    click({60, 30}); // beside the arrow
    EXPECT_EQ(w.list->CurrentSelection(), 1);
    click({12, 9});
    EXPECT_EQ(w.Shown(0), "t");
    click({12, 9});
    EXPECT_EQ(w.Shown(0), "tmen");
}

#ifndef NDEBUG
TEST(Locking, IsAskedForByEveryChange) {
    PlainWindow w;
    EXPECT_DEATH(w.list->SetSortKey(1), "The looper must be locked.");
    EXPECT_DEATH(w.list->ColumnAt(1)->SetWidth(90), "The looper must be locked.");
    EXPECT_DEATH(w.list->RemoveItem(0), "The looper must be locked.");
}
#endif

} // namespace
