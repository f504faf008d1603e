// XWindow: a window on the X server that DISPLAY names. Apart from everything else, because Xlib's header
// claims common words.
#pragma once

#include <cstdint>

struct _XDisplay;

namespace Moka::Testing {

class XWindow {
public:
    // Mapped. Without a server there is no display.
    XWindow(int width, int height);
    ~XWindow();
    XWindow(XWindow const&) = delete;
    XWindow& operator=(XWindow const&) = delete;

    void* GetDisplay() const { return mDisplay; }
    std::uintptr_t GetWindow() const { return mWindow; }

    // Each returns when the server has done it.
    void Resize(int width, int height);
    void Destroy();

    // What the server shows: 0xRRGGBB.
    unsigned long GetPixel(int x, int y) const;

private:
    _XDisplay* const mDisplay;
    unsigned long mWindow = 0;
};

} // namespace Moka::Testing
