#include "tests/examples/ExampleWindow.h"

#include <X11/Xlib.h>
#include <X11/Xutil.h>

namespace Moka::Testing {
namespace {

::Display* ToX(void* display) { return static_cast<::Display*>(display); }

unsigned char GetByte(unsigned long pixel, int shift) { return static_cast<unsigned char>(pixel >> shift); }

} // namespace

ExampleWindow::ExampleWindow() : mDisplay(XOpenDisplay(nullptr)) {
    // A window may go while it is asked for.
    XSetErrorHandler([](::Display*, XErrorEvent*) { return 0; });
}

ExampleWindow::~ExampleWindow() {
    if (mDisplay) XCloseDisplay(ToX(mDisplay));
}

bool ExampleWindow::Find(int width, int height) {
    if (!mDisplay) return false;
    ::Window root = 0;
    ::Window parent = 0;
    ::Window* children = nullptr;
    unsigned count = 0;
    XQueryTree(ToX(mDisplay), DefaultRootWindow(ToX(mDisplay)), &root, &parent, &children, &count);
    mWindow = 0;
    for (unsigned i = 0; i < count; ++i) {
        XWindowAttributes attributes;
        if (!XGetWindowAttributes(ToX(mDisplay), children[i], &attributes)) continue;
        bool const fits = attributes.width == width && attributes.height == height;
        if (fits && attributes.map_state == IsViewable) mWindow = children[i];
    }
    if (children) XFree(children);
    return mWindow != 0;
}

Picture ExampleWindow::Grab(int width, int height) const {
    Picture image(width, height);
    XImage* const seen = XGetImage(ToX(mDisplay), mWindow, 0, 0, static_cast<unsigned>(width),
                                   static_cast<unsigned>(height), AllPlanes, ZPixmap);
    if (!seen) return image;
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) {
            unsigned long const pixel = XGetPixel(seen, x, y);
            image.SetColor(x, y, {GetByte(pixel, 16), GetByte(pixel, 8), GetByte(pixel, 0), 255});
        }
    }
    XDestroyImage(seen);
    return image;
}

void ExampleWindow::Resize(int width, int height) {
    XResizeWindow(ToX(mDisplay), mWindow, static_cast<unsigned>(width), static_cast<unsigned>(height));
    XSync(ToX(mDisplay), False);
}

void ExampleWindow::Close() {
    XEvent event{};
    event.xclient.type = ClientMessage;
    event.xclient.window = mWindow;
    event.xclient.message_type = XInternAtom(ToX(mDisplay), "WM_PROTOCOLS", False);
    event.xclient.format = 32;
    event.xclient.data.l[0] = static_cast<long>(XInternAtom(ToX(mDisplay), "WM_DELETE_WINDOW", False));
    XSendEvent(ToX(mDisplay), mWindow, False, NoEventMask, &event);
    XSync(ToX(mDisplay), False);
}

// A cut buffer, as nobody owns the selection.
void ExampleWindow::SetClipboard(std::string const& text) {
    XStoreBytes(ToX(mDisplay), text.data(), static_cast<int>(text.size()));
    XSync(ToX(mDisplay), False);
}

} // namespace Moka::Testing
