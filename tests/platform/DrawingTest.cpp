// Views: where they lie, and what their drawing calls leave on the picture.
#include <cmath>

#include <QApplication>
#include <QImage>
#include <QTest>
#include <QWidget>
#include <gtest/gtest.h>

#include "platform/Application.h"
#include "platform/View.h"
#include "platform/Window.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr rgb_color kRed{255, 0, 0, 255};
constexpr rgb_color kBlue{0, 0, 255, 255};

// A view that draws what a test says.
class Canvas : public BView {
  public:
    explicit Canvas(std::function<void(BView*)> draw)
        : BView(BRect(0, 0, 99, 99), "canvas", B_FOLLOW_ALL_SIDES, B_WILL_DRAW), draw_(std::move(draw)) {}
    void Draw(BRect) override { draw_(this); }

  private:
    std::function<void(BView*)> draw_;
};

struct Shown {
    BApplication application{"test"};

    explicit Shown(std::function<void(BView*)> draw)
        : window(new BWindow(BRect(0, 0, 99, 99), "picture", B_DOCUMENT_WINDOW, 0)),
          canvas(new Canvas(std::move(draw))) {
        window->AddChild(canvas);
        window->Show();
    }
    // On a screen with this many pixels to a logical one, each way.
    QImage Picture(double density = 1) const {
        QImage image((QSizeF(100, 100) * density).toSize(), QImage::Format_RGB32);
        image.setDevicePixelRatio(density);
        Toolkit()->render(&image);
        return image;
    }
    static QWidget* Toolkit() {
        for (QWidget* widget : QApplication::topLevelWidgets())
            if (widget->objectName() == QLatin1String("picture"))
                return widget;
        return nullptr;
    }

    BWindow* window;
    Canvas* canvas;
};

// That all these pixels have the colour.
void ExpectColor(QRgb color, const QImage& picture, std::initializer_list<QPoint> pixels) {
    ASSERT_FALSE(picture.isNull());
    for (const QPoint pixel : pixels)
        EXPECT_EQ(picture.pixel(pixel), 0xFF000000 | color) << "at " << pixel.x() << ", " << pixel.y();
}

constexpr QRgb kRedPixel = 0xFF0000;
constexpr QRgb kBluePixel = 0x0000FF;
constexpr QRgb kBlackPixel = 0x000000;
constexpr QRgb kWhitePixel = 0xFFFFFF;

} // namespace

TEST(Drawing, ShapesCoverTheirInclusiveRectangles) {
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
    const QImage picture = shown.Picture();
    ExpectColor(kRedPixel, picture, {{10, 10}, {19, 19}, {30, 10}, {39, 19}, {50, 10}, {59, 10}});
    ExpectColor(kWhitePixel, picture,
                {{20, 19}, {9, 10}, {31, 11}, {40, 10}, {60, 10}, {50, 11}, {85, 84}, {79, 80}});
    // The first quarter lies right of and above the centre.
    ExpectColor(kBluePixel, picture, {{58, 52}, {80, 80}, {84, 84}, {98, 0}});
    ExpectColor(kWhitePixel, picture, {{42, 52}, {58, 68}, {42, 68}});
}

TEST(Drawing, BitmapsKeepTheirTransparentPixels) {
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
    ExpectColor(kBlackPixel, shown.Picture(), {{10, 10}, {20, 10}});
    ExpectColor(kBluePixel, shown.Picture(), {{11, 10}});
    ExpectColor(kRedPixel, shown.Picture(), {{21, 10}});
}

TEST(Drawing, BitmapsStaySharpOnDenseScreens) {
    BBitmap bitmap(BRect(0, 0, 2, 0), B_CMAP8);
    const uint8 pixels[] = {0, B_TRANSPARENT_MAGIC_CMAP8, 0};
    bitmap.SetBits(pixels, 3, 0, B_CMAP8);
    const Shown shown([&](BView* view) {
        view->SetDrawingMode(B_OP_OVER);
        view->DrawBitmap(&bitmap, BPoint(10, 10));
    });
    const QImage dense = shown.Picture(2);
    ExpectColor(kBlackPixel, dense, {{20, 20}, {21, 21}, {24, 20}, {25, 21}});
    ExpectColor(kWhitePixel, dense, {{19, 20}, {22, 20}, {23, 21}, {26, 20}});
    // Between two whole densities only the pixels that two share are mixed: here there is one such at each
    // side of the middle.
    ExpectColor(kBlackPixel, shown.Picture(1.5), {{15, 15}, {18, 15}});
    ExpectColor(kWhitePixel, shown.Picture(1.5), {{14, 15}});
}

// The part of the picture that is not white.
QRect Inked(const QImage& picture) {
    QRegion found;
    for (int y = 0; y < picture.height(); ++y)
        for (int x = 0; x < picture.width(); ++x)
            if (picture.pixel(x, y) != (0xFF000000 | kWhitePixel))
                found += QRect(x, y, 1, 1);
    return found.boundingRect();
}

TEST(Drawing, TextKeepsToItsPlaceInARectangle) {
    constexpr uint8 centered = DrawTextCenter | DrawTextMiddle;
    int width = 0;
    const Shown shown([&](BView* view) {
        const BRect rooms[] = {{0, 0, 39, 39}, {60, 0, 99, 39}, {0, 60, 39, 99}, {60, 60, 99, 99}};
        view->SetFontSize(12);
        width = static_cast<int>(std::ceil(view->StringWidth("H")));
        DrawText(view, &rooms[0], "H", DrawTextLeft | DrawTextTop);
        DrawText(view, &rooms[1], "H", centered);
        DrawText(view, &rooms[2], "H", DrawTextRight | DrawTextBottom);
        DrawText(view, &rooms[3], "HHHHHHHHHHHHHHHH", centered);
    });
    const QImage picture = shown.Picture();
    const QRect leftTop = Inked(picture.copy(0, 0, 50, 50));
    const QRect center = Inked(picture.copy(60, 0, 40, 40));
    const QRect rightBottom = Inked(picture.copy(0, 60, 40, 40));
    EXPECT_TRUE(leftTop.left() <= 3 && leftTop.top() <= 6) << leftTop.left() << ", " << leftTop.top();
    EXPECT_NEAR(center.left() + center.right(), 39, 3);
    EXPECT_NEAR(center.top() + center.bottom(), 39, 5);
    EXPECT_EQ(rightBottom.left(), 39 - 2 - width + leftTop.left());
    EXPECT_TRUE(rightBottom.bottom() >= 33 && rightBottom.bottom() <= 37) << rightBottom.bottom();
    const QRect tooWide = Inked(picture.copy(50, 50, 50, 50)); // cut on the right only, and within its room
    EXPECT_EQ(tooWide.left() - 10, leftTop.left());
    EXPECT_GE(tooWide.right(), 47);
}

TEST(Drawing, BevelsAreLitFromTheLeftTop) {
    const Shown shown([](BView* view) {
        view->SetLowColor(kBlue);
        view->FillRectLow({0, 0, 99, 99});
        const BRect raised(5, 5, 44, 44);
        const BRect sunken(55, 5, 94, 44);
        ThreeDRectangle(view, &raised, 0);
        ThreeDRectangle(view, &sunken, 1);
        EXPECT_EQ(view->PenSize(), 1);
    });
    const QRgb dark = qRgb(colors::dark_gray.red, colors::dark_gray.green, colors::dark_gray.blue);
    ExpectColor(kWhitePixel, shown.Picture(), {{20, 5}, {5, 20}, {70, 44}, {94, 20}});
    ExpectColor(dark, shown.Picture(), {{20, 44}, {44, 20}, {70, 5}, {55, 20}});
    ExpectColor(kBluePixel, shown.Picture(), {{20, 20}, {20, 8}, {70, 41}});
    ExpectColor(kBluePixel, shown.Picture(), {{20, 3}, {20, 7}});
}

TEST(Views, FollowTheirParentsEdges) {
    const BApplication application("test");
    const std::pair<uint32, BRect> cases[] = {
        // and where the view is then
        {B_FOLLOW_LEFT | B_FOLLOW_TOP, {10, 10, 29, 29}},
        {B_FOLLOW_RIGHT | B_FOLLOW_BOTTOM, {50, 30, 69, 49}},
        {B_FOLLOW_ALL_SIDES, {10, 10, 69, 49}},
    };
    for (const auto& [mode, after] : cases) {
        auto* window = new BWindow(BRect(0, 0, 99, 99), "edges", B_DOCUMENT_WINDOW, 0);
        auto* view = new BView(BRect(10, 10, 29, 29), "", mode, 0);
        window->AddChild(view);
        window->ResizeTo(139, 119);
        EXPECT_EQ(view->Frame(), after) << std::hex << mode;
        window->Quit();
    }
}
