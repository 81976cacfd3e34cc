// A settings file of any bytes: every reading ends, stays inside its buffer, and a written value comes back
// while all else keeps its bytes.
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <unistd.h>

#include "util/IniFile.h"

namespace {

// A folder in memory where there is one, since every input is written to a file.
std::string Folder() {
    const char* base = std::filesystem::is_directory("/dev/shm") ? "/dev/shm" : "/tmp";
    const std::string folder = std::string(base) + "/quorvan-fuzz-settings-" + std::to_string(getpid());
    std::filesystem::create_directories(folder);
    std::atexit([] {
        std::error_code ignored;
        for (const char* place : {"/dev/shm", "/tmp"})
            std::filesystem::remove_all(
                std::string(place) + "/quorvan-fuzz-settings-" + std::to_string(getpid()), ignored);
    });
    return folder;
}

void Require(bool condition, const char* what) {
    if (!condition) {
        std::fprintf(stderr, "%s\n", what);
        std::abort();
    }
}

} // namespace

// NOLINTNEXTLINE(readability-identifier-naming): the fuzzer's own name.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const std::string path = Folder() + "/Quorvan.ini";
    std::ofstream(path, std::ios::binary)
        .write(reinterpret_cast<const char*>(data), static_cast<std::streamsize>(size));
    const INI_FILEx file(path.c_str());

    char small[4];
    char large[128];
    file.ReadString("GENERAL", "Password", "none", small);
    file.ReadString("GENERAL", "Password", "none", large);
    Require(std::memchr(small, 0, sizeof(small)) && std::memchr(large, 0, sizeof(large)),
            "a value without an end");
    static_cast<void>(file.ReadInt("GENERAL", "ColumnWidth0", 50));

    if (file.WriteString("GENERAL", "Added", "value") == 0) {
        file.ReadString("GENERAL", "Added", "", large);
        Require(std::strcmp(large, "value") == 0, "a written value does not come back");
    } else {
        std::ifstream after(path, std::ios::binary);
        const std::string bytes(std::istreambuf_iterator<char>(after), {});
        Require(bytes == std::string(reinterpret_cast<const char*>(data), size),
                "a refused write changed the file");
    }
    return 0;
}
