#include "dialogs/InvestmentDialog.h"

#include <string>

#include "app/model/PortfolioRules.h"
#include "app/state/AppState.h"
#include "platform/Alert.h"
#include "platform/Button.h"
#include "platform/MenuField.h"
#include "platform/TextControl.h"
#include "util/CharacterBuffer.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr float Width = 250;
constexpr float FirstHeight = 100;
constexpr float Margin = 10;
constexpr float RowGap = 5;
constexpr float PickListWidth = 20;
constexpr float PickListRise = 2;

template <std::size_t Size>
std::string TextOf(const char (&field)[Size]) {
    return std::string(FieldText(field));
}

void MarkItem(BMenu* menu, const std::string& label) {
    if (BMenuItem* item = menu->FindItem(label.c_str()))
        item->SetMarked(true);
}

void Warn(const char* text) {
    (new BAlert("", text, "Ok", nullptr, nullptr, B_WARNING_ALERT))->Go();
}

const char* WhyNot(InvestmentCheck check) {
    switch (check) {
    case InvestmentCheck::NoName:
        return "You must enter a Name!";
    case InvestmentCheck::SharesNotPlain:
        return "Shares must be a plain number such as 1250.5, with a point and no other separator!";
    case InvestmentCheck::PriceNotPlain:
        return "Share price must be a plain number such as 1250.5, with a point and no other separator!";
    case InvestmentCheck::SharesTooLarge:
        return "The number of shares is too large!";
    case InvestmentCheck::PriceTooLarge:
        return "The share price is too large!";
    default:
        return "Shares times share price is too large!";
    }
}

} // namespace

InvestmentDialog::InvestmentDialog(float x, float y, const char* title, INVESTMENT_DATA* investment,
                                   uint16 flags)
    : BDialog({x, y, x + FormWidth(Width), y + FirstHeight}, title, flags),
      investment_(investment),
      rowTop_(Margin) {
    ResizeTo(Bounds().Width(), 20 * FontHeight());
    rowWidth_ = Bounds().Width() - 2 * Margin;
    divider_ = Form()->StringWidth("Share price   ");
    AddRows();
    nameControl_->MakeFocus();
}

void InvestmentDialog::AddRows() {
    const float narrow = 2 * rowWidth_ / 3;
    const float besidePickList = rowWidth_ - PickListWidth;
    nameControl_ =
        AddTextRow("name control", "Name", TextOf(investment_->Name).c_str(), rowWidth_, NameSize - 1);
    tickerControl_ =
        AddTextRow("ticker control", "Ticker", TextOf(investment_->Ticker).c_str(), narrow, TickerSize - 1);

    typeControl_ =
        AddTextRow("type control", "Type", TextOf(investment_->Type).c_str(), besidePickList, NameSize - 1);
    auto* types = new BPopUpMenu("");
    FillTypeMenu(types);
    MarkItem(types, TextOf(investment_->Type));
    typeMenuField_ = AddPickList(typeControl_, types);

    sharesControl_ =
        AddTextRow("shares control", "Shares", ShownShares(*investment_).c_str(), narrow, MaxAmountBytes);
    priceControl_ =
        AddTextRow("price control", "Share price", ShownPrice(*investment_).c_str(), narrow, MaxAmountBytes);
    riskMenuField_ = AddRiskRow();

    agentControl_ = AddTextRow("agent control", "Agent", TextOf(investment_->Agent).c_str(), besidePickList,
                               NameSize - 1);
    auto* agents = new BPopUpMenu("");
    FillAgentMenu(agents);
    MarkItem(agents, TextOf(investment_->Agent));
    agentMenuField_ = AddPickList(agentControl_, agents);

    AddRetirementRow();
}

BTextControl* InvestmentDialog::AddTextRow(const char* name, const char* label, const char* text, float width,
                                           int32 maxBytes) {
    const BRect frame(Margin, rowTop_, Margin + width, rowTop_ + FontHeight());
    auto* control = new BTextControl(frame, name, label, "");
    control->SetDivider(divider_);
    control->SetMaxBytes(maxBytes);
    control->SetText(text);
    Form()->AddChild(control);
    EndRow(control);
    return control;
}

BMenuField* InvestmentDialog::AddRiskRow() {
    auto* risks = new BPopUpMenu("");
    FillRiskMenu(risks);
    MarkItem(risks, TextOf(investment_->Risk));
    const BRect frame(Margin, rowTop_, Margin + 2 * rowWidth_ / 3, rowTop_ + FontHeight());
    auto* field = new BMenuField(frame, "", "Risk", risks);
    field->SetDivider(divider_);
    Form()->AddChild(field);
    EndRow(field);
    return field;
}

BMenuField* InvestmentDialog::AddPickList(const BTextControl* control, BPopUpMenu* menu) {
    menu->SetTargetForItems(this);
    const BRect row = control->Frame();
    const BRect frame(row.right + 1, row.top - PickListRise, row.right + 1 + PickListWidth,
                      row.top - PickListRise + FontHeight());
    auto* field = new BMenuField(frame, "", "", menu);
    field->SetDivider(0);
    Form()->AddChild(field);
    return field;
}

void InvestmentDialog::AddRetirementRow() {
    const float width = 2 * Form()->StringWidth("Retirement");
    const BRect frame(Margin, rowTop_, Margin + width, rowTop_ + FontHeight());
    retirementCheckBox_ = new BCheckBox(frame, "retirement check", "Retirement", nullptr);
    retirementCheckBox_->SetValue(investment_->Retire != 0 ? B_CONTROL_ON : B_CONTROL_OFF);
    Form()->AddChild(retirementCheckBox_);
    EndRow(retirementCheckBox_);
}

void InvestmentDialog::EndRow(const BView* control) {
    rowTop_ = control->Frame().bottom + RowGap;
}

void InvestmentDialog::FillTypeMenu(BPopUpMenu* menu) {
    FillFromCategory(menu, "Type", MessageTypePicked, TypeField);
}

void InvestmentDialog::FillAgentMenu(BPopUpMenu* menu) {
    FillFromCategory(menu, "Agent", MessageAgentPicked, AgentField);
}

void InvestmentDialog::FillRiskMenu(BPopUpMenu* menu) {
    for (const char* risk : RiskNames)
        menu->AddItem(new BMenuItem(risk, nullptr));
    menu->ItemAt(1)->SetMarked(true);
}

void InvestmentDialog::FillFromCategory(BPopUpMenu* menu, const char* category, uint32 code,
                                        const char* field) {
    const bool read = ForEachCategoryEntry(*app_state->categories, category, [&](const char* entry) {
        auto* message = new BMessage(code);
        message->AddString(field, entry);
        menu->AddItem(new BMenuItem(entry, message));
    });
    if (!read)
        TellNotRead((std::string("The list for ") + category).c_str());
    if (BMenuItem* first = menu->ItemAt(0))
        first->SetMarked(true);
}

int InvestmentDialog::OnOK() {
    InvestmentInput input;
    input.name = nameControl_->Text();
    input.ticker = tickerControl_->Text();
    input.type = typeControl_->Text();
    input.shares = sharesControl_->Text();
    input.price = priceControl_->Text();
    if (const BMenuItem* risk = riskMenuField_->MenuItem())
        input.risk = risk->Label();
    input.agent = agentControl_->Text();
    input.retirement = retirementCheckBox_->Value() == B_CONTROL_ON;
    const InvestmentCheck check = FillInvestment(input, investment_);
    if (check == InvestmentCheck::Accepted)
        return 1;
    Warn(WhyNot(check));
    ControlOf(check)->MakeFocus();
    return 0;
}

BTextControl* InvestmentDialog::ControlOf(InvestmentCheck check) const {
    switch (check) {
    case InvestmentCheck::NoName:
        return nameControl_;
    case InvestmentCheck::PriceNotPlain:
    case InvestmentCheck::PriceTooLarge:
        return priceControl_;
    default:
        return sharesControl_;
    }
}

int InvestmentDialog::HandleMessage(BMessage* message) {
    const char* entry = nullptr;
    if (message->what == MessageTypePicked && message->FindString(TypeField, &entry) == B_OK)
        typeControl_->SetText(entry);
    else if (message->what == MessageAgentPicked && message->FindString(AgentField, &entry) == B_OK)
        agentControl_->SetText(entry);
    else
        return 0;
    return 1;
}
