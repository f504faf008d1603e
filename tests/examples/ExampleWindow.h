// ExampleWindow: another program's window on the X server that DISPLAY names: what it shows, and what a person
// does to it. Apart from everything else, because Xlib's header claims common words.
#pragma once

#include "tests/support/TestImages.h"

#include <cstdint>
#include <string>

namespace Moka::Testing {

class ExampleWindow {
public:
    // The largest window on the screen. Tests begin without any.
    ExampleWindow();
    ~ExampleWindow();
    ExampleWindow(ExampleWindow const&) = delete;
    ExampleWindow& operator=(ExampleWindow const&) = delete;

    // False while there is none.
    bool Find(int width, int height);
    Picture Grab(int width, int height) const;
    void Resize(int width, int height);
    // As a click on its frame's button does it.
    void Close();
    // Text that other programs paste.
    void SetClipboard(std::string const& text);

private:
    void* const mDisplay;
    std::uintptr_t mWindow = 0;
};

} // namespace Moka::Testing
