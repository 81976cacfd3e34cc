#pragma once

#include "dialogs/PasswordForm.h"

// Asks for the start-up password. Whether it is the right one is for the caller to say.
class PasswordDialog : public PasswordForm {
  public:
    // The dialog is centred on center, in screen coordinates; flags are BDialog's. answer holds the first
    // text and receives what was typed when the dialog ends with DialogOk; it must last until DoModal
    // returns.
    PasswordDialog(BPoint center, char (&answer)[PasswordSize], uint16 flags);

    int OnOK() override;

  private:
    char (&answer_)[PasswordSize];
};
