#pragma once

#include <cstddef>

#include "dialogs/BDialog.h"

class BTextControl;

// A dialog with one field for a short text, readable as typed, that has the focus and cannot grow beyond what
// is kept of it. What the text is for is the subclasses' business.
class FieldForm : public BDialog {
  protected:
    // where is the form's left top in screen coordinates; the field takes maxBytes at most.
    FieldForm(BPoint where, const char* title, const char* label, std::size_t maxBytes, uint16 flags);

    // Puts the text into the field, selected.
    void SetText(const char* text);
    // Valid until the text changes.
    [[nodiscard]] const char* Text() const;

  private:
    BTextControl* field_;
};
