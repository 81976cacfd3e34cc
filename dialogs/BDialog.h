#pragma once

#include <cstddef>
#include <memory>

#include "platform/Window.h"

class BTextControl;

// How a modal dialog ended; also the codes of its two buttons.
inline constexpr uint32 DialogCancel = 2001; // cancelled or closed
inline constexpr uint32 DialogOk = 2002;     // confirmed, and its data accepted

// Which buttons a dialog has.
inline constexpr uint16 DialogHasOk = 1;
inline constexpr uint16 DialogHasCancel = 2;

// Base of the program's modal dialogs: a grey window with "Ok" and "Cancel" in its lower right corner that a
// caller creates with new, runs with DoModal and gets a result from. Enter presses Ok, Escape and the close
// box cancel. A dialog is run once and then deletes itself; what was typed reaches the caller through buffers
// given to the subclass's constructor, which are written in OnOK and never after DoModal has returned.
//
// It lays out nothing but its buttons and knows no data. It lives on the interface thread; only DoModal may
// be called from another one.
class BDialog : public BWindow {
  public:
    // Builds the dialog, hidden. frame is in screen coordinates; flags say which buttons there are.
    BDialog(BRect frame, const char* title, uint16 flags);
    // Ends the dialog with DialogCancel, should it still be running.
    ~BDialog() override;

    // Shows the dialog, waits until it ends and lets it go; returns DialogOk or DialogCancel. The caller must
    // not touch the dialog afterwards. It blocks its caller alone: windows go on painting, and other loopers
    // serve their messages. A stop request to the calling thread and the application's quit end it with
    // DialogCancel.
    uint32 DoModal();

    // Ends the dialog with the given result; only the first call counts.
    void EndDialog(uint32 result);

    // The Ok button was pressed: 1 accepts and ends the dialog with DialogOk; anything else keeps it open,
    // after the override has told the person why. The base accepts.
    virtual int OnOK() { return 1; }

    // Any other message: 0 when it is not the subclass's, 2 to end the dialog with DialogOk, anything else
    // (1) when it was handled. The base returns 0.
    virtual int HandleMessage(BMessage* /*message*/) { return 0; }

    void MessageReceived(BMessage* message) override;
    // Makes the dialog less high first where the screen has no room for it.
    void Show() override;

  protected:
    // Fills the dialog above its buttons; subclasses add their controls to it. They scroll where the screen
    // has no room for all, so that the buttons are always seen.
    [[nodiscard]] BView* Form() const { return form_; }
    // The width of a form that is usual wide: more when the person's font is so large that buttons and fields
    // would not find room.
    [[nodiscard]] static float FormWidth(float usual);
    // Height of the bold font, the unit of the dialogs' layouts.
    [[nodiscard]] float FontHeight() const { return fontHeight_; }

  private:
    struct Outcome;

    // Returns where they begin.
    float AddButtons(uint16 flags);

    BView* topView_;
    BView* form_ = nullptr;
    float fontHeight_;
    std::shared_ptr<Outcome> outcome_; // shared with DoModal, which may outlive the dialog
};

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
