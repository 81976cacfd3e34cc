#include "dialogs/PasswordDialog.h"

#include "util/CharacterBuffer.h"

PasswordDialog::PasswordDialog(BPoint center, char (&answer)[PasswordSize], uint16 flags)
    : PasswordForm(center, "Enter Password", flags), answer_(answer) {
    SetPassword(answer_);
    MoveBy(-Bounds().Width() / 2, -3 * FontHeight());
}

int PasswordDialog::OnOK() {
    CopyText(answer_, Password());
    return 1;
}
