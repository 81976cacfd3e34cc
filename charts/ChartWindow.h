#pragma once

#include <string>

#include "charts/ChartDataSets.h"
#include "platform/Window.h"

class DATABASE;
class PieChartView;
class ValueChartView;
enum class PictureFormat;

// The messages of the chart's context menu.
inline constexpr uint32 MessageCopyChart = 3002;
inline constexpr uint32 MessageSaveChart = 3003;

// The window that charts one portfolio: a chart, and below it the menu that chooses which. It reads the
// portfolio's investments once, when it is created; nothing that it does changes a file of the program. The
// chart's context menu copies it or saves it as a picture. The caller makes it
// with new, when the portfolio is worth more than nothing, and keeps no pointer: it shows itself and deletes
// itself when it is closed. While it is there the person can do nothing else in the program. Interface
// thread; app_state must be set.
class ChartWindow : public BWindow {
  public:
    // left and top are screen coordinates.
    ChartWindow(float left, float top, const char* portfolio);

    void MessageReceived(BMessage* message) override;

  private:
    // Returns 0, or 1 after telling the person that there is no memory. What could not be read is told too.
    int GenerateDataSets(const char* portfolio);
    void CreateGraphTypeMenu();
    void ShowChart(uint32 code);
    void SelectDataSet(bool invalidate);
    void CreatePictureMenu();
    [[nodiscard]] std::string Picture(PictureFormat format) const;
    void CopyChart();
    void SaveChart();

    const std::string portfolio_;
    ChartDataSets dataSets_;
    float currentValue_ = 0; // the sum of all investments' values
    uint32 currentChart_ = FirstChart;
    PieChartView* pieView_ = nullptr; // these belong to the window
    ValueChartView* valueView_ = nullptr;
    BView* topView_ = nullptr;
};

enum class ChartData { Read, NotRead, NoMemory };

// Reads the portfolio's investments into the data sets; the sum of their values goes to `total`. With NotRead
// some are missing in both.
[[nodiscard]] ChartData ReadChartData(DATABASE& investments, const char* portfolio, ChartDataSets& dataSets,
                                      float& total);

// The part of the window that a chart fills, from (0, 0) on.
[[nodiscard]] BRect ChartArea();

// Says to who does not see the chart whose it is.
void NameChart(BView& view, const char* portfolio);

// Gives the view title, values and labels of one of the pie charts.
void ShowDataSet(PieChartView& view, const ChartDataSets& dataSets, uint32 code);
