#pragma once

#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <memory>
#include <new>

// Memory that may be refused, and the bytes of values as the data file has them: least significant byte
// first, as this machine has them, at any address.

static_assert(std::endian::native == std::endian::little);

// An array of `count` elements whose values are not set; null when there is no memory for it.
template <class T>
[[nodiscard]] std::unique_ptr<T[]> TryAllocate(std::size_t count) {
    return std::unique_ptr<T[]>(new (std::nothrow) T[count]);
}

// Reads a value from its first min(`size`, sizeof(T)) bytes; the missing high bytes are 0, so that a column
// narrower than its type is never read past its end.
template <class T>
[[nodiscard]] inline T LoadBytes(const void* bytes, std::size_t size = sizeof(T)) {
    T value{};
    if (size >= sizeof(T))
        std::memcpy(&value, bytes, sizeof(T)); // the same in one instruction
    else
        std::memcpy(&value, bytes, size);
    return value;
}

// Writes the first min(`size`, sizeof(T)) bytes of a value.
template <class T>
inline void StoreBytes(void* bytes, T value, std::size_t size = sizeof(T)) {
    std::memcpy(bytes, &value, size < sizeof(T) ? size : sizeof(T));
}
