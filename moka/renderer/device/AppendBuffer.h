// AppendBuffer.h: an array of numbers that grows, for the vertices and uniform values of a draw list. Each
// draw appends a few, so Append() is in line, and resize() does not initialise new elements.
// Fails: throws bad_alloc. The buffer is then as it was before the call.
#pragma once

#include "moka/base/Likely.h"

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <memory>
#include <type_traits>
#include <utility>

namespace Moka::detail {

template <class T>
class AppendBuffer {
    static_assert(std::is_trivially_copyable_v<T>);

public:
    T* data() { return mElements.get(); }
    T const* data() const { return mElements.get(); }
    std::size_t size() const { return mSize; }
    std::size_t capacity() const { return mCapacity; }
    bool empty() const { return mSize == 0; }
    void clear() { mSize = 0; }

    // New elements are uninitialised.
    void resize(std::size_t size) {
        if (MOKA_UNLIKELY(size > mCapacity)) Grow(size);
        mSize = size;
    }
    void Append(T const* elements, std::size_t count) {
        std::size_t const end = mSize;
        resize(end + count);
        std::memcpy(mElements.get() + end, elements, count * sizeof(T));
    }

private:
    [[gnu::cold]] void Grow(std::size_t needed) {
        std::size_t const capacity = std::max(needed, 2 * mCapacity);
        std::unique_ptr<T[]> elements(new T[capacity]);
        if (mSize > 0) std::memcpy(elements.get(), mElements.get(), mSize * sizeof(T));
        mElements = std::move(elements);
        mCapacity = capacity;
    }

    std::unique_ptr<T[]> mElements;
    std::size_t mSize = 0;
    std::size_t mCapacity = 0;
};

} // namespace Moka::detail
