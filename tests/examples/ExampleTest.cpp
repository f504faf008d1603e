// An example's window shows what the library draws without a window, at every size it is given, and closes without
// a complaint. The example to run is the program's argument; its window is kept as a picture for whoever looks.
#include "examples/Picture.h"
#include "moka/base/RefPtr.h"
#include "moka/host/RenderThread.h"
#include "tests/app/MokaProcess.h"
#include "tests/examples/ExampleWindow.h"
#include "tests/support/ImageCompare.h"
#include "tests/support/TestFiles.h"

#include <gtest/gtest.h>

#include <chrono>
#include <cstdio>
#include <filesystem>
#include <string>
#include <thread>

namespace Moka::Testing {
namespace {

std::string theProgram;

Picture DrawWithoutWindow(int width, int height) {
    Picture image(width, height);
    std::string error;
    auto const queue = RenderThread::Start({}, &error);
    EXPECT_TRUE(queue) << error;
    if (!queue) return image;
    auto const bitmap = RefPtr<IMKBitmap>::Adopt(
        MKGraphicsFactory::CreateBitmap(queue.get(), width, height, nullptr, false, 1, false));
    auto const canvas =
        RefPtr<IMKCanvas>::Adopt(MKGraphicsFactory::CreateCanvas(queue.get(), bitmap.Get(), 1));
    Examples::DrawPicture(*canvas, width, height);
    bitmap->GetBitmapData(bitmap->GetBitmapRect(), image.pixels.data());
    return image;
}

// For some seconds: the sanitizers and a cold disk take their time.
template <class Condition>
bool Soon(Condition const& holds) {
    for (int i = 0; i < 600; ++i) {
        if (holds()) return true;
        std::this_thread::sleep_for(std::chrono::milliseconds(50));
    }
    return false;
}

// Edges may be rounded otherwise, since a window's rows lie the other way round in GL.
bool IsSame(Picture const& a, Picture const& b) {
    ImageDifference const difference = CompareImages(a, b);
    return difference.largest <= 3;
}

TEST(ExampleTest, ShowsThePictureAtEverySizeAndCloses) {
    ProcessOptions options;
    options.program = theProgram;
    options.environment = {"GDK_BACKEND=x11", "SDL_VIDEODRIVER=x11", "QT_QPA_PLATFORM=xcb",
                           "QT_XCB_GL_INTEGRATION=xcb_egl"};
    MokaProcess program(".", {}, options);
    ExampleWindow window;
    bool const isThere = Soon([&] { return program.IsOver() || window.Find(320, 240); }) && !program.IsOver();
    std::string const messages = program.GetError();
    if (messages.find("no GLES context") != std::string::npos) GTEST_SKIP() << messages;
    ASSERT_TRUE(isThere) << messages;
    struct Size {
        int width;
        int height;
    };
    for (Size const size : {Size{320, 240}, Size{480, 360}, Size{220, 300}}) {
        window.Resize(size.width, size.height);
        Picture const expected = DrawWithoutWindow(size.width, size.height);
        Picture seen(1, 1);
        EXPECT_TRUE(Soon([&] {
            if (window.Find(size.width, size.height)) seen = window.Grab(size.width, size.height);
            return program.IsOver() || IsSame(expected, seen);
        }));
        EXPECT_TRUE(IsSame(expected, seen))
            << CompareImages(expected, seen)
            << KeepDifference(expected, seen, std::filesystem::path(theProgram).filename());
        EXPECT_TRUE(SaveImage(seen, theProgram + "-" + std::to_string(size.width) + ".png"));
    }
    window.Close();
    EXPECT_TRUE(Soon([&] { return program.IsOver(); }));
    ProcessResult const result = program.Wait();
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(result.err.find("mok_log"), std::string::npos) << result.err;
}

} // namespace
} // namespace Moka::Testing

int main(int argc, char** argv) {
    ::testing::InitGoogleTest(&argc, argv);
    if (argc != 2) return std::fprintf(stderr, "name the example's program\n"), 2;
    Moka::Testing::theProgram = argv[1];
    return RUN_ALL_TESTS();
}
