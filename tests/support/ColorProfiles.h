// ColorProfiles.h: ICC profiles, and image files with one put into them, in ways this tree's codecs never write.
#pragma once

#include <cstdint>
#include <string>

namespace Moka::Testing {

// Of a file.
using Bytes = std::string;

Bytes ToLittleEndian(std::uint64_t value, int count);
Bytes ToBigEndian(std::uint64_t value, int count);
Bytes Deflate(Bytes const& content); // as zlib does it

// One of fuzz/corpus/profile: "srgb"; "p3", sRGB's curve and wider primaries; "grey", whose numbers are light; "ink",
// a table where paper is white, full black ink black and full cyan ink the colour L 50, a -40, b -40.
Bytes ReadProfile(std::string const& name);

// A copy of a file of this tree's encoders with the profile; a PNG loses its mark "sRGB". Parts of a JPEG's
// profile hold partBytes at most, and stand last to first.
Bytes EmbedProfile(Bytes const& file, Bytes const& profile, std::size_t partBytes = 60000);

// A PNG's chunk, or a WebP's; one that belongs before the pixels of a PNG in place of the mark "sRGB".
Bytes MakePngChunk(std::string const& type, Bytes const& content);
Bytes PutBeforePixels(Bytes png, Bytes const& chunks);
Bytes MakeWebpChunk(std::string const& type, Bytes const& content);
// With the extended header.
Bytes MakeWebpFile(unsigned flags, int width, int height, Bytes const& chunks);

} // namespace Moka::Testing
