// An example's window shows what the library draws without a window, at every size it is given, and closes without
// a complaint. The example to run is the program's argument; its window is kept as a picture for whoever looks.
#include "examples/Picture.h"
#include "moka/graphics/MokaGraphics.h"
#include "moka/host/RenderThread.h"
#include "tests/app/MokaProcess.h"
#include "tests/examples/ExampleWindow.h"
#include "tests/support/ImageCompare.h"
#include "tests/support/TestFiles.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <filesystem>
#include <string>

namespace Moka::Testing {
namespace {

// What the toolkits need to use the X server.
constexpr char const* kOnX =
    "GDK_BACKEND=x11 SDL_VIDEODRIVER=x11 QT_QPA_PLATFORM=xcb QT_XCB_GL_INTEGRATION=xcb_egl ";

std::string theProgram;

Picture DrawWithoutWindow(int width, int height) {
    Picture image(width, height);
    auto const queue = RenderThread::Start({}, nullptr);
    auto const bitmap = NewBitmap(*queue, width, height);
    Examples::DrawPicture(*NewCanvas(*queue, bitmap), width, height);
    bitmap->GetBitmapData(bitmap->GetBitmapRect(), image.pixels.data());
    return image;
}

// Edges may be rounded otherwise, since a window's rows lie the other way round in GL.
bool IsSame(Picture const& a, Picture const& b) { return CompareImages(a, b).largest <= 3; }

TEST(ExampleTest, ShowsThePictureAtEverySizeAndCloses) {
    MokaProcess program(".", kOnX + ("exec '" + theProgram + "'"));
    ExampleWindow window;
    ASSERT_TRUE(Soon([&] { return program.IsOver() || window.Grab(320, 240).width > 0; }));
    std::string const messages = program.GetError();
    if (messages.find("no GLES context") != std::string::npos) GTEST_SKIP() << messages;
    ASSERT_FALSE(program.IsOver()) << messages;
    for (auto const& [width, height] : {std::pair(320, 240), std::pair(480, 360), std::pair(220, 300)}) {
        window.Resize(width, height);
        Picture const expected = DrawWithoutWindow(width, height);
        Picture seen;
        EXPECT_TRUE(Soon([&, width = width, height = height] {
            seen = window.Grab(width, height);
            return program.IsOver() || IsSame(expected, seen);
        }));
        EXPECT_TRUE(IsSame(expected, seen))
            << CompareImages(expected, seen)
            << KeepDifference(expected, seen, std::filesystem::path(theProgram).filename());
        EXPECT_TRUE(SaveImage(seen, theProgram + "-" + std::to_string(width) + ".png"));
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
