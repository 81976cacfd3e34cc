#pragma once

#include "app/model/RecordLayouts.h"
#include "dialogs/BDialog.h"
#include "dialogs/InvestmentInput.h"

class BCheckBox;
class BMenuField;
class BPopUpMenu;
class BTextControl;
class BView;

// The codes and string fields of the messages that the pick lists send to the dialog.
inline constexpr uint32 MessageTypePicked = 1060;
inline constexpr uint32 MessageAgentPicked = 1061;
inline constexpr const char* TypeField = "Type";
inline constexpr const char* AgentField = "Agent";

// The form for a new investment or an existing one. On Ok the person's input is in the caller's record, with
// its value and today's date; the record is stored by the caller. What is stored as type and agent is always
// the text in their fields; the pick lists beside them, from the categories database, only fill those.
class InvestmentDialog : public BDialog {
  public:
    // The left top is in screen coordinates; flags are BDialog's. investment fills the form and receives the
    // input; it must last until DoModal returns. The running program's state must exist (app_state).
    InvestmentDialog(float x, float y, const char* title, INVESTMENT_DATA* investment, uint16 flags);

    int OnOK() override;
    int HandleMessage(BMessage* message) override;

  private:
    // The field that what was refused is in.
    [[nodiscard]] BTextControl* ControlOf(InvestmentCheck check) const;

    void AddRows();
    void AddRetirementRow();
    BTextControl* AddTextRow(const char* name, const char* label, const char* text, float width,
                             int32 maxBytes);
    BMenuField* AddRiskRow();
    // Puts a pop-up right behind the control of the row above.
    BMenuField* AddPickList(const BTextControl* control, BPopUpMenu* menu);
    void EndRow(const BView* control);

    void FillTypeMenu(BPopUpMenu* menu);
    void FillAgentMenu(BPopUpMenu* menu);
    void FillRiskMenu(BPopUpMenu* menu);
    void FillFromCategory(BPopUpMenu* menu, const char* category, uint32 code, const char* field);

    INVESTMENT_DATA* investment_;
    float rowTop_;
    float rowWidth_ = 0;
    float divider_ = 0;
    BTextControl* nameControl_ = nullptr;
    BTextControl* tickerControl_ = nullptr;
    BTextControl* typeControl_ = nullptr;
    BMenuField* typeMenuField_ = nullptr;
    BTextControl* sharesControl_ = nullptr;
    BTextControl* priceControl_ = nullptr;
    BMenuField* riskMenuField_ = nullptr;
    BTextControl* agentControl_ = nullptr;
    BMenuField* agentMenuField_ = nullptr;
    BCheckBox* retirementCheckBox_ = nullptr;
};
