#pragma once

#include <array>
#include <cmath>
#include <optional>
#include <string>
#include <vector>

#include "charts/ChartGeometry.h"
#include "platform/View.h"

class BCheckBox;

// Sent to the window when the check box is clicked.
inline constexpr uint32 MessageToggleRates = 3001;

// What a portfolio's present value would grow to in 25 years at fixed yearly rates: one line for each of 5,
// 10 and 15 percent, and for 20 and 25 while the check box is ticked. It reads no file; the value given at
// construction is all it knows, and there is nothing to chart unless that is a number above 0. A line ends
// where its value is too large for a number. Interface thread.
class ValueChartView : public BView {
  public:
    enum class Controls { CheckBox, None };
    // Without the check box the chart is for a picture.
    ValueChartView(BRect frame, float currentValue, Controls controls = Controls::CheckBox);

    // Shows or hides the two highest rates, with the values' scale. The check box is left as it is: its click
    // has changed it already.
    void Toggle20And25Percent();
    [[nodiscard]] bool ShowsAllRates() const { return allRates_; }

    void Draw(BRect updateRect) override;
    void FrameResized(float width, float height) override;
    // Over the graph: shows year and value of the nearest curve. Left and Right go from year to year, Up and
    // Down from curve to curve.
    void MouseMoved(BPoint where, uint32 transit) override;
    bool KeyDown(char key) override;
    // What the value comes to at each rate, or the value that is shown.
    [[nodiscard]] std::string AccessibleDescription() const override;

  private:
    // A place on a curve.
    struct Point {
        std::size_t year = 0;
        std::size_t row = 0;
        bool operator==(const Point&) const = default;
    };

    void AddCheckBox();
    [[nodiscard]] bool HasChart() const;
    // A curve ends where a float ends.
    [[nodiscard]] bool IsDrawn(Point point) const { return std::isfinite(points_[point.row][point.year]); }
    [[nodiscard]] std::size_t RowsInUse() const;
    [[nodiscard]] BPoint PlaceOf(Point point) const;
    [[nodiscard]] Point NearestTo(BPoint where) const;
    [[nodiscard]] std::string PointText() const;
    void PointTo(std::optional<Point> point);
    void CalculateDataPoints();
    [[nodiscard]] float GetMaxValue() const;
    [[nodiscard]] std::vector<float> AxisValues() const;
    [[nodiscard]] float CalcXCoord(float years) const;
    [[nodiscard]] float CalcYCoord(float value) const;
    void DrawTitle();
    void DrawChart();
    void DrawYears();
    void DrawValues();
    void DrawGrowth();
    void DrawRates();
    void DrawLegend();
    void DrawPointedTo();

    std::array<GrowthRow, Percentages.size()> points_{};
    float maximum_ = 0;
    float currentValue_;
    int year_ = 0;
    GrowthRects rects_;
    bool allRates_ = true;
    std::optional<Point> pointed_; // what the person points to
};
