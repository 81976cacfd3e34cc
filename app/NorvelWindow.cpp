#include "app/NorvelWindow.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>

#include "ColumnListView/CLVColumn.h"
#include "ColumnListView/ColumnListView.h"
#include "app/WindowLayout.h"
#include "app/rows/NorvelItem.h"
#include "app/state/AppState.h"
#include "app/state/MessageCodes.h"
#include "platform/Application.h"
#include "platform/Button.h"
#include "platform/Menu.h"
#include "platform/MenuField.h"
#include "platform/StringView.h"
#include "util/CharacterBuffer.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr float LeastSize = 200;
constexpr float GreatestSize = 10000;
constexpr float ScrollBarSpace = 14;
constexpr float ButtonSpace = 50; // below the list
constexpr float ButtonStep = 125;
constexpr float ButtonWidth = 90;
constexpr float ButtonMargin = 16; // around a label that is wider than usual
constexpr float TotalLeft = 200;
constexpr float TotalGap = 10;

constexpr const char* WidthKey = "ColumnWidth%d";
constexpr int DefaultWidth = 50;
// The size, in pixels, of the list's letters that the widths were saved for.
constexpr const char* TextSizeKey = "TextSize";
// What lies outside is no size of letters that can be read.
constexpr int LeastTextSize = 6;
constexpr int GreatestTextSize = 100;

struct ColumnInfo {
    const char* label;
    uint32 flags;
    float minWidth;
};
constexpr ColumnInfo Columns[InvestmentColumnCount] = {
    {nullptr, CLVF_FIXED_POSITION | CLVF_FIXED_WIDTH | CLVF_KEEP_FIRST | CLVF_JOIN_HEADER | CLVF_PASS_INDENT,
     20},
    {"Name", CLVF_SORTABLE, 50},
    {"Ticker", CLVF_SORTABLE, 20},
    {"Type", CLVF_SORTABLE, 20},
    {"Shares", CLVF_SORTABLE, 20},
    {"Price", CLVF_SORTABLE, 20},
    {"Value", CLVF_SORTABLE, 20},
    {"Date", CLVF_SORTABLE, 20},
    {"Retire", CLVF_SORTABLE, 20},
    {"Risk", CLVF_SORTABLE, 20},
    {"Agent", CLVF_SORTABLE, 20},
};

// As it was left; at first, for the usual font, 501 by 201 pixels.
BRect FirstFrame() {
    const std::vector<int> numbers = ReadNumbers(INI_FILEx(app_state->settingsPath), PlaceKey);
    const std::vector<float> left(numbers.begin(), numbers.end());
    const auto isSize = [](float size) { return size >= LeastSize && size <= GreatestSize; };
    if (left.size() == 4 && isSize(left[2]) && isSize(left[3]))
        return {left[0], left[1], left[0] + left[2], left[1] + left[3]};
    const float growth = GetFontGrowth();
    return {100, 100, 100 + std::round(500 * growth), 100 + std::round(200 * growth)};
}

struct ButtonInfo {
    const char* name;
    const char* label;
    uint32 code;
};
constexpr ButtonInfo Buttons[] = {
    {"add button", "Add", MessageInvestmentAdd},
    {"print button", "Print", MessagePortfolioPrint},
    {"chart button", "Charts", MessagePortfolioChart},
    {"Update button", "Update", MessagePortfolioUpdate},
};

} // namespace

NorvelWindow::NorvelWindow()
    : BWindow(FirstFrame(), WindowTitle, B_DOCUMENT_WINDOW, B_WILL_ACCEPT_FIRST_CLICK),
      settings_(app_state->settingsPath) {
    SetSizeLimits(LeastSize, GreatestSize, LeastSize, GreatestSize);
    BView* topView = AddTopView(*this);
    const float barHeight = AddMenus(topView)->Frame().Height();
    AddSelector(topView, barHeight + 1);
    AddTotalValueView(topView, barHeight + 1, barHeight);
    AddInvestmentList(topView, barHeight + 1 + selector_->Frame().Height() + 1);
    AddButtons(topView);
    LoadPortfolioList();
    LoadInvestmentList();
    NorvelWindow::MenusBeginning();
    investmentList_->MakeFocus();
    Show();
}

NorvelWindow::~NorvelWindow() {
    selector_->SetTextChangedHook(nullptr);
    SaveColumnWidths();
    SaveLayout();
    be_app->PostMessage(B_QUIT_REQUESTED);
}

bool NorvelWindow::QuitRequested() {
    return MayForgetClipboard();
}

void NorvelWindow::Quit() {
    Lock(); // the application quits its windows from outside their handlers
    ClearInvestmentList();
    Unlock();
    BWindow::Quit();
}

BMenuBar* NorvelWindow::AddMenus(BView* topView) {
    menuBar_ = new BMenuBar(BRect(0, 0, 0, 0), "menu bar");
    LoadMenus(menuBar_);
    topView->AddChild(menuBar_);
    return menuBar_;
}

void NorvelWindow::AddSelector(BView* topView, float top) {
    auto* menu = new BPopUpMenu("        "); // what the field shows while nothing is marked
    selector_ = new BMenuField({0, top, 300, top + 20}, "", "Portfolio:", menu, B_FOLLOW_LEFT | B_FOLLOW_TOP,
                               B_WILL_DRAW | B_NAVIGABLE);
    selector_->SetDivider(topView->StringWidth("Portfolio: "));
    topView->AddChild(selector_);
    selector_->SetTextChangedHook([this] { PlaceTotalValueView(); });
}

void NorvelWindow::AddTotalValueView(BView* topView, float top, float height) {
    totalValueView_ = new BStringView({TotalLeft, top, Bounds().right + TotalLeft, top + height},
                                      "total value", "Total Value: $0.00");
    totalValueView_->SetHighColor(colors::green);
    topView->AddChild(totalValueView_);
    PlaceTotalValueView();
}

void NorvelWindow::PlaceTotalValueView() {
    if (totalValueView_)
        totalValueView_->MoveTo(std::max(TotalLeft, selector_->VisibleRight() + TotalGap),
                                selector_->Frame().top);
}

void NorvelWindow::AddInvestmentList(BView* topView, float top) {
    const BRect frame(0, top, Bounds().right - ScrollBarSpace,
                      Bounds().bottom - ScrollBarSpace - ButtonSpace);
    BetterScrollView* container = nullptr;
    investmentList_ = new ColumnListView(
        frame, &container, nullptr, B_FOLLOW_ALL_SIDES, B_WILL_DRAW | B_FRAME_EVENTS | B_NAVIGABLE,
        B_MULTIPLE_SELECTION_LIST, false, true, true, true, B_NO_BORDER, be_plain_font);
    investmentList_->SetAccessibleName("Investments");
    AddColumns();
    RestoreColumns();
    investmentList_->SetViewColor(colors::light_gray);
    investmentList_->SetFont(be_fixed_font);
    investmentList_->SetSortFunction(NorvelItem::MyCompare);
    investmentList_->SetInvocationMessage(new BMessage(MessageInvestmentInvoked));
    topView->AddChild(container);
}

float NorvelWindow::WidthGrowth() const {
    const int size = settings_.ReadInt(DisplaySection, TextSizeKey, 0);
    if (size < LeastTextSize || size > GreatestTextSize)
        return 1;
    return be_fixed_font->Size() / static_cast<float>(size);
}

void NorvelWindow::AddColumns() {
    const float growth = WidthGrowth();
    for (int index = 0; index < InvestmentColumnCount; ++index) {
        char key[32];
        FormatInto(key, sizeof key, WidthKey, index);
        const auto width = static_cast<float>(settings_.ReadInt(DisplaySection, key, DefaultWidth));
        const ColumnInfo& info = Columns[index];
        investmentList_->AddColumn(new CLVColumn(info.label, info.label ? std::round(width * growth) : width,
                                                 info.flags, info.minWidth));
    }
}

void NorvelWindow::SaveColumnWidths() const {
    if (settings_.ReadInt(DisplaySection, TextSizeKey, 0) > 0)
        static_cast<void>(
            settings_.WriteInt(DisplaySection, TextSizeKey, static_cast<int>(be_fixed_font->Size())));
    const CLVColumn* column = nullptr;
    for (int index = 0; (column = investmentList_->ColumnAt(index)) != nullptr; ++index) {
        char key[32];
        FormatInto(key, sizeof key, WidthKey, index);
        // Without a settings file there is nowhere to keep them.
        static_cast<void>(settings_.WriteInt(DisplaySection, key, static_cast<int>(column->Width())));
    }
}

// The list itself refuses an order that lacks a column, and keys that are none.
void NorvelWindow::RestoreColumns() {
    const std::vector<int> order = ReadNumbers(settings_, OrderKey);
    if (order.size() == InvestmentColumnCount)
        static_cast<void>(investmentList_->SetDisplayOrder(order.data()));
    std::vector<int32> columns;
    std::vector<CLVSortMode> modes;
    for (const int key : ReadNumbers(settings_, SortKey)) {
        columns.push_back(std::abs(key));
        modes.push_back(key < 0 ? CLVSortMode::Descending : CLVSortMode::Ascending);
    }
    investmentList_->SetSorting(static_cast<int32>(columns.size()), columns.data(), modes.data());
}

void NorvelWindow::SaveLayout() const {
    const BRect frame = UnzoomedFrame();
    std::vector<int> place;
    for (const float number : {frame.left, frame.top, frame.Width(), frame.Height()})
        place.push_back(static_cast<int>(number));
    WriteNumbers(settings_, PlaceKey, place);
    WriteNumbers(settings_, OrderKey, investmentList_->DisplayOrder());
    int32 keys[InvestmentColumnCount];
    CLVSortMode modes[InvestmentColumnCount];
    const int32 count = investmentList_->Sorting(keys, modes);
    for (int32 i = 0; i < count; ++i)
        keys[i] = modes[i] == CLVSortMode::Descending ? -keys[i] : keys[i];
    WriteNumbers(settings_, SortKey, {keys, keys + count});
}

void NorvelWindow::NameAfterPortfolio() {
    SetAccessibleName((std::string(WindowTitle) + " " + currentPortfolio_).c_str());
}

void NorvelWindow::AddButtons(BView* topView) {
    BRect frame(10, Bounds().bottom - 40, 10 + ButtonWidth, Bounds().bottom - 10);
    for (const ButtonInfo& info : Buttons) {
        frame.right = frame.left + std::max(ButtonWidth, topView->StringWidth(info.label) + ButtonMargin);
        topView->AddChild(new BButton(frame, info.name, info.label, new BMessage(info.code),
                                      B_FOLLOW_LEFT | B_FOLLOW_BOTTOM));
        frame.OffsetBy(ButtonStep, 0);
    }
}

void NorvelWindow::MessageReceived(BMessage* message) {
    if (message->what == MessageUpdateEnded)
        isUpdating_ = false;
    else if (isUpdating_)
        MarkCurrentPortfolio(); // another one may just have been chosen in the selector
    else if (message->what == MessagePortfolioSelected)
        OnPortfolioSelected(message);
    else if (const Command* command = FindCommand(message->what))
        Execute(*command);
    else
        BWindow::MessageReceived(message);
}
