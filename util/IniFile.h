#pragma once

#include <cstddef>
#include <string>
#include <string_view>

#include "util/Strings.h"

// Reads and changes the plain-text settings file. The object holds a path and no content: every call opens
// the file, does its work and closes it, so that every reader sees every earlier write. The format is
// described in doc/settings-file.md.
//
// What it does not do: create a settings file, keep anything in memory, or guard against two writers at once.
// It is usually a local object of the function that reads or writes a setting, on any thread.
class INI_FILEx {
  public:
    // A path of PathBufferSize bytes or more names no file: reads then give their defaults and writes fail.
    explicit INI_FILEx(const char* path);

    // Copies the value of `key` in `section` into the `size` bytes at `result`: the first matching entry,
    // without trailing blanks; `defaultValue` when the file, the section or the entry is missing. A value
    // that does not fit is cut between whole UTF-8 characters.
    void ReadString(const char* section, const char* key, const char* defaultValue, char* result,
                    std::size_t size) const;

    template <std::size_t Size>
    void ReadString(const char* section, const char* key, const char* defaultValue,
                    char (&result)[Size]) const {
        ReadString(section, key, defaultValue, result, Size);
    }

    // The number at the start of the value (leading blanks allowed), 0 when it has none, `defaultValue` when
    // there is no such entry. Numbers beyond an int give the nearest int.
    [[nodiscard]] int ReadInt(const char* section, const char* key, int defaultValue) const;

    // Sets the entry: the first one of that key in the section is replaced; a new key goes behind the
    // section's last line, a new section to the end of the file. Every other byte of the file stays. Returns
    // 0 when the file holds the value, else 1, and then the file is as it was: when there is no settings
    // file, when it cannot be read or written (no space included), and when the entry could not be read back
    // (a line of more than 127 bytes with its line feed, a control character other than a tab, a key with "="
    // or beginning with "[" or ";", a section name of more than 61 bytes). Trailing blanks of a value do not
    // survive reading.
    //
    // The new content goes to "ini_file.tmp" in the settings file's own folder (another file system cannot be
    // in between there) and takes the settings file's name when it is complete on disk: killed at any moment,
    // the file under that name is the whole old one or the whole new one.
    [[nodiscard]] int WriteString(const char* section, const char* key, const char* value) const;
    [[nodiscard]] int WriteInt(const char* section, const char* key, int value) const;

  private:
    [[nodiscard]] bool Find(std::string_view section, std::string_view key, std::string& value) const;

    char filePath_[PathBufferSize] = "";
};

// The text that a person wrote as the value of `key`, which may be in a file whose lines end in CR LF:
// ReadString's value without that carriage return and the blanks before it; empty when there is none.
void ReadSetting(const INI_FILEx& file, const char* section, const char* key, char* result, std::size_t size);

template <std::size_t Size>
void ReadSetting(const INI_FILEx& file, const char* section, const char* key, char (&result)[Size]) {
    ReadSetting(file, section, key, result, Size);
}
