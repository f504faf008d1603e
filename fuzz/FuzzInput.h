// FuzzInput: reads a fuzzer's bytes as values. What is past the end reads as 0.
// Numbers take one byte when they are small, as most should be for anything to be seen, and five bytes, of
// any pattern, when the first one says so.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace Moka::Fuzz {

class FuzzInput {
public:
    FuzzInput(std::uint8_t const* data, std::size_t size) : mData(data), mSize(size) {}

    bool IsEmpty() const { return mSize == 0; }

    int Byte() {
        if (mSize == 0) return 0;
        --mSize;
        return *mData++;
    }

    bool Bool() { return (Byte() & 1) != 0; }

    // count is 1 ... 256.
    int Below(int count) { return Byte() % count; }

    // Mostly -16 ... 207.
    int Int() {
        int const first = Byte();
        return first < kSmall ? first - kBelowZero : Read<int>();
    }

    // Mostly -8 ... 103.5 in halves; any other bit pattern, NaN and infinities among them.
    float Float() {
        int const first = Byte();
        return first < kSmall ? static_cast<float>(first - kBelowZero) * 0.5f : Read<float>();
    }

private:
    static constexpr int kSmall = 224;
    static constexpr int kBelowZero = 16;

    template <class T>
    T Read() {
        unsigned char bytes[sizeof(T)];
        for (unsigned char& byte : bytes) byte = static_cast<unsigned char>(Byte());
        T value;
        std::memcpy(&value, bytes, sizeof(T));
        return value;
    }

    std::uint8_t const* mData;
    std::size_t mSize;
};

// What a fuzzer reports as a crash.
inline void Require(bool holds, char const* what) {
    if (holds) return;
    std::fprintf(stderr, "fuzz: %s\n", what);
    std::abort();
}

} // namespace Moka::Fuzz
