#include "tests/support/TestFiles.h"

#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"

#include <algorithm>
#include <cstdlib>

namespace Moka::Testing {

TempFolder::TempFolder() {
    std::string pattern = (std::filesystem::temp_directory_path() / "moka-test-XXXXXX").string();
    mPath = mkdtemp(pattern.data());
}

TempFolder::~TempFolder() { std::filesystem::remove_all(mPath); }

std::vector<std::string> TempFolder::List() const {
    std::vector<std::string> names;
    for (auto const& entry : std::filesystem::directory_iterator(mPath))
        names.push_back(entry.path().filename().string());
    std::sort(names.begin(), names.end());
    return names;
}

bool SaveImage(TestImage const& image, std::string const& path, int quality) {
    Bitmap bitmap;
    String const text(path);
    // The bitmap only lends the pixels to the encoder, which reads them.
    return bitmap.Construct(const_cast<unsigned char*>(image.pixels.data()), image.width, image.height,
                            image.GetStride(), Bitmap::kFormatRgba8888, false, false) &&
           BitmapFactory::SaveBitmap(&bitmap, &text, quality);
}

} // namespace Moka::Testing
