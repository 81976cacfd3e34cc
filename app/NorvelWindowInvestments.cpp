#include "app/NorvelWindow.h"

#include <cmath>
#include <cstdlib>
#include <string>
#include <vector>

#include "ColumnListView/ColumnListView.h"
#include "app/model/CutFile.h"
#include "app/model/InvestmentTexts.h"
#include "app/model/PortfolioRules.h"
#include "app/rows/NorvelItem.h"
#include "app/state/AppState.h"
#include "dialogs/InvestmentDialog.h"
#include "platform/MenuField.h"
#include "platform/StringView.h"
#include "util/CharacterBuffer.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr const char* UnknownTotal = "Total Value: not known"; // some of the investments could not be read

// The selected rows from the top.
std::vector<NorvelItem*> SelectedItems(const ColumnListView* list) {
    std::vector<NorvelItem*> selected;
    for (int32 i = 0; i < list->CountItems(); ++i)
        if (list->IsItemSelected(i))
            selected.push_back(static_cast<NorvelItem*>(list->ItemAt(i)));
    return selected;
}

} // namespace

NorvelItem* CreateNewInvestmentItem(const INVESTMENT_DATA& record, int32 recordNumber) {
    return new NorvelItem(record, recordNumber);
}

int32 CountSelectedItems(const ColumnListView* list) {
    return static_cast<int32>(SelectedItems(list).size());
}

void NorvelWindow::LoadInvestmentList() {
    NameAfterPortfolio();
    ClearInvestmentList();
    float total = 0;
    BList rows;
    const bool read = ForEachInvestment(
        *app_state->investments, currentPortfolio_, [&](const INVESTMENT_DATA& record, long number) {
            total += record.Value;
            rows.AddItem(CreateNewInvestmentItem(record, static_cast<int32>(number)));
        });
    investmentList_->AddList(&rows);
    if (investmentList_->PrimarySortKey() >= 0)
        investmentList_->SortItems(); // as the underlined header says
    if (read) {
        DisplayTotalValue(total);
        return;
    }
    totalValueView_->SetText(UnknownTotal);
    TellNotRead();
}

void NorvelWindow::ReloadInvestmentList() {
    const BPoint place = investmentList_->Bounds().LeftTop();
    const auto* current = RowAt(investmentList_->CurrentRow());
    const int32 number = current ? current->RecordNumber() : -1;
    LoadInvestmentList();
    for (int32 i = 0; number >= 0 && i < investmentList_->CountItems(); ++i) {
        if (RowAt(i)->RecordNumber() == number) {
            investmentList_->SetCurrentRow(i);
            break;
        }
    }
    investmentList_->ScrollTo(place);
}

void NorvelWindow::ScrollToFirstRow() {
    investmentList_->ScrollTo({investmentList_->Bounds().left, 0});
}

void NorvelWindow::ShowRow(int32 index) {
    investmentList_->SetCurrentRow(index);
    investmentList_->ScrollToRow(index);
}

void NorvelWindow::ShowRowsFrom(int32 recordNumber) {
    int32 first = -1;
    int32 last = -1;
    for (int32 i = 0; i < investmentList_->CountItems(); ++i) {
        if (RowAt(i)->RecordNumber() < recordNumber)
            continue;
        first = first < 0 ? i : first;
        last = i;
    }
    if (first < 0)
        return;
    investmentList_->ScrollToRow(last);
    ShowRow(first);
}

NorvelItem* NorvelWindow::RowAt(int32 index) const {
    return static_cast<NorvelItem*>(investmentList_->ItemAt(index));
}

void NorvelWindow::ClearInvestmentList() {
    std::vector<BListItem*> rows;
    rows.reserve(static_cast<std::size_t>(investmentList_->CountItems()));
    for (int32 i = 0; i < investmentList_->CountItems(); ++i)
        rows.push_back(investmentList_->ItemAt(i));
    investmentList_->MakeEmpty();
    for (const BListItem* row : rows)
        delete row;
}

void NorvelWindow::DisplayTotalValue(float total) {
    const std::optional<float> known = total >= 0 ? total : PortfolioTotalValue();
    totalValueView_->SetText(known ? TotalValueText(*known).c_str() : UnknownTotal);
}

std::optional<float> NorvelWindow::PortfolioTotalValue() {
    const std::optional<float> total = TotalValue(*app_state->investments, currentPortfolio_);
    if (!total)
        TellNotRead();
    return total;
}

bool NorvelWindow::IsInvestmentPresent() {
    if (investmentList_->CountItems() > 0)
        return true;
    MessageBox("This command requires a portfolio with at least one investment.", B_STOP_ALERT);
    return false;
}

bool NorvelWindow::IsValuePresent() {
    if (!IsInvestmentPresent())
        return false;
    const std::optional<float> total = PortfolioTotalValue();
    if (!total)
        return false;
    if (!std::isfinite(*total))
        MessageBox("Unable to chart. A value in the portfolio is not a number, or too large for one!",
                   B_INFO_ALERT);
    else if (*total > 0)
        return true;
    else
        MessageBox("Unable to chart. Total value of portfolio equals zero!", B_INFO_ALERT);
    return false;
}

bool NorvelWindow::RunInvestmentDialog(const char* title, INVESTMENT_DATA* record) {
    const BPoint corner = DialogCorner();
    auto* dialog = new InvestmentDialog(corner.x, corner.y, title, record, DialogHasOk | DialogHasCancel);
    return dialog->DoModal() == DialogOk;
}

void NorvelWindow::OnInvestmentAdd() {
    INVESTMENT_DATA record{};
    if (!RunInvestmentDialog("Add an Investment", &record))
        return;
    const BMenuItem* marked = MarkedPortfolio();
    if (!marked)
        return;
    CopyTextZeroed(record.Portfolio, marked->Label());
    record.QuoteError = 0;
    record.PrevPrice = NoPreviousPrice;
    const long number = app_state->investments->Append(&record);
    if (number < 0) {
        TellNotSaved();
        return;
    }
    investmentList_->AddItem(CreateNewInvestmentItem(record, static_cast<int32>(number)));
    ShowRow(investmentList_->CountItems() - 1);
    DisplayTotalValue(-1);
}

void NorvelWindow::OnInvestmentEdit() {
    const int32 index = investmentList_->CurrentSelection();
    const NorvelItem* row = RowAt(index);
    if (!row) {
        MessageBox("You must select an investment to edit!", B_INFO_ALERT);
        return;
    }
    INVESTMENT_DATA record;
    const int32 number = row->RecordNumber();
    if (!ReadInvestment(*app_state->investments, number, &record)) {
        TellNotRead();
        return;
    }
    if (!RunInvestmentDialog("Edit this Investment", &record))
        return;
    if (app_state->investments->Write(number, &record) != 0) {
        TellNotSaved();
        return;
    }
    investmentList_->RemoveItem(index);
    investmentList_->AddItem(CreateNewInvestmentItem(record, number), index);
    delete row;
    ShowRow(index);
    DisplayTotalValue(-1);
}

// A record that could not be deleted keeps its row.
void NorvelWindow::OnInvestmentDelete() {
    const std::vector<NorvelItem*> selected = SelectedItems(investmentList_);
    if (selected.empty()) {
        MessageBox("You must select an investment to delete!", B_INFO_ALERT);
        return;
    }
    bool all = true;
    for (const NorvelItem* row : selected)
        all = app_state->investments->Delete(row->RecordNumber()) == 0 && all;
    if (!all) {
        TellNotSaved();
        ReloadInvestmentList();
        return;
    }
    investmentList_->RemoveSelected();
    for (const NorvelItem* row : selected)
        delete row;
    DisplayTotalValue(-1);
}

bool NorvelWindow::MayForgetClipboard() {
    if (!app_state->clipboardIsOnlyCopy)
        return true;
    const bool no = YesNoBox("What you cut has not been pasted yet, and would be lost. Go on all the same?");
    if (!no)
        CutIsSettled();
    return !no;
}

void NorvelWindow::CutIsSettled() {
    if (app_state->clipboardIsOnlyCopy)
        CutFile(app_state->homeFolder).Forget();
    app_state->clipboardIsOnlyCopy = false;
}

bool NorvelWindow::CopySelection() {
    const std::vector<NorvelItem*> selected = SelectedItems(investmentList_);
    if (selected.empty()) {
        MessageBox("You must select a(n) investment(s) to cut or copy.", B_INFO_ALERT);
        return false;
    }
    if (!MayForgetClipboard())
        return false;
    AppState& state = *app_state;
    state.clipboardCount = 0;
    state.clipboard.reset(
        static_cast<INVESTMENT_DATA*>(std::calloc(selected.size(), sizeof(INVESTMENT_DATA))));
    if (!state.clipboard) {
        MessageBox("Clipboard memory error!", B_INFO_ALERT);
        return false;
    }
    int32 copied = 0;
    for (const NorvelItem* row : selected) {
        if (!ReadInvestment(*state.investments, row->RecordNumber(), &state.clipboard[copied++])) {
            TellNotRead();
            return false;
        }
    }
    state.clipboardCount = copied; // all of them, or none
    return true;
}

void NorvelWindow::OnInvestmentCopy() {
    CopySelection();
}

void NorvelWindow::OnInvestmentCut() {
    if (!CopySelection())
        return;
    AppState& state = *app_state;
    std::vector<long> numbers;
    for (const NorvelItem* row : SelectedItems(investmentList_))
        numbers.push_back(row->RecordNumber());
    if (!CutFile(state.homeFolder).Keep({state.clipboard.get(), numbers.size()}, numbers)) {
        TellNotSaved();
        return;
    }
    state.clipboardIsOnlyCopy = true;
    OnInvestmentDelete();
}

void NorvelWindow::OnInvestmentPaste() {
    AppState& state = *app_state;
    if (state.clipboardCount <= 0 || currentPortfolio_[0] == '\0')
        return;
    DATABASE_HEADER before{};
    state.investments->GetHeaderInfo(&before);
    if (AppendCopies(*state.investments,
                     {state.clipboard.get(), static_cast<std::size_t>(state.clipboardCount)},
                     currentPortfolio_) &&
        state.investments->Sync() == 0) // before cut.db goes
        CutIsSettled();
    else
        TellNotSaved();
    ReloadInvestmentList();
    ShowRowsFrom(before.recordCount);
}
