#include "moka/host/EglError.h"
#include "moka/host/EglPlatform.h"
#include "moka/host/RenderThread.h"

#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

TEST(EglTest, NamesErrorsAsTheHeadersDo) {
    EXPECT_EQ(detail::NameOfEglError(EGL_SUCCESS), "EGL_SUCCESS");
    EXPECT_EQ(detail::NameOfEglError(EGL_BAD_MATCH), "EGL_BAD_MATCH");
    EXPECT_EQ(detail::NameOfEglError(EGL_CONTEXT_LOST), "EGL_CONTEXT_LOST");
    EXPECT_EQ(detail::NameOfEglError(0x4000), "error 0x4000");
}

TEST(EglTest, FindsWholeExtensionNamesOnly) {
    char const* const list = "EGL_EXT_device_base_long EGL_KHR_surface  EGL_KHR_last";
    EXPECT_TRUE(detail::HasEglExtension(list, "EGL_KHR_surface"));
    EXPECT_TRUE(detail::HasEglExtension(list, "EGL_KHR_last"));
    EXPECT_FALSE(detail::HasEglExtension(list, "EGL_EXT_device_base"));
    EXPECT_FALSE(detail::HasEglExtension(list, "KHR_surface"));
    EXPECT_FALSE(detail::HasEglExtension(nullptr, "EGL_KHR_last"));
}

// EGL gives everybody the same display, and does not count who initialises it.
TEST(EglTest, ADisplayThatTheHostHasInitialisedStaysOpen) {
    EGLDisplay display = EGL_NO_DISPLAY;
    auto const startAndStop = [&display] {
        std::string error;
        std::unique_ptr<RenderThread> const thread = RenderThread::Start({}, &error);
        ASSERT_TRUE(thread) << error;
        thread->Call([&display] { display = eglGetCurrentDisplay(); });
    };
    startAndStop();
    ASSERT_TRUE(eglInitialize(display, nullptr, nullptr));
    startAndStop();
    EXPECT_NE(eglQueryString(display, EGL_VERSION), nullptr);
    eglTerminate(display);
}

} // namespace
} // namespace Moka::Testing
