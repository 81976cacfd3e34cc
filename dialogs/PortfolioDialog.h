#pragma once

#include "app/model/RecordLayouts.h"
#include "dialogs/BDialog.h"

class DATABASE;

// What a portfolio's name may turn out to be.
enum class PortfolioNameCheck { Accepted, Invalid, Taken };

// Whether a portfolio may have this name: one that a record and a query can hold (CanBePortfolioName), and
// none that a portfolio has in any letter case. When the file cannot be read the name is accepted:
// AddPortfolio and RenamePortfolio find out for themselves. Replaces the database's result set.
[[nodiscard]] PortfolioNameCheck CheckPortfolioName(DATABASE& portfolios, const char* name);

// Asks for a portfolio's name: one field, which cannot grow beyond what a record holds. It writes nothing to
// the database; the caller adds or renames when the dialog has ended with DialogOk.
class PortfolioDialog : public FieldForm {
  public:
    // The left top is in screen coordinates. name holds the first text and receives the accepted one; it and
    // the database must last until DoModal returns.
    PortfolioDialog(float x, float y, const char* title, char (&name)[NameSize], DATABASE* portfolios);

    // Hands the typed name to the caller and returns 1, or tells the person why not and returns 0.
    int OnOK() override;

  private:
    DATABASE* portfolios_;
    char (&name_)[NameSize];
};

// Asks for the name of a new portfolio.
class PortfolioAddDialog : public PortfolioDialog {
  public:
    using PortfolioDialog::PortfolioDialog;
};

// Asks for a new name for a portfolio. The present name counts as taken: who wants to keep it cancels.
class PortfolioEditDialog : public PortfolioDialog {
  public:
    using PortfolioDialog::PortfolioDialog;
};
