// Draws in a GLFW window. The render thread owns the context; GLFW creates none.
#include "examples/Picture.h"
#include "moka/base/RefPtr.h"
#include "moka/host/RenderThread.h"

#define GLFW_INCLUDE_NONE
#define GLFW_EXPOSE_NATIVE_X11
#include <GLFW/glfw3.h>
#include <GLFW/glfw3native.h>

#include <cstdio>
#include <memory>

namespace {

using namespace Moka;

// Creates a screen bitmap of the window's current size, because its size is fixed.
void Show(GLFWwindow* window) {
    auto& queue = *static_cast<RenderThread*>(glfwGetWindowUserPointer(window));
    int width = 0;
    int height = 0;
    glfwGetFramebufferSize(window, &width, &height);
    auto const screen =
        RefPtr<IMKBitmap>::Adopt(MKGraphicsFactory::CreateScreenBitmap(&queue, 0, 0, width, height, 1, 1));
    auto const canvas = RefPtr<IMKCanvas>::Adopt(MKGraphicsFactory::CreateCanvas(&queue, screen.Get(), 1));
    Examples::DrawPicture(*canvas, width, height);
    if (!queue.Present()) glfwSetWindowShouldClose(window, GLFW_TRUE);
}

int Run(GLFWwindow* window) {
    RenderThreadOptions options;
    options.nativeWindow = glfwGetX11Window(window);
    options.nativeDisplay = glfwGetX11Display();
    std::string error;
    auto const queue = RenderThread::Start(options, &error);
    if (!queue) return std::fprintf(stderr, "%s\n", error.c_str()), 1;
    glfwSetWindowUserPointer(window, queue.get());
    glfwSetWindowRefreshCallback(window, Show);
    glfwSetFramebufferSizeCallback(window, [](GLFWwindow* resized, int, int) { Show(resized); });
    Show(window);
    while (!glfwWindowShouldClose(window)) glfwWaitEvents();
    return 0; // the render thread stops before the window is destroyed
}

} // namespace

int main() {
    glfwSetErrorCallback([](int, char const* text) { std::fprintf(stderr, "GLFW: %s\n", text); });
    if (!glfwInit()) return 1;
    glfwWindowHint(GLFW_CLIENT_API, GLFW_NO_API);
    GLFWwindow* const window = glfwCreateWindow(320, 240, "GLFW", nullptr, nullptr);
    int const status = window ? Run(window) : 1;
    glfwTerminate();
    return status;
}
