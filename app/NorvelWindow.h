#pragma once

#include <memory>
#include <optional>

#include "app/model/RecordLayouts.h"
#include "platform/Window.h"
#include "util/IniFile.h"

class BMenu;
class BMenuBar;
class BMenuField;
class BMenuItem;
class BStringView;
class ColumnListView;
class NorvelItem;

// The program's main window: the portfolio selector, the portfolio's total value, the list of its
// investments, four buttons and the menus. It turns menu items, buttons and the list's invocation into
// messages and each message into one command. What a command does to the files is PortfolioRules' business;
// the databases, paths and the clipboard are app_state's, which must exist as long as the window.
//
// The application object creates it; it deletes itself when it quits, and asks the application to quit as it
// goes. Interface thread.
class NorvelWindow : public BWindow {
  public:
    // Builds the window, loads the selector and the last portfolio's investments, and shows it all.
    NorvelWindow();
    // Saves its place and size, and the columns' widths, order and sort keys.
    ~NorvelWindow() override;

    // From the press of Update until that has ended what else is pressed is dropped: the investment file is
    // the update's.
    void MessageReceived(BMessage* message) override;
    void MenusBeginning() override;
    // Deletes the rows first.
    bool QuitRequested() override;
    void Quit() override;

    // The sum of the Value of the current portfolio's investments, which are left as the investment
    // database's result set; nothing, after telling the person so, when they could not all be read.
    [[nodiscard]] std::optional<float> PortfolioTotalValue();
    // False, after telling the person so, when there is no portfolio, or no row in the list.
    [[nodiscard]] bool IsPortfolioPresent();
    [[nodiscard]] bool IsInvestmentPresent();
    // Also false, after telling the person so, when all investments together are worth nothing or could not
    // be read.
    [[nodiscard]] bool IsValuePresent();

  private:
    // What a command needs before its menu item can be chosen.
    enum class Needs { Nothing, Portfolio, Investment };
    // What it changes itself. An update's worker has the investment file to itself while it runs, and sees to
    // its own changes.
    enum class Changes { Nothing, Files };
    struct Command {
        uint32 code;
        Needs needs;
        Changes changes;
        void (NorvelWindow::*run)();
        bool (NorvelWindow::*check)() = nullptr; // tells the person what is missing, and answers false then
    };
    // What messages lead to.
    static const Command Commands[];
    [[nodiscard]] static const Command* FindCommand(uint32 code);
    [[nodiscard]] bool CanRun(const Command& command) const;
    // Runs it, and returns when what it changed in the data files would outlast a power cut.
    void Execute(const Command& command);
    // Tells the person when the disk fails.
    static void SyncDataFiles();

    BMenuBar* AddMenus(BView* topView);
    void LoadMenus(BMenuBar* bar);
    void AddSelector(BView* topView, float top);
    void AddTotalValueView(BView* topView, float top, float height);
    void AddInvestmentList(BView* topView, float top);
    void AddColumns();
    void AddButtons(BView* topView);
    // Keeps the total to the right of what the selector shows.
    void PlaceTotalValueView();
    // How many times larger the list's letters are than when the widths were saved; 1 when it is not known.
    [[nodiscard]] float WidthGrowth() const;
    void SaveColumnWidths() const;
    // The columns' order and the sort keys as they were left.
    void RestoreColumns();
    void SaveLayout() const;
    // Says to who does not see it which portfolio it shows.
    void NameAfterPortfolio();

    // --- portfolios ---
    void LoadPortfolioList();
    // Appends a portfolio to the selector, marks it and asks for it to be shown.
    void AddPortfolioMenuItem(const char* name);
    void AppendMarkedItem(const char* name);
    void PostSelection(const char* name);
    void SelectFirstPortfolioMenuItem();
    // The selector's marked item; null when there is none.
    [[nodiscard]] BMenuItem* MarkedPortfolio() const;
    void MarkCurrentPortfolio();
    void OnPortfolioSelected(BMessage* message);
    void OnPortfolioAdd();
    void OnPortfolioEdit();
    void OnPortfolioDelete();
    void OnPortfolioChart();
    void OnPortfolioPrint();
    // Opens the window that brings the prices up to date, unless there is no network.
    void OnPortfolioUpdate();
    // Looks whether there is a network, and tells the person when there is none.
    [[nodiscard]] bool FindConnection();
    // Takes the marked item out of the selector.
    void RemoveMarkedItem();

    // --- investments ---
    void LoadInvestmentList();
    // The same for the portfolio that is shown already: the list stays where it is scrolled to, and its
    // current row stays current.
    void ReloadInvestmentList();
    void ScrollToFirstRow();
    // Scrolls the row into sight and makes it the current one; what is selected stays.
    void ShowRow(int32 index);
    // The same for the first row of those whose records came from this number on; all are seen that fit.
    void ShowRowsFrom(int32 recordNumber);
    // Null when the index lies outside.
    [[nodiscard]] NorvelItem* RowAt(int32 index) const;
    void ClearInvestmentList();
    // Shows total when it is 0 or more, else the current portfolio's, or that this is not known.
    void DisplayTotalValue(float total);
    // Whether what was cut and never pasted may go: the person is asked, since nothing else has it.
    [[nodiscard]] static bool MayForgetClipboard();
    // What was cut is pasted, or given up.
    static void CutIsSettled();
    // Copies the selected investments to the clipboard; true when it now holds all of them.
    bool CopySelection();
    // Runs the investment form on the record; true when the person confirmed it.
    bool RunInvestmentDialog(const char* title, INVESTMENT_DATA* record);
    void OnInvestmentAdd();
    // Edits the first selected investment; its row keeps its place.
    void OnInvestmentEdit();
    void OnInvestmentDelete();
    void OnInvestmentCopy();
    void OnInvestmentCut();
    void OnInvestmentPaste();

    // --- other commands ---
    void OnSettings();
    void OnHelp();
    // Where dialogs open, and where other windows do.
    [[nodiscard]] BPoint DialogCorner() const;
    [[nodiscard]] BPoint WindowCorner() const;

    INI_FILEx settings_;
    BMenuBar* menuBar_ = nullptr;
    BMenuField* selector_ = nullptr;
    BStringView* totalValueView_ = nullptr;
    ColumnListView* investmentList_ = nullptr;
    std::unique_ptr<BMessage> printSettings_; // chosen at the first print; null until then
    char currentPortfolio_[NameSize] = "";    // whose investments are shown; empty for none
    bool isUpdating_ = false;                 // until MessageUpdateEnded
};

// A new row for the investment, which belongs to the caller until a list takes it.
[[nodiscard]] NorvelItem* CreateNewInvestmentItem(const INVESTMENT_DATA& record, int32 recordNumber);

// How many of the list's rows are selected.
[[nodiscard]] int32 CountSelectedItems(const ColumnListView* list);
