// VertexBuffer.h: an array of floats that grows, for the vertices of a draw list. Each draw appends a few
// floats, so Append() is in line, and resize() does not initialise new floats.
// Fails: throws bad_alloc. The buffer is then as it was before the call.
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <memory>
#include <utility>

namespace Moka::detail {

class VertexBuffer {
public:
    float* data() { return mFloats.get(); }
    float const* data() const { return mFloats.get(); }
    std::size_t size() const { return mSize; }
    std::size_t capacity() const { return mCapacity; }
    bool empty() const { return mSize == 0; }
    void clear() { mSize = 0; }

    // New floats are uninitialised.
    void resize(std::size_t size) {
        if (size > mCapacity) Grow(size);
        mSize = size;
    }
    void Append(float const* floats, std::size_t count) {
        std::size_t const end = mSize;
        resize(end + count);
        std::memcpy(mFloats.get() + end, floats, count * sizeof(float));
    }

private:
    [[gnu::cold]] void Grow(std::size_t needed) {
        std::size_t const capacity = std::max(needed, 2 * mCapacity);
        std::unique_ptr<float[]> floats(new float[capacity]);
        if (mSize > 0) std::memcpy(floats.get(), mFloats.get(), mSize * sizeof(float));
        mFloats = std::move(floats);
        mCapacity = capacity;
    }

    std::unique_ptr<float[]> mFloats;
    std::size_t mSize = 0;
    std::size_t mCapacity = 0;
};

} // namespace Moka::detail
