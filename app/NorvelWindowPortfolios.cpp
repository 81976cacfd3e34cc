#include "app/NorvelWindow.h"

#include <cstring>
#include <string>

#include "app/ConnectionCheck.h"
#include "app/model/PortfolioRules.h"
#include "app/state/AppState.h"
#include "app/state/MessageCodes.h"
#include "charts/ChartWindow.h"
#include "dialogs/PortfolioDialog.h"
#include "platform/MenuField.h"
#include "print/Report.h"
#include "quotes/update/UpdateWindow.h"
#include "util/CharacterBuffer.h"
#include "util/File.h"
#include "util/interface/InterfaceHelpers.h"

void NorvelWindow::LoadPortfolioList() {
    DATABASE& portfolios = *app_state->portfolios;
    const long all = portfolios.Query(nullptr, QueryMode::New);
    const bool read = ForEachSelected(portfolios, all, [this](const void* data, long) {
        PORTFOLIO_DATA record;
        std::memcpy(&record, data, sizeof record);
        // Without a message for each to be selected: the list would be loaded once for every portfolio,
        // to end with the last one's investments, which the constructor loads in any case.
        AppendMarkedItem(std::string(FieldText(record.Name)).c_str());
    });
    if (!read)
        TellNotRead("A portfolio");
    if (const BMenuItem* marked = MarkedPortfolio())
        CopyTextZeroed(currentPortfolio_, marked->Label());
}

void NorvelWindow::AddPortfolioMenuItem(const char* name) {
    AppendMarkedItem(name);
    PostSelection(name);
}

void NorvelWindow::AppendMarkedItem(const char* name) {
    auto* message = new BMessage(MessagePortfolioSelected);
    message->AddString(PortfolioNameField, name);
    auto* item = new BMenuItem(name, message);
    item->SetTarget(this);
    selector_->Menu()->AddItem(item);
    item->SetMarked(true);
}

void NorvelWindow::PostSelection(const char* name) {
    BMessage message(MessagePortfolioSelected);
    message.AddString(PortfolioNameField, name);
    PostMessage(&message);
}

void NorvelWindow::SelectFirstPortfolioMenuItem() {
    BMenuItem* first = selector_->Menu()->ItemAt(0);
    if (!first) {
        currentPortfolio_[0] = '\0';
        NameAfterPortfolio();
        ClearInvestmentList();
        DisplayTotalValue(0);
        return;
    }
    first->SetMarked(true);
    CopyTextZeroed(currentPortfolio_, first->Label());
    ScrollToFirstRow(); // of the list that is about to be shown
    PostSelection(currentPortfolio_);
}

BMenuItem* NorvelWindow::MarkedPortfolio() const {
    return selector_->Menu()->FindMarked();
}

bool NorvelWindow::IsPortfolioPresent() {
    if (selector_->Menu()->CountItems() > 0)
        return true;
    MessageBox("This command requires that a portfolio be created first.", B_STOP_ALERT);
    return false;
}

// The selector has marked the item already when the message is its own.
void NorvelWindow::MarkCurrentPortfolio() {
    const BMenuItem* marked = MarkedPortfolio();
    if (marked && std::strcmp(marked->Label(), currentPortfolio_) == 0)
        return;
    if (BMenuItem* item = selector_->Menu()->FindItem(currentPortfolio_))
        item->SetMarked(true);
}

void NorvelWindow::OnPortfolioSelected(BMessage* message) {
    const char* name = nullptr;
    if (message->FindString(PortfolioNameField, &name) != B_OK)
        return;
    const bool shown = std::strcmp(currentPortfolio_, name) == 0;
    CopyTextZeroed(currentPortfolio_, name);
    MarkCurrentPortfolio();
    if (shown) {
        ReloadInvestmentList();
    } else {
        LoadInvestmentList();
        ScrollToFirstRow();
    }
}

void NorvelWindow::OnPortfolioAdd() {
    char name[NameSize] = "";
    const BPoint corner = DialogCorner();
    auto* dialog =
        new PortfolioAddDialog(corner.x, corner.y, "Add a Portfolio", name, app_state->portfolios.get());
    if (dialog->DoModal() != DialogOk)
        return;
    if (AddPortfolio(*app_state->portfolios, name))
        AddPortfolioMenuItem(name);
    else
        TellNotSaved();
}

void NorvelWindow::OnPortfolioEdit() {
    const BMenuItem* marked = MarkedPortfolio();
    if (!marked)
        return;
    char name[NameSize];
    CopyTextZeroed(name, marked->Label());
    const BPoint corner = DialogCorner();
    auto* dialog =
        new PortfolioEditDialog(corner.x, corner.y, "Edit Portfolio", name, app_state->portfolios.get());
    if (dialog->DoModal() != DialogOk)
        return;
    if (!RenamePortfolio(*app_state->portfolios, *app_state->investments, currentPortfolio_, name)) {
        TellNotSaved();
        return;
    }
    RemoveMarkedItem();
    CopyTextZeroed(currentPortfolio_, name);
    AddPortfolioMenuItem(name);
}

void NorvelWindow::OnPortfolioDelete() {
    if (!MarkedPortfolio()) {
        MessageBox("There are no portfolios to delete!", B_INFO_ALERT);
        return;
    }
    if (YesNoBox("Are you sure you want to delete this portfolio?") || YesNoBox("Are you really sure?"))
        return;
    if (!DeletePortfolio(*app_state->portfolios, *app_state->investments, currentPortfolio_)) {
        TellNotSaved();
        ReloadInvestmentList();
        return;
    }
    RemoveMarkedItem();
    SelectFirstPortfolioMenuItem();
}

void NorvelWindow::OnPortfolioUpdate() {
    isUpdating_ = true;
    PrintDebugStatement("CLEAR", app_state->logPath);
    if (FindConnection())
        new UpdateWindow(WindowCorner(), currentPortfolio_, app_state->investments.get(), investmentList_);
    else
        PostMessage(MessageUpdateEnded); // behind what was pressed meanwhile
}

bool NorvelWindow::FindConnection() {
    char host[128];
    ReadSetting(settings_, "GENERAL", "IsConnectedURL", host);
    const Connection connection = CheckConnection(host, WindowCorner());
    if (connection == Connection::NotFound)
        TellNotConnected();
    LogConnection(host, connection, app_state->logPath);
    return connection == Connection::Found;
}

void NorvelWindow::OnPortfolioChart() {
    const BPoint corner = WindowCorner();
    new ChartWindow(corner.x, corner.y, currentPortfolio_);
}

void NorvelWindow::OnPortfolioPrint() {
    switch (RunReportJob(this, currentPortfolio_, *app_state->investments, printSettings_)) {
    case ReportResult::NotPrinted:
        MessageBox("The report could not be printed! Is the printer there, or the file protected?",
                   B_STOP_ALERT);
        break;
    case ReportResult::NotRead:
        TellNotRead();
        break;
    default:
        break;
    }
}

void NorvelWindow::RemoveMarkedItem() {
    BMenuItem* marked = MarkedPortfolio();
    if (marked && selector_->Menu()->RemoveItem(marked))
        delete marked;
}
