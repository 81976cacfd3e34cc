#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>

// Lower letters as the whole program sees them where their case does not count: A to Z count as a to z, up to
// the first byte of 128 or above. util/Strings.h has the same for texts that end at a NUL.

inline constexpr std::uint8_t FirstNonAscii = 128;

// A to Z in lower letters, every other byte as it is.
[[nodiscard]] constexpr std::uint8_t LoweredByte(std::uint8_t c) {
    return static_cast<std::uint8_t>(c + (static_cast<std::uint8_t>(c - 'A') < 26 ? 'a' - 'A' : 0));
}

// Copies `size` bytes to `lowered` in lower letters, as far as letters count as such. The copy goes on behind
// a NUL.
inline void CopyLowered(const std::uint8_t* text, std::size_t size, std::uint8_t* lowered) {
    std::uint8_t seen = 0;
    for (std::size_t i = 0; i < size; ++i) { // no way out, so that many bytes are done at once
        seen |= text[i];
        lowered[i] = LoweredByte(text[i]);
    }
    if (seen >= FirstNonAscii) {
        std::size_t first = 0;
        while (text[first] < FirstNonAscii)
            ++first;
        std::memcpy(lowered + first, text + first, size - first);
    }
}
