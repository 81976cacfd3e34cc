#include "dialogs/SettingsDialog.h"

#include "app/AppState.h"

namespace {

constexpr const char* Section = "GENERAL";
constexpr const char* Key = "Password";

} // namespace

SettingsDialog::SettingsDialog(BPoint where, uint16 flags)
    : PasswordForm(where, "Settings", flags), settings_(app_state->settingsPath) {
    char password[PasswordSize];
    settings_.ReadString(Section, Key, "", password);
    SetPassword(password);
}

int SettingsDialog::OnOK() {
    static_cast<void>(settings_.WriteString(Section, Key, Password()));
    return 1;
}
