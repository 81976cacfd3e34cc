#include "app/model/DailyBackup.h"

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <string_view>
#include <system_error>

#include "app/model/DataFolders.h"
#include "util/Dates.h"

namespace {

constexpr const char* PartSuffix = "part";

// Whether the text is like the pattern, in which a 0 stands for any digit.
bool IsLike(std::string_view text, std::string_view pattern) {
    return std::equal(
        text.begin(), text.end(), pattern.begin(), pattern.end(),
        [](char letter, char wanted) {
            return wanted == '0' ? letter >= '0' && letter <= '9' : letter == wanted;
        });
}

// Whether the text is a day such as "2026-11-22".
bool IsDay(const std::string& text) {
    return IsLike(text, "0000-00-00") &&
           CheckDate(std::atoi(text.c_str()), std::atoi(text.c_str() + 5), std::atoi(text.c_str() + 8)) == 0;
}

// Whether the text is a day and time such as "2026-11-22-140307".
bool IsMoment(const std::string& text) {
    return IsLike(text, "0000-00-00-000000") && IsDay(text.substr(0, 10));
}

std::string MomentText(std::time_t now) {
    std::tm parts{};
    char text[32] = "";
    return localtime_r(&now, &parts) != nullptr &&
                   std::strftime(text, sizeof text, "%Y-%m-%d-%H%M%S", &parts) != 0
               ? text
               : "";
}

} // namespace

std::time_t DailyBackup::SystemClock() {
    return std::time(nullptr);
}

std::vector<std::string> DailyBackup::FilesKeptWith(const std::string& name) {
    if (name == "portfol.db" || name == "invest.db")
        return {"portfol.db", "invest.db"};
    return {name};
}

DailyBackup::DailyBackup(const std::string& folder, const std::vector<std::string>& names,
                         FileOperations& operations, Clock clock)
    : operations_(operations), clock_(clock) {
    for (const std::string& name : names)
        if (std::string file = FollowLinks((std::filesystem::path(folder) / name).string()); !file.empty())
            files_.push_back(std::move(file));
}

DailyBackup::~DailyBackup() {
    stop_ = true;
    EndPreparing();
    for (const std::string& file : prepared_)
        static_cast<void>(RemoveFile(operations_, Kept(file, PartSuffix)));
}

std::string DailyBackup::Kept(const std::string& file, const std::string& suffix) {
    const std::filesystem::path path(file);
    return (path.parent_path() / FolderName / path.filename()).string() + "." + suffix;
}

std::vector<std::pair<std::string, std::string>> DailyBackup::KeptIn(const std::string& folder) {
    std::vector<std::pair<std::string, std::string>> kept;
    std::error_code error;
    std::filesystem::directory_iterator entry(std::filesystem::path(folder) / FolderName, error);
    for (; !error && entry != std::filesystem::directory_iterator(); entry.increment(error)) {
        const std::string name = entry->path().filename().string();
        const std::size_t dot = std::min(name.rfind('.'), name.size() - 1);
        if (std::string suffix = name.substr(dot + 1); IsDay(suffix) || IsMoment(suffix))
            kept.emplace_back(name.substr(0, dot), std::move(suffix));
    }
    std::sort(kept.begin(), kept.end());
    return kept;
}

void DailyBackup::EndPreparing() {
    if (worker_.joinable())
        worker_.join();
}

bool DailyBackup::BeginDay(std::time_t now) {
    std::tm midnight{};
    char text[16] = "";
    if (localtime_r(&now, &midnight) == nullptr ||
        std::strftime(text, sizeof text, "%Y-%m-%d", &midnight) == 0)
        return false;
    midnight.tm_hour = midnight.tm_min = midnight.tm_sec = 0;
    midnight.tm_isdst = -1;
    std::tm next = midnight;
    ++next.tm_mday;
    day_ = text;
    dayBegin_ = std::mktime(&midnight);
    dayEnd_ = std::mktime(&next);
    return true;
}

bool DailyBackup::IsWanted(const std::string& file) const {
    return FileExists(file) && !FileExists(Kept(file, day_));
}

void DailyBackup::Prepare() {
    std::vector<std::string> wanted;
    {
        const std::lock_guard guard(mutex_);
        if (!BeginDay(clock_()))
            return;
        dayEnd_ = 0; // no Keep has made sure of it
        std::copy_if(files_.begin(), files_.end(), std::back_inserter(wanted),
                     [this](const std::string& file) { return IsWanted(file); });
    }
    const auto copy = [this, wanted] {
        for (const std::string& file : wanted)
            if (!stop_ && CopyToPart(file) == 0)
                prepared_.push_back(file);
    };
    try {
        if (!wanted.empty())
            worker_ = std::thread(copy);
    } catch (const std::system_error&) {
        // Without a thread the first Keep makes the copies.
    }
}

int DailyBackup::Keep() {
    const std::lock_guard guard(mutex_);
    const std::time_t now = clock_();
    if (now >= dayBegin_ && now < dayEnd_)
        return error_;
    EndPreparing();
    error_ = BeginDay(now) ? KeepAll() : EOVERFLOW;
    if (error_ != 0 && tell_)
        tell_(error_);
    return error_;
}

int DailyBackup::KeepAll() {
    int error = 0;
    for (const std::string& file : files_) {
        const int failure = IsWanted(file) ? KeepFile(file, day_) : 0;
        error = error == 0 ? failure : error;
    }
    for (const std::string& file : files_)
        if (error == 0)
            RemoveOldOf(file);
    return error;
}

int DailyBackup::KeepPresent(std::string* suffix) {
    const std::lock_guard guard(mutex_);
    EndPreparing();
    const auto isTaken = [suffix](const std::string& file) { return FileExists(Kept(file, *suffix)); };
    std::time_t now = clock_();
    do
        *suffix = MomentText(now++);
    while (std::any_of(files_.begin(), files_.end(), isTaken));
    if (suffix->empty())
        return EOVERFLOW;
    for (const std::string& file : files_)
        if (const int error = FileExists(file) ? KeepFile(file, *suffix) : 0; error != 0)
            return error;
    return 0;
}

int DailyBackup::KeepFile(const std::string& file, const std::string& suffix) {
    const auto prepared = std::find(prepared_.begin(), prepared_.end(), file);
    if (prepared != prepared_.end())
        prepared_.erase(prepared); // the file is not as it was then for a second time
    else if (const int error = CopyToPart(file); error != 0)
        return error;
    const std::string part = Kept(file, PartSuffix);
    const int error = RenameFile(operations_, part, Kept(file, suffix));
    if (error != 0)
        static_cast<void>(RemoveFile(operations_, part));
    return error != 0 ? error : SyncFolderOf(operations_, part);
}

// The complete copy, on the disk, under the name that it has until it is needed.
int DailyBackup::CopyToPart(const std::string& file) {
    const std::string part = Kept(file, PartSuffix);
    // What hinders it, or is in the folder's place, shows when the file is made.
    struct stat around {};
    if (stat(FolderOf(file).c_str(), &around) == 0)
        static_cast<void>(mkdir(FolderOf(part).c_str(), PermissionsBeside(around.st_mode)));
    static_cast<void>(RemoveFile(operations_, part)); // left by a program that was killed
    File source(operations_);
    File target(operations_);
    int error = source.Open(file, FileMode::ReadOnly);
    if (error == 0)
        error = target.Open(part, FileMode::CreateNew);
    if (error != 0)
        return error;
    error = target.CopyFrom(source, &stop_);
    target.Close();
    if (error != 0)
        static_cast<void>(RemoveFile(operations_, part));
    return error;
}

void DailyBackup::RemoveOldOf(const std::string& file) {
    std::vector<std::string> days;
    for (const auto& [name, day] : KeptIn(FolderOf(file)))
        // Today's is never too old, whatever a clock that ran ahead has left.
        if (name == std::filesystem::path(file).filename() && IsDay(day) && day != day_)
            days.push_back(day);
    for (std::size_t i = 0; i + Generations - 1 < days.size(); ++i)
        static_cast<void>(RemoveFile(operations_, Kept(file, days[i])));
}

int BackedUpFiles::Open(const char* path, int flags, mode_t mode) {
    const int descriptor = FileOperations::Open(path, flags, mode);
    if (descriptor >= 0 && (flags & O_ACCMODE) == O_RDWR && (flags & O_CREAT) == 0)
        dataFiles_.push_back(descriptor);
    return descriptor;
}

int BackedUpFiles::Close(int descriptor) {
    std::erase(dataFiles_, descriptor);
    return FileOperations::Close(descriptor);
}

ssize_t BackedUpFiles::WriteAt(int descriptor, const void* data, std::size_t size, off_t offset) {
    BeforeChange(descriptor);
    return FileOperations::WriteAt(descriptor, data, size, offset);
}

int BackedUpFiles::Truncate(int descriptor, off_t length) {
    BeforeChange(descriptor);
    return FileOperations::Truncate(descriptor, length);
}

void BackedUpFiles::BeforeChange(int descriptor) {
    if (std::find(dataFiles_.begin(), dataFiles_.end(), descriptor) != dataFiles_.end())
        static_cast<void>(backup_.Keep());
}
