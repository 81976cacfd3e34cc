// The charts as they are drawn, read pixel by pixel, and the window they stand in.
#include "DataFolder.h"
#include "Driver.h"

#include <cmath>

#include <QCheckBox>
#include <QImage>
#include <QMenu>
#include <QPushButton>

#include "app/AppState.h"
#include "charts/ChartWindow.h"
#include "charts/PieChartView.h"
#include "charts/ValueChartView.h"
#include "platform/CheckBox.h"
#include "platform/ViewPicture.h"
#include "util/InterfaceHelpers.h"

namespace {

const BRect Area(0, 0, 350, 370);

class Picture {
  public:
    explicit Picture(BView& view, float scale = 1) : scale_(scale) {
        const std::string bytes = DrawPicture(&view, PictureFormat::Png, scale);
        image_.loadFromData(reinterpret_cast<const uchar*>(bytes.data()), static_cast<int>(bytes.size()));
        EXPECT_FALSE(image_.isNull());
    }
    [[nodiscard]] rgb_color At(float x, float y) const {
        const QColor color = image_.pixelColor(static_cast<int>(x * scale_), static_cast<int>(y * scale_));
        return {static_cast<uint8>(color.red()), static_cast<uint8>(color.green()),
                static_cast<uint8>(color.blue()), 255};
    }
    // Half-way between the pie's middle and its rim.
    [[nodiscard]] rgb_color AtAngle(double degrees) const {
        const PieEllipse pie = EllipseIn(LayOutPie(Area).chart);
        const double angle = degrees / 180 * M_PI;
        return At(static_cast<float>(pie.center.x + pie.xRadius / 2 * std::cos(angle)),
                  static_cast<float>(pie.center.y - pie.yRadius / 2 * std::sin(angle)));
    }
    [[nodiscard]] bool Has(BRect part, rgb_color color) const {
        for (int y = 0; static_cast<float>(y) <= part.Height(); ++y) {
            for (int x = 0; static_cast<float>(x) <= part.Width(); ++x) {
                if (At(part.left + static_cast<float>(x), part.top + static_cast<float>(y)) == color)
                    return true;
            }
        }
        return false;
    }
    [[nodiscard]] int Width() const { return image_.width(); }

  private:
    QImage image_;
    float scale_;
};

// The colour box of a legend's line, without its outline.
BRect LegendBox(int line) {
    const float height = std::ceil(::GetFontHeight(be_plain_font));
    const BRect legend = LayOutPie(Area).legend;
    const float top = legend.top + static_cast<float>(line) * (height + 2);
    return {legend.left + 2, top + 2, legend.left + height - 3, top + height - 3};
}

rgb_color SliceColor(std::size_t index) {
    return PieChartColors[index % PieChartColors.size()];
}

class PieChart : public testing::Test {
  protected:
    Picture Show(const std::vector<float>& values, const std::vector<const char*>& labels, float scale = 1) {
        return Show(view_, values, labels, scale);
    }
    Picture Show(PieChartView& view, const std::vector<float>& values, const std::vector<const char*>& labels,
                 float scale = 1) {
        values_ = values;
        view.SetTitle("Title");
        EXPECT_EQ(view.SetData(values_.data(), static_cast<int>(values_.size())), 0);
        for (std::size_t i = 0; i < labels.size(); ++i)
            EXPECT_EQ(view.SetLegendLabel(static_cast<int>(i), labels[i]), 0);
        return Picture(view, scale);
    }

    std::vector<float> values_; // which the view reads as long as it shows them
    BApplication application_{"test"};
    PieChartView view_{Area};
    const PieEllipse pie_ = EllipseIn(LayOutPie(Area).chart);
};

class GrowthChart : public testing::Test {
  protected:
    BApplication application_{"test"};
    const BRect graph_ = LayOutGrowth(Area, ::GetFontHeight(be_plain_font)).graph;
};

} // namespace

TEST_F(PieChart, SlicesRunCounterClockwiseFromThreeOClock) {
    for (const float scale : {1.0F, 2.0F}) {
        // The last one's sweep is out of the legend's way.
        const Picture picture = Show({1, 2, 1, 4}, {"", "", "", ""}, scale);
        EXPECT_EQ(picture.Width(), static_cast<int>(scale) * Picture(view_).Width());
        const double middles[] = {22.5, 90, 157.5, 270};
        for (std::size_t i = 0; i < std::size(middles); ++i)
            EXPECT_EQ(picture.AtAngle(middles[i]), SliceColor(i)) << i;
        EXPECT_EQ(picture.At(pie_.center.x, pie_.center.y + pie_.yRadius + 3), colors::dark_gray);
        EXPECT_EQ(picture.At(pie_.center.x, pie_.center.y - pie_.yRadius - 4), colors::gray);
        EXPECT_TRUE(picture.Has(LayOutPie(Area).title, colors::black));
    }
}

TEST_F(PieChart, LegendLinesKeepStepWithTheirSlices) {
    const Picture picture = Show({1, 1, 0, 1}, {"First", "", "Nothing", "A label of thirty-one bytes, aaa"});
    const rgb_color boxes[] = {SliceColor(0), colors::gray, SliceColor(2), SliceColor(3)};
    for (int i = 0; i < 4; ++i) {
        const BRect box = LegendBox(i);
        EXPECT_EQ(picture.At(box.left, box.top), boxes[i]) << i;
        EXPECT_EQ(picture.At(box.right, box.bottom), boxes[i]) << i;
    }
    EXPECT_EQ(view_.AccessibleDescription(), "Title\nFirst: $1.00 33.33%\nNothing: $0.00 0.00%\n"
                                             "A label of thirty-one bytes, aa: $1.00 33.33%");
    EXPECT_EQ(view_.SetLegendLabel(4, "too many"), 1);
    EXPECT_EQ(view_.SetLegendLabel(-1, "none"), 1);
}

TEST_F(PieChart, ColorsBeginAgainAndALongLegendSaysWhatIsMissing) {
    const Picture picture = Show(std::vector<float>(17, 1), std::vector<const char*>(17, "x"));
    EXPECT_EQ(picture.AtAngle(16.5 / 17 * 360), SliceColor(0));
    const BRect last = LegendBox(16);
    EXPECT_EQ(picture.At(last.left, last.top), SliceColor(0));

    const Picture full = Show(std::vector<float>(60, 1), std::vector<const char*>(60, "x"));
    const float step = LegendBox(1).top - LegendBox(0).top;
    const int room = static_cast<int>((LayOutPie(Area).legend.Height() + 2) / step);
    EXPECT_EQ(full.At(LegendBox(room - 2).left, LegendBox(room - 2).top), SliceColor(room - 2));
    EXPECT_EQ(full.At(LegendBox(room - 1).left, LegendBox(room - 1).top), colors::gray);
    BRect note = LegendBox(room - 1); // "and 42 more" in place of the box's line
    note.OffsetBy(25, 0);
    note.right += 60;
    EXPECT_TRUE(full.Has(note, colors::black));
}

TEST_F(PieChart, LegendTextsStayReadableAndInTheView) {
    std::vector<float> values(12, 0);
    values[11] = 5e6F; // all of the pie
    std::vector<const char*> labels(12, "A name long enough to lie on the pie");
    labels[0] = "WWWWWWWWWWWWWWWWWWWWWWWWWWWWWWW";
    const Picture picture = Show(values, labels);
    const BRect first = LegendBox(0);
    for (const float y : {2.0F, 4.0F, 6.0F, 8.0F, 10.0F})
        EXPECT_EQ(picture.At(Area.right, first.top + y), colors::gray) << "the percentage is cut off";
    // At the top of a line's text, which no letter reaches, and on the pie's free half.
    const rgb_color veiled = picture.At(pie_.center.x - pie_.xRadius / 2, LegendBox(9).top - 2);
    EXPECT_GT(veiled.red, SliceColor(11).red);
    EXPECT_LT(veiled.red, colors::gray.red);
    EXPECT_EQ(picture.At(pie_.center.x + pie_.xRadius * 0.9F, pie_.center.y), SliceColor(11));

    PieChartView tiny({0, 0, 60, 9}); // without room for a line
    EXPECT_FALSE(Show(tiny, values, labels).Has({0, 0, 60, 9}, SliceColor(0)));
}

TEST_F(PieChart, SaysWhenThereIsNothingToChart) {
    for (const std::vector<float>& values :
         std::vector<std::vector<float>>{{}, {0, 0, 0}, {5, -5, 0}, {1, std::nanf(""), 2}}) {
        const Picture picture = Show(values, {});
        EXPECT_TRUE(picture.Has({100, 170, 250, 200}, colors::black)) << values.size();
        EXPECT_FALSE(picture.Has(LegendBox(0), SliceColor(0))) << values.size();
    }
}

TEST_F(GrowthChart, LinesRunFromTheCornerToTheirValues) {
    ValueChartView view(Area, 1000);
    const auto at = [&](float x, float y) { return BRect(x - 3, y - 3, x + 2, y + 3); };
    const auto end = [&](float value, float maximum) {
        return graph_.bottom - (value - 1000) * graph_.Height() / (maximum - 1000);
    };
    const Picture all(view);
    EXPECT_TRUE(all.Has(at(graph_.right, graph_.top + 3), colors::magenta));
    EXPECT_TRUE(all.Has(at(graph_.right, end(95'396, 264'698)), colors::yellow));
    EXPECT_TRUE(all.Has(at(graph_.left + 4, graph_.bottom), colors::magenta)); // the last one lies on top
    EXPECT_EQ(all.At(graph_.left + 10, graph_.top + 10), (rgb_color{205, 168, 157, 255}));

    view.Toggle20And25Percent();
    const Picture some(view);
    EXPECT_FALSE(some.Has(Area, colors::magenta));
    EXPECT_FALSE(some.Has(Area, colors::yellow));
    EXPECT_TRUE(some.Has(at(graph_.right, graph_.top + 3), colors::blue));
    EXPECT_TRUE(some.Has(at(graph_.right, end(10'835, 32'919)), colors::green));
    view.Toggle20And25Percent();
    EXPECT_TRUE(Picture(view).Has(Area, colors::magenta));
}

TEST_F(GrowthChart, DrawsWithoutGrowth) {
    for (const float value : {0.0F, -100.0F, 3e38F, std::nanf("")}) {
        ValueChartView view(Area, value);
        EXPECT_TRUE(Picture(view).Has(graph_, {205, 168, 157, 255})) << value;
    }
}

TEST(ChartWindow, TheMenuAndTheCheckBoxChooseWhatIsShown) {
    DataFolder folder;
    folder.AddInvestment(MakeInvestment("P", "Acme", 10, 10));
    folder.AddInvestment(MakeInvestment("Q", "Other", 10, 10));
    Driver driver;
    BApplication application("test");
    AppState state;
    state.investments = std::make_unique<DATABASE>(folder.File("invest.db").c_str());
    app_state = &state;
    const auto choose = [&](const char* title) {
        driver.When("menu", Driver::WindowShown("Quorvan"), [] {
            for (auto* button : Driver::Window("Quorvan")->findChildren<QPushButton*>()) {
                if (button->menu())
                    QTest::mouseClick(button, Qt::LeftButton);
            }
        });
        driver.When(
            title, [] { return QApplication::activePopupWidget() != nullptr; },
            [title] {
                auto* menu = qobject_cast<QMenu*>(QApplication::activePopupWidget());
                for (QAction* item : menu->actions()) {
                    if (item->objectName() == title)
                        QTest::mouseClick(menu, Qt::LeftButton, {}, menu->actionGeometry(item).center());
                }
            });
    };
    const auto view = [](const char* name) { return GetAppWindow(be_app, "Quorvan")->FindView(name); };
    const auto pie = [view] { return view("pie chart view")->AccessibleDescription(); };
    driver.When("first", Driver::WindowShown("Quorvan"), [&] {
        EXPECT_EQ(pie(), "Value by Investment\nAcme: $100.00 100.00%");
        EXPECT_TRUE(view("value chart view")->IsHidden());
        EXPECT_EQ(Driver::Window("Quorvan")->windowModality(), Qt::ApplicationModal);
        QWidget other; // the person works nowhere else meanwhile
        QPushButton elsewhere(&other);
        int clicks = 0;
        QObject::connect(&elsewhere, &QPushButton::clicked, [&clicks] { ++clicks; });
        other.show();
        QTest::mouseClick(other.windowHandle(), Qt::LeftButton, {}, elsewhere.geometry().center());
        EXPECT_EQ(clicks, 0);
    });
    choose("Shares by Investment");
    driver.When(
        "shares", [&] { return pie() == "Shares by Investment\nAcme: 10.00 100.00%"; }, [] {});
    choose("Value over Time");
    driver.When(
        "growth", [&] { return !view("value chart view")->IsHidden(); },
        [&] {
            EXPECT_TRUE(view("pie chart view")->IsHidden());
            QTest::mouseClick(Driver::Window("Quorvan")->findChild<QCheckBox*>(), Qt::LeftButton, {}, {6, 6});
        });
    driver.When(
        "without 25%",
        [&] { return view("value chart view")->AccessibleDescription().find("25%") == std::string::npos; },
        [] { Driver::Window("Quorvan")->close(); });
    driver.When(
        "closed", [] { return !GetAppWindow(be_app, "Quorvan"); },
        [] { be_app->PostMessage(B_QUIT_REQUESTED); });
    new ChartWindow(50, 50, "P");
    application.Run();
    app_state = nullptr;
}
