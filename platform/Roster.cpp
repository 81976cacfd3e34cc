#include "platform/Roster.h"

#include <QDesktopServices>
#include <QFileInfo>
#include <QUrl>

namespace {

bool OpenWithDesktop(const char* path) {
    return QDesktopServices::openUrl(QUrl::fromLocalFile(QString::fromUtf8(path)));
}

bool (*gLauncher)(const char*) = OpenWithDesktop;
const BRoster kRoster;

} // namespace

const BRoster* be_roster = &kRoster;

status_t BRoster::Launch(const entry_ref* ref) const {
    if (!QFileInfo::exists(QString::fromUtf8(ref->path.c_str())))
        return B_NAME_NOT_FOUND;
    return gLauncher(ref->path.c_str()) ? B_OK : B_ERROR;
}

void BRoster::SetLauncher(bool (*launcher)(const char*)) {
    gLauncher = launcher ? launcher : OpenWithDesktop;
}
