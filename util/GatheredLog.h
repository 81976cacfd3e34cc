#pragma once

#include <string>
#include <string_view>

// Lines for a debug log that are written together: to open and write the log for each line took half as long
// as a request to a near server. Its owner calls Write before every wait that may be a long one, so that the
// log tells what is being waited for; without that it writes whenever a few kilobytes are there, and at its
// end. It does not format lines and empties no log (see PrintDebugStatement). A local object or a member;
// used on one thread at a time.
class GatheredLog {
  public:
    // `path` is borrowed.
    explicit GatheredLog(const char* path) : path_(path) {}
    GatheredLog(const GatheredLog&) = delete;
    GatheredLog& operator=(const GatheredLog&) = delete;
    ~GatheredLog() { Write(); }

    // Adds the text as it is.
    void Add(std::string_view text);
    // Appends to the log what has been added since. A log that cannot be opened loses it.
    void Write();

  private:
    const char* path_;
    std::string unwritten_;
};
