#include "app/NorvelApp.h"

#include <algorithm>
#include <cerrno>
#include <cstring>

#include "ColumnListView/ColumnListView.h"
#include "app/NorvelWindow.h"
#include "app/model/CutFile.h"
#include "app/model/DataFileOpening.h"
#include "app/model/DataFolders.h"
#include "app/model/PortfolioRules.h"
#include "db/Database.h"
#include "dialogs/PasswordDialogs.h"
#include "resources/DesktopFiles.h"
#include "resources/StatusImages.h"
#include "util/CharacterBuffer.h"
#include "util/File.h"
#include "util/IniFile.h"
#include "util/Strings.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr const char* Signature = "application/x-vnd.Palandri-Quorvan";
constexpr const char* Program = "quorvan"; // as a lock names it

struct StatusBitmap {
    BBitmap** global;
    const StatusImageData& pixels;
};
constexpr StatusBitmap StatusBitmaps[] = {
    {&UpArrowBitmap, UpArrowImageData},         {&DownArrowBitmap, DownArrowImageData},
    {&EqualsSignBitmap, EqualsSignImageData},   {&QuestionMarkBitmap, QuestionMarkImageData},
    {&ErrorSymbolBitmap, ErrorSymbolImageData},
};

// False when the path does not fit.
bool JoinPath(char (&out)[PathBufferSize], const char* folder, const char* file) {
    return FormatInto(out, sizeof out, "%s/%s", folder, file);
}

bool IsFull(int error) {
    return error == ENOSPC || error == EDQUOT;
}

// The application's message to itself that the day's backup failed, with the errno number.
constexpr uint32 MessageBackupFailed = 1050;
constexpr const char* ErrorField = "Error";

// Whether the person says that the program has ended which the folder's lock names.
bool HasEnded(const FolderLock& lock, const std::string& folder) {
    const std::string question = "The folder " + folder + " was in use by " + DescribeHolder(lock.Holder()) +
                                 ", and it cannot be seen from here whether it still is. Two programs that "
                                 "change the same files damage them.\n\nHas that program ended?";
    return !YesNoBox(question.c_str());
}

} // namespace

NorvelApp::NorvelApp() : BApplication(Signature) {
    // Without its icon the program works all the same.
    static_cast<void>(SetDesktopIdentity(DesktopId, ProgramIcon()));
    app_state = &state_;
    std::string complaints;
    if (Initialize(complaints) != 0)
        exitStatus_ = 1;
    if (exitStatus_ != 0 || !PassPasswordGate()) {
        PostMessage(B_QUIT_REQUESTED);
        return;
    }
    if (!complaints.empty()) {
        complaints.pop_back(); // the last line's end
        MessageBox(complaints.c_str(), B_WARNING_ALERT);
    }
    (new NorvelWindow)->Activate(); // above what stood there while the password was asked for
}

NorvelApp::~NorvelApp() {
    for (std::unique_ptr<DATABASE>* database : {&state_.portfolios, &state_.investments}) {
        if (!*database)
            continue;
        DATABASE_HEADER header{};
        (*database)->GetHeaderInfo(&header);
        // What was deleted on an earlier day can be had back until now.
        if (backup_ && header.deletedCount > 0)
            static_cast<void>(backup_->Keep());
        (*database)->Compress(0);
        database->reset();
    }
    app_state = nullptr;
    for (const StatusBitmap& bitmap : StatusBitmaps)
        *bitmap.global = nullptr;
}

int NorvelApp::Initialize(std::string& complaints) {
    MakeStatusBitmaps();
    if (!BuildPaths()) {
        MessageBox("Quorvan cannot start: the path of its folder is too long. Please move the folder to a "
                   "place with a path of at most 108 characters.",
                   B_STOP_ALERT);
        return 1;
    }
    if (!EnterFolders(complaints))
        return 1;
    PrepareBackup();
    OpenDatabases(complaints);
    return 0;
}

void NorvelApp::MakeStatusBitmaps() {
    for (std::size_t i = 0; i < statusBitmaps_.size(); ++i) {
        const StatusImageData& pixels = StatusBitmaps[i].pixels;
        statusBitmaps_[i] = std::make_unique<PrefilledBitmap>(BRect(0, 0, 15, 15), B_CMAP8, pixels.data(),
                                                              static_cast<int32>(pixels.size()));
        *StatusBitmaps[i].global = statusBitmaps_[i].get();
    }
}

bool NorvelApp::BuildPaths() {
    return GetHomeDir(state_.homeFolder) && JoinPath(state_.settingsPath, state_.homeFolder, "Quorvan.ini") &&
           JoinPath(state_.helpPath, state_.homeFolder, "/help/Quorvan.html") &&
           JoinPath(state_.quoteSourcePath, state_.homeFolder, "Quorvan.cfg") &&
           JoinPath(state_.logPath, state_.homeFolder, "Quorvan.log");
}

bool NorvelApp::EnterFolders(std::string& complaints) {
    return TakeFolders(
        locks_, state_.homeFolder, DailyBackup::FilesKeptWith("invest.db"), Program,
        [&](FolderLock& lock, const std::string& folder, FolderLock::Outcome outcome) {
            return EnterFolder(lock, folder, outcome, complaints);
        });
}

bool NorvelApp::EnterFolder(FolderLock& lock, const std::string& folder, FolderLock::Outcome outcome,
                            std::string& complaints) {
    if (outcome == FolderLock::Outcome::Doubtful && HasEnded(lock, folder))
        outcome = lock.Take(folder, Program, FolderLock::Doubt::PassOver);
    if (outcome == FolderLock::Outcome::Held)
        MessageBox(("Quorvan cannot start: its folder " + folder + " is in use by " +
                    DescribeHolder(lock.Holder()) + ". Please close that program first.")
                       .c_str(),
                   B_STOP_ALERT);
    if (outcome == FolderLock::Outcome::Held || outcome == FolderLock::Outcome::Doubtful)
        return false;
    const int error = outcome == FolderLock::Outcome::Failed ? lock.Error() : TryWritingIn(folder);
    const bool lookOnly = error != 0 && !(IsFull(error) && lock.IsTaken());
    lookOnly_ = lookOnly_ || lookOnly;
    if (lookOnly)
        complaints += "The folder " + folder + " cannot be written: " +
                      (error == EINVAL ? std::string(FolderLock::FileName) + " in it is no file of Quorvan's"
                                       : Reason(error)) +
                      ". You can look at your portfolios, but no change will be kept.\n";
    else if (error != 0)
        complaints += "The disk of the folder " + folder +
                      " is full. Please make room: until then changes may not be kept.\n";
    return true;
}

void NorvelApp::PrepareBackup() {
    if (lookOnly_)
        return;
    backup_.emplace(state_.homeFolder, DailyBackup::FilesKeptWith("invest.db"));
    portfolioFiles_.emplace(*backup_);
    investmentFiles_.emplace(*backup_);
    // Told by the loop, since it fails in the middle of a command or on the price update's thread.
    backup_->OnFailure([this](int error) {
        BMessage message(MessageBackupFailed);
        message.AddInt32(ErrorField, error);
        PostMessage(&message);
    });
}

void NorvelApp::OpenDatabases(std::string& complaints) {
    const auto open = [&](const char* name, bool (*holds)(DATABASE&), std::optional<BackedUpFiles>* files) {
        FileOperations& operations = lookOnly_ ? readOnlyFiles_ : files ? **files : SystemFiles();
        const bool change = files != nullptr && !lookOnly_;
        return OpenDataFile(state_.homeFolder, name, holds, change ? DataFileUse::Change : DataFileUse::Look,
                            operations, complaints);
    };
    state_.portfolios = open("portfol.db", HoldsPortfolios, &portfolioFiles_);
    state_.investments = open("invest.db", HoldsInvestments, &investmentFiles_);
    state_.categories = open("misc.db", HoldsCategories, nullptr); // which the program never changes
    if (backup_)
        backup_->Prepare();
    if (!lookOnly_ && state_.portfolios->IsOpen() && state_.investments->IsOpen()) {
        RestoreCut(complaints);
        RestoreLostPortfolios(complaints);
    }
}

void NorvelApp::RestoreCut(std::string& complaints) {
    switch (CutFile(state_.homeFolder).Restore(*state_.investments)) {
    case CutFile::Outcome::NothingKept:
        break;
    case CutFile::Outcome::Restored:
        complaints += "What had been cut and not pasted when Quorvan last ended is back in its portfolio.\n";
        break;
    case CutFile::Outcome::Failed:
        complaints += "What had been cut and not pasted when Quorvan last ended could not be put back. It is "
                      "kept in the file cut.db, and nothing can be cut while that is there.\n";
        break;
    }
}

void NorvelApp::RestoreLostPortfolios(std::string& complaints) {
    constexpr std::size_t named = 5;
    const std::vector<std::string> names = RestorePortfolios(*state_.portfolios, *state_.investments);
    if (names.empty())
        return;
    static_cast<void>(state_.portfolios->Sync()); // they would be found again the next time
    std::string list;
    for (std::size_t i = 0; i < std::min(names.size(), named); ++i)
        list += (i == 0 ? "\"" : ", \"") + names[i] + "\"";
    if (names.size() > named)
        list += " and " + std::to_string(names.size() - named) + " more";
    complaints +=
        "There are investments of portfolios that were not in the list. These portfolios are in the "
        "list again: " +
        list + ".\n";
}

void NorvelApp::MessageReceived(BMessage* message) {
    if (message->what != MessageBackupFailed) {
        BApplication::MessageReceived(message);
        return;
    }
    int32 error = 0;
    static_cast<void>(message->FindInt32(ErrorField, &error));
    MessageBox(("The day's backup of your portfolios could not be made in the folder \"backups\": " +
                Reason(error) + ".\nYour changes are saved all the same.")
                   .c_str(),
               B_WARNING_ALERT);
}

bool NorvelApp::PassPasswordGate() {
    char password[PasswordSize];
    ReadSetting(INI_FILEx(state_.settingsPath), "GENERAL", "Password", password);
    if (password[0] == '\0')
        return true;
    BPoint center;
    GetScreenCenter(&center);
    char typed[PasswordSize] = "";
    if ((new PasswordDialog(center, typed, DialogHasOk | DialogHasCancel))->DoModal() != DialogOk)
        return false;
    Trim(typed); // as the settings keep it
    Trim(password);
    if (std::strcmp(typed, password) == 0)
        return true;
    MessageBox("Invalid password", B_INFO_ALERT);
    return false;
}

void NorvelApp::AboutRequested() {
    MessageBox(AboutText, B_INFO_ALERT);
}
