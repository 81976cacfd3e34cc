#pragma once

#include <vector>

#include "charts/ChartDataSets.h"
#include "charts/ChartGeometry.h"
#include "platform/View.h"

// A slice's or legend line's colour; they are used in turn, and from the start again after the last.
inline constexpr std::array<rgb_color, 16> PieChartColors = {{
    {33, 163, 218, 255},
    {215, 164, 206, 255},
    {178, 117, 70, 255},
    {125, 240, 146, 255},
    {248, 151, 118, 255},
    {130, 144, 130, 255},
    {163, 125, 163, 255},
    {226, 64, 118, 255},
    {62, 138, 155, 255},
    {185, 144, 130, 255},
    {243, 183, 130, 255},
    {89, 113, 145, 255},
    {164, 136, 166, 255},
    {113, 187, 220, 255},
    {193, 163, 14, 255},
    {193, 100, 14, 255},
}};

// A titled pie chart with a legend of its slices. It knows nothing of investments and keeps no values: they
// are lent to it. Where there is nothing to chart it says so; of values below 0, which have no slice, too.
// The geometry is that of the view's first size. Interface thread.
class PieChartView : public BView {
  public:
    // Without data, and with 2 decimal places.
    explicit PieChartView(BRect frame);

    void SetTitle(const char* title);
    // Borrows `count` values, which must stay where they are until the next call or the view's end, and makes
    // room for as many labels, which the caller then sets. Draws nothing. Returns 0, or 1 without memory for
    // the labels; then there are none.
    int SetData(const float* values, int count);
    // 2: a legend of money; 3: of plain numbers; any other: of labels alone.
    void SetDecimalPlaces(int places);
    // Copies at most 31 bytes. Returns 0, or 1 when there is no such slice.
    int SetLegendLabel(int index, const char* label);

    void Draw(BRect updateRect) override;
    void FrameResized(float width, float height) override;
    // Over a slice or its line in the legend: lifts the slice and shows the whole line. Left and Right go
    // from one line to the next.
    void MouseMoved(BPoint where, uint32 transit) override;
    bool KeyDown(char key) override;
    // Title and legend lines, or the line that is shown.
    [[nodiscard]] std::string AccessibleDescription() const override;

  private:
    [[nodiscard]] bool HasChart() const;
    [[nodiscard]] bool HasLine(int index) const;
    // Empty for a slice without a label.
    [[nodiscard]] std::string LegendText(int index) const;
    // The rectangle of a line's text, as long as the legend is wide.
    [[nodiscard]] BRect LegendLineRect(int index) const;
    // How many slices have their line, with the rest told in one more.
    [[nodiscard]] int LinesShown() const;
    // The slice whose line or place in the pie this is; -1 for none.
    [[nodiscard]] int IndexAt(BPoint where) const;
    void PointTo(int index);
    void DrawTitle();
    void DrawChart();
    void DrawSlice(const PieEllipse& pie, const PieSlice& slice, float overlap);
    void DrawSeams(const PieEllipse& pie, const std::vector<PieSlice>& slices);
    void DrawLifted(const PieEllipse& pie, const PieSlice& slice);
    void DrawLegend();
    void DrawLegendBox(BRect box, int color);
    void DrawLegendText(BRect text, const std::string& line);
    void DrawPointedTo();
    void DrawEmptyMessage();

    std::string title_;
    const float* data_ = nullptr;
    int count_ = 0;
    std::vector<ChartLabel> labels_;
    float total_ = 0;
    bool hasNegative_ = false;
    int pointed_ = -1; // the slice that the person points to
    int decimalPlaces_ = 2;
    PieRects rects_;
};
