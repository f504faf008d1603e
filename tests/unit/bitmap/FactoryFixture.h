// FactoryFixture: the bitmap fixture with a folder of its own for picture files, and the log.
#pragma once

#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestFiles.h"
#include "tests/unit/bitmap/BitmapFixture.h"

#include <string>

namespace Moka::Testing {

class Factory : public BitmapFixture {
protected:
    String Path(char const* name) const { return String(folder.Path(name)); }

    // A picture file of unique opaque pixels.
    String Save(char const* name, int width, int height) const {
        Pixels pixels = UniquePixels(width, height);
        Bitmap bitmap;
        EXPECT_TRUE(bitmap.Construct(pixels.data(), width, height, width * 4, 1, false, false));
        String const path = Path(name);
        EXPECT_TRUE(BitmapFactory::SaveBitmap(&bitmap, &path, 100));
        return path;
    }

    TempFolder folder;
    LogCapture log;
};

} // namespace Moka::Testing
