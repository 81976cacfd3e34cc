#include "platform/Application.h"

#include <algorithm>
#include <clocale>
#include <filesystem>
#include <mutex>

#include <QApplication>
#include <QDesktopServices>
#include <QFileInfo>
#include <QIcon>
#include <QPainter>
#include <QPalette>
#include <QPixmap>
#include <QSvgRenderer>
#include <QTimer>
#include <QUrl>

#include "platform/Window.h"
#include "platform/private/ApplicationPeer.h"
#include "platform/private/Convert.h"
#include "platform/private/Loop.h"
#include "platform/private/ViewPeer.h"

BApplication* be_app = nullptr;

namespace {

constexpr int QuitRetryMilliseconds = 5;
constexpr bigtime_t ThreadPatience = 5000000;

constexpr int IconSizes[] = {16, 22, 24, 32, 48, 64, 128, 256};

std::string gExecutablePath; // empty: ask the system

// The toolkit wants its arguments to live as long as itself.
int gArgumentCount = 1;
char gProgramName[] = "quorvan";
char* gArguments[] = {gProgramName, nullptr};

bool OpenWithDesktop(const char* path) {
    return QDesktopServices::openUrl(QUrl::fromLocalFile(QString::fromUtf8(path)));
}

bool (*gLauncher)(const char*) = OpenWithDesktop;
const BRoster Roster;

// Controls in light colours, black on grey and white, whatever the desktop's theme: they stand between what
// views paint in colours of their own. The person's fonts are left alone.
// The style, too: some paint in the theme's colours whatever the palette says.
void SetLook() {
    QPalette palette(QColor(240, 240, 240), QColor(216, 216, 216));
    palette.setColor(QPalette::Highlight, QColor(0, 0, 128));
    palette.setColor(QPalette::HighlightedText, Qt::white);
    QApplication::setStyle(QStringLiteral("Fusion"));
    QApplication::setPalette(palette);
}

} // namespace

BApplication::BApplication(const char* signature)
    : BLooper("application"), signature_(signature), peer_(std::make_unique<ApplicationPeer>()) {
    be_app = this;
    peer_->toolkit = std::make_unique<QApplication>(gArgumentCount, gArguments);
    // The toolkit takes over the person's locale; numbers in files and on screen keep the decimal point all
    // the same.
    std::setlocale(LC_NUMERIC, "C");
    QApplication::setApplicationName(QStringLiteral("Quorvan"));
    // The loop ends when the application says so, not when a start-up dialog closes before the first window
    // opens.
    QApplication::setQuitOnLastWindowClosed(false);
    SetLook();
    NameAccessibleRoles();
    OpenInterfaceThread();
    ApplicationAccess::WatchInput(*peer_->toolkit);
    FontAccess::MakeSystemFonts();
}

BApplication::~BApplication() {
    while (BWindow* window = WindowAt(0))
        delete window;
    StopAllThreads(ThreadPatience);
    CloseInterfaceThread();
    FontAccess::DeleteSystemFonts();
    peer_->toolkit.reset();
    be_app = nullptr;
}

void BApplication::Run() {
    QApplication::exec();
}

void BApplication::MessageReceived(BMessage* message) {
    if (message->what == B_ABOUT_REQUESTED)
        AboutRequested();
    else
        BLooper::MessageReceived(message);
}

bool BApplication::QuitRequested() {
    for (int32 index = 0; BWindow* window = WindowAt(index); ++index)
        if (!window->QuitRequested())
            return false;
    return true;
}

void BApplication::Quit() {
    if (peer_->quitting)
        return;
    peer_->quitting = true;
    ApplicationAccess::QuitWhenNothingWaits(*this);
}

int32 BApplication::CountWindows() const {
    const std::lock_guard guard(peer_->mutex);
    return static_cast<int32>(peer_->windows.size());
}

BWindow* BApplication::WindowAt(int32 index) const {
    const std::lock_guard guard(peer_->mutex);
    if (index < 0 || static_cast<std::size_t>(index) >= peer_->windows.size())
        return nullptr;
    return peer_->windows[static_cast<std::size_t>(index)];
}

bool BApplication::SetDesktopIdentity(const char* desktopId, std::string_view svgIcon) {
    QApplication::setDesktopFileName(QString::fromUtf8(desktopId));
    QSvgRenderer picture(QByteArray(svgIcon.data(), static_cast<qsizetype>(svgIcon.size())));
    if (!picture.isValid())
        return false;
    QIcon icon;
    for (const int size : IconSizes) {
        QPixmap pixels(size, size);
        pixels.fill(Qt::transparent);
        QPainter painter(&pixels);
        picture.render(&painter);
        painter.end();
        icon.addPixmap(pixels);
    }
    QApplication::setWindowIcon(icon);
    return true;
}

status_t BApplication::GetAppInfo(app_info* info) const {
    info->ref.path = ExecutablePath();
    info->signature = signature_;
    return B_OK;
}

std::string BApplication::ExecutablePath() {
    std::error_code error;
    return gExecutablePath.empty() ? std::filesystem::read_symlink("/proc/self/exe", error).string()
                                   : gExecutablePath;
}

void BApplication::SetExecutablePath(const char* path) {
    gExecutablePath = path ? path : "";
}

void ApplicationAccess::AddWindow(BWindow* window) {
    const std::lock_guard guard(be_app->peer_->mutex);
    be_app->peer_->windows.push_back(window);
}

void ApplicationAccess::RemoveWindow(BWindow* window) {
    const std::lock_guard guard(be_app->peer_->mutex);
    std::erase(be_app->peer_->windows, window);
}

// A handler that waits for a dialog must return before its window can go, so the innermost dialog is closed
// first, then the one outside it, until nothing waits.
void ApplicationAccess::QuitWhenNothingWaits(BApplication& application) {
    if (CountInterfaceWaits() > 0) {
        if (!RejectInnermostDialog())
            QuitModalWindows(application);
        QTimer::singleShot(QuitRetryMilliseconds, application.peer_->toolkit.get(),
                           [&application] { QuitWhenNothingWaits(application); });
        return;
    }
    for (int32 index = application.CountWindows() - 1; index >= 0; --index)
        application.WindowAt(index)->Quit();
    if (application.CountWindows() > 0) {
        QTimer::singleShot(QuitRetryMilliseconds, application.peer_->toolkit.get(),
                           [&application] { QuitWhenNothingWaits(application); });
        return;
    }
    QApplication::quit();
}

const BRoster* be_roster = &Roster;

status_t BRoster::Launch(const entry_ref* ref) const {
    if (!QFileInfo::exists(QString::fromUtf8(ref->path.c_str())))
        return B_NAME_NOT_FOUND;
    return gLauncher(ref->path.c_str()) ? B_OK : B_ERROR;
}

void BRoster::SetLauncher(bool (*launcher)(const char*)) {
    gLauncher = launcher ? launcher : OpenWithDesktop;
}
