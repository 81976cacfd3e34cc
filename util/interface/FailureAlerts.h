#pragma once

// What the person is told when a data file or the network lets a command down. Each shows an alert and waits
// until it is closed. Any thread.

// A change could not be written to its file.
void TellNotSaved();
// A record could not be read: an investment, unless `what` says otherwise.
void TellNotRead(const char* what = "An investment");
// The network cannot be reached.
void TellNotConnected();
// A quote server's certificate was refused.
void TellNotTrusted(const char* host);
