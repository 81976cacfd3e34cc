#include "util/interface/FailureAlerts.h"

#include <string>

#include "util/interface/InterfaceHelpers.h"

void TellNotSaved() {
    MessageBox("The change could not be saved! Is the disk full, or the file protected?", B_STOP_ALERT);
}

void TellNotRead(const char* what) {
    MessageBox((std::string(what) + " could not be read from its file!").c_str(), B_STOP_ALERT);
}

void TellNotConnected() {
    MessageBox("No Internet connection found!\nPlease establish your connection and try again.",
               B_STOP_ALERT);
}

void TellNotTrusted(const char* host) {
    MessageBox(
        (std::string("The server ") + host +
         " could not be trusted: its certificate was refused, and it was not asked for a price.\nIs the "
         "name in Quorvan.cfg right, and the date of this computer?")
            .c_str(),
        B_STOP_ALERT);
}
