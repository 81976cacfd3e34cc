#include <sstream>

#include "SampleFile.h"
#include "db/LittleEndian.h"

namespace {

// The bytes of the document's dump: lines of an offset, 1 to 16 bytes and their characters.
std::string DocumentedBytes() {
    std::ifstream document(DATA_FILE_DOCUMENT);
    std::string bytes;
    for (std::string line; std::getline(document, line);) {
        if (line.size() < 10 || line.compare(8, 2, "  ") != 0 ||
            !std::isxdigit(static_cast<unsigned char>(line[0]))) {
            continue;
        }
        EXPECT_EQ(std::stoul(line.substr(0, 8), nullptr, 16), bytes.size()) << line;
        std::istringstream dump(line.substr(8, line.find('|') - 8));
        for (std::string byte; dump >> byte;) {
            bytes += static_cast<char>(std::stoi(byte, nullptr, 16));
        }
    }
    return bytes;
}

TEST(DataFile, IsAsDocumented) {
    TemporaryFolder folder;
    DATABASE database(nullptr);
    const COLUMN_ENTRY columns[] = {Column("Name", ColumnType::String, 8), Column("Price", ColumnType::Float),
                                    Column("Bought", ColumnType::Date), Column("Sold", ColumnType::Time)};
    ASSERT_EQ(database.Create(folder.File("a.db").c_str(), "example", 4, columns), 0);
    std::string data(23, '\0');
    data.replace(0, 5, "Acorn");
    StoreLittleEndian<std::uint32_t>(reinterpret_cast<std::uint8_t*>(&data[8]), 0x41440000); // 12.25
    data.replace(16, 4, std::string("\x05\x01\xCF\x07", 4));
    data.replace(20, 3, std::string("\x1E\x0F\x09", 3));
    ASSERT_EQ(database.Append(data.data()), 0);
    data.replace(0, 5, "Birch");
    ASSERT_EQ(database.Append(data.data()), 1);
    ASSERT_EQ(database.Delete(0), 0);
    ASSERT_EQ(database.Lock(1), 0);
    EXPECT_EQ(database.Query("Price = 12.25", QueryMode::New), 1);
    EXPECT_EQ(database.Query("Bought = 19990105", QueryMode::New), 1);
    EXPECT_EQ(database.Query("Sold = 091530", QueryMode::New), 1);
    EXPECT_EQ(folder.Read("a.db"), DocumentedBytes());
}

} // namespace
