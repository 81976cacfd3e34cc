#pragma once

// Appends `text` as it is to the debug log at `logPath`, creating the log where needed; the text "CLEAR"
// empties the log instead. The log is complete on disk when the call returns. A log that cannot be opened is
// passed over in silence. May be called from any thread: each text goes out in one write, so texts do not
// mix.
void PrintDebugStatement(const char* text, const char* logPath);

// The debug log held open for many texts in a row, each of which is in the file when its call returns, as if
// PrintDebugStatement had written it. Others may write to the log, and empty it, in the meantime. It opens
// the log with the first text. It is a local object of whoever has much to say.
class DebugLog {
  public:
    // A null path is no log, and what is written to it is dropped, as with one that cannot be opened. The
    // path must live as long as the object.
    explicit DebugLog(const char* logPath) : logPath_(logPath) {}
    DebugLog(const DebugLog&) = delete;
    DebugLog& operator=(const DebugLog&) = delete;
    ~DebugLog();

    void Write(const char* text);

  private:
    const char* logPath_; // null once it is open or will not be
    int file_ = -1;
};
