#pragma once

#include <array>
#include <list>
#include <memory>
#include <optional>
#include <string>

#include "app/model/DailyBackup.h"
#include "app/model/DataFileOpening.h"
#include "app/state/AppState.h"
#include "platform/Application.h"
#include "platform/Bitmap.h"
#include "util/FolderLock.h"

// The application object: finds the program's folder and keeps other programs out of it, opens the three data
// files, says what is wrong with them, asks for the start-up password and opens the main window; at the end
// it rewrites the two data files that the program changes without their deleted records. It makes no data
// file: missing or foreign ones leave the program without portfolios, and are not touched. In a folder that
// cannot be written the files are opened for looking only.
//
// main owns the only one, on the interface thread. app_state and the status bitmaps last exactly as long.
class NorvelApp : public BApplication {
  public:
    // It says where the manual is, since Help shows nothing where there is no browser.
    static constexpr const char* AboutText = "Quorvan version " QUORVAN_VERSION "\n\nThe manual is the file "
                                             "help/Quorvan.html in your Quorvan folder. Help opens it in "
                                             "your web browser.";

    // Ends with the main window shown; or, when the password was refused or the folder cannot be used or is
    // in use, with the quit request posted, so that Run returns at once.
    NorvelApp();
    ~NorvelApp() override;

    void MessageReceived(BMessage* message) override;
    void AboutRequested() override;

    // What the process should end with: 1 when the folder could not be used, else 0.
    [[nodiscard]] int ExitStatus() const { return exitStatus_; }

  private:
    // Makes bitmaps and paths, takes the folder and opens the databases. 0, or 1 when the folder cannot be
    // used, which the person was told: then no file is opened. Sentences on what else is wrong are appended
    // to `complaints`, a line each.
    [[nodiscard]] int Initialize(std::string& complaints);
    void MakeStatusBitmaps();
    [[nodiscard]] bool BuildPaths();
    // Takes the home folder for this program, and those in which data files lie that are links in it. When
    // one of them cannot be written, lookOnly_ is set.
    [[nodiscard]] bool EnterFolders(std::string& complaints);
    [[nodiscard]] bool EnterFolder(FolderLock& lock, const std::string& folder, FolderLock::Outcome outcome,
                                   std::string& complaints);
    void OpenDatabases(std::string& complaints);
    void PrepareBackup();
    void RestoreCut(std::string& complaints);
    void RestoreLostPortfolios(std::string& complaints);
    // Whether the person may go on: no password is set, or it was typed.
    [[nodiscard]] bool PassPasswordGate();

    int exitStatus_ = 0;
    bool lookOnly_ = false;
    std::list<FolderLock> locks_;
    // What the databases reach their files through.
    ReadOnlyFiles readOnlyFiles_;
    std::optional<DailyBackup> backup_; // unless lookOnly_; and so the next two
    std::optional<BackedUpFiles> portfolioFiles_;
    std::optional<BackedUpFiles> investmentFiles_;
    AppState state_;
    std::array<std::unique_ptr<BBitmap>, 5> statusBitmaps_;
};
