#include "app/NorvelApp.h"

#include <cstring>

#include <malloc.h>

#include "ColumnListView/PrefilledBitmap.h"
#include "app/NorvelWindow.h"
#include "app/PortfolioRules.h"
#include "db/Compaction.h"
#include "db/Database.h"
#include "dialogs/PasswordDialog.h"
#include "resources/DesktopFiles.h"
#include "resources/StatusImages.h"
#include "util/CharacterBuffer.h"
#include "util/IniFile.h"
#include "util/InterfaceHelpers.h"
#include "util/Strings.h"

namespace {

constexpr const char* Signature = "application/x-vnd.Palandri-Quorvan";

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

// Opens a data file. One that is no such file, or has another layout than the program's records, gives a
// database without a file.
std::unique_ptr<DATABASE> OpenDatabase(const char* folder, const char* file, bool (*holds)(DATABASE&)) {
    char path[PathBufferSize];
    if (JoinPath(path, folder, file)) {
        RestoreCompactionBackup(path);
        auto database = std::make_unique<DATABASE>(path);
        if (holds(*database))
            return database;
    }
    return std::make_unique<DATABASE>(nullptr);
}

// A portfolio's rows come and go together. Their memory is kept for the next portfolio's up to this size:
// handing it back to the system and having it cleared anew takes longer than making the rows.
void KeepRowMemory() {
    constexpr int keptBytes = 64 * 1024 * 1024;
    mallopt(M_TOP_PAD, keptBytes);
    mallopt(M_TRIM_THRESHOLD, keptBytes);
}

} // namespace

NorvelApp::NorvelApp() : BApplication(Signature) {
    KeepRowMemory();
    // Without its icon the program works all the same.
    static_cast<void>(SetDesktopIdentity(DesktopId, ProgramIcon()));
    app_state = &state_;
    const bool ready = Initialize() == 0;
    if (!ready)
        MessageBox("Quorvan cannot start: the path of its folder is too long. Please move the folder to a "
                   "place with a path of at most 108 characters.",
                   B_STOP_ALERT);
    if (ready && PassPasswordGate())
        (new NorvelWindow)->Activate(); // above what stood there while the password was asked for
    else
        PostMessage(B_QUIT_REQUESTED);
}

NorvelApp::~NorvelApp() {
    for (std::unique_ptr<DATABASE>* database : {&state_.portfolios, &state_.investments}) {
        if (*database)
            (*database)->Compress(0);
        database->reset();
    }
    app_state = nullptr;
    for (const StatusBitmap& bitmap : StatusBitmaps)
        *bitmap.global = nullptr;
}

int NorvelApp::Initialize() {
    MakeStatusBitmaps();
    if (!BuildPaths())
        return 1;
    OpenDatabases();
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

void NorvelApp::OpenDatabases() {
    state_.portfolios = OpenDatabase(state_.homeFolder, "portfol.db", HoldsPortfolios);
    state_.investments = OpenDatabase(state_.homeFolder, "invest.db", HoldsInvestments);
    state_.categories = OpenDatabase(state_.homeFolder, "misc.db", HoldsCategories);
}

bool NorvelApp::PassPasswordGate() {
    char password[PasswordSize];
    INI_FILEx(state_.settingsPath).ReadString("GENERAL", "Password", "", password);
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
    MessageBox("Quorvan version 1.0", B_INFO_ALERT);
}
