#pragma once

// Appends `text` as it is to the debug log at `logPath`, creating the log where needed, for its owner alone;
// the text "CLEAR" empties the log instead. The log is complete on disk when the call returns. A log that
// cannot be opened is passed over in silence. May be called from any thread: each text goes out in one write,
// so texts do not mix.
void PrintDebugStatement(const char* text, const char* logPath);
