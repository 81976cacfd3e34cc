#include "charts/ChartWindow.h"

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <string>

#include "app/model/PortfolioRules.h"
#include "app/state/AppState.h"
#include "charts/ChartPicture.h"
#include "charts/PieChartView.h"
#include "charts/ValueChartView.h"
#include "platform/FilePanel.h"
#include "platform/MenuField.h"
#include "platform/MenuItem.h"
#include "util/File.h"
#include "util/Strings.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr float Width = 350;
constexpr float Height = 400;
constexpr float UsualFontHeight = 17; // above it the window grows with the person's font
constexpr float MenuLeft = 10;

BRect FrameAt(float left, float top) {
    const float scale = std::max(1.0F, ::GetFontHeight(be_plain_font) / UsualFontHeight);
    return {left, top, left + std::ceil(Width * scale), top + std::ceil(Height * scale)};
}

// No larger than its screen has room for.
BRect FrameOnScreen(float left, float top) {
    BRect frame = FrameAt(left, top);
    const BRect room = BWindow::RoomAt(frame.LeftTop());
    frame.right = std::min(frame.right, left + room.Width());
    frame.bottom = std::min(frame.bottom, top + room.Height());
    return frame;
}

// What the menu at the window's bottom leaves.
BRect AboveMenu(BRect window) {
    window.bottom -= 2 * ::GetFontHeight(be_plain_font);
    return window;
}

} // namespace

ChartData ReadChartData(DATABASE& investments, const char* portfolio, ChartDataSets& dataSets, float& total) {
    total = 0;
    if (dataSets.GenerateDataSets(SelectInvestments(investments, portfolio)) != 0)
        return ChartData::NoMemory;
    int index = 0;
    const bool read = ForEachInvestment(investments, portfolio, [&](const INVESTMENT_DATA& record, long) {
        dataSets.AccumulateDataSet(index++, record);
        total += record.Value;
    });
    return read ? ChartData::Read : ChartData::NotRead;
}

BRect ChartArea() {
    return AboveMenu(FrameAt(0, 0));
}

void NameChart(BView& view, const char* portfolio) {
    view.SetAccessibleName((std::string("Chart of ") + portfolio).c_str());
}

void ShowDataSet(PieChartView& view, const ChartDataSets& dataSets, uint32 code) {
    for (const ChartInfo& chart : Charts) {
        if (chart.code != code)
            continue;
        view.SetTitle(chart.title);
        view.SetDecimalPlaces(chart.decimalPlaces);
    }
    const CHART_DATA_SET& set = dataSets.ForChart(code);
    view.SetData(set.values.data(), set.count);
    for (int i = 0; i < set.count; ++i)
        view.SetLegendLabel(i, set.labels[static_cast<std::size_t>(i)].data());
}

ChartWindow::ChartWindow(float left, float top, const char* portfolio)
    : BWindow(FrameOnScreen(left, top), WindowTitle, B_FLOATING_WINDOW_LOOK, B_MODAL_APP_WINDOW_FEEL,
              B_NOT_RESIZABLE | B_NOT_ZOOMABLE | B_WILL_ACCEPT_FIRST_CLICK),
      portfolio_(portfolio),
      topView_(AddTopView(*this)) {
    CreateGraphTypeMenu();
    CreatePictureMenu();
    const BRect chart = AboveMenu(Bounds());
    pieView_ = new PieChartView(chart);
    topView_->AddChild(pieView_);
    if (GenerateDataSets(portfolio) != 0)
        return; // never shown, it goes with the application
    SelectDataSet(false);
    valueView_ = new ValueChartView(chart, currentValue_);
    valueView_->Hide();
    topView_->AddChild(valueView_);
    SetAccessibleName((std::string(WindowTitle) + ", charts of " + portfolio).c_str());
    for (BView* view : {static_cast<BView*>(pieView_), static_cast<BView*>(valueView_)})
        NameChart(*view, portfolio);
    Show();
}

int ChartWindow::GenerateDataSets(const char* portfolio) {
    const ChartData data = ReadChartData(*app_state->investments, portfolio, dataSets_, currentValue_);
    if (data == ChartData::NoMemory)
        MessageBox("GenerateDataSets() malloc error!", B_STOP_ALERT);
    else if (data == ChartData::NotRead)
        TellNotRead();
    return data == ChartData::NoMemory ? 1 : 0;
}

void ChartWindow::CreateGraphTypeMenu() {
    auto* menu = new BPopUpMenu(Charts[0].title);
    for (const ChartInfo& chart : Charts) {
        auto* item = new BMenuItem(chart.title, new BMessage(chart.code));
        item->SetTarget(this);
        menu->AddItem(item);
    }
    const BRect bounds = Bounds();
    const float top = bounds.bottom - 2 * ::GetFontHeight(be_plain_font);
    auto* field = new BMenuField({bounds.left + MenuLeft, top, bounds.right, bounds.bottom}, "", "", menu,
                                 B_FOLLOW_LEFT | B_FOLLOW_BOTTOM);
    field->SetDivider(0);
    field->SetAccessibleName("Chart");
    topView_->AddChild(field);
}

void ChartWindow::MessageReceived(BMessage* message) {
    if (message->what >= FirstChart && message->what <= GrowthChart)
        ShowChart(message->what);
    else if (message->what == MessageToggleRates && !valueView_->IsHidden())
        valueView_->Toggle20And25Percent();
    else if (message->what == MessageCopyChart)
        CopyChart();
    else if (message->what == MessageSaveChart)
        SaveChart();
    else
        BWindow::MessageReceived(message);
}

void ChartWindow::ShowChart(uint32 code) {
    currentChart_ = code;
    const bool growth = code == GrowthChart;
    BView* shown = growth ? static_cast<BView*>(valueView_) : pieView_;
    BView* hidden = growth ? static_cast<BView*>(pieView_) : valueView_;
    if (!hidden->IsHidden())
        hidden->Hide();
    if (shown->IsHidden())
        shown->Show();
    if (!growth)
        SelectDataSet(true);
}

void ChartWindow::SelectDataSet(bool invalidate) {
    ShowDataSet(*pieView_, dataSets_, currentChart_);
    if (invalidate)
        pieView_->Invalidate();
}

void ChartWindow::CreatePictureMenu() {
    auto* menu = new BMenu("Picture");
    menu->AddItem(new BMenuItem("Copy", new BMessage(MessageCopyChart), 'C'));
    menu->AddItem(new BMenuItem("Save picture...", new BMessage(MessageSaveChart), 'S'));
    topView_->SetContextMenu(menu);
}

std::string ChartWindow::Picture(PictureFormat format) const {
    const GrowthRates rates = valueView_->ShowsAllRates() ? GrowthRates::All : GrowthRates::Lower;
    return ChartPicture(portfolio_.c_str(), dataSets_, currentValue_, currentChart_, rates, format);
}

void ChartWindow::CopyChart() {
    if (!CopyPicture(Picture(PictureFormat::Png)))
        MessageBox("There is not enough memory to copy the chart!", B_STOP_ALERT);
}

void ChartWindow::SaveChart() {
    const std::string title = Charts[currentChart_ - FirstChart].title;
    const std::string path =
        RunSavePanel("Save picture", portfolio_ + ", " + title,
                     {{"PNG picture", ".png"}, {"SVG picture", ".svg"}, {"PDF page", ".pdf"}});
    if (path.empty())
        return;
    const std::optional<PictureFormat> format = PictureFormatOf(path);
    if (!format) {
        MessageBox("The name of the picture must end with .png, .svg or .pdf!", B_INFO_ALERT);
        return;
    }
    const std::string picture = Picture(*format);
    const int error = picture.empty() ? ENOMEM : WriteNamedFile(path, picture);
    if (error != 0)
        MessageBox(("The picture could not be saved as " + path + "!\n" + Reason(error)).c_str(),
                   B_STOP_ALERT);
}
