#pragma once

#include "dialogs/BDialog.h"
#include "util/IniFile.h"

// What a password is kept in: at most 15 bytes and a NUL.
inline constexpr std::size_t PasswordSize = 16;

// Asks for the start-up password. Whether it is the right one is for the caller to say.
class PasswordDialog : public FieldForm {
  public:
    // The dialog is centred on center, in screen coordinates; flags are BDialog's. answer holds the first
    // text and receives what was typed when the dialog ends with DialogOk; it must last until DoModal
    // returns.
    PasswordDialog(BPoint center, char (&answer)[PasswordSize], uint16 flags);

    int OnOK() override;

  private:
    char (&answer_)[PasswordSize];
};

// Sets, changes or removes the start-up password in the program's settings file; an empty text removes it. Ok
// writes it, Cancel writes nothing. A write that fails, as without a settings file, changes nothing and is
// passed over.
class SettingsDialog : public FieldForm {
  public:
    // where is the dialog's left top in screen coordinates; flags are BDialog's. The running program's state
    // must exist (app_state).
    SettingsDialog(BPoint where, uint16 flags);

    int OnOK() override;

  private:
    INI_FILEx settings_;
};
