// The charts as they are drawn, read pixel by pixel and text by text, the window they stand in, and what they
// are made of: slices and lines.
#include "DataFolder.h"
#include "DrawnView.h"
#include "Driver.h"
#include "SystemFonts.h"

#include <cmath>
#include <limits>

#include <QClipboard>
#include <QDate>
#include <QPushButton>

#include "app/state/AppState.h"
#include "charts/ChartGeometry.h"
#include "charts/ChartWindow.h"
#include "charts/PieChartView.h"
#include "charts/ValueChartView.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

class Chart : public testing::Test {
  protected:
    // With as few labels as there are, again and again.
    Picture Show(const std::vector<float>& values, const std::vector<const char*>& labels,
                 BRect area = ChartArea()) {
        values_ = values;
        view_ = std::make_unique<PieChartView>(area);
        view_->SetTitle("Title");
        EXPECT_EQ(view_->SetData(values_.data(), static_cast<int>(values_.size())), 0);
        for (std::size_t i = 0; i < values.size(); ++i)
            EXPECT_EQ(view_->SetLegendLabel(static_cast<int>(i), labels[i % labels.size()]), 0);
        return Picture(*view_);
    }
    // The right bottom of a legend's colour box, inside its outline.
    [[nodiscard]] BPoint Box(int line) const {
        const float top = pieRects_.legend.top + static_cast<float>(line) * (lineHeight_ + 2);
        return {pieRects_.legend.left + lineHeight_ - 3, top + lineHeight_ - 3};
    }
    // Of the growth chart, so many years from now.
    static std::string At(int years, const std::string& rest) {
        return std::to_string(QDate::currentDate().year() + years) + rest;
    }

    // Points to a place or presses a key, whatever is given, and looks at what is told then.
    struct Step {
        BPoint place;
        char key;
        std::string told;
    };
    static void Follow(BView& view, const std::string& title, const std::vector<Step>& steps) {
        const std::string atRest = view.AccessibleDescription();
        for (const auto& [place, key, told] : steps) {
            EXPECT_TRUE(!key || view.KeyDown(key)) << told;
            if (!key)
                view.MouseMoved(place, B_INSIDE_VIEW);
            EXPECT_EQ(view.AccessibleDescription(), told.empty() ? atRest : (title + ": ").append(told));
            const Written note = TextsIn(view.Name()).back();
            const BPoint beside(static_cast<float>(note.box.left()) - 2, static_cast<float>(note.box.top()));
            EXPECT_TRUE(told.empty() || (note.text == told && note.size >= be_plain_font->Size() &&
                                         Picture(view).At(beside) == colors::light_gray))
                << note.text << note.size;
        }
        EXPECT_FALSE(view.KeyDown('x'));
        view.MouseMoved(steps[0].place, B_EXITED_VIEW);
        EXPECT_EQ(view.AccessibleDescription(), atRest);
    }

    BApplication application_{"test"};
    const BRect area_ = ChartArea();
    const float lineHeight_ = std::ceil(::GetFontHeight(be_plain_font));
    std::vector<float> values_; // which the view reads as long as it shows them
    std::unique_ptr<PieChartView> view_;
    const PieRects pieRects_ = LayOutPie(area_);
    const PieEllipse pie_ = EllipseIn(pieRects_.chart);
    const BRect graph_ = LayOutGrowth(area_, ::GetFontHeight(be_plain_font)).graph;
};

constexpr const char* ArabicName = "محفظة الأسهم";

std::string SlicesIn(const CHART_DATA_SET& set) {
    std::string slices;
    for (std::size_t i = 0; i < static_cast<std::size_t>(set.count); ++i)
        slices += set.labels[i].data() + (": " + std::to_string(std::lround(set.values[i]))) + ", ";
    return slices;
}

} // namespace

TEST_F(Chart, SlicesRunCounterClockwiseAndLegendLinesKeepStep) {
    const Picture picture = Show({1, 2, 1, 4}, {"First", "", "Third’s", "A label of thirty-one bytes, aaa"});
    const rgb_color boxes[] = {PieChartColors[0], colors::gray, PieChartColors[2], PieChartColors[3]};
    for (int i = 0; const float middle : {22.5F, 90.0F, 157.5F, 290.0F}) {
        EXPECT_EQ(picture.At(PointInPie(pie_, middle, 0.8F)), PieChartColors[static_cast<std::size_t>(i)]);
        EXPECT_EQ(picture.At(Box(i)), boxes[i]) << i;
        ++i;
    }
    EXPECT_EQ(picture.At(PointInPie(pie_, 270, 1) + BPoint(0, 3)), colors::dark_gray);
    EXPECT_EQ(picture.At(PointInPie(pie_, 90, 1) - BPoint(0, 4)), colors::gray);
    EXPECT_EQ(view_->AccessibleDescription(), "Title\nFirst: $1.00 12.50%\nThird’s: $1.00 12.50%\n"
                                              "A label of thirty-one bytes, aa: $4.00 50.00%");
    EXPECT_EQ(view_->SetLegendLabel(4, "too many"), 1);
}

TEST_F(Chart, NeighboursAreToldApartAndNoShadowShinesThrough) {
    // From the sixteenth slice on colours begin again: the last one here meets the first.
    const Picture picture = Show(std::vector<float>(17, 1), {""});
    EXPECT_EQ(picture.At(PointInPie(pie_, 350, 0.5F)), PieChartColors[0]);
    EXPECT_LT(picture.At(PointInPie(pie_, 0, 0.5F)).blue, PieChartColors[0].blue / 2);
    EXPECT_EQ(Show({1, 1}, {""}).At(PointInPie(pie_, 1, 0.5F)), PieChartColors[0]); // no line
    const rgb_color middle = Show(std::vector<float>(1000, 1), {"x"}).At(pie_.center);
    EXPECT_GT(middle.red + middle.green + middle.blue, 3 * 130);
    const int room = static_cast<int>((pieRects_.legend.Height() + 2) / (lineHeight_ + 2));
    EXPECT_TRUE(Texts(*view_).ends_with("|x: $1.00 0.10%|and " + std::to_string(1001 - room) + " more|"));
}

TEST_F(Chart, LegendTextsStayReadableOnThePie) {
    std::vector<float> values(12, 0);
    values[11] = 5e6F; // all of the pie
    const Picture picture = Show(values, {"A name long enough to lie on the pie"});
    const rgb_color veiled = picture.At({pie_.center.x - pie_.xRadius / 2, Box(8).y + 3}); // below a text
    EXPECT_TRUE(veiled.red > PieChartColors[11].red && veiled.red < colors::gray.red) << veiled.red;
    EXPECT_EQ(picture.At(PointInPie(pie_, 0, 0.9F)), PieChartColors[11]);
    Show(values, {"x"}, {0, 0, 60, 9}); // without room for a line
    EXPECT_TRUE(Texts(*view_).ends_with("and 12 more|"));
    Show({5}, {ArabicName});
    std::vector<Written> line = TextsIn(view_->Name());
    std::ranges::sort(line, {}, [](const Written& each) { return each.box.left(); });
    EXPECT_EQ(line[0].text + line[1].text, ArabicName + std::string(": $5.00 100.00%"));
}

TEST_F(Chart, SaysWhatIsNotDrawn) {
    for (const std::vector<float>& values :
         {std::vector<float>(), {0, 0}, {5, -5}, {1, std::nanf("")}, {1, HUGE_VALF}}) {
        EXPECT_EQ(Show(values, {"a"}).At(pie_.center + BPoint(0, 30)), colors::gray) << values.size();
        EXPECT_EQ(Texts(*view_), "Title|Nothing to Chart!|");
    }
    const Picture picture = Show({100, -50, 100}, {"Plus", "Minus", "More"});
    EXPECT_EQ(Texts(*view_), "Title|Plus: $100.00 66.67%|Minus: $-50.00 -33.33%|More: $100.00 66.67%|"
                             "Negative values are not drawn.|");
    EXPECT_EQ(picture.At(PointInPie(pie_, 175, 0.9F)), PieChartColors[0]);
    EXPECT_EQ(picture.At(PointInPie(pie_, 185, 0.9F)), PieChartColors[2]);
    EXPECT_EQ(Show({-1, -2}, {""}).At(PointInPie(pie_, 270, 1) + BPoint(0, 3)), colors::gray);
    for (const float total : {0.0F, -5.0F, std::nanf(""), HUGE_VALF}) {
        const ValueChartView view(area_, total, ValueChartView::Controls::None);
        EXPECT_EQ(Texts(view), "Value over Time|Nothing to Chart!|") << total;
    }
    const ValueChartView view(area_, 1e37F, ValueChartView::Controls::None);
    EXPECT_NE(Texts(view).find("|3.29e+38|5%|10%|15%|20%|25%|5%|"), std::string::npos) << Texts(view);
    EXPECT_TRUE(view.AccessibleDescription().ends_with("\n25%: too large for a number"));
}

TEST_F(Chart, NothingIsCutNorTouchesAnotherInAnyFont) {
    const std::string wide(31, 'W');
    const std::pair<std::size_t, float> cases[] = {{0, 0.001F},   {1, 166851.94F}, {17, 1e9F}, {33, 1e12F},
                                                   {1000, 9e28F}, {2, 1e30F},      {1, 3e38F}};
    for (const float size : {12.0F, 16.0F, 64.0F / 3, 80.0F / 3}) // 9, 12, 16 and 20 points
        for (const auto& [count, value] : cases) {
            SCOPED_TRACE(testing::Message() << count << " times " << value << ", " << size);
            const SystemFonts fonts(size);
            std::vector<float> values(count, value);
            values.resize(count > 1 ? count + 1 : count, -value / 2);
            Show(values, {"Acme", wide.c_str(), ArabicName, "投資信託基金"});
            ExpectReadable(TextsIn(view_->Name()), size * 0.59);
            const ValueChartView view(ChartArea(), value, ValueChartView::Controls::None);
            ExpectReadable(TextsIn(view.Name()), size * 0.59);
        }
}

TEST_F(Chart, ShowsWhatThePersonPointsTo) {
    Show({1, 1, 0, 2}, {"First", "", "Nothing", "Last"});
    const BPoint first = PointInPie(pie_, 45, 0.8F), above = PointInPie(pie_, 20, 1) - BPoint(2, 5);
    const std::string texts[] = {"First: $1.00 25.00%", "Nothing: $0.00 0.00%", "Last: $2.00 50.00%"};
    EXPECT_EQ(Picture(*view_).At(above), colors::gray);
    view_->MouseMoved(first, B_INSIDE_VIEW);
    EXPECT_EQ(Picture(*view_).At(above), PieChartColors[0]);
    EXPECT_LT(Picture(*view_).At(pie_.center + BPoint(20, -pie_.yRadius * 0.1F)).blue, 150); // its edge
    view_->MouseMoved(first, B_EXITED_VIEW);
    Follow(*view_, "Title",
           {{first, 0, texts[0]},
            {Box(2) + BPoint(30, 0), 0, texts[1]},
            {PointInPie(pie_, 45, 1.1F), 0, ""},
            {PointInPie(pie_, 135, 0.5F), 0, ""},
            {{}, B_LEFT_ARROW, texts[2]},
            {{}, B_RIGHT_ARROW, texts[2]},
            {{}, B_LEFT_ARROW, texts[1]},
            {{}, B_LEFT_ARROW, texts[0]},
            {PointInPie(pie_, 359, 0.9F), 0, texts[2]}});
    ValueChartView view(area_, 1000, ValueChartView::Controls::None);
    Follow(view, "Value over Time",
           {{{graph_.right - 1, graph_.top + 5}, 0, At(25, " at 25%: 264,698")},
            {{}, B_RIGHT_ARROW, At(25, " at 25%: 264,698")},
            {{graph_.left + graph_.Width() * 0.799F, graph_.bottom - 2}, 0, At(20, " at 5%: 2653")},
            {{}, B_LEFT_ARROW, At(19, " at 5%: 2527")},
            {{}, B_UP_ARROW, At(19, " at 10%: 6116")},
            {{}, B_DOWN_ARROW, At(19, " at 5%: 2527")},
            {{graph_.left - 5, graph_.top}, 0, ""},
            {{}, B_RIGHT_ARROW, At(0, " at 5%: 1000")}});
}

TEST_F(Chart, LinesRunFromTheCornerToTheirValues) {
    ValueChartView view(area_, 1000, ValueChartView::Controls::None);
    const BPoint top(graph_.right, graph_.top + 3);
    const BPoint fourth(graph_.right, graph_.bottom - 94'396.0F * graph_.Height() / 263'698);
    const Picture all(view);
    EXPECT_TRUE(all.Has(top, colors::magenta) && all.Has(fourth, colors::yellow));
    EXPECT_TRUE(all.Has({graph_.left + 4, graph_.bottom}, colors::magenta)); // the last one lies on top
    EXPECT_EQ(all.At({graph_.left + 10, graph_.top + 10}), (rgb_color{205, 168, 157, 255}));
    std::string axis = "Value over Time|";
    for (int step = 0; step <= 25; step += 5)
        axis += At(step, "|");
    EXPECT_EQ(Texts(view), axis + "1000|53,740|106,479|159,219|211,958|264,698|"
                                  "5%|10%|15%|20%|25%|5%|10%|15%|20%|25%|");
    const QRectF rate = TextsIn(view.Name())[17].box; // 25%, at its line's end
    EXPECT_TRUE(rate.left() > graph_.right && std::abs(rate.center().y() - graph_.top) < 2) << rate.top();
    view.Toggle20And25Percent();
    const Picture some(view);
    EXPECT_TRUE(some.Has(top, colors::blue) && !some.Has(fourth, colors::yellow));
    EXPECT_EQ(Texts(view), axis + "1000|7384|13,768|20,151|26,535|32,919|5%|10%|15%|5%|10%|15%|");
}

TEST(ChartWindow, IsWorkedByPointerKeysAndMenus) {
    const DataFolder folder;
    folder.AddInvestment(MakeInvestment("P/1", "Acme", 10, 10));
    folder.AddInvestment(MakeInvestment("Q", "Other", 10, 10));
    Driver driver;
    BApplication application("test");
    AppState state;
    state.investments = std::make_unique<DATABASE>(folder.File("invest.db").c_str());
    app_state = &state;
    auto* window = new ChartWindow(50, 50, "P/1");
    QWidget* widget = Driver::Window("Quorvan");
    BView* pie = window->FindView("pie chart view");
    BView* growth = window->FindView("value chart view");
    // Waits until one view alone is seen, and tells this of itself.
    const auto seen = [&](const char* first, const char* last, const StepDriver::Action& action) {
        const auto ready = [=] {
            std::string told;
            for (const char* view : {"pie chart view", "value chart view"})
                if (const auto* shown = widget->findChild<QWidget*>(view); shown->isVisible())
                    told += shown->accessibleDescription().toStdString(); // as it was painted
            return told.starts_with(first) && told.ends_with(last) && !QApplication::activePopupWidget();
        };
        driver.When(last, ready, action);
    };
    const auto choose = [widget](int chart) {
        return [=] { widget->findChild<QPushButton*>()->menu()->actions().at(chart)->trigger(); };
    };
    const auto press = [widget](BView* focus, Qt::Key key, Qt::KeyboardModifiers with = Qt::ControlModifier) {
        return [=] {
            widget->activateWindow(); // as window managers do when a menu or dialog closes
            EXPECT_TRUE(QTest::qWaitForWindowActive(widget));
            focus->MakeFocus();
            QTest::keyClick(widget->windowHandle(), key, with);
        };
    };
    const BPoint center = EllipseIn(LayOutPie(ChartArea()).chart).center;
    const QPoint inPie(static_cast<int>(center.x), static_cast<int>(center.y) + 20);

    const auto moveTo = [=](QPoint to) { return [=] { QTest::mouseMove(widget->windowHandle(), to); }; };
    seen("Value by Investment\n", "Acme: $100.00 100.00%", moveTo(inPie));
    seen("Value by Investment: Acme", "%", moveTo({20, 390}));
    seen("Value by Investment\n", "%", press(pie, Qt::Key_C));
    const auto copied = [] { return !QApplication::clipboard()->image().isNull(); };
    driver.When(
        "copied", copied,
        [=] {
            const QImage copy = QApplication::clipboard()->image();
            EXPECT_EQ(widget->grab().toImage().pixelColor(0, 0),
                      QColor(120, 120, 120)); // it has the keyboard
            EXPECT_EQ(copy.pixel(2 * inPie), Picture(*pie).pixel(inPie));
            QTest::mouseClick(widget->windowHandle(), Qt::RightButton, {}, inPie);
        });
    driver.When("the menu", Driver::OpenMenu, [] { Driver::ClickItem("Save picture..."); });
    driver.InDialog("save dialog", true, folder.File("new.gif"), "P-1, Value by Investment.png");
    driver.Answer("The name of the picture must end with .png, .svg or .pdf!", "Ok");
    seen("Value by Investment", "%", press(pie, Qt::Key_S));
    const std::string missing = folder.File("missing/new.png");
    driver.InDialog("save dialog", true, missing, "P-1, Value by Investment.png");
    driver.Answer("The picture could not be saved as " + missing + "!\nNo such file or directory", "Ok");
    seen("Value by Investment", "%", choose(6));
    seen("Shares by Investment\n", "\nAcme: 10.00 100.00%", choose(7));
    seen("Value over Time", "\n25%: 26,470", [=] { Driver::Press(widget, "last percentage check"); });
    seen("Value over Time", "\n15%: 3292", press(growth, Qt::Key_S));
    driver.InDialog("save dialog", true, folder.File("new.svg"), "P-1, Value over Time.png");
    const auto saved = [&] { return std::filesystem::exists(folder.File("new.svg")); };
    driver.When("saved", saved, press(growth, Qt::Key_Up, Qt::NoModifier));
    seen("Value over Time", " at 10%: 100", [] { be_app->PostMessage(B_QUIT_REQUESTED); });
    application.Run();
    app_state = nullptr;
    const std::string picture = folder.Read("new.svg");
    EXPECT_TRUE(picture.find("15%") != picture.npos && picture.find("20%") == picture.npos) << picture;
}

TEST(ChartDataSets, GroupByTheirKeysInTheOrderMet) {
    ChartDataSets sets;
    EXPECT_EQ(sets.GenerateDataSets(5), 0);
    const INVESTMENT_DATA all[] = {MakeInvestment("P", "Acme", 1, 10, "Stock Fund", "ABC", "MED"),
                                   MakeInvestment("P", "Birch", 2, 10, "STOCK", "abc", "Med"),
                                   MakeInvestment("P", "Acme", 4, 10, "Bond Fund", "ABC", "low"),
                                   MakeInvestment("P", "Cedar", 8, 10, "Cash", " ", "Medium"),
                                   MakeInvestment("P", "Dogwood", 16, 10, "", "", "")};
    for (int i = 0; INVESTMENT_DATA record : all) {
        record.Retire = i % 4 == 0;
        EXPECT_EQ(sets.AccumulateDataSet(i++, record), 0);
    }
    const char* expected[] = {"Acme: 10, Birch: 20, Acme: 40, Cedar: 80, Dogwood: 160, ",
                              "ABC: 50, abc: 20, ",
                              "Stock Fund: 10, STOCK: 20, Bond Fund: 40, Cash: 80, ",
                              "Fund: 50, Stock: 20, Other: 240, ",
                              "Low: 40, Med: 30, High: 0, ",
                              "Retirement: 170, Non-Retirement: 140, ",
                              "Acme: 5, Birch: 2, Cedar: 8, Dogwood: 16, "};
    for (std::uint32_t i = 0; i < std::size(expected); ++i)
        EXPECT_EQ(SlicesIn(sets.ForChart(FirstChart + i)), expected[i]) << Charts[i].title;
    EXPECT_EQ(&sets.ForChart(1), &sets.ForChart(FirstChart));
}

TEST(ChartDataSets, HaveTheirFixedSlicesAndKeepWithinTheirCapacity) {
    ChartDataSets sets;
    EXPECT_EQ(sets.GenerateDataSets(-1), 0); // a query that failed: room for three
    for (int i = 0; i < 10; ++i)
        sets.AccumulateDataSet(i, MakeInvestment("P", std::to_string(i), 1, 1, std::to_string(i)));
    for (const std::uint32_t chart : {2000, 2002, 2006})
        EXPECT_EQ(SlicesIn(sets.ForChart(chart)), "0: 1, 1: 1, 2: 1, ") << chart;
    EXPECT_EQ(SlicesIn(sets.ForChart(2005)), "Retirement: 0, Non-Retirement: 10, ");
    EXPECT_EQ(sets.GenerateDataSets(std::numeric_limits<long>::max()), 1);
}

TEST(ChartGeometry, SlicesTooNarrowToBeSeenAreOne) {
    EXPECT_LT(SlicesOf(std::vector<float>(100'000, 0.5F).data(), 100'000).size(), 4000U);
    const float values[] = {3e38F, 1, 0, -7, 3e38F, 1e-9F};
    const std::vector<PieSlice> slices = SlicesOf(values, 6);
    ASSERT_EQ(slices.size(), 2U);
    EXPECT_TRUE(slices[1].value == 4 && slices[1].start == 180 && slices[1].sweep == 180);
}

TEST(ChartGeometry, LegendLinesAndAxesKeepTheirNumbers) {
    const auto letters = [](const std::string& text) { return static_cast<float>(text.size()); };
    EXPECT_EQ(FittedLegendLine("Maple Timber", 5, 10, 2, 26, letters), "Maple Timber: $5.00 50.00%");
    EXPECT_EQ(FittedLegendLine("Maple Timber", 5, 10, 3, 24, letters), "Maple Ti...: 5.00 50.00%");
    EXPECT_EQ(FittedLegendLine("Maple Timber", 5, 10, 0, 8, letters), "Maple...");
    EXPECT_TRUE(LegendLine("Huge", -3e38F, 1e-45F, 2).ends_with(".00%"));
    EXPECT_FLOAT_EQ(PlaceOnAxis(1500, 1000, 2000, 300, 100), 200);
    EXPECT_FLOAT_EQ(PlaceOnAxis(0, 0, 0, 300, 100), 300); // without a length
    EXPECT_FLOAT_EQ(PlaceOnAxis(3.2e38F, 3e38F, 3.4e38F, 300, 100), 200);
}
