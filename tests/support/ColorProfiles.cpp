#include "tests/support/ColorProfiles.h"

#include <fstream>
#include <iterator>
#include <stdexcept>
#include <zlib.h>

namespace Moka::Testing {
namespace {

using namespace std::string_literals;

constexpr std::size_t kPngHeader = 33; // signature and IHDR; our encoder's sRGB chunk follows
constexpr std::size_t kSrgbChunk = 13;
constexpr unsigned kWebpProfileFlag = 0x20;
constexpr unsigned kWebpAlphaFlag = 0x10;

Bytef const* DataOf(Bytes const& bytes) { return reinterpret_cast<Bytef const*>(bytes.data()); }

Bytes EmbedInPng(Bytes const& file, Bytes const& profile) {
    return PutBeforePixels(file, MakePngChunk("iCCP", "test\0\0"s + Deflate(profile)));
}

Bytes EmbedInJpeg(Bytes const& file, Bytes const& profile, std::size_t partBytes) {
    std::size_t const count = (profile.size() + partBytes - 1) / partBytes;
    Bytes parts;
    for (std::size_t i = count; i-- > 0;) {
        Bytes const part = profile.substr(i * partBytes, partBytes);
        parts += "\xFF\xE2" + ToBigEndian(2 + 14 + part.size(), 2) + "ICC_PROFILE\0"s +
                 ToBigEndian(i + 1, 1) + ToBigEndian(count, 1) + part;
    }
    return Bytes(file).insert(2, parts);
}

// The sides of a simple file stand in its one chunk, lossless.
Bytes EmbedInWebp(Bytes const& file, Bytes const& profile) {
    auto const byte = [&file](std::size_t at) { return static_cast<unsigned char>(file[at]); };
    int const bits = byte(21) | byte(22) << 8 | byte(23) << 16 | (byte(24) & 0xF) << 24;
    return MakeWebpFile(kWebpProfileFlag | kWebpAlphaFlag, (bits & 0x3FFF) + 1, (bits >> 14) + 1,
                        MakeWebpChunk("ICCP", profile) + file.substr(12));
}

} // namespace

Bytes ToLittleEndian(std::uint64_t value, int count) {
    Bytes bytes;
    for (int i = 0; i < count; ++i) bytes += static_cast<char>(value >> (8 * i));
    return bytes;
}

Bytes ToBigEndian(std::uint64_t value, int count) {
    Bytes const bytes = ToLittleEndian(value, count);
    return {bytes.rbegin(), bytes.rend()};
}

Bytes Deflate(Bytes const& content) {
    uLongf size = compressBound(content.size());
    Bytes packed(size, '\0');
    compress(reinterpret_cast<Bytef*>(packed.data()), &size, DataOf(content), content.size());
    return packed.substr(0, size);
}

Bytes ReadProfile(std::string const& name) {
    std::ifstream file(MOKA_PROFILE_FOLDER "/" + name, std::ios::binary);
    file.ignore(); // for the fuzzer: the kind of pixels
    Bytes bytes(std::istreambuf_iterator<char>(file), {});
    if (bytes.empty()) throw std::runtime_error("no profile " + name);
    return bytes;
}

Bytes EmbedProfile(Bytes const& file, Bytes const& profile, std::size_t partBytes) {
    if (file[0] == '\xFF') return EmbedInJpeg(file, profile, partBytes);
    return file[0] == 'R' ? EmbedInWebp(file, profile) : EmbedInPng(file, profile);
}

Bytes MakePngChunk(std::string const& type, Bytes const& content) {
    Bytes const checked = type + content;
    return ToBigEndian(content.size(), 4) + checked +
           ToBigEndian(crc32(0, DataOf(checked), static_cast<uInt>(checked.size())), 4);
}

Bytes PutBeforePixels(Bytes png, Bytes const& chunks) {
    bool const hasMark = png.compare(kPngHeader + 4, 4, "sRGB") == 0;
    return png.replace(kPngHeader, hasMark ? kSrgbChunk : 0, chunks);
}

Bytes MakeWebpChunk(std::string const& type, Bytes const& content) {
    return type + ToLittleEndian(content.size(), 4) + content + Bytes(content.size() % 2, '\0');
}

Bytes MakeWebpFile(unsigned flags, int width, int height, Bytes const& chunks) {
    auto const side = [](int length) { return ToLittleEndian(static_cast<unsigned>(length - 1), 3); };
    return MakeWebpChunk(
        "RIFF",
        "WEBP" + MakeWebpChunk("VP8X", ToLittleEndian(flags, 4) + side(width) + side(height)) + chunks);
}

} // namespace Moka::Testing
