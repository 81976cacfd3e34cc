#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <span>

#include "util/File.h"

// Reads a text file line by line, a block at a time. It borrows the file.
class LineReader {
  public:
    explicit LineReader(const File& file) : file_(file) {}

    // Makes room for lines of `longest` characters, at least 1. False when there is no memory.
    [[nodiscard]] bool Prepare(std::size_t longest);
    // Reads the next line, its newline included; of a longer one than `longest` the next piece. Empty at the
    // end of the file. The line, one byte behind it included, may be changed; it is valid until the next
    // call. Returns 0 or an errno number.
    [[nodiscard]] int Next(std::span<char>* line);
    // Begins again with the first line.
    void Rewind();
    // Makes the text begin behind a UTF-8 byte order mark, where there is one, and begins again. Returns 0
    // or an errno number.
    [[nodiscard]] int PassByteOrderMark();

  private:
    const File& file_;
    std::unique_ptr<char[]> block_;
    std::unique_ptr<char[]> line_;
    std::size_t longest_ = 0;
    std::int64_t start_ = 0;  // of the text, in the file
    std::int64_t offset_ = 0; // in the file, behind the block
    std::size_t next_ = 0;    // in the block
    std::size_t end_ = 0;     // of the block
};

// Writes a text file from its beginning on, a block at a time. It borrows the file. What was written before
// a failure may be in the file or not.
class TextWriter {
  public:
    explicit TextWriter(File& file) : file_(file) {}

    // Makes room for pieces of `longest` characters. False when there is no memory.
    [[nodiscard]] bool Prepare(std::size_t longest);
    // Where the next piece can be put, room for `longest` characters; null when the file could not be
    // written.
    [[nodiscard]] char* Room();
    // Takes the piece that was put there and ends at `end`.
    void Take(const char* end) { used_ = static_cast<std::size_t>(end - block_.get()); }
    // Hands what is left to the kernel. Returns 0 or an errno number.
    [[nodiscard]] int Flush();

  private:
    File& file_;
    std::unique_ptr<char[]> block_;
    std::size_t size_ = 0;
    std::size_t longest_ = 0;
    std::size_t used_ = 0;
    std::int64_t offset_ = 0;
};
