#include "scenes/RecordedBitmaps.h"

#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"
#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/bitmap/TextureFilter.h"
#include "scenes/SceneFile.h"
#include "scenes/SceneLine.h"

#include <filesystem>
#include <tuple>

namespace Moka::Scenes {
namespace {

namespace fs = std::filesystem;

// The FNV-1a hash.
std::uint64_t Hash(std::vector<unsigned char> const& bytes) {
    std::uint64_t hash = 14695981039346656037u;
    for (unsigned char const byte : bytes) hash = (hash ^ byte) * 1099511628211u;
    return hash;
}

} // namespace

bool RecordedBitmaps::Key::operator<(Key const& other) const {
    return std::tie(hash, width, height, filter) <
           std::tie(other.hash, other.width, other.height, other.filter);
}

RecordedBitmaps::RecordedBitmaps(std::string const& parent, std::string const& folder)
    : mPath((fs::path(parent) / folder).string()), mFolder(folder) {}

RecordedBitmaps::Result RecordedBitmaps::Record(IMKBitmap* bitmap) {
    if (!bitmap || !bitmap->GetBitmapReadable()) return {};
    int const width = bitmap->GetWidth();
    int const height = bitmap->GetHeight();
    if (width < 1 || height < 1) return {};
    std::vector<unsigned char> pixels(static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * 4);
    bitmap->GetBitmapData(bitmap->GetBitmapRect(), pixels.data());
    // After the read-back all requests for the bitmap are done, so the filter can be read.
    Key const key{Hash(pixels), width, height, GetTextureFilter(*bitmap)};
    auto const found = mNames.find(key);
    return found != mNames.end() ? Result{found->second, ""} : Write(pixels, key);
}

RecordedBitmaps::Result RecordedBitmaps::Write(std::vector<unsigned char>& pixels, Key const& key) {
    mPixels += std::int64_t{key.width} * key.height;
    if (mNames.size() == kMaxBitmaps || mPixels > kMaxPicturePixels)
        return {"", "a scene has no room for another bitmap"};
    std::error_code error;
    fs::create_directory(mPath, error);
    if (error) return {"", "cannot create the folder " + mPath + ": " + error.message()};
    std::string const name = 'b' + std::to_string(mNames.size() + 1);
    std::string const file = name + ".mki"; // keeps premultiplied colours exactly, unlike PNG
    String const path = String::FromFileName((fs::path(mPath) / file).string());
    Bitmap image;
    std::string reason;
    bool const isSaved = image.Construct(pixels.data(), key.width, key.height, key.width * 4,
                                         Bitmap::kFormatRgba8888, false, false) &&
                         BitmapFactory::SaveBitmap(&image, &path, 100, &reason);
    if (!isSaved) return {"", "cannot write the bitmap " + mPath + '/' + file + ": " + reason};
    SceneLine line(name);
    line.AddText("file", mFolder + '/' + file);
    if (key.filter != TextureFilterLinear) line.Add("filter", key.filter);
    mText += (mText.empty() ? "\n    " : ",\n    ") + Quote(name) + ": " + line.GetFields();
    mNames[key] = name;
    return {name, ""};
}

} // namespace Moka::Scenes
