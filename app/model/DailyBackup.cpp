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

// Whether the text is a day such as "2026-11-22".
bool IsDay(std::string_view text) {
    constexpr std::string_view pattern = "0000-00-00";
    if (text.size() != pattern.size())
        return false;
    for (std::size_t i = 0; i < pattern.size(); ++i) {
        const bool digit = text[i] >= '0' && text[i] <= '9';
        if (pattern[i] == '0' ? !digit : text[i] != pattern[i])
            return false;
    }
    const std::string parts(text);
    return CheckDate(std::atoi(parts.c_str()), std::atoi(parts.c_str() + 5), std::atoi(parts.c_str() + 8)) ==
           0;
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
        const int failure = IsWanted(file) ? KeepFile(file) : 0;
        error = error == 0 ? failure : error;
    }
    for (const std::string& file : files_)
        if (error == 0)
            RemoveOldOf(file);
    return error;
}

int DailyBackup::KeepFile(const std::string& file) {
    const auto prepared = std::find(prepared_.begin(), prepared_.end(), file);
    if (prepared != prepared_.end())
        prepared_.erase(prepared); // the file is not as it was then for a second time
    else if (const int error = CopyToPart(file); error != 0)
        return error;
    const std::string part = Kept(file, PartSuffix);
    const int error = RenameFile(operations_, part, Kept(file, day_));
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
    const std::filesystem::path newest(Kept(file, day_));
    const std::string beginning = std::filesystem::path(file).filename().string() + ".";
    std::vector<std::string> days;
    std::error_code error;
    std::filesystem::directory_iterator entry(newest.parent_path(), error);
    for (; !error && entry != std::filesystem::directory_iterator(); entry.increment(error)) {
        const std::string name = entry->path().filename().string();
        if (!name.starts_with(beginning))
            continue;
        std::string day = name.substr(beginning.size());
        // Today's is never too old, whatever a clock that ran ahead has left.
        if (IsDay(day) && day != day_)
            days.push_back(std::move(day));
    }
    std::sort(days.begin(), days.end());
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
