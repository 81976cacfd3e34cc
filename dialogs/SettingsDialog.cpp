#include "dialogs/SettingsDialog.h"

#include "app/state/AppState.h"
#include "util/CharacterBuffer.h"
#include "util/Strings.h"

namespace {

constexpr const char* Section = "GENERAL";
constexpr const char* Key = "Password";

} // namespace

SettingsDialog::SettingsDialog(BPoint where, uint16 flags)
    : PasswordForm(where, "Settings", flags), settings_(app_state->settingsPath) {
    char password[PasswordSize];
    ReadSetting(settings_, Section, Key, password);
    SetPassword(password);
}

int SettingsDialog::OnOK() {
    // The settings file keeps no blanks at a value's end; a password that ended in one would never be right
    // again.
    char password[PasswordSize];
    CopyText(password, Password());
    Trim(password);
    static_cast<void>(settings_.WriteString(Section, Key, password));
    return 1;
}
