#pragma once

#include <string_view>
#include <vector>

#include "platform/Looper.h"

class BWindow;
struct ApplicationPeer;

// A file named by its full path.
struct entry_ref {
    std::string path;
};

// What the running application knows of itself.
struct app_info {
    entry_ref ref; // the executable
    std::string signature;
};

// The application: starts the toolkit, keeps the list of windows, and runs the interface thread's loop. There
// is exactly one, made by main before anything else of the layer is used; be_app points at it. The thread
// that makes it is the interface thread.
class BApplication : public BLooper {
  public:
    explicit BApplication(const char* signature);
    ~BApplication() override;

    // Serves all loopers until the application quits. A quit request posted earlier ends it at once.
    virtual void Run();

    // B_QUIT_REQUESTED asks every window's QuitRequested; when all agree it quits them and ends Run.
    // B_ABOUT_REQUESTED calls AboutRequested.
    void MessageReceived(BMessage* message) override;
    bool QuitRequested() override;
    // Quits every window and ends Run, as soon as nothing waits any more (an open dialog is closed first). It
    // does not delete the application object, which belongs to main.
    void Quit() override;
    virtual void AboutRequested() {}

    [[nodiscard]] int32 CountWindows() const;
    // Null when the index lies outside. Any thread.
    [[nodiscard]] BWindow* WindowAt(int32 index) const;

    // How the desktop knows the program: the name of its desktop entry (without ".desktop") and the icon of
    // all its windows, an SVG picture that is drawn anew for every usual size. To be called before the first
    // window is made. False, with the icon left as it was, when the picture cannot be read.
    [[nodiscard]] static bool SetDesktopIdentity(const char* desktopId, std::string_view svgIcon);

    // Always B_OK.
    status_t GetAppInfo(app_info* info) const;
    // The file of the running program; empty when the system does not tell. Needs no application object.
    [[nodiscard]] static std::string ExecutablePath();
    // Makes the two answer with this file, so that a test has a home folder of its own. To be called before
    // the application object is made; null goes back to the running program's.
    static void SetExecutablePath(const char* path);

  private:
    friend class BWindow;
    friend struct ApplicationAccess;

    std::string signature_;
    std::unique_ptr<ApplicationPeer> peer_;
};

extern BApplication* be_app;

// The desktop's knowledge of which program opens what.
class BRoster {
  public:
    // Asks the desktop to open the file in the person's preferred program. B_OK when the request was handed
    // over, B_NAME_NOT_FOUND when there is no such file, B_ERROR when the desktop took no request. It does
    // not wait for the program. Interface thread.
    status_t Launch(const entry_ref* ref) const;

    // Replaces the hand-over in tests, which must not start programs: called with the file's path, answering
    // whether it took it. Null restores the desktop.
    static void SetLauncher(bool (*launcher)(const char* path));
};

extern const BRoster* be_roster;
