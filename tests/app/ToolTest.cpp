#include "tests/app/ToolTest.h"

#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iterator>

namespace Moka::Testing {

namespace fs = std::filesystem;

ToolTest::ToolTest() {
    std::string name = (fs::temp_directory_path() / "moka-tool-XXXXXX").string();
    mFolder = mkdtemp(name.data());
}

ToolTest::~ToolTest() { fs::remove_all(mFolder); }

void ToolTest::Save(TestImage const& image, std::string const& name, int quality) const {
    Bitmap bitmap;
    bitmap.Construct(const_cast<unsigned char*>(image.pixels.data()), image.width, image.height,
                     image.GetStride(), Bitmap::kFormatRgba8888, false, false);
    String const path(Path(name));
    ASSERT_TRUE(BitmapFactory::SaveBitmap(&bitmap, &path, quality));
}

void ToolTest::WriteFile(std::string const& name, std::string const& content) const {
    std::ofstream(Path(name), std::ios::binary) << content;
}

std::string ToolTest::ReadFile(std::string const& name) const {
    std::ifstream file(Path(name), std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

void ToolTest::Truncate(std::string const& name) const {
    fs::resize_file(Path(name), fs::file_size(Path(name)) / 2);
}

TestImage ToolTest::Load(std::string const& name) const {
    String const path(Path(name));
    std::unique_ptr<Bitmap> const bitmap(BitmapFactory::CreateBitmapForGraphics(&path));
    if (!bitmap) return {0, 0};
    TestImage image(bitmap->GetWidth(), bitmap->GetHeight());
    for (int y = 0; y < image.height; ++y)
        std::memcpy(image.At(0, y),
                    bitmap->GetBuffer() + static_cast<std::ptrdiff_t>(bitmap->GetStride()) * y,
                    static_cast<std::size_t>(image.GetStride()));
    return image;
}

std::vector<std::string> ToolTest::List(std::string const& folder) const {
    std::vector<std::string> names;
    for (auto const& entry : fs::directory_iterator(mFolder / folder))
        names.push_back(entry.path().filename().string());
    std::sort(names.begin(), names.end());
    return names;
}

ProcessResult ToolTest::Run(std::vector<std::string> const& arguments, ProcessOptions const& options) const {
    return MokaProcess(mFolder.string(), arguments, options).Wait();
}

std::string ToolTest::RunWell(std::vector<std::string> const& arguments) const {
    ProcessResult const result = Run(arguments);
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
    return result.out;
}

} // namespace Moka::Testing
