// Mutates PNG and "mki" files and, mostly, puts their checksums right again: else nearly every change would
// be refused for its checksum, and what comes after would hardly be reached.
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <endian.h>
#include <zlib.h>

extern "C" std::size_t LLVMFuzzerMutate(std::uint8_t* data, std::size_t size, std::size_t maxSize);

namespace Moka::Fuzz {
namespace {

constexpr std::size_t kPngSignature = 8;
constexpr std::size_t kChunkAround = 12; // length, type and checksum
constexpr std::size_t kMkiChecked = 24;
constexpr std::size_t kMkiHeader = 32;
constexpr unsigned kLeaveOneIn = 16;

std::uint32_t Checksum(std::uint8_t const* data, std::size_t size) {
    return static_cast<std::uint32_t>(crc32(0, data, static_cast<uInt>(size)));
}

void RepairPng(std::uint8_t* data, std::size_t size) {
    std::uint32_t length = 0;
    for (std::size_t at = kPngSignature; at + kChunkAround <= size; at += kChunkAround + length) {
        std::memcpy(&length, data + at, 4);
        length = be32toh(length);
        if (length > size - at - kChunkAround) return;
        std::uint32_t const checksum = htobe32(Checksum(data + at + 4, length + 4));
        std::memcpy(data + at + 8 + length, &checksum, 4);
    }
}

void RepairMki(std::uint8_t* data, std::size_t size) {
    if (size < kMkiHeader) return;
    std::uint64_t const payload = htole64(size - kMkiHeader);
    std::memcpy(data + 16, &payload, 8);
    std::uint32_t const checksum = htole32(Checksum(data, kMkiChecked));
    std::memcpy(data + kMkiChecked, &checksum, 4);
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
