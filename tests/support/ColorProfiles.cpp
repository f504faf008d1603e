#include "tests/support/ColorProfiles.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <lcms2.h>
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

cmsHPROFILE MakeP3() {
    cmsCIExyY const white = {0.3127, 0.3290, 1};
    cmsCIExyYTRIPLE const primaries = {{0.680, 0.320, 1}, {0.265, 0.690, 1}, {0.150, 0.060, 1}};
    cmsFloat64Number const srgb[] = {2.4, 1 / 1.055, 0.055 / 1.055, 1 / 12.92, 0.04045};
    cmsToneCurve* const curve = cmsBuildParametricToneCurve(nullptr, 4, srgb);
    cmsToneCurve* const curves[] = {curve, curve, curve};
    cmsHPROFILE const profile = cmsCreateRGBProfile(&white, &primaries, curves);
    cmsFreeToneCurve(curve);
    cmsMLU* const name = cmsMLUalloc(nullptr, 1);
    cmsMLUsetASCII(name, "en", "US", "Display P3");
    cmsWriteTag(profile, cmsSigProfileDescriptionTag, name);
    cmsMLUfree(name);
    return profile;
}

cmsHPROFILE MakeGrey() {
    cmsToneCurve* const curve = cmsBuildGamma(nullptr, 1.0);
    cmsHPROFILE const profile = cmsCreateGrayProfile(cmsD50_xyY(), curve);
    cmsFreeToneCurve(curve);
    return profile;
}

cmsInt32Number MixInks(cmsUInt16Number const inks[], cmsUInt16Number lab[], void*) {
    double const cyan = inks[0] / 65535.0;
    double const light = 1 - inks[3] / 65535.0;
    cmsCIELab const color = {(100 - 50 * cyan) * light, -40 * cyan * light, -40 * cyan * light};
    cmsFloat2LabEncoded(lab, &color);
    return 1;
}

cmsHPROFILE MakeCmyk() {
    cmsHPROFILE const profile = cmsCreateProfilePlaceholder(nullptr);
    cmsSetProfileVersion(profile, 4.3);
    cmsSetDeviceClass(profile, cmsSigOutputClass);
    cmsSetColorSpace(profile, cmsSigCmykData);
    cmsSetPCS(profile, cmsSigLabData);
    cmsPipeline* const pipeline = cmsPipelineAlloc(nullptr, 4, 3);
    cmsStage* const table = cmsStageAllocCLut16bit(nullptr, 2, 4, 3, nullptr);
    cmsStageSampleCLut16bit(table, MixInks, nullptr, 0);
    // The file format has curves on both sides.
    cmsPipelineInsertStage(pipeline, cmsAT_END, cmsStageAllocToneCurves(nullptr, 4, nullptr));
    cmsPipelineInsertStage(pipeline, cmsAT_END, table);
    cmsPipelineInsertStage(pipeline, cmsAT_END, cmsStageAllocToneCurves(nullptr, 3, nullptr));
    cmsWriteTag(profile, cmsSigAToB0Tag, pipeline);
    cmsPipelineFree(pipeline);
    return profile;
}

cmsHPROFILE Make(ProfileKind kind) {
    switch (kind) {
    case ProfileKind::Srgb:
        return cmsCreate_sRGBProfile();
    case ProfileKind::DisplayP3:
        return MakeP3();
    case ProfileKind::LinearGrey:
        return MakeGrey();
    case ProfileKind::Cmyk:
        return MakeCmyk();
    }
    return nullptr;
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

FileBytes MakeProfile(ProfileKind kind) {
    cmsHPROFILE const profile = Make(kind);
    cmsUInt32Number size = 0;
    cmsSaveProfileToMem(profile, nullptr, &size);
    FileBytes bytes(size);
    cmsSaveProfileToMem(profile, bytes.data(), &size);
    cmsCloseProfile(profile);
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
