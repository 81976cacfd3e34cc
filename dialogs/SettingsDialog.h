#pragma once

#include "dialogs/PasswordForm.h"
#include "util/IniFile.h"

// Sets, changes or removes the start-up password in the program's settings file; an empty text removes it. Ok
// writes it, Cancel writes nothing. A write that fails, as without a settings file, changes nothing and is
// passed over.
class SettingsDialog : public PasswordForm {
  public:
    // where is the dialog's left top in screen coordinates; flags are BDialog's. The running program's state
    // must exist (app_state).
    SettingsDialog(BPoint where, uint16 flags);

    int OnOK() override;

  private:
    INI_FILEx settings_;
};
