#pragma once

#include "platform/View.h"

// Sends a message to a handler when something is invoked. Owns its message. Interface thread.
class BInvoker {
  public:
    // Takes ownership of message, which may be null.
    BInvoker(BMessage* message, const BHandler* target);
    virtual ~BInvoker();
    BInvoker(const BInvoker&) = delete;
    BInvoker& operator=(const BInvoker&) = delete;

    void SetMessage(BMessage* message) { message_.reset(message); }
    [[nodiscard]] BMessage* Message() const { return message_.get(); }
    // Where messages go from now on; null goes back to the default (a control's window). B_BAD_VALUE, with
    // nothing to send to, when target belongs to no looper yet.
    virtual status_t SetTarget(const BHandler* target);
    // Queues a copy of the message. B_BAD_VALUE when there is no message or no target.
    status_t Invoke();

  protected:
    // Where messages go while no target was set.
    [[nodiscard]] virtual BMessenger DefaultTarget() const { return {}; }

  private:
    std::unique_ptr<BMessage> message_;
    BMessenger target_;
    bool hasTarget_ = false;
};

constexpr int32 B_CONTROL_OFF = 0;
constexpr int32 B_CONTROL_ON = 1;

// Base of the controls a person works: a toolkit widget with a label, a value and a message sent to the
// window (or the target set) when it is worked. It keeps its label, and the person's font.
class BControl : public BView, public BInvoker {
  public:
    ~BControl() override;

    virtual void SetValue(int32 value) { value_ = value; }
    [[nodiscard]] int32 Value() const { return value_; }

  protected:
    BControl(BRect frame, const char* name, const char* label, BMessage* message, uint32 resizingMode,
             uint32 flags, std::unique_ptr<ViewPeer> peer);
    [[nodiscard]] BMessenger DefaultTarget() const override;
    // For a control whose value the person has just changed.
    void TakeValue(int32 value) { value_ = value; }

  private:
    int32 value_ = B_CONTROL_OFF;
};
