// FactoryFixture: the bitmap fixture with a folder of its own for picture files, and the log.
#pragma once

#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"
#include "tests/support/LogCapture.h"
#include "tests/unit/bitmap/BitmapFixture.h"

#include <filesystem>
#include <string>
#include <unistd.h>

namespace Moka::Testing {

class Factory : public BitmapFixture {
protected:
    void SetUp() override {
        BitmapFixture::SetUp();
        folder = std::filesystem::temp_directory_path() / ("moka_factory_" + std::to_string(getpid()));
        std::filesystem::create_directories(folder);
    }
    void TearDown() override {
        BitmapFixture::TearDown();
        std::filesystem::remove_all(folder);
    }

    String Path(char const* name) const { return String((folder / name).string()); }

    // A picture file of unique opaque pixels.
    String Save(char const* name, int width, int height) const {
        Pixels pixels = UniquePixels(width, height);
        Bitmap bitmap;
        EXPECT_TRUE(bitmap.Construct(pixels.data(), width, height, width * 4, 1, false, false));
        String const path = Path(name);
        EXPECT_TRUE(BitmapFactory::SaveBitmap(&bitmap, &path, 100));
        return path;
    }

    std::filesystem::path folder;
    LogCapture log;
};

} // namespace Moka::Testing
