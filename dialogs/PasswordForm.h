#pragma once

#include <cstddef>

#include "dialogs/BDialog.h"

class BTextControl;

// What a password is kept in: at most 15 bytes and a NUL.
inline constexpr std::size_t PasswordSize = 16;

// The form that the settings and the start-up dialog share: one field, "Password:", whose text is readable as
// typed and cannot grow beyond what a password may have. What the text is for is the subclasses' business.
class PasswordForm : public BDialog {
  protected:
    // where is the form's left top in screen coordinates.
    PasswordForm(BPoint where, const char* title, uint16 flags);

    // Puts the text into the field, selected, and the focus on it.
    void SetPassword(const char* password);
    // Valid until the text changes.
    [[nodiscard]] const char* Password() const;

  private:
    BTextControl* passwordControl_;
};
