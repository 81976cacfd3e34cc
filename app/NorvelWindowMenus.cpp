#include "app/NorvelWindow.h"

#include <algorithm>
#include <iterator>
#include <span>

#include "ColumnListView/ColumnListView.h"
#include "app/AppState.h"
#include "app/MessageCodes.h"
#include "dialogs/SettingsDialog.h"
#include "platform/Application.h"
#include "platform/MenuBar.h"
#include "platform/Roster.h"
#include "util/InterfaceHelpers.h"

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
    auto* item =
        new BMenuItem(info.label, new BMessage(info.code), info.shortcut, info.shortcut ? B_COMMAND_KEY : 0);
    if (info.goes == Goes::ToApplication)
        item->SetTarget(be_app);
    return item;
}

} // namespace

const NorvelWindow::Command NorvelWindow::Commands[] = {
    {MessageSettings, Needs::Nothing, &NorvelWindow::OnSettings},
    {MessagePortfolioAdd, Needs::Nothing, &NorvelWindow::OnPortfolioAdd},
    {MessagePortfolioEdit, Needs::Portfolio, &NorvelWindow::OnPortfolioEdit},
    {MessagePortfolioDelete, Needs::Portfolio, &NorvelWindow::OnPortfolioDelete},
    {MessagePortfolioChart, Needs::Investment, &NorvelWindow::OnPortfolioChart,
     &NorvelWindow::IsValuePresent},
    {MessagePortfolioPrint, Needs::Investment, &NorvelWindow::OnPortfolioPrint,
     &NorvelWindow::IsPortfolioPresent},
    {MessagePortfolioUpdate, Needs::Investment, &NorvelWindow::OnPortfolioUpdate,
     &NorvelWindow::IsPortfolioPresent},
    {MessageInvestmentAdd, Needs::Portfolio, &NorvelWindow::OnInvestmentAdd,
     &NorvelWindow::IsPortfolioPresent},
    {MessageInvestmentEdit, Needs::Investment, &NorvelWindow::OnInvestmentEdit},
    {MessageInvestmentInvoked, Needs::Investment, &NorvelWindow::OnInvestmentEdit},
    {MessageInvestmentDelete, Needs::Investment, &NorvelWindow::OnInvestmentDelete},
    {MessageInvestmentCut, Needs::Investment, &NorvelWindow::OnInvestmentCut},
    {MessageInvestmentCopy, Needs::Investment, &NorvelWindow::OnInvestmentCopy},
    {MessageInvestmentPaste, Needs::Portfolio, &NorvelWindow::OnInvestmentPaste},
    {MessageHelp, Needs::Nothing, &NorvelWindow::OnHelp},
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

void NorvelWindow::OnSettings() {
    (new SettingsDialog(DialogCorner(), DialogHasOk | DialogHasCancel))->DoModal();
}

void NorvelWindow::OnHelp() {
    const entry_ref help{app_state->helpPath};
    be_roster->Launch(&help);
}
