#include "dialogs/PasswordDialogs.h"

#include "app/state/AppState.h"
#include "util/CharacterBuffer.h"
#include "util/Strings.h"

namespace {

constexpr const char* Label = "Password:";
constexpr const char* Section = "GENERAL";
constexpr const char* Key = "Password";

} // namespace

PasswordDialog::PasswordDialog(BPoint center, char (&answer)[PasswordSize], uint16 flags)
    : FieldForm(center, "Enter Password", Label, PasswordSize - 1, flags), answer_(answer) {
    SetText(answer_);
    MoveBy(-Bounds().Width() / 2, -3 * FontHeight());
}

int PasswordDialog::OnOK() {
    CopyText(answer_, Text());
    return 1;
}

SettingsDialog::SettingsDialog(BPoint where, uint16 flags)
    : FieldForm(where, "Settings", Label, PasswordSize - 1, flags), settings_(app_state->settingsPath) {
    char password[PasswordSize];
    ReadSetting(settings_, Section, Key, password);
    SetText(password);
}

int SettingsDialog::OnOK() {
    // The settings file keeps no blanks at a value's end; a password that ended in one would never be right
    // again.
    char password[PasswordSize];
    CopyText(password, Text());
    Trim(password);
    static_cast<void>(settings_.WriteString(Section, Key, password));
    return 1;
}
