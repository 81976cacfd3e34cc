#pragma once

#include "dialogs/PortfolioDialog.h"

// Asks for a new name for a portfolio. The present name counts as taken: who wants to keep it cancels.
class PortfolioEditDialog : public PortfolioDialog {
  public:
    PortfolioEditDialog(float x, float y, const char* title, char (&name)[NameSize], DATABASE* portfolios)
        : PortfolioDialog(x, y, title, name, portfolios, DialogHasOk | DialogHasCancel) {}

    int OnOK() override { return AcceptName(); }
};
