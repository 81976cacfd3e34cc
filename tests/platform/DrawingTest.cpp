// Views: where they lie, and what their drawing calls leave on the picture.
#include <QApplication>
#include <QImage>
#include <QTest>
#include <QWidget>
#include <gtest/gtest.h>

#include "platform/Application.h"
#include "platform/View.h"
#include "platform/Window.h"

namespace {

constexpr rgb_color kRed{255, 0, 0, 255};
constexpr rgb_color kBlue{0, 0, 255, 255};

// A view that draws what a test says.
class Canvas : public BView {
  public:
    explicit Canvas(std::function<void(BView*)> draw)
        : BView(BRect(0, 0, 99, 99), "canvas", B_FOLLOW_ALL_SIDES, B_WILL_DRAW), draw_(std::move(draw)) {}
    void Draw(BRect) override {
        draws++;
        draw_(this);
    }

    int draws = 0;

  private:
    std::function<void(BView*)> draw_;
};

struct Shown {
    explicit Shown(std::function<void(BView*)> draw)
        : window(new BWindow(BRect(0, 0, 99, 99), "picture", B_TITLED_WINDOW, 0)),
          canvas(new Canvas(std::move(draw))) {
        window->AddChild(canvas);
        window->Show();
    }
    // On a screen with this many pixels to a logical one, each way.
    QImage Picture(double density = 1) const {
        QImage image((QSizeF(100, 100) * density).toSize(), QImage::Format_RGB32);
        image.setDevicePixelRatio(density);
        for (QWidget* widget : QApplication::topLevelWidgets())
            if (widget->objectName() == QLatin1String("picture"))
                widget->render(&image);
        return image;
    }

    BWindow* window;
    Canvas* canvas;
};

// Compares single pixels; each line of the table is one place and the colour expected there.
struct Pixel {
    int x, y;
    QRgb color;
};
void ExpectPixels(const QImage& picture, std::initializer_list<Pixel> pixels) {
    ASSERT_FALSE(picture.isNull());
    for (const Pixel& pixel : pixels)
        EXPECT_EQ(picture.pixel(pixel.x, pixel.y) & 0xFFFFFF, pixel.color)
            << "at " << pixel.x << ", " << pixel.y << std::hex << " found "
            << picture.pixel(pixel.x, pixel.y);
}

} // namespace

TEST(Drawing, ShapesCoverTheirInclusiveRectangles) {
    BApplication application("test");
    const Shown shown([](BView* view) {
        view->SetHighColor(kRed);
        view->FillRect({10, 10, 19, 19});
        view->StrokeRect({30, 10, 39, 19});
        view->StrokeLine({50, 10}, {59, 10});
        view->SetHighColor(kBlue);
        view->FillArc({50, 60}, 20, 20, 0, 90);
        const BRegion region(BRect(80, 80, 84, 84));
        view->ConstrainClippingRegion(&region);
        view->FillRect({70, 70, 99, 99});
        view->ConstrainClippingRegion(nullptr);
        view->FillRect({98, 0, 99, 1});
    });
    ExpectPixels(shown.Picture(), {{10, 10, 0xFF0000},
                                   {19, 19, 0xFF0000},
                                   {20, 19, 0xFFFFFF},
                                   {9, 10, 0xFFFFFF},
                                   {30, 10, 0xFF0000},
                                   {39, 19, 0xFF0000},
                                   {31, 11, 0xFFFFFF},
                                   {40, 10, 0xFFFFFF},
                                   {50, 10, 0xFF0000},
                                   {59, 10, 0xFF0000},
                                   {60, 10, 0xFFFFFF},
                                   {50, 11, 0xFFFFFF},
                                   // the first quarter lies right of and above the centre
                                   {58, 52, 0x0000FF},
                                   {42, 52, 0xFFFFFF},
                                   {58, 68, 0xFFFFFF},
                                   {42, 68, 0xFFFFFF},
                                   {80, 80, 0x0000FF},
                                   {84, 84, 0x0000FF},
                                   {85, 84, 0xFFFFFF},
                                   {79, 80, 0xFFFFFF},
                                   {98, 0, 0x0000FF}});
}

TEST(Drawing, BitmapsKeepTheirTransparentPixels) {
    BApplication application("test");
    BBitmap bitmap(BRect(0, 0, 1, 0), B_CMAP8);
    const uint8 pixels[] = {0, B_TRANSPARENT_MAGIC_CMAP8};
    bitmap.SetBits(pixels, 2, 0, B_CMAP8);
    bitmap.SetBits(pixels, 2, 1, B_CMAP8); // beyond the end: left out but for the first byte
    bitmap.SetBits(pixels + 1, 1, 1, B_CMAP8);
    const Shown shown([&](BView* view) {
        view->SetLowColor(kBlue);
        view->FillRectLow({0, 0, 99, 99});
        view->SetDrawingMode(B_OP_OVER);
        view->DrawBitmap(&bitmap, BPoint(10, 10));
        view->SetDrawingMode(B_OP_COPY);
        view->SetLowColor(kRed);
        view->DrawBitmap(&bitmap, BPoint(20, 10));
    });
    ExpectPixels(shown.Picture(),
                 {{10, 10, 0x000000}, {11, 10, 0x0000FF}, {20, 10, 0x000000}, {21, 10, 0xFF0000}});
}

TEST(Drawing, BitmapsStaySharpOnDenseScreens) {
    BApplication application("test");
    BBitmap bitmap(BRect(0, 0, 2, 0), B_CMAP8);
    const uint8 pixels[] = {0, B_TRANSPARENT_MAGIC_CMAP8, 0};
    bitmap.SetBits(pixels, 3, 0, B_CMAP8);
    const Shown shown([&](BView* view) {
        view->SetDrawingMode(B_OP_OVER);
        view->DrawBitmap(&bitmap, BPoint(10, 10));
    });
    ExpectPixels(shown.Picture(2), {{19, 20, 0xFFFFFF},
                                    {20, 20, 0x000000},
                                    {21, 21, 0x000000},
                                    {22, 20, 0xFFFFFF},
                                    {23, 21, 0xFFFFFF},
                                    {24, 20, 0x000000},
                                    {25, 21, 0x000000},
                                    {26, 20, 0xFFFFFF}});
    // Between two whole densities only the pixels that two share are mixed: here there is one such at each
    // side of the middle.
    ExpectPixels(shown.Picture(1.5), {{15, 15, 0x000000}, {18, 15, 0x000000}, {14, 15, 0xFFFFFF}});
}

TEST(Drawing, OutsideAPaintPassItOnlyAsksForOne) {
    BApplication application("test");
    const Shown shown([](BView* view) { view->FillRect({0, 0, 9, 9}); });
    ASSERT_TRUE(QTest::qWaitFor([&] { return shown.canvas->draws > 0; }));
    QCoreApplication::processEvents();
    const int before = shown.canvas->draws;
    shown.canvas->FillRect({50, 50, 59, 59});
    EXPECT_EQ(shown.canvas->draws, before);
    ASSERT_TRUE(QTest::qWaitFor([&] { return shown.canvas->draws > before; }));
    ExpectPixels(shown.Picture(), {{5, 5, 0x000000}, {55, 55, 0xFFFFFF}});
}

TEST(Views, FollowTheirParentsEdges) {
    BApplication application("test");
    auto* window = new BWindow(BRect(0, 0, 99, 99), "edges", B_TITLED_WINDOW, 0);
    struct Case {
        uint32 mode;
        BRect after; // of (10, 10, 29, 29) when the window grows by 40 and 20
    };
    const Case cases[] = {
        {B_FOLLOW_LEFT | B_FOLLOW_TOP, {10, 10, 29, 29}},
        {B_FOLLOW_RIGHT | B_FOLLOW_BOTTOM, {50, 30, 69, 49}},
        {B_FOLLOW_ALL_SIDES, {10, 10, 69, 49}},
        {B_FOLLOW_LEFT_RIGHT | B_FOLLOW_TOP, {10, 10, 69, 29}},
        {B_FOLLOW_LEFT | B_FOLLOW_BOTTOM, {10, 30, 29, 49}},
        {B_FOLLOW_H_CENTER | B_FOLLOW_V_CENTER, {30, 20, 49, 39}},
    };
    std::vector<BView*> views;
    for (const Case& row : cases) {
        views.push_back(new BView(BRect(10, 10, 29, 29), "", row.mode, 0));
        window->AddChild(views.back());
    }
    window->ResizeBy(40, 20);
    for (std::size_t i = 0; i < views.size(); i++)
        EXPECT_EQ(views[i]->Frame(), cases[i].after) << "row " << i;
    window->Quit();
}

TEST(Views, PressesComeAsMessagesWithTheirDetails) {
    BApplication application("test");
    class Pressed : public BView {
      public:
        Pressed() : BView(BRect(10, 10, 59, 59), "pressed", B_FOLLOW_NONE, B_WILL_DRAW) {}
        void MouseDown(BPoint where) override {
            place = where;
            Window()->CurrentMessage()->FindInt32("modifiers", &keys);
            GetMouse(&place2, &buttons);
        }
        BPoint place, place2;
        int32 keys = 0;
        uint32 buttons = 0;
    };
    const Shown shown([](BView*) {});
    auto* view = new Pressed;
    shown.canvas->AddChild(view);
    QWidget* widget = nullptr;
    for (QWidget* candidate : QApplication::allWidgets())
        if (candidate->objectName() == QLatin1String("pressed"))
            widget = candidate;
    ASSERT_NE(widget, nullptr);
    QTest::mousePress(widget, Qt::LeftButton, Qt::ShiftModifier, QPoint(5, 7));
    ASSERT_TRUE(QTest::qWaitFor([&] { return view->place == BPoint(5, 7); }));
    EXPECT_EQ(view->keys, static_cast<int32>(B_SHIFT_KEY));
    EXPECT_EQ(view->buttons, B_PRIMARY_MOUSE_BUTTON);
    QTest::mouseMove(widget, QPoint(30, 31));
    QTest::mouseRelease(widget, Qt::LeftButton, Qt::NoModifier, QPoint(30, 31));
    BPoint where;
    uint32 buttons = 9;
    view->GetMouse(&where, &buttons);
    EXPECT_EQ(where, BPoint(30, 31));
    EXPECT_EQ(buttons, 0U);
}
