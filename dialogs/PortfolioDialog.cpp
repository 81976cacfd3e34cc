#include "dialogs/PortfolioDialog.h"

#include "app/model/PortfolioRules.h"
#include "platform/TextControl.h"
#include "util/CharacterBuffer.h"
#include "util/Strings.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr float Width = 200;
constexpr float FirstHeight = 80;
constexpr float Margin = 10;

} // namespace

PortfolioNameCheck CheckPortfolioName(DATABASE& portfolios, const char* name) {
    if (!CanBePortfolioName(name) || IsBlank(name))
        return PortfolioNameCheck::Invalid;
    return SelectPortfolios(portfolios, name) > 0 ? PortfolioNameCheck::Taken : PortfolioNameCheck::Accepted;
}

PortfolioDialog::PortfolioDialog(float x, float y, const char* title, char (&name)[NameSize],
                                 DATABASE* portfolios, uint16 flags)
    : BDialog({x, y, x + FormWidth(Width), y + FirstHeight}, title, flags),
      portfolios_(portfolios),
      name_(name) {
    ResizeTo(Bounds().Width(), 7 * FontHeight());
    const BRect frame(Margin, Margin, Bounds().right - Margin, Margin + 1.5F * FontHeight());
    nameControl_ = new BTextControl(frame, "text control", "Name:", "", nullptr, B_FOLLOW_LEFT | B_FOLLOW_TOP,
                                    B_WILL_DRAW | B_NAVIGABLE);
    nameControl_->SetDivider(TopView()->StringWidth("Name: "));
    nameControl_->SetMaxBytes(NameSize - 1);
    nameControl_->SetText(name);
    TopView()->AddChild(nameControl_);
    nameControl_->MakeFocus();
}

int PortfolioDialog::AcceptName() {
    switch (CheckPortfolioName(*portfolios_, nameControl_->Text())) {
    case PortfolioNameCheck::Invalid:
        MessageBox("Invalid portfolio name!", B_INFO_ALERT);
        return 0;
    case PortfolioNameCheck::Taken:
        MessageBox("Portfolio name already exists!", B_INFO_ALERT);
        return 0;
    case PortfolioNameCheck::Accepted:
        break;
    }
    CopyTextZeroed(name_, nameControl_->Text());
    return 1;
}
