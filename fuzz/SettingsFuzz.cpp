// A settings file of any bytes: every reading ends, stays inside its buffer, and a written value comes back
// while all else keeps its bytes.
#include <cstdint>
#include <cstring>
#include <string>

#include "FuzzFiles.h"
#include "util/IniFile.h"

// NOLINTNEXTLINE(readability-identifier-naming): the fuzzer's own name.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const std::string path = FuzzFolder() + "/Quorvan.ini";
    WriteBytes(path, BytesOf(data, size));
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
        Require(ReadBytes(path) == BytesOf(data, size), "a refused write changed the file");
    }
    return 0;
}
