#include "tests/pixel/host/XWindow.h"

#include <X11/Xlib.h>
#include <X11/Xutil.h>

#include <utility>

namespace Moka::Testing {

namespace {

::Display* Connect() {
    XInitThreads(); // the render thread uses the connection too
    return XOpenDisplay(nullptr);
}

} // namespace

XWindow::XWindow(int width, int height) : mDisplay(Connect()) {
    if (!mDisplay) return;
    mWindow = XCreateSimpleWindow(mDisplay, DefaultRootWindow(mDisplay), 0, 0, static_cast<unsigned>(width),
                                  static_cast<unsigned>(height), 0, 0, 0);
    XSelectInput(mDisplay, mWindow, StructureNotifyMask);
    XMapWindow(mDisplay, mWindow);
    XEvent event;
    do XNextEvent(mDisplay, &event);
    while (event.type != MapNotify);
}

XWindow::~XWindow() {
    if (mWindow != 0) XDestroyWindow(mDisplay, mWindow);
    if (mDisplay) XCloseDisplay(mDisplay);
}

void XWindow::Resize(int width, int height) {
    XResizeWindow(mDisplay, mWindow, static_cast<unsigned>(width), static_cast<unsigned>(height));
    XSync(mDisplay, False);
}

void XWindow::Destroy() {
    XDestroyWindow(mDisplay, std::exchange(mWindow, 0));
    XSync(mDisplay, False);
}

unsigned long XWindow::GetPixel(int x, int y) const {
    XImage* const image = XGetImage(mDisplay, mWindow, x, y, 1, 1, AllPlanes, ZPixmap);
    unsigned long const pixel = XGetPixel(image, 0, 0) & 0xFFFFFF;
    XDestroyImage(image);
    return pixel;
}

} // namespace Moka::Testing
