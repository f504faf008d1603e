#include "moka/host/RenderThread.h"

#include <gmock/gmock.h>

#include <cstdlib>
#include <filesystem>

namespace Moka::Testing {
namespace {

using testing::AllOf;
using testing::HasSubstr;

TEST(NoDriverTest, TheMessageSaysWhatWasTriedAndWhatToInstall) {
    std::filesystem::path const empty = std::filesystem::temp_directory_path() / "moka-no-driver";
    std::filesystem::create_directories(empty);
    setenv("__EGL_VENDOR_LIBRARY_DIRS", empty.c_str(), 1);
    unsetenv("__EGL_VENDOR_LIBRARY_FILENAMES");

    std::string error;
    std::unique_ptr<RenderThread> thread = RenderThread::Start({}, &error);
    if (thread && thread->GetContextInfo().renderer.find("ANGLE") == 0) {
        GTEST_SKIP() << "this libEGL is a driver itself and looks for none";
    }
    ASSERT_EQ(thread, nullptr);
    EXPECT_THAT(error, AllOf(HasSubstr("OpenGL ES 3.0"), HasSubstr("Tried: "), HasSubstr("default display"),
                             HasSubstr("EGL_"), HasSubstr("libegl1"), HasSubstr("libgl1-mesa-dri")));

    // It fails the same way again, and without a place for the message.
    std::string again;
    EXPECT_EQ(RenderThread::Start({}, &again), nullptr);
    EXPECT_EQ(again, error);
    EXPECT_EQ(RenderThread::Start({}, nullptr), nullptr);
}

} // namespace
} // namespace Moka::Testing
