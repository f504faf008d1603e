#include "tests/support/TestFiles.h"

#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <memory>
#include <thread>

namespace Moka::Testing {

TempFolder::TempFolder() {
    std::string pattern = (std::filesystem::temp_directory_path() / "moka-test-XXXXXX").string();
    mPath = mkdtemp(pattern.data());
}

TempFolder::~TempFolder() { std::filesystem::remove_all(mPath); }

std::vector<std::string> TempFolder::List(std::string const& folder) const {
    std::vector<std::string> names;
    for (auto const& entry : std::filesystem::directory_iterator(mPath / folder))
        names.push_back(entry.path().filename().string());
    std::sort(names.begin(), names.end());
    return names;
}

bool Soon(std::function<bool()> const& holds) {
    bool isSo = holds();
    for (int i = 0; i < 30000 && !isSo; ++i, isSo = holds())
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    return isSo;
}

std::string ReadFile(std::string const& path) {
    std::ifstream file(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

void WriteFile(std::string const& path, std::string const& content) {
    std::ofstream(path, std::ios::binary) << content;
}

bool SaveImage(Picture const& image, std::string const& path, int quality) {
    Bitmap bitmap;
    String const text(path);
    // The bitmap only lends the pixels to the encoder, which reads them.
    return bitmap.Construct(const_cast<unsigned char*>(image.pixels.data()), image.width, image.height,
                            image.GetStride(), Bitmap::kFormatRgba8888, false, false) &&
           BitmapFactory::SaveBitmap(&bitmap, &text, quality);
}

Picture LoadImage(std::string const& path) {
    String const text = String::FromFileName(path);
    std::unique_ptr<Bitmap> const bitmap(BitmapFactory::CreateBitmapForGraphics(&text));
    if (!bitmap) return {};
    Picture image(bitmap->GetWidth(), bitmap->GetHeight());
    for (int y = 0; y < image.height; ++y)
        std::copy_n(bitmap->GetBuffer() + std::ptrdiff_t{bitmap->GetStride()} * y, image.GetStride(),
                    image.At(0, y));
    return image;
}

} // namespace Moka::Testing
