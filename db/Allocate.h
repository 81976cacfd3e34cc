#pragma once

#include <cstddef>
#include <memory>
#include <new>

/// An array of `count` elements whose values are not set; null when there is no memory for it.
template <class T>
[[nodiscard]] std::unique_ptr<T[]> TryAllocate(std::size_t count) {
    return std::unique_ptr<T[]>(new (std::nothrow) T[count]);
}
