#include "tests/support/ColorProfiles.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <fstream>
#include <iterator>
#include <stdexcept>
#include <zlib.h>

namespace Moka::Testing {
namespace {

constexpr std::size_t kPngHeader = 33; // signature and IHDR; our encoder's sRGB chunk follows
constexpr std::size_t kSrgbChunk = 13;
constexpr unsigned kWebpProfileFlag = 0x20;
constexpr unsigned kWebpAlphaFlag = 0x10;

void Append(FileBytes& bytes, FileBytes const& more) { bytes.insert(bytes.end(), more.begin(), more.end()); }
void Append(FileBytes& bytes, std::string const& text) {
    bytes.insert(bytes.end(), text.begin(), text.end());
}
void AppendBig(FileBytes& bytes, std::size_t value, int count) {
    while (count-- > 0) bytes.push_back(static_cast<unsigned char>(value >> (8 * count)));
}
void AppendLittle(FileBytes& bytes, std::size_t value, int count) {
    for (int i = 0; i < count; ++i) bytes.push_back(static_cast<unsigned char>(value >> (8 * i)));
}

FileBytes EmbedInPng(FileBytes const& file, FileBytes const& profile) {
    uLongf size = compressBound(static_cast<uLong>(profile.size()));
    FileBytes packed(size);
    compress(packed.data(), &size, profile.data(), static_cast<uLong>(profile.size()));
    packed.resize(size);
    FileBytes content;
    Append(content, std::string("test\0\0", 6));
    Append(content, packed);
    return PutBeforePixels(file, MakePngChunk("iCCP", content));
}

FileBytes EmbedInJpeg(FileBytes const& file, FileBytes const& profile, std::size_t partBytes) {
    std::size_t const count = (profile.size() + partBytes - 1) / partBytes;
    FileBytes result(file.begin(), file.begin() + 2);
    for (std::size_t i = count; i-- > 0;) {
        std::size_t const begin = i * partBytes;
        std::size_t const end = std::min(profile.size(), begin + partBytes);
        Append(result, std::string("\xFF\xE2", 2));
        AppendBig(result, 2 + 14 + end - begin, 2);
        Append(result, std::string("ICC_PROFILE\0", 12));
        AppendBig(result, i + 1, 1);
        AppendBig(result, count, 1);
        Append(result, FileBytes(profile.begin() + static_cast<std::ptrdiff_t>(begin),
                                 profile.begin() + static_cast<std::ptrdiff_t>(end)));
    }
    Append(result, FileBytes(file.begin() + 2, file.end()));
    return result;
}

// The sides of a simple file stand in its one chunk, lossless.
FileBytes EmbedInWebp(FileBytes const& file, FileBytes const& profile) {
    auto const byte = [&file](std::size_t at) { return static_cast<unsigned>(file[at]); };
    unsigned const bits = byte(21) | byte(22) << 8 | byte(23) << 16 | byte(24) << 24;
    FileBytes chunks = MakeWebpChunk("ICCP", profile);
    Append(chunks, FileBytes(file.begin() + 12, file.end()));
    return MakeWebpFile(kWebpProfileFlag | kWebpAlphaFlag, static_cast<int>(bits & 0x3FFF) + 1,
                        static_cast<int>(bits >> 14 & 0x3FFF) + 1, chunks);
}

} // namespace

FileBytes ReadProfile(std::string const& name) {
    std::ifstream file(MOKA_PROFILE_FOLDER "/" + name, std::ios::binary);
    FileBytes bytes(std::istreambuf_iterator<char>(file), {});
    if (bytes.empty()) throw std::runtime_error("no profile " + name);
    bytes.erase(bytes.begin()); // for the fuzzer: the kind of pixels
    return bytes;
}

FileBytes EmbedProfile(FileBytes const& file, FileBytes const& profile, std::size_t partBytes) {
    if (file[0] == 0xFF) return EmbedInJpeg(file, profile, partBytes);
    return file[0] == 'R' ? EmbedInWebp(file, profile) : EmbedInPng(file, profile);
}

FileBytes MakePngChunk(std::string const& type, FileBytes const& content) {
    FileBytes chunk;
    AppendBig(chunk, content.size(), 4);
    Append(chunk, type);
    Append(chunk, content);
    AppendBig(chunk, crc32(0, chunk.data() + 4, static_cast<uInt>(chunk.size() - 4)), 4);
    return chunk;
}

FileBytes PutBeforePixels(FileBytes const& png, FileBytes const& chunks) {
    FileBytes result(png.begin(), png.begin() + kPngHeader);
    Append(result, chunks);
    bool const hasMark = std::memcmp(png.data() + kPngHeader + 4, "sRGB", 4) == 0;
    auto const rest = static_cast<std::ptrdiff_t>(kPngHeader + (hasMark ? kSrgbChunk : 0));
    Append(result, FileBytes(png.begin() + rest, png.end()));
    return result;
}

FileBytes MakeWebpChunk(std::string const& type, FileBytes const& content) {
    FileBytes chunk;
    Append(chunk, type);
    AppendLittle(chunk, content.size(), 4);
    Append(chunk, content);
    if (content.size() % 2 != 0) chunk.push_back(0);
    return chunk;
}

FileBytes MakeWebpFile(unsigned flags, int width, int height, FileBytes const& chunks) {
    FileBytes header;
    AppendLittle(header, flags, 4);
    AppendLittle(header, static_cast<std::size_t>(width - 1), 3);
    AppendLittle(header, static_cast<std::size_t>(height - 1), 3);
    FileBytes content;
    Append(content, "WEBP");
    Append(content, MakeWebpChunk("VP8X", header));
    Append(content, chunks);
    return MakeWebpChunk("RIFF", content);
}

} // namespace Moka::Testing
