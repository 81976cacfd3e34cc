#pragma once

#include <array>
#include <memory>

#include "app/AppState.h"
#include "platform/Application.h"
#include "platform/Bitmap.h"

// The application object: finds the program's folder, opens the three data files, asks for the start-up
// password and opens the main window; at the end it rewrites the two data files that the program changes
// without their deleted records. It makes no data file: missing or foreign ones leave the program without
// portfolios, and are not touched.
//
// main owns the only one, on the interface thread. app_state and the status bitmaps last exactly as long.
class NorvelApp : public BApplication {
  public:
    // Ends with the main window shown; or, when the password was refused or the folder cannot be used, with
    // the quit request posted, so that Run returns at once.
    NorvelApp();
    ~NorvelApp() override;

    void AboutRequested() override;

  private:
    // Makes the bitmaps and paths and opens the databases. 0, or 1 when the folder's path is too long for the
    // files in it: then no file is opened.
    [[nodiscard]] int Initialize();
    void MakeStatusBitmaps();
    [[nodiscard]] bool BuildPaths();
    void OpenDatabases();
    // Whether the person may go on: no password is set, or it was typed.
    [[nodiscard]] bool PassPasswordGate();

    AppState state_;
    std::array<std::unique_ptr<BBitmap>, 5> statusBitmaps_;
};
