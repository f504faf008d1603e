// Draws in an Xlib window with the application's own EGL context and queue, on one thread.
#include "examples/AppQueue.h"
#include "examples/Picture.h"
#include "moka/base/RefPtr.h"
#include "moka/renderer/RendererFactory.h"

#include <EGL/egl.h>
#include <X11/Xlib.h>

#include <cstdio>

namespace {

using namespace Moka;

void Draw(Examples::AppQueue& queue, int width, int height) {
    {
        auto const screen = RefPtr<IMKBitmap>::Adopt(
            MKGraphicsFactory::CreateScreenBitmap(&queue, 0, 0, width, height, 1, 1));
        auto const canvas =
            RefPtr<IMKCanvas>::Adopt(MKGraphicsFactory::CreateCanvas(&queue, screen.Get(), 1));
        Examples::DrawPicture(*canvas, width, height);
    }
    queue.Run();
    RendererFactory::Flush(); // before the swap
}

bool MakeContext(EGLDisplay egl, Window window, EGLSurface& surface) {
    EGLint const wanted[] = {EGL_RENDERABLE_TYPE, EGL_OPENGL_ES3_BIT, EGL_RED_SIZE, 8, EGL_NONE};
    EGLint const version[] = {EGL_CONTEXT_CLIENT_VERSION, 3, EGL_NONE};
    EGLConfig config = nullptr;
    EGLint count = 0;
    if (!eglInitialize(egl, nullptr, nullptr) || !eglBindAPI(EGL_OPENGL_ES_API)) return false;
    if (!eglChooseConfig(egl, wanted, &config, 1, &count) || count == 0) return false;
    surface = eglCreateWindowSurface(egl, config, window, nullptr);
    EGLContext const context = eglCreateContext(egl, config, EGL_NO_CONTEXT, version);
    return eglMakeCurrent(egl, surface, surface, context) && RendererFactory::AttachContext();
}

} // namespace

int main() {
    ::Display* const display = XOpenDisplay(nullptr);
    if (!display) return std::fprintf(stderr, "no X server; DISPLAY names it\n"), 1;
    Window const window = XCreateSimpleWindow(display, DefaultRootWindow(display), 0, 0, 320, 240, 0, 0, 0);
    Atom closes = XInternAtom(display, "WM_DELETE_WINDOW", False);
    XSetWMProtocols(display, window, &closes, 1);
    XStoreName(display, window, "EGL");
    XSelectInput(display, window, ExposureMask | StructureNotifyMask);
    XMapWindow(display, window);
    EGLDisplay const egl = eglGetDisplay(display);
    EGLSurface surface = EGL_NO_SURFACE;
    if (!MakeContext(egl, window, surface))
        return std::fprintf(stderr, "no GLES context: EGL error 0x%x\n",
                            static_cast<unsigned>(eglGetError())),
               1;
    int width = 320;
    int height = 240;
    Examples::AppQueue queue;
    RendererFactory::SetDeferred(true); // this program flushes after each frame
    for (XEvent event; XNextEvent(display, &event), event.type != ClientMessage;) {
        if (event.type == ConfigureNotify) {
            width = event.xconfigure.width;
            height = event.xconfigure.height;
        } else if (event.type == Expose && event.xexpose.count == 0) {
            Draw(queue, width, height);
            eglSwapBuffers(egl, surface);
        }
    }
    RendererFactory::DetachContext();
    eglTerminate(egl);
    XCloseDisplay(display);
    return 0;
}
