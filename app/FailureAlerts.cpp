#include "app/FailureAlerts.h"

#include "util/InterfaceHelpers.h"

void TellNotSaved() {
    MessageBox("The change could not be saved! Is the disk full, or the file protected?", B_STOP_ALERT);
}

void TellNotRead() {
    MessageBox("An investment could not be read from its file!", B_STOP_ALERT);
}

void TellNotConnected() {
    MessageBox("No Internet connection found!\nPlease establish your connection and try again.",
               B_STOP_ALERT);
}
