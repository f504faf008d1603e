// Mutates PNG and "mki" files and, mostly, puts their checksums right again: else nearly every change would
// be refused for its checksum, and what comes after would hardly be reached.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <zlib.h>

extern "C" std::size_t LLVMFuzzerMutate(std::uint8_t* data, std::size_t size, std::size_t maxSize);

namespace Moka::Fuzz {
namespace {

constexpr std::size_t kPngSignature = 8;
constexpr std::size_t kChunkAround = 12; // length, type and checksum
constexpr std::size_t kMkiChecked = 24;
constexpr std::size_t kMkiHeader = 32;
constexpr unsigned kLeaveOneIn = 16;

void StoreBigEndian(std::uint8_t* to, std::uint32_t value) {
    for (int i = 0; i < 4; ++i) to[i] = static_cast<std::uint8_t>(value >> (24 - 8 * i));
}

std::uint32_t LoadBigEndian(std::uint8_t const* from) {
    std::uint32_t value = 0;
    for (int i = 0; i < 4; ++i) value = value << 8 | from[i];
    return value;
}

void RepairPng(std::uint8_t* data, std::size_t size) {
    std::size_t at = kPngSignature;
    while (at + kChunkAround <= size) {
        std::size_t const length = LoadBigEndian(data + at);
        if (length > size - at - kChunkAround) return;
        auto const checksum = crc32(0, data + at + 4, static_cast<uInt>(length + 4));
        StoreBigEndian(data + at + 8 + length, static_cast<std::uint32_t>(checksum));
        at += kChunkAround + length;
    }
}

void RepairMki(std::uint8_t* data, std::size_t size) {
    if (size < kMkiHeader) return;
    std::uint64_t const payload = size - kMkiHeader;
    for (int i = 0; i < 8; ++i) data[16 + i] = static_cast<std::uint8_t>(payload >> (8 * i));
    auto const checksum = crc32(0, data, static_cast<uInt>(kMkiChecked));
    for (int i = 0; i < 4; ++i)
        data[kMkiChecked + static_cast<std::size_t>(i)] = static_cast<std::uint8_t>(checksum >> (8 * i));
}

} // namespace
} // namespace Moka::Fuzz

extern "C" std::size_t LLVMFuzzerCustomMutator(std::uint8_t* data, std::size_t size, std::size_t maxSize,
                                               unsigned seed) {
    using namespace Moka::Fuzz;
    std::size_t const mutated = LLVMFuzzerMutate(data, size, maxSize);
    if (seed % kLeaveOneIn == 0) return mutated;
    if (mutated >= 4 && std::memcmp(data, "MKI1", 4) == 0)
        RepairMki(data, mutated);
    else if (mutated >= kPngSignature && std::memcmp(data + 1, "PNG", 3) == 0)
        RepairPng(data, mutated);
    return mutated;
}
