// ExampleWindow: another program's window on the X server that DISPLAY names: what it shows, and what a person
// does to it. Apart from everything else, because Xlib's header claims common words.
#pragma once

#include "tests/support/TestImages.h"

#include <cstdint>
#include <string>

struct _XDisplay;

namespace Moka::Testing {

class ExampleWindow {
public:
    ExampleWindow();
    ~ExampleWindow();
    ExampleWindow(ExampleWindow const&) = delete;
    ExampleWindow& operator=(ExampleWindow const&) = delete;

    // The pixels of the window of this size; empty while none is visible. The functions below act on the window that
    // was seen last.
    Picture Grab(int width, int height);
    void Resize(int width, int height);
    // As a click on its frame's button does it.
    void Close();
    // Text that other programs paste.
    void SetClipboard(std::string const& text);

private:
    _XDisplay* const mDisplay;
    std::uintptr_t mWindow = 0;
};

} // namespace Moka::Testing
