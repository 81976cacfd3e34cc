#pragma once

#include <algorithm>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>

// Numbers as the data file stores them: least significant byte first, at any address.

/// Reads the unsigned number in the first min(`size`, sizeof(T)) bytes at `bytes`; the missing high bytes are
/// 0, so that a column narrower than its type is never read past its end.
template <class T>
[[nodiscard]] inline T LoadLittleEndian(const std::uint8_t* bytes, std::size_t size = sizeof(T)) {
    T value = 0;
    if constexpr (std::endian::native == std::endian::little) {
        if (size >= sizeof(T)) {
            std::memcpy(&value, bytes, sizeof(T)); // the same in one instruction
            return value;
        }
    }
    for (std::size_t i = 0; i < std::min(size, sizeof(T)); ++i)
        value = static_cast<T>(value | static_cast<T>(static_cast<T>(bytes[i]) << (8 * i)));
    return value;
}

/// Writes the first min(`size`, sizeof(T)) bytes of an unsigned number.
template <class T>
inline void StoreLittleEndian(std::uint8_t* bytes, T value, std::size_t size = sizeof(T)) {
    for (std::size_t i = 0; i < std::min(size, sizeof(T)); ++i)
        bytes[i] = static_cast<std::uint8_t>(value >> (8 * i));
}
