#pragma once

#include <string>
#include <vector>

#include "platform/Types.h"

enum alert_type { B_INFO_ALERT, B_WARNING_ALERT, B_STOP_ALERT };

// A short message with one to three buttons. It is created with new; Go shows it, waits and deletes it. The
// last button is the default. Go may be called from any thread; the caller alone is blocked.
class BAlert {
  public:
    BAlert(const char* title, const char* text, const char* button1, const char* button2 = nullptr,
           const char* button3 = nullptr, alert_type type = B_INFO_ALERT);

    // Returns the index of the button pressed, counted from 0. Closing the alert or Escape answers with the
    // last button; so does a thread's stop request or the application's quit.
    int32 Go();

  private:
    ~BAlert() = default;

    std::string title_;
    std::string text_;
    std::vector<std::string> buttons_;
    alert_type type_;
};
