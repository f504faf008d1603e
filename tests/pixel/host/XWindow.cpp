#include "tests/pixel/host/XWindow.h"

#include <X11/Xlib.h>
#include <X11/Xutil.h>

#include <utility>

namespace Moka::Testing {

struct XWindow::Impl {
    ::Display* display;
    ::Window window;
};

std::unique_ptr<XWindow> XWindow::Open(int width, int height) {
    XInitThreads(); // the render thread uses the connection too
    ::Display* const display = XOpenDisplay(nullptr);
    if (!display) return nullptr;
    auto const w = static_cast<unsigned>(width);
    auto const h = static_cast<unsigned>(height);
    ::Window const window = XCreateSimpleWindow(display, DefaultRootWindow(display), 0, 0, w, h, 0, 0, 0);
    XSelectInput(display, window, StructureNotifyMask);
    XMapWindow(display, window);
    XEvent event;
    do XNextEvent(display, &event);
    while (event.type != MapNotify);
    return std::unique_ptr<XWindow>(new XWindow(std::make_unique<Impl>(Impl{display, window})));
}

XWindow::XWindow(std::unique_ptr<Impl> impl) : mImpl(std::move(impl)) {}

XWindow::~XWindow() {
    if (mImpl->window != 0) XDestroyWindow(mImpl->display, mImpl->window);
    XCloseDisplay(mImpl->display);
}

void XWindow::Resize(int width, int height) {
    XResizeWindow(mImpl->display, mImpl->window, static_cast<unsigned>(width), static_cast<unsigned>(height));
    XSync(mImpl->display, False);
}

void XWindow::Destroy() {
    XDestroyWindow(mImpl->display, std::exchange(mImpl->window, 0));
    XSync(mImpl->display, False);
}

void* XWindow::GetDisplay() const { return mImpl->display; }

std::uintptr_t XWindow::GetWindow() const { return mImpl->window; }

unsigned long XWindow::GetPixel(int x, int y) const {
    XImage* const image = XGetImage(mImpl->display, mImpl->window, x, y, 1, 1, AllPlanes, ZPixmap);
    unsigned long const pixel = XGetPixel(image, 0, 0) & 0xFFFFFF;
    XDestroyImage(image);
    return pixel;
}

} // namespace Moka::Testing
