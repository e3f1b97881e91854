#pragma once
// Sizing of the large sample and resource-element stores (megabytes per row). The first touch of
// fresh memory costs far more than any later pass over it (a page fault per 4 KiB page), so the
// stores ask the kernel for huge pages before they are first written, are zero-filled once, and
// keep their memory when they are sized again. Zero-filled rows are made in place, never copied
// from a zero-filled model row.

#include <cstddef>
#include <vector>

namespace Orvalis_NR {

/// Below this many bytes a row is left to the allocator as it is.
inline constexpr std::size_t kLargeBufferBytes = std::size_t{1} << 21;

/// Asks the kernel to back [data, data + bytes) with huge pages where it can (Linux
/// transparent huge pages, MADV_HUGEPAGE); elsewhere, or for short ranges, does nothing. Call it
/// before the memory is first written.
void adviseHugePages(void* data, std::size_t bytes);

/// `row` holds `count` value-initialised elements afterwards. Memory it already has is reused;
/// new memory of kLargeBufferBytes or more is advised for huge pages before it is filled.
template <class T>
void assignZeroed(std::vector<T>& row, std::size_t count) {
    if (row.capacity() >= count) {
        row.assign(count, T{});
        return;
    }
    std::vector<T> fresh;
    fresh.reserve(count);
    adviseHugePages(fresh.data(), count * sizeof(T));
    fresh.resize(count);
    row.swap(fresh);
}

/// `rows` rows of `count` value-initialised elements each, every row made in place.
template <class T>
void assignZeroedRows(std::vector<std::vector<T>>& table, std::size_t rows, std::size_t count) {
    table.resize(rows);
    for (auto& row : table) assignZeroed(row, count);
}

}  // namespace Orvalis_NR
