// The charts as they are drawn, read pixel by pixel and text by text, the window they stand in, and what they
// are made of: slices and lines.
#include "DataFolder.h"
#include "Driver.h"

#include <cmath>
#include <limits>

#include <QImage>
#include <QPushButton>

#include "app/state/AppState.h"
#include "charts/ChartDataSets.h"
#include "charts/ChartGeometry.h"
#include "charts/ChartWindow.h"
#include "charts/PieChartView.h"
#include "charts/ValueChartView.h"
#include "platform/ViewPicture.h"
#include "util/Dates.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

struct Picture : QImage {
    explicit Picture(BView& view) {
        loadFromData(QByteArray::fromStdString(DrawPicture(&view, PictureFormat::Png)));
    }
    [[nodiscard]] rgb_color At(float x, float y) const {
        const QColor color = pixelColor(static_cast<int>(x), static_cast<int>(y));
        const auto part = [](int value) { return static_cast<uint8>(value); };
        return {part(color.red()), part(color.green()), part(color.blue()), 255};
    }
    [[nodiscard]] bool Has(BRect part, rgb_color color) const {
        bool has = false;
        for (float y = part.top; y <= part.bottom; ++y)
            for (float x = part.left; x <= part.right; ++x)
                has |= At(x, y) == color;
        return has;
    }
};

// All that is written in the view, in the order it is drawn.
std::string Texts(BView& view) {
    const std::string svg = DrawPicture(&view, PictureFormat::Svg);
    std::string all;
    for (std::size_t end = svg.find("</text>"); end != svg.npos; end = svg.find("</text>", end + 1)) {
        const std::size_t begin = svg.rfind('>', end) + 1;
        all += svg.substr(begin, end - begin) + '|';
    }
    return all;
}

class Chart : public testing::Test {
  protected:
    Picture Show(const std::vector<float>& values, const std::vector<const char*>& labels) {
        values_ = values;
        view_.SetTitle("Title");
        EXPECT_EQ(view_.SetData(values_.data(), static_cast<int>(values_.size())), 0);
        for (std::size_t i = 0; i < labels.size(); ++i)
            EXPECT_EQ(view_.SetLegendLabel(static_cast<int>(i), labels[i]), 0);
        return Picture(view_);
    }
    // The colour box of a legend's line, without its outline.
    [[nodiscard]] BRect Box(int line) const {
        const float top = legend_.top + static_cast<float>(line) * (lineHeight_ + 2);
        return {legend_.left + 2, top + 2, legend_.left + lineHeight_ - 3, top + lineHeight_ - 3};
    }
    // Half-way between the pie's middle and its rim.
    [[nodiscard]] rgb_color AtAngle(const Picture& picture, double degrees) const {
        const double angle = degrees / 180 * M_PI;
        return picture.At(static_cast<float>(pie_.center.x + pie_.xRadius / 2 * std::cos(angle)),
                          static_cast<float>(pie_.center.y - pie_.yRadius / 2 * std::sin(angle)));
    }

    BApplication application_{"test"};
    const BRect area_ = ChartArea();
    const float lineHeight_ = std::ceil(::GetFontHeight(be_plain_font));
    std::vector<float> values_; // which the view reads as long as it shows them
    PieChartView view_{area_};
    const PieEllipse pie_ = EllipseIn(LayOutPie(area_).chart);
    const BRect legend_ = LayOutPie(area_).legend;
};

using Slices = std::vector<std::pair<std::string, float>>;

Slices SlicesIn(const CHART_DATA_SET& set) {
    Slices slices;
    for (std::size_t i = 0; i < static_cast<std::size_t>(set.count); ++i)
        slices.emplace_back(set.labels[i].data(), set.values[i]);
    return slices;
}

struct Held {
    std::string_view name, ticker, type, risk;
    int8 retire;
    float shares, value;
};

ChartDataSets SetsOf(const std::vector<Held>& all) {
    ChartDataSets sets;
    EXPECT_EQ(sets.GenerateDataSets(static_cast<long>(all.size())), 0);
    for (int index = 0; const Held& held : all) {
        INVESTMENT_DATA record = MakeInvestment("P", held.name, held.shares, 1, held.type);
        CopyTextZeroed(record.Ticker, held.ticker);
        CopyTextZeroed(record.Risk, held.risk);
        record.Retire = held.retire;
        record.Value = held.value;
        sets.AccumulateDataSet(index++, record);
    }
    return sets;
}

} // namespace

TEST_F(Chart, SlicesRunCounterClockwiseFromThreeOClock) {
    // The last one's sweep is out of the legend's way.
    const Picture picture = Show({1, 2, 1, 4}, {"", "", "", ""});
    for (std::size_t i = 0; const double middle : {22.5, 90.0, 157.5, 270.0})
        EXPECT_EQ(AtAngle(picture, middle), PieChartColors[i++]) << middle;
    EXPECT_EQ(picture.At(pie_.center.x, pie_.center.y + pie_.yRadius + 3), colors::dark_gray);
    EXPECT_EQ(picture.At(pie_.center.x, pie_.center.y - pie_.yRadius - 4), colors::gray);
    EXPECT_EQ(Texts(view_), "Title|");
}

TEST_F(Chart, LegendLinesKeepStepWithTheirSlices) {
    const Picture picture = Show({1, 1, 0, 1}, {"First", "", "Nothing", "A label of thirty-one bytes, aaa"});
    const rgb_color boxes[] = {PieChartColors[0], colors::gray, PieChartColors[2], PieChartColors[3]};
    for (int i = 0; i < 4; ++i)
        EXPECT_EQ(picture.At(Box(i).right, Box(i).bottom), boxes[i]) << i;
    EXPECT_EQ(view_.AccessibleDescription(), "Title\nFirst: $1.00 33.33%\nNothing: $0.00 0.00%\n"
                                             "A label of thirty-one bytes, aa: $1.00 33.33%");
    EXPECT_EQ(view_.SetLegendLabel(4, "too many"), 1);
}

TEST_F(Chart, ColorsBeginAgainAndALongLegendSaysWhatIsMissing) {
    const Picture picture = Show(std::vector<float>(60, 1), std::vector<const char*>(60, "x"));
    EXPECT_EQ(AtAngle(picture, 16.5 / 60 * 360), PieChartColors[0]);
    EXPECT_EQ(picture.At(Box(16).left, Box(16).top), PieChartColors[0]);
    const int room = static_cast<int>((legend_.Height() + 2) / (lineHeight_ + 2));
    EXPECT_TRUE(Texts(view_).ends_with("|x: $1.00 1.67%|and " + std::to_string(60 - room + 1) + " more|"));
}

TEST_F(Chart, LegendTextsStayReadableAndInTheView) {
    std::vector<float> values(12, 0);
    values[11] = 5e6F; // all of the pie
    std::vector<const char*> labels(12, "A name long enough to lie on the pie");
    labels[0] = "WWWWWWWWWWWWWWWWWWWWWWWWWWWWWWW";
    const Picture picture = Show(values, labels);
    for (const float y : {2.0F, 4.0F, 6.0F, 8.0F, 10.0F})
        EXPECT_EQ(picture.At(area_.right, Box(0).top + y), colors::gray) << "the percentage is cut off";
    // At the top of a line's text, which no letter reaches, and on the pie's free half.
    const rgb_color veiled = picture.At(pie_.center.x - pie_.xRadius / 2, Box(9).top - 2);
    EXPECT_GT(veiled.red, PieChartColors[11].red);
    EXPECT_LT(veiled.red, colors::gray.red);
    EXPECT_EQ(picture.At(pie_.center.x + pie_.xRadius * 0.9F, pie_.center.y), PieChartColors[11]);

    PieChartView tiny({0, 0, 60, 9}); // without room for a line
    tiny.SetData(values_.data(), 12);
    tiny.SetLegendLabel(0, "x");
    EXPECT_EQ(Texts(tiny), "and 12 more|");
}

TEST_F(Chart, SaysWhenThereIsNothingToChart) {
    for (const std::vector<float>& values : {std::vector<float>(), {0, 0}, {5, -5}, {1, std::nanf("")}}) {
        EXPECT_FALSE(Show(values, {}).Has(area_, PieChartColors[0])) << values.size();
        EXPECT_EQ(Texts(view_), "Title|Nothing to Chart!|");
    }
}

TEST_F(Chart, LinesRunFromTheCornerToTheirValues) {
    ValueChartView view(area_, 1000, ValueChartView::Controls::None);
    const auto [title, legend, frame, graph] = LayOutGrowth(area_, ::GetFontHeight(be_plain_font));
    const auto at = [](float x, float y) { return BRect(x - 3, y - 3, x + 2, y + 3); };
    const Picture all(view);
    EXPECT_TRUE(all.Has(at(graph.right, graph.top + 3), colors::magenta));
    EXPECT_TRUE(
        all.Has(at(graph.right, graph.bottom - 94'396.0F * graph.Height() / 263'698), colors::yellow));
    EXPECT_TRUE(all.Has(at(graph.left + 4, graph.bottom), colors::magenta)); // the last one lies on top
    // The last year, under its line's end.
    EXPECT_TRUE(all.Has({graph.right - 9, graph.bottom + 9, graph.right + 9, legend.top - 1}, colors::black));
    EXPECT_EQ(all.At(graph.left + 10, graph.top + 10), (rgb_color{205, 168, 157, 255}));
    // The legend's first text, between two boxes.
    const float text = legend.left + 30 + lineHeight_ + 3;
    EXPECT_TRUE(all.Has({text, legend.top, text + 15, legend.top + lineHeight_}, colors::black));
    int year = 0;
    GetDate(&year, nullptr, nullptr);
    std::string axis = "Value over Time|";
    for (int step = 0; step <= 25; step += 5)
        axis += std::to_string(year + step) + '|';
    EXPECT_EQ(Texts(view), axis + "1000|53,740|106,479|159,219|211,958|264,698|5%|10%|15%|20%|25%|");

    view.Toggle20And25Percent();
    const Picture some(view);
    EXPECT_FALSE(some.Has(area_, colors::magenta) || some.Has(area_, colors::yellow));
    EXPECT_TRUE(some.Has(at(graph.right, graph.top + 3), colors::blue));
    EXPECT_EQ(Texts(view), axis + "1000|7384|13,768|20,151|26,535|32,919|5%|10%|15%|");
}

TEST(ChartWindow, TheMenuAndTheCheckBoxChooseWhatIsShown) {
    const DataFolder folder;
    folder.AddInvestment(MakeInvestment("P", "Acme", 10, 10));
    folder.AddInvestment(MakeInvestment("Q", "Other", 10, 10));
    Driver driver;
    BApplication application("test");
    AppState state;
    state.investments = std::make_unique<DATABASE>(folder.File("invest.db").c_str());
    app_state = &state;
    const auto choose = [](const char* title) {
        return [title] {
            for (QAction* item : Driver::Window("Quorvan")->findChild<QPushButton*>()->menu()->actions())
                if (item->objectName() == title)
                    item->trigger();
        };
    };
    // Waits until one view alone is seen, and tells this of itself.
    const auto seen = [&](const char* first, const char* last, const StepDriver::Action& action) {
        const auto ready = [=] {
            std::string told;
            for (const char* name : {"pie chart view", "value chart view"})
                if (const BView* view = GetAppWindow(be_app, "Quorvan")->FindView(name); !view->IsHidden())
                    told += view->AccessibleDescription();
            return told.starts_with(first) && told.ends_with(last);
        };
        driver.When(last, ready, action);
    };
    seen("Value by Investment", "\nAcme: $100.00 100.00%", choose("Shares by Investment"));
    seen("Shares by Investment", "\nAcme: 10.00 100.00%", choose("Value over Time"));
    seen(
        "Value over Time", "\n25%: 26,470",
        [] { Driver::Press(Driver::Window("Quorvan"), "last percentage check"); });
    seen("Value over Time", "\n15%: 3292", [] { be_app->PostMessage(B_QUIT_REQUESTED); });
    new ChartWindow(50, 50, "P");
    EXPECT_EQ(Driver::Window("Quorvan")->windowModality(), Qt::ApplicationModal);
    application.Run();
    app_state = nullptr;
}

TEST(ChartDataSets, GroupByTheirKeysInTheOrderMet) {
    const ChartDataSets sets = SetsOf({{"Acme", "ABC", "Stock Fund", "MED", 1, 1, 10},
                                       {"Birch", "abc", "STOCK", "Med", 0, 2, 20},
                                       {"Acme", "ABC", "Bond Fund", "low", 0, 4, 40},
                                       {"Cedar", " ", "Cash", "Medium", 0, 8, 80},
                                       {"Dogwood", "", "", "", 1, 16, 160}});
    const Slices expected[] = {
        {{"Acme", 10}, {"Birch", 20}, {"Acme", 40}, {"Cedar", 80}, {"Dogwood", 160}},
        {{"ABC", 50}, {"abc", 20}},
        {{"Stock Fund", 10}, {"STOCK", 20}, {"Bond Fund", 40}, {"Cash", 80}},
        {{"Fund", 50}, {"Stock", 20}, {"Other", 240}},
        {{"Low", 40}, {"Med", 30}, {"High", 0}},
        {{"Retirement", 170}, {"Non-Retirement", 140}},
        {{"Acme", 5}, {"Birch", 2}, {"Cedar", 8}, {"Dogwood", 16}},
    };
    for (std::uint32_t i = 0; i < std::size(expected); ++i)
        EXPECT_EQ(SlicesIn(sets.ForChart(FirstChart + i)), expected[i]) << Charts[i].title;
    EXPECT_EQ(&sets.ForChart(1), &sets.ForChart(FirstChart));
}

TEST(ChartDataSets, HaveTheirFixedSlicesAndKeepWithinTheirCapacity) {
    ChartDataSets sets = SetsOf({{"Acme", "ABC", "Fund", "Med", 1, 1, 10}});
    for (int i = 1; i < 10; ++i)
        sets.AccumulateDataSet(i, MakeInvestment("P", std::to_string(i), 1, 1, std::to_string(i)));
    for (const std::uint32_t chart : {2000, 2002, 2006})
        EXPECT_EQ(sets.ForChart(chart).count, 3) << chart;
    EXPECT_EQ(SlicesIn(sets.ForChart(2005)), (Slices{{"Retirement", 10}, {"Non-Retirement", 9}}));
    EXPECT_EQ(sets.GenerateDataSets(-1), 0); // a query that failed
    EXPECT_EQ(SlicesIn(sets.ForChart(2002)), Slices{});
    EXPECT_EQ(SlicesIn(sets.ForChart(2005)), (Slices{{"Retirement", 0}, {"Non-Retirement", 0}}));
    EXPECT_EQ(sets.GenerateDataSets(std::numeric_limits<long>::max()), 1);
}

TEST(ChartGeometry, SlicesTakeTheirShareOfTheTurn) {
    const float values[] = {1, 0, 2, 1};
    std::string slices;
    for (const PieSlice& slice : SlicesOf(values, 4, 4))
        slices += std::to_string(slice.value) + ": " + std::to_string(std::lround(slice.start)) + " + " +
                  std::to_string(std::lround(slice.sweep)) + '\n';
    EXPECT_EQ(slices, "0: 0 + 90\n2: 90 + 180\n3: 270 + 90\n");
    const std::vector<float> many(100'000, 0.5F);
    EXPECT_LT(SlicesOf(many.data(), 100'000, 50'000).size(), 4000U);
    for (const float total : {0.0F, std::nanf(""), std::numeric_limits<float>::infinity()})
        EXPECT_TRUE(SlicesOf(values, 4, total).empty()) << total;
    const float mixed[] = {1e9F, -1e9F, 1};
    for (const PieSlice& slice : SlicesOf(mixed, 3, 1))
        EXPECT_LE(std::abs(slice.sweep), 360);
}

TEST(ChartGeometry, LegendLinesKeepTheirNumbersWhole) {
    const auto letters = [](const std::string& text) { return static_cast<float>(text.size()); };
    EXPECT_EQ(FittedLegendLine("Maple Timber", 5, 10, 2, 26, letters), "Maple Timber: $5.00 50.00%");
    EXPECT_EQ(FittedLegendLine("Maple Timber", 5, 10, 2, 25, letters), "Maple Ti...: $5.00 50.00%");
    EXPECT_EQ(FittedLegendLine("Maple Timber", 5, 10, 0, 8, letters), "Maple...");
    EXPECT_EQ(LegendLine("Huge", -3e38F, 3e38F, 2).substr(0, 14), "Huge: $-300000");
}

TEST(ChartGeometry, AnAxisWithoutALengthHasAllOnItsBegin) {
    EXPECT_FLOAT_EQ(PlaceOnAxis(1500, 1000, 2000, 300, 100), 200);
    EXPECT_FLOAT_EQ(PlaceOnAxis(0, 0, 0, 300, 100), 300);
    EXPECT_FLOAT_EQ(PlaceOnAxis(1, 0, std::numeric_limits<float>::infinity(), 300, 100), 300);
}
