// Draws in an SDL 2 window. The render thread owns the context; SDL creates none.
#include "examples/Picture.h"
#include "moka/base/RefPtr.h"
#include "moka/host/RenderThread.h"

#include <SDL.h>
#include <SDL_syswm.h>

#include <cstdio>
#include <memory>

namespace {

using namespace Moka;

bool GetNativeWindow(SDL_Window* window, RenderThreadOptions& options) {
    SDL_SysWMinfo info;
    SDL_VERSION(&info.version);
    if (!SDL_GetWindowWMInfo(window, &info) || info.subsystem != SDL_SYSWM_X11) return false;
    options.nativeWindow = info.info.x11.window;
    options.nativeDisplay = info.info.x11.display;
    return true;
}

// Creates a screen bitmap of the window's current size, because its size is fixed.
bool Show(RenderThread& queue, SDL_Window* window) {
    int width = 0;
    int height = 0;
    SDL_GetWindowSize(window, &width, &height);
    auto const screen =
        RefPtr<IMKBitmap>::Adopt(MKGraphicsFactory::CreateScreenBitmap(&queue, 0, 0, width, height, 1, 1));
    auto const canvas = RefPtr<IMKCanvas>::Adopt(MKGraphicsFactory::CreateCanvas(&queue, screen.Get(), 1));
    Examples::DrawPicture(*canvas, width, height);
    return queue.Present(); // waits while two frames are in flight
}

int Run(SDL_Window* window) {
    RenderThreadOptions options;
    if (!GetNativeWindow(window, options)) return std::fprintf(stderr, "this is no X11 window\n"), 1;
    std::string error;
    auto const queue = RenderThread::Start(options, &error);
    if (!queue) return std::fprintf(stderr, "%s\n", error.c_str()), 1;
    bool isShown = Show(*queue, window);
    for (SDL_Event event; isShown && SDL_WaitEvent(&event) && event.type != SDL_QUIT;) {
        bool const isStale =
            event.type == SDL_WINDOWEVENT && (event.window.event == SDL_WINDOWEVENT_EXPOSED ||
                                              event.window.event == SDL_WINDOWEVENT_SIZE_CHANGED);
        if (isStale) isShown = Show(*queue, window);
    }
    return isShown ? 0 : 1; // the render thread stops before the window is destroyed
}

} // namespace

int main(int, char**) {
    if (SDL_Init(SDL_INIT_VIDEO) != 0) return std::fprintf(stderr, "SDL: %s\n", SDL_GetError()), 1;
    SDL_Window* const window = SDL_CreateWindow("SDL 2", 0, 0, 320, 240, SDL_WINDOW_RESIZABLE);
    int const status = window ? Run(window) : 1;
    if (!window) std::fprintf(stderr, "SDL: %s\n", SDL_GetError());
    SDL_DestroyWindow(window);
    SDL_Quit();
    return status;
}
