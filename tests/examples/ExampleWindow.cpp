#include "tests/examples/ExampleWindow.h"

#include <X11/Xlib.h>
#include <X11/Xutil.h>

namespace Moka::Testing {
namespace {

::Window FindWindow(::Display* display, int width, int height) {
    ::Window found = 0;
    ::Window root = 0;
    ::Window parent = 0;
    ::Window* children = nullptr;
    unsigned count = 0;
    XQueryTree(display, DefaultRootWindow(display), &root, &parent, &children, &count);
    for (unsigned i = 0; i < count; ++i) {
        XWindowAttributes attributes{};
        if (XGetWindowAttributes(display, children[i], &attributes) && attributes.width == width &&
            attributes.height == height && attributes.map_state == IsViewable)
            found = children[i];
    }
    if (children) XFree(children);
    return found;
}

} // namespace

ExampleWindow::ExampleWindow() : mDisplay(XOpenDisplay(nullptr)) {
    // A window may go while it is asked for.
    XSetErrorHandler([](::Display*, XErrorEvent*) { return 0; });
}

ExampleWindow::~ExampleWindow() { XCloseDisplay(mDisplay); }

Picture ExampleWindow::Grab(int width, int height) {
    ::Window const window = FindWindow(mDisplay, width, height);
    if (window == 0) return {};
    mWindow = window;
    XImage* const seen = XGetImage(mDisplay, window, 0, 0, static_cast<unsigned>(width),
                                   static_cast<unsigned>(height), AllPlanes, ZPixmap);
    if (!seen) return {};
    Picture image(width, height);
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) {
            unsigned long const pixel = XGetPixel(seen, x, y);
            auto const get = [pixel](int shift) { return static_cast<unsigned char>(pixel >> shift); };
            image.SetColor(x, y, {get(16), get(8), get(0), 255});
        }
    }
    XDestroyImage(seen);
    return image;
}

void ExampleWindow::Resize(int width, int height) {
    XResizeWindow(mDisplay, mWindow, static_cast<unsigned>(width), static_cast<unsigned>(height));
    XSync(mDisplay, False);
}

void ExampleWindow::Close() {
    XEvent event{};
    event.xclient.type = ClientMessage;
    event.xclient.window = mWindow;
    event.xclient.message_type = XInternAtom(mDisplay, "WM_PROTOCOLS", False);
    event.xclient.format = 32;
    event.xclient.data.l[0] = static_cast<long>(XInternAtom(mDisplay, "WM_DELETE_WINDOW", False));
    XSendEvent(mDisplay, mWindow, False, NoEventMask, &event);
    XSync(mDisplay, False);
}

// A cut buffer, as nobody owns the selection.
void ExampleWindow::SetClipboard(std::string const& text) {
    XStoreBytes(mDisplay, text.data(), static_cast<int>(text.size()));
    XSync(mDisplay, False);
}

} // namespace Moka::Testing
