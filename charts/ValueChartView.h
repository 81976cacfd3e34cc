#pragma once

#include <array>
#include <string>

#include "charts/ChartGeometry.h"
#include "platform/View.h"

class BCheckBox;

// Sent to the window when the check box is clicked.
inline constexpr uint32 MessageToggleRates = 3001;

// What a portfolio's present value would grow to in 25 years at fixed yearly rates: one line for each of 5,
// 10 and 15 percent, and for 20 and 25 while the check box is ticked. It reads no file; the value given at
// construction is all it knows. Interface thread.
class ValueChartView : public BView {
  public:
    enum class Controls { CheckBox, None };
    // Without the check box the chart is for a picture.
    ValueChartView(BRect frame, float currentValue, Controls controls = Controls::CheckBox);

    // Shows or hides the two highest rates, with the values' scale. The check box is left as it is: its click
    // has changed it already.
    void Toggle20And25Percent();

    void Draw(BRect updateRect) override;
    void FrameResized(float width, float height) override;
    // What the value comes to at each rate.
    [[nodiscard]] std::string AccessibleDescription() const override;

  private:
    void AddCheckBox();
    [[nodiscard]] std::size_t RowsInUse() const;
    void CalculateDataPoints();
    [[nodiscard]] float GetMaxValue() const;
    [[nodiscard]] float CalcXCoord(float years) const;
    [[nodiscard]] float CalcYCoord(float value) const;
    void DrawTitle();
    void DrawChart();
    void DrawYears();
    void DrawValues();
    void DrawGrowth();
    void DrawLegend();

    std::array<GrowthRow, Percentages.size()> points_{};
    float maximum_ = 0;
    float currentValue_;
    int year_ = 0;
    GrowthRects rects_;
    bool allRates_ = true;
};
