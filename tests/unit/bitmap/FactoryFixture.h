// FactoryFixture: the bitmap fixture with a folder of its own for picture files, and the log.
#pragma once

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
        EXPECT_TRUE(SaveImage(MakeGradient(width, height), folder.Path(name)));
        return Path(name);
    }

    TempFolder folder;
    LogCapture log;
};

} // namespace Moka::Testing
