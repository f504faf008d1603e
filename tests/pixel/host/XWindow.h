// XWindow: a window on the X server that DISPLAY names. Apart from everything else, because Xlib's header
// claims common words.
#pragma once

#include <cstdint>
#include <memory>

namespace Moka::Testing {

class XWindow {
public:
    // Mapped. Null without a server.
    static std::unique_ptr<XWindow> Open(int width, int height);
    ~XWindow();
    XWindow(XWindow const&) = delete;
    XWindow& operator=(XWindow const&) = delete;

    void* GetDisplay() const;
    std::uintptr_t GetWindow() const;

    // Each returns when the server has done it.
    void Resize(int width, int height);
    void Destroy();

    // What the server shows: 0xRRGGBB.
    unsigned long GetPixel(int x, int y) const;

private:
    struct Impl;
    explicit XWindow(std::unique_ptr<Impl> impl);
    std::unique_ptr<Impl> const mImpl;
};

} // namespace Moka::Testing
