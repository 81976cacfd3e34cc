#include "app/NorvelWindow.h"

#include <algorithm>
#include <iterator>
#include <span>

#include "ColumnListView/ColumnListView.h"
#include "app/state/AppState.h"
#include "app/state/MessageCodes.h"
#include "db/Database.h"
#include "dialogs/PasswordDialogs.h"
#include "platform/Application.h"
#include "platform/Menu.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

enum class Goes { ToWindow, ToApplication };

struct ItemInfo {
    const char* label; // null for a separator
    uint32 code = 0;
    Goes goes = Goes::ToWindow;
    char shortcut = 0;
};
constexpr ItemInfo Separator{nullptr};

constexpr ItemInfo FileItems[] = {
    {"Settings", MessageSettings},
    Separator,
    {"Quit", B_QUIT_REQUESTED, Goes::ToApplication, 'Q'},
};
constexpr ItemInfo PortfolioItems[] = {
    {"Add", MessagePortfolioAdd},
    {"Edit", MessagePortfolioEdit},
    {"Del", MessagePortfolioDelete},
    Separator,
    {"Chart", MessagePortfolioChart},
    {"Print", MessagePortfolioPrint},
    {"Update prices", MessagePortfolioUpdate},
};
constexpr ItemInfo InvestmentItems[] = {
    {"Add", MessageInvestmentAdd},     {"Edit", MessageInvestmentEdit},
    {"Del", MessageInvestmentDelete},  Separator,
    {"Cut", MessageInvestmentCut},     {"Copy", MessageInvestmentCopy},
    {"Paste", MessageInvestmentPaste},
};
constexpr ItemInfo HelpItems[] = {
    {"Help", MessageHelp},
    {"About Quorvan...", B_ABOUT_REQUESTED, Goes::ToApplication},
};

struct MenuInfo {
    const char* title;
    std::span<const ItemInfo> items;
};
constexpr MenuInfo Menus[] = {
    {"File", FileItems},
    {"Portfolio", PortfolioItems},
    {"Investment", InvestmentItems},
    {"Help", HelpItems},
};

BMenuItem* NewItem(const ItemInfo& info) {
    if (!info.label)
        return new BSeparatorItem;
    auto* item = new BMenuItem(info.label, new BMessage(info.code), info.shortcut);
    if (info.goes == Goes::ToApplication)
        item->SetTarget(be_app);
    return item;
}

} // namespace

const NorvelWindow::Command NorvelWindow::Commands[] = {
    {MessageSettings, Needs::Nothing, Changes::Nothing, &NorvelWindow::OnSettings},
    {MessagePortfolioAdd, Needs::Nothing, Changes::Files, &NorvelWindow::OnPortfolioAdd},
    {MessagePortfolioEdit, Needs::Portfolio, Changes::Files, &NorvelWindow::OnPortfolioEdit},
    {MessagePortfolioDelete, Needs::Portfolio, Changes::Files, &NorvelWindow::OnPortfolioDelete},
    {MessagePortfolioChart, Needs::Investment, Changes::Nothing, &NorvelWindow::OnPortfolioChart,
     &NorvelWindow::IsValuePresent},
    {MessagePortfolioPrint, Needs::Investment, Changes::Nothing, &NorvelWindow::OnPortfolioPrint,
     &NorvelWindow::IsPortfolioPresent},
    {MessagePortfolioUpdate, Needs::Investment, Changes::Nothing, &NorvelWindow::OnPortfolioUpdate,
     &NorvelWindow::IsPortfolioPresent},
    {MessageInvestmentAdd, Needs::Portfolio, Changes::Files, &NorvelWindow::OnInvestmentAdd,
     &NorvelWindow::IsPortfolioPresent},
    {MessageInvestmentEdit, Needs::Investment, Changes::Files, &NorvelWindow::OnInvestmentEdit},
    {MessageInvestmentInvoked, Needs::Investment, Changes::Files, &NorvelWindow::OnInvestmentEdit},
    {MessageInvestmentDelete, Needs::Investment, Changes::Files, &NorvelWindow::OnInvestmentDelete},
    {MessageInvestmentCut, Needs::Investment, Changes::Files, &NorvelWindow::OnInvestmentCut},
    {MessageInvestmentCopy, Needs::Investment, Changes::Nothing, &NorvelWindow::OnInvestmentCopy},
    {MessageInvestmentPaste, Needs::Portfolio, Changes::Files, &NorvelWindow::OnInvestmentPaste},
    {MessageHelp, Needs::Nothing, Changes::Nothing, &NorvelWindow::OnHelp},
};

const NorvelWindow::Command* NorvelWindow::FindCommand(uint32 code) {
    const auto* found = std::find_if(std::begin(Commands), std::end(Commands),
                                     [code](const Command& command) { return command.code == code; });
    return found == std::end(Commands) ? nullptr : found;
}

void NorvelWindow::Execute(const Command& command) {
    if (command.check && !(this->*command.check)())
        return;
    (this->*command.run)();
    if (command.changes == Changes::Files)
        SyncDataFiles();
}

void NorvelWindow::SyncDataFiles() {
    const bool portfolios = app_state->portfolios->Sync() == 0;
    if (app_state->investments->Sync() != 0 || !portfolios)
        TellNotSaved();
}

bool NorvelWindow::CanRun(const Command& command) const {
    switch (command.needs) {
    case Needs::Portfolio:
        return MarkedPortfolio() != nullptr;
    case Needs::Investment:
        return investmentList_->CountItems() > 0;
    default:
        return true;
    }
}

void NorvelWindow::LoadMenus(BMenuBar* bar) {
    for (const MenuInfo& info : Menus) {
        auto* menu = new BMenu(info.title);
        for (const ItemInfo& item : info.items)
            menu->AddItem(NewItem(item));
        bar->AddItem(menu);
    }
}

void NorvelWindow::MenusBeginning() {
    for (const MenuInfo& menu : Menus) {
        for (const ItemInfo& item : menu.items) {
            if (!item.label || item.goes == Goes::ToApplication)
                continue;
            const Command* command = FindCommand(item.code);
            menuBar_->FindItem(item.code)->SetEnabled(command && CanRun(*command));
        }
    }
}

BPoint NorvelWindow::DialogCorner() const {
    return Frame().LeftTop() + BPoint(50, 50);
}

BPoint NorvelWindow::WindowCorner() const {
    return Frame().LeftTop() + BPoint(100, 100);
}

void NorvelWindow::OnSettings() {
    (new SettingsDialog(DialogCorner(), DialogHasOk | DialogHasCancel))->DoModal();
}

void NorvelWindow::OnHelp() {
    const entry_ref help{app_state->helpPath};
    be_roster->Launch(&help);
}
