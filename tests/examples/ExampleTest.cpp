// An example's window shows what the library draws without a window, at every size it is given, and closes without
// a complaint. The example to run is the program's argument; its window is kept as a picture for whoever looks.
#include "examples/Picture.h"
#include "moka/base/RefPtr.h"
#include "moka/host/RenderThread.h"
#include "tests/examples/ExampleWindow.h"
#include "tests/support/ImageCompare.h"
#include "tests/support/TestFiles.h"

#include <gtest/gtest.h>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <thread>

#include <fcntl.h>
#include <sys/wait.h>
#include <unistd.h>

namespace Moka::Testing {
namespace {

std::string theProgram;

// The example, with its messages in a file. Killed at the end of the scope.
class Program {
public:
    Program() : mMessages(theProgram + ".log"), mProcess(fork()) {
        if (mProcess == 0) Become();
    }
    ~Program() {
        if (mProcess <= 0) return;
        kill(mProcess, SIGKILL);
        waitpid(mProcess, nullptr, 0);
    }
    Program(Program const&) = delete;
    Program& operator=(Program const&) = delete;

    // The exit status once it has ended; -1 before, and when a signal ended it.
    int GetStatus() {
        int status = 0;
        if (mProcess <= 0 || waitpid(mProcess, &status, WNOHANG) != mProcess) return mStatus;
        mProcess = 0;
        return mStatus = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }
    bool IsOver() {
        GetStatus();
        return mProcess <= 0;
    }
    std::string GetMessages() const {
        std::ifstream file(mMessages);
        return {std::istreambuf_iterator<char>(file), {}};
    }

private:
    [[noreturn]] void Become() const {
        int const log = open(mMessages.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0666);
        dup2(log, STDERR_FILENO);
        setenv("GDK_BACKEND", "x11", 1);
        setenv("SDL_VIDEODRIVER", "x11", 1);
        setenv("QT_QPA_PLATFORM", "xcb", 1);
        setenv("QT_XCB_GL_INTEGRATION", "xcb_egl", 1);
        execl(theProgram.c_str(), theProgram.c_str(), nullptr);
        _exit(127);
    }

    std::string const mMessages;
    pid_t mProcess; // 0 once it has ended
    int mStatus = -1;
};

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
    Program program;
    ExampleWindow window;
    bool const isThere = Soon([&] { return program.IsOver() || window.Find(320, 240); }) && !program.IsOver();
    std::string const messages = program.GetMessages();
    if (messages.find("no GLES context") != std::string::npos) GTEST_SKIP() << messages;
    ASSERT_TRUE(isThere) << "status " << program.GetStatus() << ", " << messages;
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
    EXPECT_EQ(program.GetStatus(), 0) << program.GetMessages();
    EXPECT_EQ(program.GetMessages().find("mok_log"), std::string::npos) << program.GetMessages();
}

} // namespace
} // namespace Moka::Testing

int main(int argc, char** argv) {
    ::testing::InitGoogleTest(&argc, argv);
    if (argc != 2) return std::fprintf(stderr, "name the example's program\n"), 2;
    Moka::Testing::theProgram = argv[1];
    return RUN_ALL_TESTS();
}
