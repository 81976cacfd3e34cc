#pragma once

#include "dialogs/PortfolioDialog.h"

// Asks for the name of a new portfolio.
class PortfolioAddDialog : public PortfolioDialog {
  public:
    PortfolioAddDialog(float x, float y, const char* title, char (&name)[NameSize], DATABASE* portfolios)
        : PortfolioDialog(x, y, title, name, portfolios, DialogHasOk | DialogHasCancel) {}

    int OnOK() override { return AcceptName(); }
};
