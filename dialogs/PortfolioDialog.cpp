#include "dialogs/PortfolioDialog.h"

#include "app/model/PortfolioRules.h"
#include "util/CharacterBuffer.h"
#include "util/Strings.h"
#include "util/interface/InterfaceHelpers.h"

PortfolioNameCheck CheckPortfolioName(DATABASE& portfolios, const char* name) {
    if (!CanBePortfolioName(name) || IsBlank(name))
        return PortfolioNameCheck::Invalid;
    return SelectPortfolios(portfolios, name) > 0 ? PortfolioNameCheck::Taken : PortfolioNameCheck::Accepted;
}

PortfolioDialog::PortfolioDialog(float x, float y, const char* title, char (&name)[NameSize],
                                 DATABASE* portfolios)
    : FieldForm({x, y}, title, "Name:", NameSize - 1, DialogHasOk | DialogHasCancel),
      portfolios_(portfolios),
      name_(name) {
    SetText(name);
}

int PortfolioDialog::OnOK() {
    switch (CheckPortfolioName(*portfolios_, Text())) {
    case PortfolioNameCheck::Invalid:
        MessageBox("Invalid portfolio name!", B_INFO_ALERT);
        return 0;
    case PortfolioNameCheck::Taken:
        MessageBox("Portfolio name already exists!", B_INFO_ALERT);
        return 0;
    case PortfolioNameCheck::Accepted:
        break;
    }
    CopyTextZeroed(name_, Text());
    return 1;
}
