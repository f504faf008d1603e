// ColorProfiles.h: ICC profiles, and image files with one put into them, in ways this tree's codecs never write.
#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace Moka::Testing {

using FileBytes = std::vector<unsigned char>;

// One of fuzz/corpus/profile: "srgb"; "p3", sRGB's curve and wider primaries; "grey", whose numbers are light; "ink",
// a table where paper is white, full black ink black and full cyan ink the colour L 50, a -40, b -40.
FileBytes ReadProfile(std::string const& name);

// A copy of a file of this tree's encoders with the profile; a PNG loses its mark "sRGB". Parts of a JPEG's
// profile hold partBytes at most, and stand last to first.
FileBytes EmbedProfile(FileBytes const& file, FileBytes const& profile, std::size_t partBytes = 60000);

// A PNG's chunk, or a WebP's; one that belongs before the pixels of a PNG in place of the mark "sRGB".
FileBytes MakePngChunk(std::string const& type, FileBytes const& content);
FileBytes PutBeforePixels(FileBytes const& png, FileBytes const& chunks);
FileBytes MakeWebpChunk(std::string const& type, FileBytes const& content);
// With the extended header. side is one for both.
FileBytes MakeWebpFile(unsigned flags, int width, int height, FileBytes const& chunks);

} // namespace Moka::Testing
